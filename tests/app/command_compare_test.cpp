// The command morvik compare: dumps of cores with a fault, and of the core itself.
#include <algorithm>
#include <cstdlib>
#include <ostream>
#include <sstream>

#include "support/Blocks.h"
#include "support/CommandTest.h"

namespace {

using namespace morvik::support;

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

std::string softText(const morvik::blocks::Block& block)
{
    std::string text = header + '\n';
    for (std::size_t i = 0; i < block.sys.size(); ++i) {
        text += "0," + std::to_string(block.sys[i]) + ',' + std::to_string(block.par1[i]) + ',' +
                std::to_string(block.par2[i]) + '\n';
    }
    return text;
}

morvik::blocks::Block noisyBlock(unsigned K, int amplitude = 16)
{
    morvik::blocks::Random random(1);
    morvik::blocks::Block block = morvik::blocks::encode(morvik::blocks::randomBits(random, K), amplitude);
    morvik::blocks::addNoise(random, 14, block);
    return block;
}

bool has(const std::string& text, const std::string& part)
{
    return text.find(part) != std::string::npos;
}

class Compare : public CommandTest {
protected:
    void writeBlock(unsigned K, int amplitude = 16) const
    {
        morvik.write("block.csv", softText(noisyBlock(K, amplitude)));
    }

    /// Has a core with the fault write rtl.csv.
    void writeDump(const std::string& fault, int units, int algorithm) const
    {
        const CommandRunner core(MORVIK_FAULT_CORE);
        const CommandResult result = core.run({fault, std::to_string(units), std::to_string(algorithm), "4"},
                                              morvik.directory() + "/block.csv",
                                              morvik.directory() + "/rtl.csv");
        ASSERT_EQ(result.status, 0) << result.err;
    }

    /// Leaves the log-likelihood ratios alone in rtl.csv, each as `written` writes it.
    template <class Written>
    void keepRatios(Written written) const
    {
        std::string ratios = "half_iteration,step,signal,value\n";
        std::istringstream all(morvik.read("rtl.csv"));
        for (std::string line; std::getline(all, line);) {
            if (has(line, ",llr,")) {
                const std::size_t value = line.rfind(',') + 1;
                ratios += line.substr(0, value) + written(line.substr(value)) + '\n';
            }
        }
        morvik.write("rtl.csv", ratios);
    }

    /// Leaves out all signals of rtl.csv whose names begin so.
    void leaveOut(const std::string& signal) const
    {
        std::string kept;
        std::istringstream all(morvik.read("rtl.csv"));
        for (std::string line; std::getline(all, line);) {
            const std::size_t name = line.find(',', line.find(',') + 1) + 1;
            kept += line.compare(name, signal.size(), signal) == 0 ? "" : line + '\n';
        }
        morvik.write("rtl.csv", kept);
    }

    CommandResult compare(const std::vector<std::string>& options = {}) const
    {
        std::vector<std::string> arguments = {
            "compare", "--block", "block.csv", "--dump", "rtl.csv", "--iterations", "4"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        return morvik.run(arguments);
    }

    /// Writes rtl.csv with other numbers of half-iterations and steps, as far as there are such in four iterations over
    /// 512 bits.
    void writeLater(const std::string& dump, unsigned passes, unsigned steps) const
    {
        std::istringstream all(dump);
        std::string line;
        std::getline(all, line);
        std::string later = line + '\n';
        for (unsigned pass = 0, step = 0; all >> pass && all.ignore() && all >> step && std::getline(all, line);) {
            if (pass + passes < 8 && step + steps < 515) {
                later += std::to_string(pass + passes) + ',' + std::to_string(step + steps) + line + '\n';
            }
        }
        morvik.write("rtl.csv", later);
    }

    void expectRefused(const CommandResult& result, const std::string& message) const
    {
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.err, "morvik compare: " + message + '\n');
    }
};

class FaultyCore : public Compare, public testing::WithParamInterface<FaultCase> {};

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
        FaultCase{"ratio_rounding", 512, 2, 1, 0, ratio, "no pattern that is known; all are one LSB too high"},
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
                  "starts, on the natural code alone, in beta0 alone:\n  no pattern that is known.\n"},
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
        FaultCase{"forward_state_swapped", 512, 2, 1, 0, forward, "no pattern that is known"},
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
        FaultCase{"one_unit_stuck_bit", 512, 2, 1, 0, extrinsic, "in unit 1 alone:\n  bit 1 is stuck at 0.\n"}),
    [](const testing::TestParamInfo<FaultCase>& each) { return std::string(each.param.fault); });

