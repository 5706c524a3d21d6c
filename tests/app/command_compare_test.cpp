// The command morvik compare: dumps of the core itself, and those that differ, lack values or cannot be read.
#include <algorithm>
#include <cstdlib>
#include <sstream>

#include "CompareTest.h"

namespace morvik::support {
namespace {

const std::string usualCore = "core: 2 units, scaled, 4 iterations\n";
const std::string allOf1088 = "compared 8 of 8 half-iterations, 200280 of 200280 values: all equal to the model\n";

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
    for (const char* const format : {"csv", "vcd", "fst"}) {
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

TEST_F(Compare, ReadsPackedDumps)
{
    writeBlock(40);
    writeDump("none", 2, 1);
    morvik.run({"trace", "block.csv", "--iterations", "4", "--format", "vcd", "--output", "trace.vcd"});
    const auto shell = [this](const std::string& command) {
        return std::system(("cd '" + morvik.directory() + "' && " + command).c_str());
    };
    ASSERT_EQ(shell("gzip rtl.csv && vcd2fst trace.vcd trace.fst && gzip trace.vcd && cp trace.fst unnamed && "
                    "head -c 300 trace.vcd.gz >part.vcd.gz && head -c 1000 trace.fst >part.fst"),
              0);
    const auto compareWith = [this](const std::string& dump) {
        return morvik.run({"compare", "--block", "block.csv", "--iterations", "4", "--dump", dump});
    };
    for (const std::string dump : {"rtl.csv.gz", "trace.vcd.gz", "trace.fst", "unnamed"}) {
        const CommandResult result = compareWith(dump);
        EXPECT_TRUE(has(result.out, "7448 of 7448 values: all equal to the model\n")) << result.err;
        EXPECT_EQ(result.status, 0);
    }
    expectRefused(compareWith("part.vcd.gz"),
                  "part.vcd.gz: cannot be unpacked by gzip: gzip: part.vcd.gz: unexpected end of file");
    expectRefused(compareWith("part.fst"),
                  "part.fst: cannot be unpacked by fst2vcd: Could not open 'part.fst', exiting.");
    const std::string path = std::getenv("PATH");
    ASSERT_EQ(shell("mkdir bin && printf '#!/bin/sh\\nexit 3\\n' >bin/fst2vcd && chmod +x bin/fst2vcd"), 0);
    ASSERT_EQ(setenv("PATH", (morvik.directory() + "/bin:" + path).c_str(), 1), 0);
    expectRefused(compareWith("trace.fst"), "trace.fst: cannot be unpacked by fst2vcd: it failed without a message");
    ASSERT_EQ(setenv("PATH", path.c_str(), 1), 0);
}

TEST_F(Compare, SaysWhenToolsOfWaveformsAreMissing)
{
    writeBlock(40);
    morvik.run({"trace", "block.csv", "--format", "fst", "--output", "trace.fst"});
    const std::string path = std::getenv("PATH");
    ASSERT_EQ(setenv("PATH", "/nowhere", 1), 0);
    const CommandResult notRead = morvik.run({"compare", "--block", "block.csv", "--dump", "trace.fst"});
    const CommandResult notWritten = morvik.run({"trace", "block.csv", "--format", "fst", "--output", "other.fst"});
    ASSERT_EQ(setenv("PATH", path.c_str(), 1), 0);
    EXPECT_EQ(notWritten.err,
              "morvik trace: vcd2fst, which writes FST waveforms (Debian package gtkwave), cannot be started: No such "
              "file or directory\n");
    expectRefused(notRead,
                  "trace.fst: is an FST waveform, which fst2vcd reads (Debian package gtkwave), and fst2vcd cannot be "
                  "started: No such file or directory");
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
    EXPECT_TRUE(has(result.out, "Where a fault is not a difference, the core had the right inputs")) << result.out;
    EXPECT_TRUE(has(result.out, "Found in intrinsic values, 1 fault")) << result.out;
    EXPECT_FALSE(has(result.out, "Found in branch metrics")) << result.out;  // which are right
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
    EXPECT_TRUE(has(result.out, "At fault: the log-likelihood ratio (rule 8), or an operation before it"))
        << result.out;
    EXPECT_TRUE(has(result.out, "the sign is flipped")) << result.out;
}

TEST_F(Compare, PassesOnTheWarningsOfTheModel)
{
    morvik.write("block.csv", header + "\n0,200,0,0\n" + zeroRows("0", 43));
    morvik.write("rtl.csv", "half_iteration,step,signal,value\n0,0,intrinsic,63\n");
    const CommandResult result = compare({"--partial"});
    EXPECT_EQ(result.status, 0) << result.out;
    EXPECT_TRUE(has(result.err, "WARNING:")) << result.err;
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
    expectRefused(compare({"--ignore-x"}), "rtl.csv: has no known value");
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
                  "rtl.csv: compared 8 of 8 half-iterations, 7446 of 7448 values: all equal to the model\n"
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
        "rtl.csv: compared 8 of 8 half-iterations, 7439 of 7448 values: all equal to the model\n"
        "  not in the dump: 9 values of beta2, llr; the first is beta2 of half-iteration 0, step 9\n";
    const std::string demand = "Incomplete: values of its signals are missing. Use --partial if that is intended";
    morvik.write("rtl.csv", gap);
    EXPECT_EQ(compare().status, 1);
    EXPECT_EQ(compare().out, gaps + demand + ".\n");
    EXPECT_EQ(compare({"--partial"}).status, 0);
    EXPECT_EQ(compare({"--partial"}).out, gaps);

    morvik.write("rtl.csv", start);
    const CommandResult cut = compare();
    EXPECT_EQ(cut.status, 1);
    EXPECT_TRUE(has(cut.out, "compared 1 of 8 half-iterations, 49 of 7448 values: all equal")) << cut.out;
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
                  "rtl.csv: compared 8 of 8 half-iterations, 320 of 7448 values: all equal to the model\n"
                  "  not in the dump: signals intrinsic, g0 to g3, alpha0 to alpha7, beta0 to beta7, extrinsic\n");
    morvik.write("rtl.csv", "half_iteration,step,llr,g0\n0,0,,\n");
    expectRefused(compare(), "rtl.csv: has no value that the core computes");
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
                  "1/8 with a point from -256.0 to 255.875; use a map for other forms");
    morvik.write("rtl.csv", "half_iteration,step,signal,value\n");
    expectRefused(compare(), "rtl.csv: has no value that the core computes");
    morvik.write("block.csv", header + '\n' + zeroRows("0", 45));
    expectRefused(
        compare(),
        "block.csv:2: block of 45 rows, expected K + 4 rows, where K is a block size of 3GPP TS 36.212 (40 to 6144)");
}

}  // namespace
}  // namespace morvik::support
