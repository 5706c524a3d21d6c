// The command morvik compare: what it says of cores with a fault, and of dumps of another run.
#include <algorithm>
#include <ostream>
#include <sstream>
#include <string>
#include <vector>

#include "CompareTest.h"
#include "Lockstep.h"

namespace morvik::support {
namespace {

/// A core with a fault, and what the command has to say of its dump.
struct FaultCase {
    const char* fault;
    unsigned K;
    int units;
    int algorithm;
    unsigned halfIteration;  ///< of the first difference
    const char* operation;   ///< at fault
    const char* found;       ///< the pattern; empty when none is known
    int amplitude = 16;
};

std::ostream& operator<<(std::ostream& out, const FaultCase& each)
{
    return out << each.fault;
}

class FaultyCore : public Compare, public testing::WithParamInterface<FaultCase> {};

/// What a report says of the first difference: its place and its values, and which operation is at fault.
std::string firstDifferenceIn(const std::string& text)
{
    const std::size_t values = text.find("  half-iteration  ");
    const std::size_t context = text.find("\n\n      step ", values);
    const std::size_t verdict = text.find("\n\n", context + 2);
    return text.substr(values, context - values) + text.substr(verdict, text.find("\n\n", verdict + 2) - verdict);
}

/// What a report finds, a line for each stage.
std::vector<std::string> findingsOf(const std::string& text)
{
    std::vector<std::string> found;
    std::istringstream lines(text);
    bool isNext = false;
    for (std::string line; std::getline(lines, line);) {
        if (isNext) {
            found.push_back(line);
        }
        isNext = line.rfind("Found in ", 0) == 0;
    }
    return found;
}

/// Each stage with faults names the mistake or none.
void expectNoOtherMistake(const FaultCase& given, const std::string& text)
{
    const std::string all = given.found;
    const std::size_t line = all.rfind("\n  ", all.size() - 2);
    const std::string mistake = all.substr(line == std::string::npos ? 0 : line + 3);
    for (const std::string& found : findingsOf(text)) {
        EXPECT_TRUE(has(found + '\n', mistake) || has(found, "no known pattern")) << found;
    }
}

/// A simulation in lockstep is stopped at the same value, with the same words.
void expectLockstep(const FaultCase& given, const std::string& dump, const std::string& compared)
{
    const Lockstep lockstep =
        observeInLockstep(dump, noisyBlock(given.K, given.amplitude), given.units, given.algorithm, 4);
    EXPECT_EQ(lockstep.standing, MORVIK_CHECKER_DIFFERS);
    ASSERT_EQ(lockstep.messages.size(), 1U);
    EXPECT_EQ(firstDifferenceIn(lockstep.messages[0]), firstDifferenceIn(compared));
    EXPECT_EQ(lockstep.messages[0].rfind("ERROR:checker:", 0), 0U) << lockstep.messages[0];
    EXPECT_TRUE(has(lockstep.report + '\n', given.found)) << lockstep.report;
}

TEST_P(FaultyCore, IsFoundAtItsPlace)
{
    const FaultCase& given = GetParam();
    writeBlock(given.K, given.amplitude);
    writeDump(given.fault, given.units, given.algorithm);
    const CommandResult result =
        compare({"--num-pu", std::to_string(given.units), "--algorithm", std::to_string(given.algorithm)});
    EXPECT_EQ(result.status, 1) << result.err;
    EXPECT_TRUE(has(result.out, "  half-iteration  " + std::to_string(given.halfIteration) + ", on the")) << result.out;
    EXPECT_TRUE(has(result.out, std::string("At fault: ") + given.operation)) << result.out;
    EXPECT_TRUE(has(result.out, given.found)) << result.out;
    expectNoOtherMistake(given, result.out);
    expectLockstep(given, morvik.read("rtl.csv"), result.out);
    if (std::getenv("MORVIK_SHOW_REPORTS") != nullptr) {
        std::cout << result.out;
    }
}

const char* const intrinsic = "the intrinsic value";
const char* const branch = "the branch metrics";
const char* const forward = "the forward recursion";
const char* const backward = "the backward recursion";
const char* const ratio = "the log-likelihood ratio";
const char* const extrinsic = "the extrinsic value";
const char* const segmentBorder = "the border metrics at the start of the segment";
const char* const windowBorder = "the border metrics at the start of the window";

INSTANTIATE_TEST_SUITE_P(
    Faults,
    FaultyCore,
    testing::Values(
        FaultCase{"extrinsic_rounding", 512, 2, 1, 0, extrinsic, "one LSB too high: rounding"},
        FaultCase{"intrinsic_rounding", 512, 2, 1, 1, intrinsic, "one LSB too high: rounding"},
        FaultCase{"ratio_rounding", 512, 2, 1, 0, ratio, "no known pattern; all are one LSB too high"},
        FaultCase{
            "forward_bits_kept", 512, 2, 1, 2, segmentBorder, "the seven low bits of border metrics are not cleared"},
        FaultCase{
            "backward_bits_kept", 1088, 2, 1, 2, windowBorder, "the seven low bits of border metrics are not cleared"},
        FaultCase{"forward_border_unknown", 512, 2, 1, 2, segmentBorder, "start metrics are zeros"},
        FaultCase{"backward_border_early", 1024, 2, 1, 2, windowBorder, "border metrics are those of the other pass"},
        FaultCase{"first_state_unknown", 512, 2, 1, 0, "the known state at the beginning", "start metrics are zeros"},
        FaultCase{"tail_bits_kept", 512, 2, 1, 0, "the metrics of the tail", "the seven low bits of border metrics"},
        FaultCase{"tail_sign",
                  512,
                  2,
                  1,
                  1,
                  "the metrics of the tail",
                  "starts, on the natural code alone, in beta0 alone:\n  no known pattern.\n"},
        FaultCase{"ratio_sign", 512, 2, 1, 0, ratio, "the sign is flipped"},
        FaultCase{"extrinsic_sign", 512, 2, 1, 0, extrinsic, "the sign is flipped"},
        FaultCase{"parity_sign", 512, 2, 1, 0, branch, "the sign of the parity is flipped"},
        FaultCase{"branch_unclipped", 512, 2, 1, 0, branch, "saturation is missing: the sum is wider", 80},
        FaultCase{"branch_eight_bits", 512, 2, 1, 0, branch, "saturation is missing: the sum is cut", 80},
        FaultCase{"extrinsic_unclipped", 512, 2, 1, 0, extrinsic, "saturation is missing: the sum is wider", 80},
        FaultCase{"metrics_unwrapped", 512, 2, 1, 0, forward, "the wrap is missing", 80},
        FaultCase{"ratio_unwrapped", 512, 2, 1, 0, ratio, "the wrap is missing: values stay at the end", 48},
        FaultCase{"apriori_late", 512, 2, 1, 1, intrinsic, "a pass late: values are those of the last pass"},
        FaultCase{
            "apriori_before", 512, 2, 1, 1, intrinsic, "a pass late: extrinsic values are those of the pass before"},
        FaultCase{"apriori_missing", 512, 2, 1, 1, intrinsic, "of the pass before do not arrive"},
        FaultCase{"apriori_unpermuted", 512, 2, 1, 1, intrinsic, "without the interleaver's permutation"},
        FaultCase{"apriori_inverse", 512, 2, 1, 1, intrinsic, "by the inverse of the permutation"},
        FaultCase{"apriori_behind", 512, 2, 1, 1, intrinsic, "by the interleaver's address for the step after"},
        FaultCase{"systematic_unpermuted", 512, 2, 1, 0, intrinsic, "in the other code's order"},
        FaultCase{"extrinsic_unscaled", 512, 2, 1, 0, extrinsic, "the factor of 0.75 is missing"},
        FaultCase{"extrinsic_stuck_bit", 512, 2, 1, 0, extrinsic, "bit 0 is stuck at 1"},
        FaultCase{"backward_uncorrected", 512, 2, 2, 0, backward, "the correction table is missing"},
        FaultCase{"forward_corrected_early", 512, 2, 2, 0, forward, "corrections come a decision early"},
        FaultCase{"forward_state_swapped", 512, 2, 1, 0, forward, "no known pattern"},
        FaultCase{"border_six_bits", 512, 2, 1, 0, "the metrics of the tail", "six low bits of border metrics are"},
        FaultCase{"border_nine_bits", 512, 2, 1, 0, "the metrics of the tail", "nine low bits of border metrics are"},
        FaultCase{"border_bit_kept", 512, 2, 1, 2, segmentBorder, "ANDed with 0xFF90, not with 0xFF80 (rule 11)"},
        FaultCase{
            "forward_border_stale", 512, 2, 1, 4, segmentBorder, "stay those of the first pass over the same code"},
        FaultCase{
            "forward_border_late", 512, 2, 1, 2, segmentBorder, "border metrics are a pass over the same code late"},
        FaultCase{
            "forward_border_early", 512, 2, 1, 2, segmentBorder, "border metrics are those of the other pass: this"},
        FaultCase{
            "forward_border_other_code", 512, 2, 1, 2, segmentBorder, "metrics are those of the other code's pass"},
        FaultCase{"backward_border_stale", 1088, 2, 1, 2, windowBorder, "stay those of the first pass over the same"},
        FaultCase{"tail_clipped", 512, 2, 1, 0, "the metrics of the tail", "the tail's branch sums are clipped", 100},
        FaultCase{"metrics_eleven_bits", 512, 2, 1, 0, forward, "values are 11 bits wide, not 12 (rule 2)"},
        FaultCase{"metrics_stored_in_eleven_bits", 512, 2, 1, 0, forward, "values are 11 bits wide, not 12 (rule 2)"},
        FaultCase{"metrics_kept_in_eleven_bits", 512, 2, 1, 0, forward, "values are 11 bits wide, not 12 (rule 2)"},
        FaultCase{"parity_negated_in_eight", 512, 2, 1, 0, branch, "is negated in eight bits, where -128 stays", 100},
        FaultCase{"doubled_in_eight", 512, 2, 1, 1, branch, "twice the intrinsic value is cut to its low eight", 100},
        FaultCase{"branch_seven_bits", 512, 2, 1, 0, branch, "the sum is clipped to seven bits, not eight"},
        FaultCase{"extrinsic_symmetric", 512, 2, 1, 0, extrinsic, "the sum is clipped to -127, not -128"},
        FaultCase{"extrinsic_half", 512, 2, 1, 0, extrinsic, "faults:\n  the factor is 0.5, not 0.75 (rule 14).\n"},
        FaultCase{"extrinsic_five_eighths", 512, 2, 1, 0, extrinsic, "faults:\n  the factor is 0.625, not 0.75"},
        FaultCase{
            "extrinsic_seven_eighths", 512, 2, 0, 0, extrinsic, "faults:\n  the factor is 0.875, not 1 (rule 14)"},
        FaultCase{"extrinsic_45_of_64", 512, 2, 1, 0, extrinsic, "faults:\n  the factor is 0.703125, not 0.75"},
        FaultCase{"extrinsic_clipped_first",
                  512,
                  2,
                  1,
                  0,
                  extrinsic,
                  "faults:\n  the difference is clipped to eight bits before it is scaled, not afterwards (rule 14).\n",
                  48},
        FaultCase{"extrinsic_wrapped_first",
                  512,
                  2,
                  1,
                  0,
                  extrinsic,
                  "faults:\n  the difference is cut to its low nine bits before it is scaled (rule 14).\n",
                  48},
        FaultCase{"extrinsic_coarse", 512, 2, 1, 0, extrinsic, "faults:\n  bits 0 and 1 are stuck at 0.\n"},
        FaultCase{"extrinsic_half_stuck",
                  512,
                  2,
                  1,
                  0,
                  extrinsic,
                  "at steps whose bit 2 is 1 alone:\n  values stay at 13.\n"},
        FaultCase{"extrinsic_apriori_missing",
                  512,
                  2,
                  1,
                  1,
                  extrinsic,
                  "faults:\n  the a-priori value is not subtracted (rule 14).\n"},
        FaultCase{"apriori_whole",
                  512,
                  2,
                  1,
                  1,
                  intrinsic,
                  "faults:\n  the a-priori value counts in full, not half (rule 13).\n"},
        FaultCase{
            "apriori_quartered", 512, 2, 1, 1, intrinsic, "faults:\n  the a-priori value is halved twice (rule 13).\n"},
        FaultCase{"intrinsic_not_halved", 512, 2, 1, 0, intrinsic, "faults:\n  the sum is not halved (rule 13).\n"},
        FaultCase{
            "apriori_cell_before",
            512,
            2,
            1,
            1,
            intrinsic,
            "faults:\n  extrinsic values are written to the address after their own, or read from the one before"},
        FaultCase{"apriori_address_bit",
                  512,
                  2,
                  1,
                  1,
                  intrinsic,
                  "faults:\n  bit 3 of the address of extrinsic values reads as 0 (rule 15).\n"},
        FaultCase{"apriori_address_held",
                  512,
                  2,
                  1,
                  1,
                  intrinsic,
                  "faults:\n  the address of extrinsic values stays at 77 (rule 15).\n"},
        FaultCase{"apriori_cell_stuck",
                  512,
                  2,
                  1,
                  1,
                  intrinsic,
                  "at address 77 of the extrinsic values alone:\n  either extrinsic values read as 88 (rule 13), or "},
        FaultCase{"apriori_cells_dead",
                  512,
                  2,
                  1,
                  1,
                  intrinsic,
                  "at addresses of extrinsic values whose bit 3 is 1 alone:\n  extrinsic values read as zeros"},
        FaultCase{"branch_apriori_whole",
                  512,
                  2,
                  1,
                  1,
                  branch,
                  "faults:\n  the a-priori value counts in full, not half (rule 13).\n"},
        FaultCase{"branch_five_bits",
                  512,
                  2,
                  1,
                  0,
                  branch,
                  "faults:\n  the sum is clipped to five bits, not eight (rules 5 and 14).\n"},
        FaultCase{"parity_address_bit",
                  512,
                  2,
                  1,
                  0,
                  branch,
                  "faults:\n  bit 4 of the address of parity values reads as 0 (rule 5).\n"},
        FaultCase{
            "other_code_first",
            512,
            2,
            1,
            0,
            intrinsic,
            "faults:\n  each half-iteration decodes the other code: half-iteration 0 the natural one (rule 15).\n"},
        FaultCase{"tail_swapped",
                  512,
                  2,
                  1,
                  1,
                  intrinsic,
                  "on the natural code alone:\n  systematic and parity values of the tail are swapped (rule 12)"},
        FaultCase{"tail_reversed",
                  512,
                  2,
                  1,
                  0,
                  intrinsic,
                  "on the interleaved code alone:\n  the tail's steps are in reverse (rule 12)"},
        FaultCase{"tail_of_other_code",
                  512,
                  2,
                  1,
                  0,
                  intrinsic,
                  "on the interleaved code alone:\n  the tail is the other code's (rule 12)"},
        FaultCase{"border_bit_lost",
                  512,
                  2,
                  1,
                  0,
                  "the metrics of the tail",
                  "alone: where segments start:\n  border metrics are ANDed with 0xFB80, not with 0xFF80 (rule 11).\n"},
        FaultCase{"forward_border_both_codes",
                  512,
                  2,
                  1,
                  1,
                  "the unknown state at the start of the segment",
                  "start:\n  border metrics are those of the other code's pass, from half-iteration 1 on"},
        FaultCase{"forward_border_third_pass",
                  512,
                  2,
                  1,
                  2,
                  segmentBorder,
                  "start:\n  border metrics are those of the other code's last pass but one (rules 19 and 20).\n"},
        FaultCase{"forward_border_neighbour",
                  512,
                  2,
                  1,
                  2,
                  segmentBorder,
                  "start:\n  border metrics are those of the neighbour after the right one (rules 19 and 20).\n"},
        FaultCase{"backward_border_neighbour",
                  512,
                  2,
                  1,
                  2,
                  windowBorder,
                  "start:\n  border metrics are those of the neighbour before the right one (rules 19 and 20).\n"},
        FaultCase{"forward_border_step_before",
                  512,
                  2,
                  1,
                  2,
                  segmentBorder,
                  "start:\n  border metrics are those of the step before the border (rules 19 and 20).\n"},
        FaultCase{"segments_late",
                  512,
                  2,
                  1,
                  0,
                  "the unknown state at the start of the segment",
                  "faults:\n  segments start one step late (rules 17 and 19).\n"},
        FaultCase{"windows_early",
                  1088,
                  2,
                  1,
                  0,
                  "the unknown state at the start of the window",
                  "faults:\n  windows start one step early (rules 18 and 20).\n"},
        FaultCase{"windows_late",
                  1088,
                  2,
                  2,
                  0,
                  "the unknown state at the start of the window",
                  "faults:\n  windows start one step late (rules 18 and 20).\n"},
        FaultCase{"forward_lesser",
                  512,
                  2,
                  1,
                  0,
                  forward,
                  "faults:\n  the decision for state 5 takes the lesser candidate (rule 6).\n"},
        FaultCase{"backward_lesser",
                  512,
                  2,
                  1,
                  0,
                  backward,
                  "faults:\n  the decision for state 2 takes the lesser candidate (rule 6).\n"},
        FaultCase{"forward_branch_behind",
                  512,
                  2,
                  1,
                  0,
                  forward,
                  "faults:\n  the branch metrics are those of the step after (rules 6 and 8)"},
        FaultCase{"ratio_lesser_of_states",
                  512,
                  2,
                  1,
                  0,
                  ratio,
                  "faults:\n  the decision between states 4 and 5 for bit 1 takes the lesser candidate (rule 8).\n"},
        FaultCase{"ratio_lesser_of_halves",
                  512,
                  2,
                  1,
                  0,
                  ratio,
                  "faults:\n  the decision between all states for bit 0 takes the lesser candidate (rule 8).\n"},
        FaultCase{"ratio_branch_behind",
                  512,
                  2,
                  2,
                  0,
                  ratio,
                  "faults:\n  the branch metrics are those of the step after (rules 6 and 8)"},
        FaultCase{"ratio_branch_before",
                  512,
                  2,
                  1,
                  0,
                  ratio,
                  "faults:\n  the branch metrics are those of the step before (rules 6 and 8).\n"},
        FaultCase{"ratio_forward_behind",
                  512,
                  2,
                  1,
                  0,
                  ratio,
                  "faults:\n  the forward metrics are those after the step (rule 8)"},
        FaultCase{"ratio_apriori_whole",
                  512,
                  2,
                  1,
                  1,
                  ratio,
                  "faults:\n  the a-priori value counts in full, not half (rule 13).\n"},
        FaultCase{"ratio_address_bit",
                  512,
                  2,
                  1,
                  0,
                  ratio,
                  "faults:\n  bit 5 of the address of forward metrics reads as 0 (rule 8).\n"},
        FaultCase{"ratio_cell_dead",
                  512,
                  2,
                  1,
                  0,
                  ratio,
                  "at steps 5 + 64 n alone:\n  forward metrics read as zeros (rule 8).\n"},
        FaultCase{"ratio_clipped_to_nine_bits",
                  512,
                  2,
                  1,
                  0,
                  ratio,
                  "faults:\n  the ratio is clipped to nine bits, not wrapped at twelve (rule 2).\n",
                  32},
        FaultCase{"metrics_compared_plainly",
                  512,
                  2,
                  1,
                  0,
                  forward,
                  "faults:\n  metrics are compared as plain numbers, though they wrap (rule 3).\n",
                  80},
        FaultCase{"table_by_magnitude",
                  512,
                  2,
                  2,
                  0,
                  forward,
                  "faults:\n  the correction table is read by the magnitude of a negative difference, which is not "
                  "inverted (rule 9).\n"},
        FaultCase{"intrinsic_cut",
                  512,
                  2,
                  1,
                  0,
                  branch,
                  "differences:\n  the intrinsic value lacks its bit below an eighth (rule 13).\n"},
        FaultCase{"apriori_address_bit_in_order",
                  512,
                  2,
                  1,
                  1,
                  intrinsic,
                  "faults:\n  bit 3 of the address of extrinsic values in natural order reads as 0 (rule 15).\n"},
        FaultCase{"forward_border_unknown_in_one",
                  512,
                  2,
                  1,
                  2,
                  segmentBorder,
                  "where segments start, in segment 3 alone:\n  start metrics are zeros, as for an unknown state"},
        FaultCase{"ratio_seven_bits", 512, 2, 1, 0, ratio, "faults:\n  values are 7 bits wide, not 12 (rule 2).\n"},
        FaultCase{"one_unit_stuck_bit", 512, 2, 1, 0, extrinsic, "in unit 1 alone:\n  bit 1 is stuck at 0.\n"}),
    [](const testing::TestParamInfo<FaultCase>& each) { return std::string(each.param.fault); });

TEST_F(Compare, NamesAllMistakesThatFit)
{
    writeBlock(512);
    writeDump("forward_border_stale", 2, 1);
    // What follows from the first wrong values fits to any mistake that leaves it alone.
    leaveOut("g");
    const std::string found = compare().out;
    EXPECT_TRUE(has(found,
                    "at window edges alone: where segments start:\n"
                    "  either border metrics are a pass over the same code late (rules 19 and 20), or border metrics "
                    "stay those of the first pass over the same code (rules 19 and 20).\n"))
        << found;
}

TEST_F(Compare, TakesNoBitThatADumpLacksForRounding)
{
    writeBlock(512);
    writeDump("backward_bits_kept", 2, 1);
    leaveOut("extrinsic");
    const std::string found = compare().out;
    EXPECT_TRUE(has(found, "where windows start:\n  the seven low bits of border metrics are not cleared")) << found;
    EXPECT_FALSE(has(found, "Found in branch metrics")) << found;
}

TEST_F(Compare, TellsThatRealNumbersLackTheirPoints)
{
    writeBlock(40);
    writeDump("none", 2, 1);
    keepRatios([](const std::string& value) {
        std::ostringstream real;
        real << std::stoi(value) / 8.0;  // 9, not 9.0
        return real.str();
    });
    EXPECT_TRUE(has(compare().out, "values are whole numbers where eighths are expected: \"numbers\": \"real\""));
    morvik.write("map.json", R"({"numbers": "real"})");
    EXPECT_EQ(compare({"--map", "map.json"}).status, 0);
}

TEST_F(Compare, TellsThatADumpCountsInAnotherWay)
{
    writeBlock(512);
    writeDump("none", 2, 1);
    const std::string dump = morvik.read("rtl.csv");
    writeLater(dump, 1, 0);
    const CommandResult result = compare();
    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(has(result.out, "Found: the dump is a pass late, or counts half-iterations from 1;")) << result.out;
    morvik.write("map.json", R"({"first_half_iteration": 1})");
    EXPECT_EQ(compare({"--map", "map.json"}).status, 1) << "half-iteration 7 is missing";
    EXPECT_EQ(compare({"--map", "map.json", "--partial"}).status, 0);

    writeLater(dump, 1, 1);
    EXPECT_TRUE(has(compare().out, "Found: the dump counts half-iterations and steps from 1;"));
    morvik.write("map.json", R"({"first_half_iteration": 1, "first_step": 1})");
    EXPECT_EQ(compare({"--map", "map.json", "--partial"}).status, 0);
}

TEST_F(Compare, TellsWhichCoreADumpIsOf)
{
    writeBlock(512);
    writeDump("none", 2, 2);
    const CommandResult result = compare();
    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(has(result.out, "\nFound: the dump is what the model computes with --algorithm table.\n"))
        << result.out;
    EXPECT_EQ(compare({"--algorithm", "table"}).status, 0);
    writeBlock(1088);
    writeDump("none", 8, 0);
    EXPECT_TRUE(has(compare().out, "computes with --algorithm max-log and --num-pu 4 or 8.\n"));
}

TEST_F(Compare, TellsWhichBlockADumpIsOf)
{
    writeBlock(40);
    writeDump("none", 2, 1);
    const std::string rows = morvik.read("block.csv").substr(header.size() + 1);
    morvik.write("block.csv", header + '\n' + zeroRows("7", 52) + zeroRows("8", 44) + rows);
    EXPECT_TRUE(has(compare({"--block-number", "1"}).out, "model computes of block 2 of block.csv.\n"));
    std::string again = rows;
    for (std::size_t at = 0; at < again.size(); at = again.find('\n', at) + 1) {
        again[at] = '9';
    }
    morvik.write("block.csv", header + '\n' + zeroRows("8", 44) + rows + again);
    EXPECT_TRUE(has(compare().out, "model computes either of block 1 of block.csv, or of block 2 of block.csv.\n"));
    morvik.write("block.csv", header + '\n' + zeroRows("7", 44) + "none of the blocks\n" + rows);
    EXPECT_EQ(compare().status, 1);
}

TEST_F(Compare, TellsAMistakeInTheBlock)
{
    writeBlock(40);
    writeDump("none", 2, 1);
    const auto expectFound = [&](const morvik::blocks::Block& block, const std::string& what) {
        morvik.write("block.csv", softText(block));
        const std::string found = compare().out;
        EXPECT_TRUE(has(found, "\nFound: the dump is what the model computes if, in the block, " + what + ".\n"))
            << found;
    };
    morvik::blocks::Block block = noisyBlock(40);
    std::swap(block.par1, block.par2);
    expectFound(block, "rsc1_par and rsc2_par are swapped");
    block = noisyBlock(40);
    for (auto& value : block.par1) {
        value = -value;
    }
    expectFound(block, "the sign of rsc1_par is flipped");
    block = noisyBlock(40);
    for (auto* const stream : {&block.sys, &block.par1, &block.par2}) {
        std::swap_ranges(stream->end() - 4, stream->end() - 2, stream->end() - 2);
    }
    expectFound(block, "the tail has the second encoder's values first");
    block = noisyBlock(40);
    for (auto* const stream : {&block.sys, &block.par1, &block.par2}) {
        std::reverse(stream->begin(), stream->end());
    }
    expectFound(block, "the rows are reversed, tail first");
}

TEST_F(Compare, TakesFewValuesForNoOtherRun)
{
    writeBlock(40);
    writeDump("none", 2, 2);
    const std::string all = morvik.read("rtl.csv");
    std::size_t end = 0;
    for (int line = 0; line < 50; ++line) {
        end = all.find('\n', end) + 1;
    }
    morvik.write("rtl.csv", all.substr(0, end));
    EXPECT_FALSE(has(compare().out, "the dump is what the model computes"));
}

}  // namespace
}  // namespace morvik::support