const std::string usualCore = "core: 2 units, scaled, 4 iterations\n";
const std::string allOf1088 =
    "compared 8 of 8 half-iterations, 200280 of 200280 values: all as the model computes them\n";

TEST_F(Compare, FindsNoDifferenceInTheCoreItself)
{
    int algorithm = 0;
    for (const std::string name : {"max-log", "scaled", "table"}) {
        writeBlock(1088);
        writeDump("none", 4, algorithm++);
        const CommandResult result = compare({"--num-pu", "4", "--algorithm", name});
        EXPECT_EQ(result.status, 0) << result.out;
        EXPECT_EQ(result.out, "core: 4 units, " + name + ", 4 iterations\nrtl.csv: " + allOf1088);
        EXPECT_EQ(result.err, "");
    }
}

// The cores with a fault at a border have recursions of their own.
TEST_F(Compare, FindsNoDifferenceInCoresWithOwnRecursions)
{
    writeBlock(1088);
    writeDump("borders_alone", 2, 1);
    const CommandResult result = compare();
    EXPECT_EQ(result.out, usualCore + "rtl.csv: " + allOf1088);
}

TEST_F(Compare, AgreesWithTheTraceOfTheModel)
{
    writeBlock(1088);
    for (const char* const format : {"csv", "vcd"}) {
        const std::string file = std::string("trace.") + format;
        const CommandResult traced =
            morvik.run({"trace", "block.csv", "--iterations", "4", "--format", format, "--output", file});
        ASSERT_EQ(traced.status, 0) << traced.err;
        const CommandResult result =
            morvik.run({"compare", "--block", "block.csv", "--iterations", "4", "--dump", file});
        EXPECT_EQ(result.status, 0) << result.out;
        EXPECT_EQ(result.out, usualCore + file + ": " + allOf1088);
    }
}

TEST_F(Compare, TellsAWrongRecordFromAWrongValue)
{
    writeBlock(512);
    writeDump("none", 2, 1);
    std::string dump = morvik.read("rtl.csv");
    const std::string place = "\n3,200,intrinsic,";
    const std::size_t value = dump.find(place) + place.size();
    const std::size_t end = dump.find('\n', value);
    dump.replace(value, end - value, std::to_string(std::stoi(dump.substr(value, end - value)) + 2));
    morvik.write("rtl.csv", dump);
    const CommandResult result = compare();
    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(has(result.out, "values: 1 difference\n")) << result.out;
    EXPECT_TRUE(has(result.out, "Where faults are no differences, the core worked on right inputs")) << result.out;
}

TEST_F(Compare, FindsAFaultInAWaveform)
{
    writeBlock(40);
    morvik.run({"trace", "block.csv", "--iterations", "4", "--format", "vcd", "--output", "trace.vcd"});
    std::string text = morvik.read("trace.vcd");
    // The variable of the ratio, and its value in step 5 of the first pass, at time 5.
    const std::size_t variable = text.rfind(' ', text.find(" llr [11:0]") - 1) + 1;
    const std::string code = text.substr(variable, text.find(' ', variable) - variable);
    const std::size_t change = text.find(" " + code + "\n", text.find("\n#5\n"));
    text[change - 1] = text[change - 1] == '0' ? '1' : '0';
    morvik.write("trace.vcd", text);
    const CommandResult result =
        morvik.run({"compare", "--block", "block.csv", "--iterations", "4", "--dump", "trace.vcd"});
    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(has(result.out, "  trellis step    5, bit")) << result.out;
    EXPECT_TRUE(has(result.out, "\n  variable        morvik.unit0.thread0.llr\n  time            5 ns\n"))
        << result.out;
    EXPECT_TRUE(has(result.out, "At fault: the log-likelihood ratio (rule 8).")) << result.out;
    EXPECT_TRUE(has(result.out, "Found in log-likelihood ratios, 1 fault, at one place alone:\n")) << result.out;
}

