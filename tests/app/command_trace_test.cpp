// The command morvik trace: its formats against the library's own trace and each other, and what it refuses.
#include <stdlib.h>
#include <sys/resource.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "hardware/trace/TraceWriter.h"
#include "support/CommandTest.h"
#include "support/TraceReader.h"

namespace morvik::support {
namespace {

using morvik::signalsOf;
using morvik::Stage;

constexpr std::size_t placeColumns = 8;  // of a row of CSV, before the signals

/// The place of a stage's first signal among the signals of a row.
constexpr std::ptrdiff_t firstOf(Stage stage)
{
    return static_cast<std::ptrdiff_t>(signalsOf(stage).first);
}

std::vector<std::string> splitAt(char separator, const std::string& text)
{
    std::vector<std::string> parts;
    std::istringstream stream(text);
    for (std::string part; std::getline(stream, part, separator);) {
        parts.push_back(part);
    }
    return parts;
}

/// A row of CSV without the number of its block.
std::vector<std::int64_t> numbersOf(const std::string& line)
{
    std::vector<std::int64_t> numbers;
    for (const std::string& field : splitAt(',', line)) {
        numbers.push_back(std::stoll(field));
    }
    numbers.erase(numbers.begin());
    return numbers;
}

/// Kilobytes that the largest of the finished processes took.
long largestProcess()
{
    rusage usage = {};
    getrusage(RUSAGE_CHILDREN, &usage);
    return usage.ru_maxrss;
}

class Trace : public CommandTest {
protected:
    CommandResult trace(const std::vector<std::string>& arguments, const std::string& output = "") const
    {
        std::vector<std::string> all = {"trace"};
        all.insert(all.end(), arguments.begin(), arguments.end());
        return morvik.run(all, "/dev/null", output);
    }

    /// What a trace that succeeds prints.
    std::string traced(const std::vector<std::string>& arguments) const
    {
        const CommandResult result = trace(arguments);
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(result.err.rfind("core: ", 0), 0U) << result.err;
        EXPECT_EQ(result.err.find('\n'), result.err.size() - 1) << result.err;
        return result.out;
    }

    /// Its lines, as CSV.
    std::vector<std::string> rows(std::vector<std::string> arguments) const
    {
        arguments.insert(arguments.end(), {"--format", "csv"});
        return splitAt('\n', traced(arguments));
    }

    void expectRefused(const std::vector<std::string>& arguments, const std::string& message) const
    {
        const CommandResult result = trace(arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.err, "morvik trace: " + message + '\n');
    }

    /// The library's own trace of the first block of a file.
    std::string tracedByDecode(const std::string& file, const std::vector<std::string>& options) const
    {
        std::vector<std::string> arguments = {"decode", "one.csv", "--output", "bits", "--trace", "30"};
        morvik.write("one.csv", firstBlock(file));
        arguments.insert(arguments.end(), options.begin(), options.end());
        return morvik.run(arguments).out;
    }

