// MorvikDecoder: the bit-accurate model of the turbo decoder as a SystemC module: reads blocks of soft values from one
// FIFO and writes decisions to another. docs/systemc.md explains it.
#ifndef MORVIK_BINDINGS_SYSTEMC_MORVIKDECODER_H
#define MORVIK_BINDINGS_SYSTEMC_MORVIKDECODER_H

#include <cstddef>
#include <cstdint>
#include <iostream>
#include <memory>
#include <sstream>
#include <string>
#include <systemc>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

/// A block of K bits: K + 4 soft values of each stream, as morvik_v1_0_bitacc_cmodel.h takes them.
struct MorvikSoftBlock {
    std::vector<std::int32_t> sys;
    std::vector<std::int32_t> par1;
    std::vector<std::int32_t> par2;
    std::uint32_t tag = 0;
};

/// The result for a block: K decisions, each 0 or 1, or none if it was refused.
struct MorvikDecisions {
    std::vector<std::uint8_t> bits;
    std::uint32_t tag = 0;
};

// FIFOs print their contents.
inline std::ostream& operator<<(std::ostream& os, const MorvikSoftBlock& block)
{
    return os << block.sys.size() << " positions, tag " << block.tag;
}

inline std::ostream& operator<<(std::ostream& os, const MorvikDecisions& decisions)
{
    return os << decisions.bits.size() << " decisions, tag " << decisions.tag;
}

/// Refusals and warnings of the model become reports of type "morvik". An error report throws, unless sc_report_handler
/// is told otherwise; then a refused block gives no decisions.
class MorvikDecoder : public sc_core::sc_module {
public:
    sc_core::sc_fifo_in<MorvikSoftBlock> in;
    sc_core::sc_fifo_out<MorvikDecisions> out;

    /// numPu        2, 4 or 8
    /// algorithm    0 max-log, 1 scaled, 2 table
    /// iterations   1 to 15
    /// latency      from a block to its decisions
    /// tagWidth     bits of a block's tag, 0 to 32
    MorvikDecoder(const sc_core::sc_module_name& name,
                  int numPu,
                  int algorithm,
                  unsigned iterations,
                  const sc_core::sc_time& latency = sc_core::SC_ZERO_TIME,
                  int tagWidth = 8)
        : sc_module(name),
          in("in"),
          out("out"),
          itsState(nullptr, veltra_ip_morvik_v1_0_destroy_state),
          itsIterations(iterations),
          itsLatency(latency)
    {
        auto generics = veltra_ip_morvik_v1_0_get_default_generics();
        generics.C_NUM_PU = numPu;
        generics.C_ALGORITHM_TYPE = algorithm;
        generics.C_TAG_WIDTH = tagWidth;
        Listener listener;
        itsState.reset(veltra_ip_morvik_v1_0_create_state(generics));
        listener.report();
        SC_HAS_PROCESS(MorvikDecoder);
        SC_THREAD(run);
    }

private:
    /// Captures what the model writes on the standard streams.
    class Listener {
    public:
        Listener() : itsOutput(std::cout.rdbuf(&itsText)), itsError(std::cerr.rdbuf(&itsText)) {}

        ~Listener()
        {
            giveBack();
        }

        Listener(const Listener&) = delete;
        Listener& operator=(const Listener&) = delete;

        /// Reports every line, and adds `hint` to errors. An error may throw.
        void report(const std::string& hint = "")
        {
            giveBack();
            std::istringstream text(itsText.str());
            for (std::string line; std::getline(text, line);) {
                if (line.rfind("WARNING:", 0) == 0) {
                    SC_REPORT_WARNING("morvik", line.c_str());
                } else {
                    SC_REPORT_ERROR("morvik", (line + hint).c_str());
                }
            }
        }

    private:
        void giveBack()
        {
            std::cout.rdbuf(itsOutput);
            std::cerr.rdbuf(itsError);
        }

        std::stringbuf itsText;
        std::streambuf* itsOutput;
        std::streambuf* itsError;
    };

    void run()
    {
        for (;;) {
            const MorvikSoftBlock block = in.read();
            wait(itsLatency);
            out.write(decode(block));
        }
    }

    MorvikDecisions decode(const MorvikSoftBlock& block)
    {
        MorvikDecisions decisions;
        if (block.sys.size() != block.par1.size() || block.sys.size() != block.par2.size()) {
            SC_REPORT_ERROR(
                "morvik",
                ("The streams differ in length: sys has " + std::to_string(block.sys.size()) + " values, par1 " +
                 std::to_string(block.par1.size()) + ", par2 " + std::to_string(block.par2.size()))
                    .c_str());
            return decisions;
        }
        if (block.sys.empty()) {
            SC_REPORT_ERROR("morvik", "The streams are empty, but a block of K bits has K + 4 soft values in each");
            return decisions;
        }
        const std::size_t positions = block.sys.size();
        decisions.bits.resize(positions);
        veltra_ip_morvik_v1_0_outputs outputs{
            decisions.bits.data(), static_cast<std::uint32_t>(decisions.bits.size()), 0, 0};
        Listener listener;
        const int status = veltra_ip_morvik_v1_0_bitacc_simulate(itsState.get(),
                                                                 block.sys.data(),
                                                                 block.par1.data(),
                                                                 block.par2.data(),
                                                                 static_cast<std::int32_t>(positions),
                                                                 itsIterations,
                                                                 block.tag,
                                                                 &outputs);
        listener.report(status == 2 ? ": " + std::to_string(positions) + " soft values in each stream, must be K + 4"
                                    : "");
        decisions.bits.resize(outputs.dout_size);
        decisions.tag = outputs.tag;
        return decisions;
    }

    std::unique_ptr<veltra_ip_morvik_v1_0_state, decltype(&veltra_ip_morvik_v1_0_destroy_state)> itsState;
    unsigned itsIterations;
    sc_core::sc_time itsLatency;
};

#endif
