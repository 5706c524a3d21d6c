// Tests of the SystemC module: the conformance file, and the messages for wrong use.
//
// SystemC allows one elaboration per process, so all decoders exist at once and the tests feed them in turn.
#include <array>
#include <fstream>
#include <iostream>
#include <memory>
#include <string>
#include <systemc>
#include <vector>

#include "MorvikDecoder.h"
#include "conformance/Cases.h"

namespace {

int failures = 0;

void expect(const std::string& what, const std::string& got, const std::string& expected)
{
    if (got != expected) {
        ++failures;
        std::cerr << what << ": expected '" << expected << "', got '" << got << "'\n";
    }
}

/// A decoder with its FIFOs.
struct Rig {
    Rig(const std::string& name, int units, int algorithm, unsigned iterations)
        : decoder(name.c_str(), units, algorithm, iterations, sc_core::sc_time(1, sc_core::SC_US))
    {
        decoder.in(soft);
        decoder.out(decisions);
    }

    MorvikDecisions decode(const MorvikSoftBlock& block)
    {
        soft.write(block);
        sc_core::sc_start(2, sc_core::SC_US);
        MorvikDecisions got;
        if (!decisions.nb_read(got)) {
            ++failures;
            std::cerr << "no decisions came\n";
        }
        return got;
    }

    sc_core::sc_fifo<MorvikSoftBlock> soft;
    sc_core::sc_fifo<MorvikDecisions> decisions;
    MorvikDecoder decoder;
};

std::string lastReport;

void keepReport(const sc_core::sc_report& report, const sc_core::sc_actions& /*actions*/)
{
    lastReport = std::string(report.get_msg_type()) + ": " + report.get_msg();
}

MorvikSoftBlock zeros(std::size_t positions)
{
    const std::vector<std::int32_t> values(positions, -24);
    return {values, values, values, 5};
}

void refuse(Rig& rig, const MorvikSoftBlock& block, const std::string& expected)
{
    lastReport.clear();
    expect("decisions", std::to_string(rig.decode(block).bits.size()), "0");
    expect("report", lastReport, expected);
}

}  // namespace

int sc_main(int argc, char* argv[])
{
    if (argc != 2) {
        std::cerr << "systemc_test CONFORMANCE_FILE\n";
        return 2;
    }
    // The default without a handler: an error throws.
    try {
        const MorvikDecoder refused("refused", 3, 1, 8);
        expect("generics", "accepted", "refused");
    } catch (const sc_core::sc_report& report) {
        expect("generics", report.get_msg(), "ERROR:decoder:C_NUM_PU must be either 2, 4 or 8");
    }

    std::ifstream file(argv[1]);
    const auto cases = morvik::conformance::readCases(file);
    std::vector<std::unique_ptr<Rig>> rigs;
    rigs.reserve(cases.size());
    for (const auto& each : cases) {
        rigs.push_back(std::make_unique<Rig>(
            "decoder" + std::to_string(rigs.size()), each.units, each.algorithm, each.iterations));
    }
    Rig endless("endless", 2, 1, 16);
    sc_core::sc_report_handler::set_handler(keepReport);
    for (std::size_t i = 0; i < cases.size(); ++i) {
        const auto& [sys, par1, par2] = cases[i].soft;
        const auto got = rigs[i]->decode({sys, par1, par2, 7});
        expect("block " + std::to_string(i), got.bits == cases[i].bits && got.tag == 7 ? "right" : "wrong", "right");
    }
    expect("reports", lastReport, "");

    Rig& rig = *rigs[0];
    refuse(rig,
           zeros(40),
           "morvik: ERROR:TDecoder3G:Block size not supported: 40 soft values in each stream, must be K + 4");
    refuse(rig, zeros(0), "morvik: The streams are empty, but a block of K bits has K + 4 soft values in each");
    refuse(endless, zeros(44), "morvik: ERROR:decoder:Number of iterations must be in the range 1 to 15");
    MorvikSoftBlock uneven = zeros(44);
    uneven.par2.pop_back();
    refuse(rig, uneven, "morvik: The streams differ in length: sys has 44 values, par1 44, par2 43");
    MorvikSoftBlock loud = zeros(44);
    loud.par1[9] = 1000;
    expect("loud block", std::to_string(rig.decode(loud).bits.size()), "40");
    expect("report",
           lastReport,
           "morvik: WARNING:decoder:RSC1 parity value in position 9 saturated positively, further saturation will not "
           "be reported");
    std::cout << cases.size() << " blocks, " << failures << " failures\n";
    return failures == 0 ? 0 : 1;
}