    static std::string firstBlock(const std::string& file)
    {
        std::ifstream input(file);
        std::string text;
        for (std::string line; std::getline(input, line) && line.rfind("1,", 0) != 0;) {
            text += line + '\n';
        }
        return text;
    }
};

TEST_F(Trace, TextIsTheTraceOfTheLibrary)
{
    for (const char* const name : {"k40.csv", "k1024.csv"}) {
        const std::vector<std::string> options = {"--num-pu", "4", "--algorithm", "2", "--iterations", "3"};
        std::vector<std::string> arguments = {vectors(name)};
        arguments.insert(arguments.end(), options.begin(), options.end());
        const std::string expected = tracedByDecode(vectors(name), options);
        ASSERT_GT(expected.size(), 1000U);
        EXPECT_EQ(traced(arguments), expected) << name;
    }
}

TEST_F(Trace, TextKeepsInputsAndChosenPasses)
{
    const std::string whole = traced({vectors("k40.csv")});
    const std::string dashes = std::string(289, '-') + "\ndecode=0 siso=";
    const auto begin = [&](int pass) {
        return whole.find(dashes + std::to_string(pass) + '\n');
    };
    ASSERT_NE(begin(15), std::string::npos);
    EXPECT_EQ(traced({vectors("k40.csv"), "--half-iterations", "2:4"}),
              whole.substr(0, begin(0)) + whole.substr(begin(2), begin(5) - begin(2)));
    EXPECT_EQ(traced({vectors("k40.csv"), "--half-iterations", "15"}),
              whole.substr(0, begin(0)) + whole.substr(begin(15)));
}

TEST_F(Trace, TableHasTheValuesOfTheText)
{
    const std::vector<std::string> lines = rows({vectors("k1024.csv"), "--half-iterations", "1:2"});
    EXPECT_EQ(lines.front(),
              "block,half_iteration,code,step,segment,window,unit,thread,intrinsic,g0,g1,g2,g3,"
              "alpha0,alpha1,alpha2,alpha3,alpha4,alpha5,alpha6,alpha7,"
              "beta0,beta1,beta2,beta3,beta4,beta5,beta6,beta7,llr,extrinsic");
    ASSERT_EQ(lines.size(), 1 + 2 * 1027U);
    std::istringstream text(traced({vectors("k1024.csv"), "--half-iterations", "1:2"}));
    morvik::support::TraceReader reader(text, "text");
    std::size_t line = 1;
    for (morvik::support::TraceStep step; reader.next(step); ++line) {
        const std::vector<std::int64_t> numbers = numbersOf(lines[line]);
        ASSERT_EQ(numbers[0], step.halfIteration);
        ASSERT_EQ(numbers[1], step.halfIteration % 2 == 0 ? 2 : 1);
        ASSERT_EQ(numbers[2], step.step);
        const auto signals = numbers.begin() + placeColumns - 1;
        EXPECT_EQ(signals[firstOf(Stage::intrinsic)], step.values[0]);
        for (std::size_t i = 0; i < (step.step < 1024 ? 16 : 0); ++i) {
            EXPECT_EQ(signals[firstOf(Stage::forward) + static_cast<std::ptrdiff_t>(i)], step.values[1 + i])
                << lines[line];  // alpha, beta
        }
        if (step.step < 1024) {
            EXPECT_EQ(signals[firstOf(Stage::ratio)], step.values[21]);
            EXPECT_EQ(signals[firstOf(Stage::extrinsic)], step.values[22]);
        }
    }
    EXPECT_EQ(line, lines.size());
}

TEST_F(Trace, SelectsSignalsAndUnits)
{
    const std::vector<std::string> all = rows({vectors("k1024.csv"), "--half-iterations", "3"});
    const std::vector<std::string> few =
        rows({vectors("k1024.csv"), "--half-iterations", "3", "--signals", "llr,g,alpha7", "--units", "1"});
    EXPECT_EQ(few.front(), "block,half_iteration,code,step,segment,window,unit,thread,g0,g1,g2,g3,alpha7,llr");
    // Eight segments; the second unit has the last four, and the tail.
    ASSERT_EQ(few.size(), 1 + 512 + 3U);
    for (std::size_t i = 1; i < few.size(); ++i) {
        const std::vector<std::string> whole = splitAt(',', all[i + 512]);
        const auto signals = whole.begin() + placeColumns;
        std::string expected;
        for (std::size_t column = 0; column < placeColumns; ++column) {
            expected += whole[column] + ',';
        }
        for (std::ptrdiff_t g = 0; g < 4; ++g) {
            expected += signals[firstOf(Stage::branch) + g] + ',';
        }
        expected += signals[firstOf(Stage::forward) + 7] + ',';
        EXPECT_EQ(few[i], expected + signals[firstOf(Stage::ratio)]);
    }
}

TEST_F(Trace, ArrayHasTheValuesOfTheTable)
{
    traced({vectors("k512.csv"),
            "--half-iterations",
            "4:5",
            "--signals",
            "beta,g",
            "--format",
            "npy",
            "--output",
            "trace.npy"});
    const std::vector<std::string> lines =
        rows({vectors("k512.csv"), "--half-iterations", "4:5", "--signals", "beta,g"});
    morvik::trace::Selection selection;
    for (const Stage stage : {Stage::branch, Stage::backward}) {
        for (unsigned i = 0; i < signalsOf(stage).count; ++i) {
            selection.signals.push_back(signalsOf(stage).first + i);
        }
    }
    const auto reader =
        morvik::tables::findFormat("npy")->reader(morvik.directory(), morvik::trace::traceTable(selection));
    std::size_t line = 1;
    for (morvik::tables::Row row; reader->next(row); ++line) {
        EXPECT_EQ(row, numbersOf(lines.at(line)));
    }
    EXPECT_EQ(line, lines.size());
}

TEST_F(Trace, TracesEachBlockOnItsOwn)
{
    const std::vector<std::string> lines = rows({vectors("k40.csv"), "--block", "2", "--half-iterations", "0"});
    EXPECT_EQ(lines[1].rfind("2,0,2,0,", 0), 0U) << lines[1];
    std::ifstream input(vectors("k40.csv"));
    std::string alone = header + '\n';
    for (std::string line; std::getline(input, line);) {
        alone += line.rfind("2,", 0) == 0 ? line + '\n' : "";
    }
    morvik.write("alone.csv", alone);
    EXPECT_EQ(traced({vectors("k40.csv"), "--block", "2"}), traced({"alone.csv"}));
    EXPECT_NE(traced({vectors("k40.csv")}), traced({"alone.csv"}));
}

TEST_F(Trace, KeepsWarningsOutOfTables)
{
    morvik.write("wide.csv", withLine(header + '\n' + zeroRows("0", 44), 3, "0,999,-64,-64"));
    const std::string warning =
        "WARNING:decoder:RSC1 systematic value in position 1 saturated positively, further saturation will not be "
        "reported\n";
    const CommandResult table = trace({"wide.csv", "--format", "csv"});
    EXPECT_EQ(table.status, 0);
    EXPECT_EQ(table.err, warning + "core: 2 units, scaled, 8 iterations\n");
    EXPECT_EQ(table.out.find("WARNING"), std::string::npos);
    EXPECT_EQ(traced({"wide.csv"}).rfind(warning, 0), 0U);  // as in the library's trace
}

/// Whatever the length of the trace: what thirty passes add to one would be 20 MB at least.
TEST_F(Trace, NeedsNoMoreMemoryForMorePasses)
{
    setenv("ASAN_OPTIONS", "quarantine_size_mb=1", 0);  // the address sanitizer keeps freed memory
    for (const std::string format : {"text", "csv", "npy", "vcd"}) {
        const std::vector<std::string> arguments = {
            vectors("k6144.csv"), "--iterations", "15", "--format", format, "--output", "trace"};
        std::vector<std::string> one = arguments;
        one.insert(one.end(), {"--half-iterations", "0"});
        traced(one);
        const long before = largestProcess();
        traced(arguments);
        EXPECT_GT(std::filesystem::file_size(morvik.directory() + "/trace"), 10000000U);
        EXPECT_LT(largestProcess(), before + 2000) << format;
    }
}

TEST_F(Trace, RefusesWhatIsNotAllowed)
{
    const std::string help = "; see 'morvik trace --help'";
    const std::string k40 = vectors("k40.csv");
    const auto expectNoRange = [&](const std::string& wrong) {
        expectRefused({k40, "--iterations", "2", "--half-iterations=" + wrong},
                      "--half-iterations: \"" + wrong +
                          "\" is not allowed, expected N or A:B, A not above B, from 0 to 3 (two for each of "
                          "--iterations)");
    };
    for (const char* const wrong : {"4", "0:4", "2:1", "a", "1:", ":1", "0:1:2", "-1"}) {
        expectNoRange(wrong);
    }
    const auto expectNoSignal = [&](const std::string& wrong) {
        expectRefused(
            {k40, "--format", "csv", "--signals=" + wrong},
            "--signals: \"" + wrong +
                "\" is not allowed, expected intrinsic, g0 to g3, alpha0 to alpha7, beta0 to beta7, llr, extrinsic, "
                "or g, alpha, beta for all of a kind" +
                help);
    };
    for (const char* const wrong : {"gamma", "alpha8", "g4", "ll"}) {
        expectNoSignal(wrong);
    }
    expectRefused({k40, "--format", "csv", "--signals", "alpha,alpha3"},
                  "--signals: \"alpha3\" is not allowed, it has been given before" + help);
    expectRefused({k40, "--format", "csv", "--units", "1x"},
                  "--units: \"1x\" is not allowed, expected unit numbers, from 0" + help);
    expectRefused({k40, "--format", "csv", "--units", "1"},
                  "--units: unit 1 computes nothing of a block of 40 bits with --num-pu 2, unit 0 does");
    expectRefused({vectors("k1024.csv"), "--format", "vcd", "--num-pu", "8", "--units", "0,8"},
                  "--units: unit 8 computes nothing of a block of 1024 bits with --num-pu 8, units 0 to 7 do");
    expectRefused({k40, "--format", "fsdb"},
                  "--format: \"fsdb\" is not allowed, expected text, csv, vcd, fst or npy" + help);
    const std::string own =
        "--signals and --units need --format csv, vcd, fst or npy: they do not apply to the library's own text";
    expectRefused({k40, "--units", "0"}, own);
    expectRefused({k40, "--signals", "llr"}, own);
    expectRefused({k40, "--format", "npy"}, "--format npy needs a regular file; use --output FILE");
}

TEST_F(Trace, TellsWhatIsWrongWithFiles)
{
    const std::string k40 = vectors("k40.csv");
    expectRefused({"nowhere.csv"}, "nowhere.csv: cannot be opened: No such file or directory");
    expectRefused({k40, "--block", "8"}, k40 + ": has 8 blocks, there is no block 8");
    morvik.write("short.csv", header + '\n' + zeroRows("0", 45));
    expectRefused(
        {"short.csv"},
        "short.csv:2: block of 45 rows, expected K + 4 rows, where K is a block size of 3GPP TS 36.212 (40 to 6144)");
    morvik.write("tail.csv", header + '\n' + zeroRows("0", 2));
    EXPECT_EQ(trace({"tail.csv"}).err.rfind("morvik trace: tail.csv:2: block of 2 rows, ", 0), 0U);
    morvik.write("in.csv", header + '\n' + zeroRows("0", 44));
    expectRefused({"in.csv", "--output", "in.csv"},
                  "in.csv: is read as in.csv, traced values need a file of their own");
    EXPECT_EQ(morvik.read("in.csv"), header + '\n' + zeroRows("0", 44));
    for (const std::string format : {"text", "csv", "vcd", "fst", "npy"}) {
        expectRefused({"in.csv", "--format", format, "--output", "nowhere/out"},
                      "nowhere/out: cannot be written: No such file or directory");
        expectRefused({"in.csv", "--format", format, "--output", "/dev/full"},
                      format == "npy" ? "--format npy needs a regular file; use --output FILE"
                                      : "/dev/full: cannot be written: No space left on device");
    }
    for (const std::string format : {"text", "csv", "vcd"}) {
        const CommandResult result = trace({"in.csv", "--format", format}, "/dev/full");
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.err, "morvik trace: <stdout>: cannot be written: No space left on device\n");
    }
}

}  // namespace
}  // namespace morvik::support
