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

#include "MorvikChecker.h"
#include "MorvikDecoder.h"
#include "MorvikUnits.h"
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

void expectAnswer(int got, int answer, const std::string& report)
{
    expect("answer", std::to_string(got), std::to_string(answer));
    expect("report", lastReport.substr(0, lastReport.find('\n')), report);
    lastReport.clear();
}

/// What a checker refuses, and x. Reports are kept.
void checkChecker()
{
    const MorvikSoftBlock block = zeros(44);
    MorvikChecker one(2, 1);
    const std::string noBlock =
        "morvik: ERROR:checker:There is no block: start comes before values are observed or asked for";
    lastReport.clear();
    expectAnswer(one.observe(MORVIK_CHECKER_LLR, 0, 0, 0), MORVIK_CHECKER_REFUSED, noBlock);
    expectAnswer(one.report(), MORVIK_CHECKER_REFUSED, noBlock);
    expectAnswer(one.start(block.sys, block.par1, {}, 8),
                 MORVIK_CHECKER_REFUSED,
                 "morvik: The streams differ in length: sys has 44 values, par1 44, par2 0");
    expectAnswer(one.start(block.sys, block.par1, block.par2, 16),
                 MORVIK_CHECKER_REFUSED,
                 "morvik: ERROR:checker:16 iterations are not allowed, expected 1 to 15");
    expectAnswer(one.start(block.sys, block.par1, block.par2, 1), MORVIK_CHECKER_AGREES, "");
    expectAnswer(one.observeRow(MORVIK_CHECKER_G, 0, 0, std::array<std::int32_t, 8>{}),
                 MORVIK_CHECKER_REFUSED,
                 "morvik: Signal 1 has no row of 8 values: MORVIK_CHECKER_G has 4, MORVIK_CHECKER_ALPHA and "
                 "MORVIK_CHECKER_BETA have 8");
    MorvikChecker other(8, 1);
    expectAnswer(other.start(block.sys, block.par1, block.par2, 1), MORVIK_CHECKER_AGREES, "");
    const int ratio = one.ratio(3);
    expect("ratio", std::to_string(one.value(MORVIK_CHECKER_LLR, 1, 3)), std::to_string(ratio));
    expectAnswer(one.observe(MORVIK_CHECKER_LLR, 1, 3, sc_dt::sc_lv<12>(ratio)), MORVIK_CHECKER_AGREES, "");
    expectAnswer(one.report(true),
                 MORVIK_CHECKER_AGREES,
                 "morvik: block 0: compared 1 of 2 half-iterations, 1 of 1862 "
                 "values: all equal to the model");
    expectAnswer(one.report(),
                 MORVIK_CHECKER_INCOMPLETE,
                 "morvik: ERROR:checker:Values are missing; set partial if that is intended");
    expectAnswer(one.writeSituations("/nowhere/met.csv"),
                 MORVIK_CHECKER_REFUSED,
                 "morvik: ERROR:checker:Situations are counted only if count_situations asks for it");
    one.countSituations();
    expectAnswer(one.writeSituations("/nowhere/met.csv"),
                 MORVIK_CHECKER_REFUSED,
                 "morvik: ERROR:checker:/nowhere/met.csv: cannot be written: No such file or directory");
    expectAnswer(
        one.observe(MORVIK_CHECKER_LLR, 1, 4, sc_dt::sc_lv<12>("0000000x0000")),
        MORVIK_CHECKER_DIFFERS,
        "morvik: ERROR:checker:llr of half-iteration 1, step 4: expected " + std::to_string(one.ratio(4)) + ", got x");
    expect("seen", std::to_string(one.seen(MORVIK_CHECKER_LLR)), "2");
    expect("seen by the other", std::to_string(other.seen(MORVIK_CHECKER_LLR)), "0");
    // A refused block is none: values are not those of the block before.
    expectAnswer(one.start(block.sys, {}, block.par2, 8),
                 MORVIK_CHECKER_REFUSED,
                 "morvik: The streams differ in length: sys has 44 values, par1 0, par2 44");
    expectAnswer(one.observe(MORVIK_CHECKER_LLR, 0, 0, 0), MORVIK_CHECKER_REFUSED, noBlock);
}

template <class Row>
std::string rowText(const Row& row)
{
    std::string text;
    for (const auto value : row) {
        text += std::to_string(value) + ' ';
    }
    return text;
}

/// Each unit with the values that the tests of all bindings have.
void checkUnits()
{
    const MorvikUnits units(2);
    MorvikUnits::Column alpha;
    MorvikUnits::Column beta;
    for (int i = 0; i < 8; ++i) {
        const auto state = static_cast<std::size_t>(i);
        alpha.metrics[state] = 12 * i - 40;
        beta.metrics[state] = 20 - 9 * i;
        alpha.pending[state] = beta.pending[state] = i < 5 ? i : 6;
    }
    lastReport = "";
    const auto g = units.branch(units.intrinsic(10, -24), 16);
    expect("branch", rowText(g), "-3 -35 -35 -3 ");
    const auto next = units.forward(alpha, g);
    expect("forward", rowText(next.metrics), "-30 34 47 53 -24 21 61 47 ");
    expect("pending", rowText(next.pending), "4 0 0 1 1 0 0 4 ");
    expect("backward", rowText(units.backward(beta, g).metrics), "23 17 16 47 39 7 -7 -1 ");
    expect("ratio", std::to_string(units.ratio(alpha.metrics, beta.metrics, g)), "-33");
    expect("extrinsic", std::to_string(units.extrinsic(-101, -19)), "-63");
    expect("scaled", std::to_string(MorvikUnits(1).extrinsic(-101, -19)), "-48");
    expect("address", std::to_string(units.address(40, 7)), "31");
    expect("tail", rowText(units.tail({1, -20, 30}, {-100, 50, -6})), "40 -160 104 -96 -152 48 -8 192 ");
    expect("border", rowText(units.border(alpha.metrics)), "-40 -32 -16 -8 8 16 32 40 ");
    expect("no report", lastReport, "");
    const auto row = MorvikUnits::rowOf<4>(sc_dt::sc_lv<32>("0xfd0102fc"));
    expect("row", rowText(row), "-4 2 1 -3 ");
    beta.metrics[5] = 2048;
    units.backward(beta, g);
    expect("refused", lastReport, "morvik: ERROR:unit:backward: a metric or the ratio is not from -2048 to 2047");
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
    checkChecker();
    checkUnits();
    std::cout << cases.size() << " blocks, " << failures << " failures\n";
    return failures == 0 ? 0 : 1;
}
