// example: a self-checking SystemC test bench. A source sends recorded blocks to the model, and a scoreboard compares
// the results with the decisions of a device under test, which a file replaces.
//
//     example K SOFT DECISIONS [BLOCK BIT]
//
// SOFT has a header, then a row BLOCK,SYS,PAR1,PAR2 for each of the K + 4 positions of a block; DECISIONS has a line of
// K bits for each block. BLOCK and BIT invert a bit, like a bug of the device.
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <string>
#include <systemc>

#include "MorvikDecoder.h"

namespace {

class Source : public sc_core::sc_module {
public:
    sc_core::sc_fifo_out<MorvikSoftBlock> out;

    Source(const sc_core::sc_module_name& name, std::size_t K, const char* file)
        : sc_module(name), out("out"), itsK(K), itsFile(file)
    {
        std::string header;
        if (!std::getline(itsFile, header)) {
            SC_REPORT_ERROR("example", (std::string(file) + " cannot be read").c_str());
        }
        SC_HAS_PROCESS(Source);
        SC_THREAD(run);
    }

private:
    void run()
    {
        MorvikSoftBlock block;
        int number = 0;
        int sys = 0;
        int par1 = 0;
        int par2 = 0;
        char comma = 0;
        while (itsFile >> number >> comma >> sys >> comma >> par1 >> comma >> par2) {
            block.sys.push_back(sys);
            block.par1.push_back(par1);
            block.par2.push_back(par2);
            if (block.sys.size() == itsK + 4) {
                out.write(block);
                block = {};
            }
        }
    }

    std::size_t itsK;
    std::ifstream itsFile;
};

class Scoreboard : public sc_core::sc_module {
public:
    sc_core::sc_fifo_in<MorvikDecisions> in;

    Scoreboard(const sc_core::sc_module_name& name, const char* file, int brokenBlock, int brokenBit)
        : sc_module(name), in("in"), itsFile(file), itsBrokenBlock(brokenBlock), itsBrokenBit(brokenBit)
    {
        if (!itsFile) {
            SC_REPORT_ERROR("example", (std::string(file) + " cannot be read").c_str());
        }
        SC_HAS_PROCESS(Scoreboard);
        SC_THREAD(run);
    }

    int blocks() const
    {
        return itsBlocks;
    }

    int wrongBits() const
    {
        return itsWrongBits;
    }

private:
    void run()
    {
        for (;; ++itsBlocks) {
            const auto model = in.read().bits;
            std::string device;
            itsFile >> device;
            device.resize(model.size(), '?');
            for (std::size_t i = 0; i < model.size(); ++i) {
                const char expected = model[i] != 0 ? '1' : '0';
                if (itsBlocks == itsBrokenBlock && static_cast<int>(i) == itsBrokenBit) {
                    device[i] = device[i] == '0' ? '1' : '0';
                }
                if (device[i] != expected) {
                    ++itsWrongBits;
                    std::cout << "block " << itsBlocks << ", bit " << i << ": the device decides " << device[i]
                              << ", the model " << expected << '\n';
                }
            }
        }
    }

    std::ifstream itsFile;
    int itsBrokenBlock;
    int itsBrokenBit;
    int itsBlocks = 0;
    int itsWrongBits = 0;
};

}  // namespace

int sc_main(int argc, char* argv[])
{
    if (argc != 4 && argc != 6) {
        std::cerr << "example K SOFT DECISIONS [BLOCK BIT]\n";
        return 2;
    }
    const unsigned long K = std::strtoul(argv[1], nullptr, 10);
    if (K < 40 || K > 6144) {
        std::cerr << argv[1] << " is no block size: they are 40 to 6144\n";
        return 2;
    }
    Source source("source", K, argv[2]);
    MorvikDecoder decoder("decoder", 4, 1, 8, sc_core::sc_time(10, sc_core::SC_US));
    Scoreboard scoreboard(
        "scoreboard", argv[3], argc == 6 ? std::atoi(argv[4]) : -1, argc == 6 ? std::atoi(argv[5]) : 0);
    sc_core::sc_fifo<MorvikSoftBlock> soft("soft", 2);
    sc_core::sc_fifo<MorvikDecisions> decisions("decisions", 2);
    source.out(soft);
    decoder.in(soft);
    decoder.out(decisions);
    scoreboard.in(decisions);
    sc_core::sc_start();
    std::cout << scoreboard.blocks() << " blocks of " << argv[1] << " bits, " << scoreboard.wrongBits()
              << " wrong bits, " << sc_core::sc_time_stamp() << '\n';
    return scoreboard.blocks() > 0 && scoreboard.wrongBits() == 0 ? 0 : 1;
}