TEST_F(Compare, TellsWhichVariableAMapHasChosen)
{
    writeBlock(40);
    morvik.run({"trace", "block.csv", "--iterations", "4", "--format", "vcd", "--output", "rtl.vcd"});
    std::string text = morvik.read("rtl.vcd");
    text.insert(text.find("$upscope"), "$scope module port $end\n$var wire 12 ~~ llr $end\n$upscope $end\n");
    morvik.write("rtl.vcd", text);
    const auto compareVcd = [this](const std::vector<std::string>& options) {
        std::vector<std::string> arguments = {
            "compare", "--block", "block.csv", "--dump", "rtl.vcd", "--iterations", "4"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        return morvik.run(arguments);
    };
    const CommandResult twice = compareVcd({});
    EXPECT_EQ(twice.status, 2);
    EXPECT_TRUE(has(twice.err, ": two variables are llr, morvik.unit0.thread0.llr and morvik.unit0.thread0.port.llr;"))
        << twice.err;
    morvik.write("map.json", R"({"signals": {"unit0.thread0.llr": "llr"}})");
    const CommandResult chosen = compareVcd({"--map", "map.json"});
    EXPECT_EQ(chosen.status, 0) << chosen.out;
    EXPECT_TRUE(has(chosen.out, "\n  by the map: llr is morvik.unit0.thread0.llr, not morvik.unit0.thread0.port.llr\n"))
        << chosen.out;
}

TEST_F(Compare, TellsWhatADumpOfRatiosAloneTells)
{
    writeBlock(512);
    writeDump("ratio_sign", 2, 1);
    keepRatios([](const std::string& value) { return value; });
    const CommandResult result = compare();
    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(has(result.out, "  half-iteration  0, on the")) << result.out;
    EXPECT_TRUE(has(result.out, "input alpha      of half-iteration 0, step 0: not in the dump")) << result.out;
    EXPECT_TRUE(has(result.out, "At fault: the log-likelihood ratio (rule 8), or what stands before it")) << result.out;
    EXPECT_TRUE(has(result.out, "the sign is flipped")) << result.out;
}

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

TEST_F(Compare, PassesOnTheWarningsOfTheModel)
{
    morvik.write("block.csv", header + "\n0,200,0,0\n" + zeroRows("0", 43));
    morvik.write("rtl.csv", "half_iteration,step,signal,value\n0,0,intrinsic,63\n");
    const CommandResult result = compare({"--partial"});
    EXPECT_EQ(result.status, 0) << result.out;
    EXPECT_TRUE(has(result.err, "WARNING:")) << result.err;
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
    expectFound(block, "the rows are in reversed order, tail first");
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

TEST_F(Compare, TakesUnknownValuesForDifferences)
{
    writeBlock(40);
    writeDump("none", 2, 1);
    keepRatios([](const std::string&) { return "x"; });
    const CommandResult ratios = compare();
    EXPECT_EQ(ratios.status, 1);
    EXPECT_EQ(
        ratios.out.substr(0, ratios.out.find(" (x)") + 4),
        usualCore +
            "rtl.csv: compared 8 of 8 half-iterations, 320 of 7448 values: 320 differences, all of them unknown values "
            "(x)");
    EXPECT_TRUE(has(ratios.out, "\n  got                 x           x           x\n")) << ratios.out;
    EXPECT_TRUE(has(ratios.out, "\n>         0         202           x *\n")) << ratios.out;
    EXPECT_TRUE(has(ratios.out, "\nllr              320        0      320          320        0   half-iteration 0"))
        << ratios.out;
    EXPECT_TRUE(has(ratios.out, "Found in log-likelihood ratios, 320 differences:\n  unknown (x).\n")) << ratios.out;
    expectRefused(compare({"--ignore-x"}), "rtl.csv: holds no known value");
}

TEST_F(Compare, TellsUnknownValuesFromWrongOnes)
{
    writeBlock(40);
    writeDump("none", 2, 1);
    std::string dump = morvik.read("rtl.csv");
    const auto replace = [&dump](const std::string& row, const std::string& value) {
        const std::size_t start = dump.find('\n' + row) + 1 + row.size();
        dump.replace(start, dump.find('\n', start) - start, value);
    };
    replace("0,7,llr,", "xxx");
    replace("0,7,extrinsic,", "U");
    morvik.write("rtl.csv", dump);
    const CommandResult unknown = compare();
    EXPECT_EQ(unknown.status, 1);
    EXPECT_TRUE(has(unknown.out, "7448 of 7448 values: 2 differences, all of them unknown values (x)\n"))
        << unknown.out;
    EXPECT_TRUE(has(unknown.out, "At fault: the log-likelihood ratio (rule 8).")) << unknown.out;
    EXPECT_TRUE(has(unknown.out, "Found in log-likelihood ratios, 1 fault:\n  unknown (x), though")) << unknown.out;
    const CommandResult ignored = compare({"--ignore-x"});
    EXPECT_EQ(ignored.status, 0);
    EXPECT_EQ(ignored.out,
              usualCore +
                  "rtl.csv: compared 8 of 8 half-iterations, 7446 of 7448 values: all as the model computes them\n"
                  "  ignored: 2 unknown values (x)\n");

    replace("7,3,beta2,", "999");
    morvik.write("rtl.csv", dump);
    EXPECT_TRUE(has(compare().out, ": 3 differences, 2 of them unknown values (x)\n"));
    EXPECT_TRUE(
        has(compare({"--ignore-x"}).out, "7446 of 7448 values: 1 difference\n  ignored: 2 unknown values (x)\n"));
}

TEST_F(Compare, MissesWhatADumpLacks)
{
    writeBlock(40);
    writeDump("none", 2, 1);
    std::istringstream all(morvik.read("rtl.csv"));
    std::string gap;
    std::string start;
    unsigned lines = 0;
    for (std::string line; std::getline(all, line);) {
        gap += has(line, "3,8,llr,") || has(line, ",9,beta2,") ? "" : line + '\n';
        start += ++lines <= 50 ? line + '\n' : "";
    }
    const std::string gaps =
        usualCore +
        "rtl.csv: compared 8 of 8 half-iterations, 7439 of 7448 values: all as the model computes them\n"
        "  not in the dump: 9 values of beta2, llr; the first is beta2 of half-iteration 0, step 9\n";
    const std::string demand =
        "Not complete: a dump should have all values of its signals. --partial accepts one that is meant to hold fewer";
    morvik.write("rtl.csv", gap);
    EXPECT_EQ(compare().status, 1);
    EXPECT_EQ(compare().out, gaps + demand + ".\n");
    EXPECT_EQ(compare({"--partial"}).status, 0);
    EXPECT_EQ(compare({"--partial"}).out, gaps);

    morvik.write("rtl.csv", start);
    const CommandResult cut = compare();
    EXPECT_EQ(cut.status, 1);
    EXPECT_TRUE(has(cut.out, "compared 1 of 8 half-iterations, 49 of 7448 values: all as")) << cut.out;
    EXPECT_TRUE(has(cut.out, "\n  not in the dump: half-iterations 1 to 7\n")) << cut.out;
}

TEST_F(Compare, NeedsNoSignalAsAWhole)
{
    writeBlock(40);
    writeDump("none", 2, 1);
    keepRatios([](const std::string& value) { return value; });
    const CommandResult result = compare();
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out,
              usualCore +
                  "rtl.csv: compared 8 of 8 half-iterations, 320 of 7448 values: all as the model computes them\n"
                  "  not in the dump: signals intrinsic, g0 to g3, alpha0 to alpha7, beta0 to beta7, extrinsic\n");
    morvik.write("rtl.csv", "half_iteration,step,llr,g0\n0,0,,\n");
    expectRefused(compare(), "rtl.csv: holds no value that the core computes");
}

TEST_F(Compare, NeedsTwoBranchMetricsToTellFaults)
{
    writeBlock(512);
    writeDump("ratio_rounding", 2, 1);
    const auto ofRatios = [](const std::string& report) {
        const std::size_t start = report.find("\nllr ");
        return report.substr(start, report.find('\n', start + 1) - start);
    };
    const std::string ratios = ofRatios(compare().out);
    std::istringstream all(morvik.read("rtl.csv"));
    std::string two;
    for (std::string line; std::getline(all, line);) {
        two += has(line, ",g2,") || has(line, ",g3,") ? "" : line + '\n';
    }
    morvik.write("rtl.csv", two);
    const CommandResult result = compare();
    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(has(result.out, "compared 8 of 8 half-iterations, 86104 of 94296 values: ")) << result.out;
    EXPECT_TRUE(has(result.out, "\n  not in the dump: signal g2, which is always g1\n")) << result.out;
    EXPECT_TRUE(has(result.out, "\nAll its inputs agree. At fault: the log-likelihood ratio")) << result.out;
    EXPECT_EQ(ofRatios(result.out), ratios);
    EXPECT_FALSE(has(result.out, "\ng3 ")) << result.out;
}

TEST_F(Compare, TellsWhatToDoWithATraceOfSomeHalfIterations)
{
    writeBlock(40);
    for (const std::string format : {"csv", "vcd"}) {
        const std::string file = "trace." + format;
        morvik.run({"trace", "block.csv", "--half-iterations", "0:1", "--format", format, "--output", file});
        const std::vector<std::string> arguments = {"compare", "--block", "block.csv", "--dump", file, "--iterations"};
        const auto with = [&](const std::vector<std::string>& more) {
            auto all = arguments;
            all.insert(all.end(), more.begin(), more.end());
            return morvik.run(all);
        };
        const CommandResult result = with({"4"});
        EXPECT_EQ(result.status, 1);
        EXPECT_TRUE(has(result.out, "; for a simulation of fewer iterations, give --iterations 1.\n")) << result.out;
        EXPECT_EQ(with({"1"}).status, 0);
        EXPECT_EQ(with({"4", "--partial"}).status, 0);
    }
}

TEST_F(Compare, NamesBadFiles)
{
    writeBlock(40);
    writeDump("none", 2, 1);
    const std::string good = morvik.read("rtl.csv");
    expectRefused(compare({"--block-number", "1"}), "block.csv: has 1 block, there is no block 1");
    expectRefused(compare({"--map", "none.json"}), "none.json: cannot be opened: No such file or directory");
    expectRefused(compare({"--map", "."}), ".: cannot be read: Is a directory");
    morvik.write("rtl.csv", withLine(good, 9, "0,0,alpha3,2048"));
    expectRefused(compare(),
                  "rtl.csv:9: alpha3 \"2048\" is not allowed, expected an integer from -2048 to 2047, or a multiple of "
                  "1/8 with a point from -256.0 to 255.875; a map tells other forms");
    morvik.write("rtl.csv", "half_iteration,step,signal,value\n");
    expectRefused(compare(), "rtl.csv: holds no value that the core computes");
    morvik.write("block.csv", header + '\n' + zeroRows("0", 45));
    expectRefused(compare(),
                  "block.csv:2: block of 45 rows, allowed are K + 4 rows, K being one of the block sizes of 3GPP TS "
                  "36.212 (40 to 6144)");
}

}  // namespace
