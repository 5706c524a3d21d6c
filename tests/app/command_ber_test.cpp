// morvik ber: what it simulates, prints and refuses.
#include <fcntl.h>
#include <stdlib.h>
#include <unistd.h>

#include <algorithm>
#include <nlohmann/json.hpp>
#include <regex>
#include <sstream>

#include "support/BerTest.h"

namespace morvik::support {
namespace {

class Ber : public BerTest {
protected:
    /// Runs a sweep and returns what a column holds.
    std::vector<std::string> column(const std::string& name, const Arguments& arguments) const
    {
        std::vector<std::string> values;
        for (const CsvRow& row : csvRows(berFile(arguments))) {
            values.push_back(row.at(name));
        }
        return values;
    }

    /// Expects that an option's value is refused for a reason. `part` is what of it the message shows.
    void expectNotAllowed(const std::string& option, const std::string& value, const std::string& reason) const
    {
        expectNotAllowed(option, value, value, reason);
    }

    void expectNotAllowed(const std::string& option,
                          const std::string& value,
                          const std::string& part,
                          const std::string& reason) const
    {
        std::string argument = option;
        argument += '=' + value;
        std::string message = option;
        message += ": \"" + part + "\" is not allowed, " + reason;
        const Arguments others = option == "--block-size" ? Arguments() : words("--block-size 40");
        expectUsageError(others + Arguments{argument}, message);
    }

    void expectUsageError(const Arguments& arguments, const std::string& message) const
    {
        SCOPED_TRACE(message);
        expectRefused(Arguments{"ber"} + arguments, "morvik ber: " + message + "; see 'morvik ber --help'");
    }
};

const Arguments smallRun = words("--block-size 40 --ebn0 0,2 --max-blocks 200 --block-errors 1000");

// ---- What is simulated

TEST_F(Ber, SimulatesEveryCombinationInAscendingOrder)
{
    const Arguments sweep = words(
        "--block-size 48,40 --num-pu 8,2 --algorithm table,0 --scale 12.5,auto --iterations 3,1 --max-blocks 10 --ebn0 "
        "2,1.5");
    std::vector<Arguments> points;
    for (const CsvRow& row : csvRows(berFile(sweep))) {
        points.push_back({row.at("block_size"),
                          row.at("num_pu"),
                          row.at("algorithm"),
                          row.at("scale_option"),
                          row.at("iterations"),
                          row.at("ebn0_db")});
    }
    std::vector<Arguments> expected;
    for (const char* size : {"40", "48"}) {
        for (const char* units : {"2", "8"}) {
            for (const char* algorithm : {"max-log", "table"}) {
                for (const char* scale : {"auto", "12.5"}) {
                    for (const char* iterations : {"1", "3"}) {
                        for (const char* ebn0 : {"1.5", "2"}) {
                            expected.push_back({size, units, algorithm, scale, iterations, ebn0});
                        }
                    }
                }
            }
        }
    }
    EXPECT_EQ(points, expected);
}

TEST_F(Ber, TakesRangesOfEbn0)
{
    const Arguments few = words("--block-size 40 --max-blocks 1 --ebn0");
    EXPECT_EQ(column("ebn0_db", few + Arguments{"0:0.5:2"}), (Arguments{"0", "0.5", "1", "1.5", "2"}));
    EXPECT_EQ(column("ebn0_db", few + Arguments{"-1:0.3:0"}), (Arguments{"-1", "-0.7", "-0.4", "-0.1"}));
    EXPECT_EQ(column("ebn0_db", few + Arguments{"3,0:0.001:0.002,-2"}), (Arguments{"-2", "0", "0.001", "0.002", "3"}));
    EXPECT_EQ(column("ebn0_db", few + Arguments{"1:1:1"}), (Arguments{"1"}));
}

TEST_F(Ber, TakesTheScaleAndChoosesItOtherwise)
{
    const Arguments few = words("--block-size 40 --max-blocks 1 --ebn0 1");
    EXPECT_EQ(column("scale", few + words("--scale 3.25")), Arguments{"3.25"});
    const Arguments chosen = column("scale", few + words("--algorithm max-log,scaled,table"));
    ASSERT_EQ(chosen.size(), 3U);
    EXPECT_GT(std::stod(chosen[0]), 0);
    EXPECT_GT(std::stod(chosen[2]), 0);
}

TEST_F(Ber, CountsClippedValues)
{
    const Arguments few = words("--block-size 40 --max-blocks 100 --ebn0 1 --scale 1,1000");
    EXPECT_EQ(column("clipped_values", few)[0], "0");
    EXPECT_GT(std::stoi(column("clipped_values", few)[1]), 100 * 132 * 9 / 10);
}

TEST_F(Ber, DecodesTheSameFramesAtEveryPointOfAKind)
{
    // With a block more iterations only help now and then, but fewer than one are none: the first iteration's failures
    // are those of the same bits and noise.
    const Arguments frames = words("--block-size 40 --ebn0 1 --frames 0:2000");
    const auto eight = csvRows(berFile(frames + words("--iterations 1,8 --num-pu 2,4")));
    ASSERT_EQ(eight.size(), 4U);
    EXPECT_EQ(eight[0].at("clipped_values"), eight[3].at("clipped_values"));
    EXPECT_EQ(eight[0].at("blocks"), "2000");
    EXPECT_LT(std::stoi(eight[1].at("block_errors")), std::stoi(eight[0].at("block_errors")));
    const auto alone = csvRows(berFile(frames + words("--num-pu 4")));
    EXPECT_EQ(alone[0].at("bit_errors"), eight[3].at("bit_errors"));
    EXPECT_EQ(alone[0].at("failed_frames"), eight[3].at("failed_frames"));
}

TEST_F(Ber, SimulatesOtherFramesWithAnotherSeed)
{
    const Arguments frames = words("--block-size 40 --ebn0 1 --frames 0:2000 --seed");
    const CsvRow one = csvRows(berFile(frames + Arguments{"1"}))[0];
    const CsvRow other = csvRows(berFile(frames + Arguments{"18446744073709551615"}))[0];
    EXPECT_EQ(other.at("seed"), "18446744073709551615");
    EXPECT_NE(one.at("failed_frames"), other.at("failed_frames"));
}

TEST_F(Ber, CountsAfterEachIteration)
{
    const Arguments options = words("--block-size 104 --ebn0 0,1 --max-blocks 300");
    const auto rows = csvRows(berFile(options + words("--iterations 3 --each-iteration")));
    ASSERT_EQ(rows.size(), 6U);
    // The same frames, simulated for each number of iterations alone.
    for (CsvRow row : rows) {
        CsvRow alone = csvRows(berFile({"--block-size",
                                        "104",
                                        "--ebn0",
                                        row["ebn0_db"],
                                        "--iterations",
                                        row["iterations"],
                                        "--frames",
                                        row["frames"]}))[0];
        alone["point"] = row["point"];
        EXPECT_EQ(row, alone);
    }
    EXPECT_EQ(rows[0].at("iterations"), "1");
    EXPECT_EQ(rows[1].at("iterations"), "1");
    EXPECT_EQ(rows[5].at("iterations"), "3");
}

// ---- When it ends

TEST_F(Ber, EndsAtTheFrameThatReachesALimit)
{
    const Arguments point = words("--block-size 40 --ebn0 1");
    const CsvRow blockErrors = csvRows(berFile(point + words("--block-errors 10")))[0];
    EXPECT_EQ(blockErrors.at("block_errors"), "10");
    const std::string& failures = blockErrors.at("failed_frames");
    const int lastFailure = std::stoi(failures.substr(failures.rfind(' ') + 1));
    EXPECT_EQ(blockErrors.at("frames"), "0:" + std::to_string(lastFailure + 1));

    const CsvRow bitErrors = csvRows(berFile(point + words("--bit-errors 20")))[0];
    EXPECT_GE(std::stoi(bitErrors.at("bit_errors")), 20);
    const CsvRow before = csvRows(
        berFile(point + Arguments{"--frames", "0:" + std::to_string(std::stoi(bitErrors.at("blocks")) - 1)}))[0];
    EXPECT_LT(std::stoi(before.at("bit_errors")), 20);

    EXPECT_EQ(csvRows(berFile(point + words("--max-blocks 77")))[0].at("blocks"), "77");
}

TEST_F(Ber, SimulatesAllFramesOfARangeUnlessRulesAreGiven)
{
    const Arguments point = words("--block-size 40 --ebn0 0 --frames 500:2000");
    const CsvRow all = csvRows(berFile(point))[0];
    EXPECT_EQ(all.at("frames"), "500:2000");
    EXPECT_GT(std::stoi(all.at("block_errors")), 100);
    const CsvRow limited = csvRows(berFile(point + words("--block-errors 5")))[0];
    EXPECT_EQ(limited.at("block_errors"), "5");
    EXPECT_EQ(limited.at("frames").substr(0, 4), "500:");
    EXPECT_EQ(limited.at("failed_frames").substr(0, 5), all.at("failed_frames").substr(0, 5));
}

TEST_F(Ber, EndsACurveAtTheFloor)
{
    const Arguments sweep = words("--block-size 40 --max-blocks 300 --iterations 1,8 --ebn0 0:1:6");
    const Arguments all = column("ebn0_db", sweep);
    EXPECT_EQ(all.size(), 14U);
    const auto rows = csvRows(berFile(sweep + words("--stop-bler 0.1")));
    EXPECT_LT(rows.size(), 14U);
    std::map<std::string, CsvRow> last;
    for (const CsvRow& row : rows) {
        CsvRow& before = last[row.at("iterations")];
        EXPECT_TRUE(before.empty() || std::stod(before.at("bler")) >= 0.1);
        before = row;
    }
    EXPECT_LT(std::stod(last["1"].at("bler")), 0.1);
    EXPECT_LT(std::stod(last["8"].at("bler")), 0.1);
}

TEST_F(Ber, EndsAPointWhenItsTimeIsUp)
{
    const auto rows = csvRows(berFile(words("--block-size 6144 --ebn0 20 --max-blocks 1000000000 --max-time 0.05s")));
    ASSERT_EQ(rows.size(), 1U);
    EXPECT_GT(std::stoi(rows[0].at("blocks")), 0);
}

TEST_F(Ber, HasDefaultsForAllButTheSize)
{
    ber(words("--block-size 6144 --max-blocks 2 --quiet --output a.json"));
    const auto json = nlohmann::json::parse(morvik.read("a.json"));
    EXPECT_EQ(
        json.at("command"),
        "morvik ber --block-size 6144 --num-pu 2 --algorithm scaled --scale auto --iterations 8 --block-errors 100 "
        "--max-blocks 2 --stop-bler 1e-04 --seed 1");
    ber(words("--block-size 40 --ebn0 0 --bit-errors 1 --quiet --output a.json --overwrite"));
    EXPECT_EQ(
        nlohmann::json::parse(morvik.read("a.json")).at("command"),
        "morvik ber --block-size 40 --num-pu 2 --algorithm scaled --scale auto --iterations 8 --ebn0 0 --bit-errors 1 "
        "--max-blocks 1000000 --stop-bler 0 --seed 1");
}

TEST_F(Ber, HoldsTheCommandThatRepeatsTheRun)
{
    const std::string first =
        berFile(words("--block-size 40,48 --ebn0 -0.5:0.5:0.5 --algorithm 2 --scale auto,9.5 --num-pu 2 --iterations 2 "
                      "--each-iteration --frames 5:105 --bit-errors 200 --max-time 1h --seed 9 --threads 1"),
                "a.json");
    const auto json = nlohmann::json::parse(std::regex_replace(first, std::regex(": T"), ": 0"));
    const Arguments arguments = words(json.at("command"));
    ASSERT_GT(arguments.size(), 2U);
    EXPECT_EQ(berFile(Arguments(arguments.begin() + 2, arguments.end()), "b.json"), first);
}

TEST_F(Ber, HoldsRangesAsRanges)
{
    const auto ebn0Of = [this](const std::string& given) {
        berFile(words("--block-size 40 --max-blocks 1 --ebn0 " + given), "a.json");
        const Arguments command = words(nlohmann::json::parse(morvik.read("a.json")).at("command"));
        const auto option = std::find(command.begin(), command.end(), "--ebn0");
        return option == command.end() ? std::string() : *(option + 1);
    };
    EXPECT_EQ(ebn0Of("0:0.01:1"), "0:0.01:1");
    EXPECT_EQ(ebn0Of("0,0.5,1"), "0:0.5:1");
    EXPECT_EQ(ebn0Of("1,1.5"), "1,1.5");
    EXPECT_EQ(ebn0Of("-1"), "-1");
    EXPECT_EQ(ebn0Of("0:0.2:0.8,3,0.801,0.802"), "0:0.2:0.8,0.801,0.802,3");
    EXPECT_EQ(ebn0Of("-0.3:0.1:0,1:1:3,7"), "-0.3:0.1:0,1:1:3,7");
}

// ---- What it prints

TEST_F(Ber, PrintsATable)
{
    const std::string heads = "point  Eb/N0    blocks failed     BLER     95 % bounds      BER blocks/s   time\n";
    EXPECT_EQ(withoutTimes(ber(smallRun + words("--num-pu 4,8"))),
              "K = 40, 4 units, scaled, scale auto, 8 iterations\n" + heads +
                  "    0      0       200    116 5.80e-01 5.1e-01 6.5e-01 1.28e-01 T\n"
                  "    1      2       200     13 6.50e-02 3.5e-02 1.1e-01 1.18e-02 T\n"
                  "\n"
                  "K = 40, 8 units, scaled, scale auto, 8 iterations\n" +
                  heads +
                  "    2      0       200    116 5.80e-01 5.1e-01 6.5e-01 1.28e-01 T\n"
                  "    3      2       200     13 6.50e-02 3.5e-02 1.1e-01 1.18e-02 T\n");
}

TEST_F(Ber, PrintsARowForEachIteration)
{
    const std::string table = ber(smallRun + words("--iterations 3 --each-iteration"));
    EXPECT_EQ(std::count(table.begin(), table.end(), '\n'), 2 + 6) << table;
    EXPECT_NE(table.find("point iter  Eb/N0"), std::string::npos) << table;
}

TEST_F(Ber, PrintsNoMovingLineToAFile)
{
    const std::string table = ber(words("--block-size 40 --ebn0 20 --max-time 0.5 --max-blocks 1000000000"));
    EXPECT_EQ(table.find_first_of("\r\x1b"), std::string::npos);
    EXPECT_EQ(std::count(table.begin(), table.end(), '\n'), 3);
    EXPECT_NE(table.find(" below "), std::string::npos) << "no error was seen";
}

TEST_F(Ber, MovesALineOnATerminal)
{
    const int terminal = posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_GE(terminal, 0);
    ASSERT_EQ(grantpt(terminal), 0);
    ASSERT_EQ(unlockpt(terminal), 0);
    const int end = open(ptsname(terminal), O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_GE(end, 0);
    const int streams[] = {end, end, end};
    Process process(morvik.program(),
                    {"ber", "--block-size", "40", "--ebn0", "20", "--max-time", "1", "--max-blocks", "1000000000"},
                    morvik.directory(),
                    streams);
    close(end);
    std::string shown;
    char part[4096];
    for (ssize_t length = 0; (length = read(terminal, part, sizeof part)) > 0;) {
        shown.append(part, static_cast<std::size_t>(length));
    }
    close(terminal);
    EXPECT_EQ(process.wait(), 0);
    const auto moves = std::count(shown.begin(), shown.end(), '\r') - std::count(shown.begin(), shown.end(), '\n');
    EXPECT_GE(moves, 3) << shown;
    EXPECT_NE(shown.find("0:01 left"), std::string::npos) << shown;
}

TEST_F(Ber, EndsWhenTheTableCannotBeWritten)
{
    const CommandResult result = morvik.run(Arguments{"ber"} + smallRun, "/dev/null", "/dev/full");
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "morvik ber: <stdout>: cannot be written\n");
}

TEST_F(Ber, ExplainsItsOptions)
{
    const std::string help = ber({"--help"});
    for (const char* option : {"--block-size", "--ebn0", "--resume", "--replay", "--each-iteration", "Exit status"}) {
        EXPECT_NE(help.find(option), std::string::npos) << option;
    }
}

// ---- What it refuses

TEST_F(Ber, RefusesSizesAndNamesTheNearest)
{
    const std::string nearest = "the nearest block sizes of 3GPP TS 36.212 are ";
    expectNotAllowed("--block-size", "500", nearest + "496 and 504");
    expectNotAllowed("--block-size", "40,520", "520", nearest + "512 and 528");
    expectNotAllowed("--block-size", "6143", nearest + "6080 and 6144");
    const std::string all = "expected a block size of 3GPP TS 36.212, 40 to 6144";
    for (const char* size : {"39", "6145", "0", "-40", "forty", "40.0", "99999999999"}) {
        expectNotAllowed("--block-size", size, all);
    }
    expectNotAllowed("--block-size", "40,", "", all);
    expectUsageError({}, "--block-size, --transport-block-size or --mcs is required");
}

TEST_F(Ber, RefusesRanges)
{
    expectNotAllowed("--ebn0", "2:0.5:1", "the range is empty: its stop is below its start");
    expectNotAllowed("--ebn0", "0:0:1", "the step of a range has to be above 0");
    expectNotAllowed("--ebn0", "0:-1:1", "the step of a range has to be above 0");
    expectNotAllowed("--ebn0", "0:1", "a range is START:STEP:STOP");
    expectNotAllowed("--ebn0", "0:1:2:3", "a range is START:STEP:STOP");
    for (const char* text : {"x", "1.2345", "50.001", "-51", "nan", "1e1"}) {
        expectNotAllowed("--ebn0", text, "expected -50 to 50 dB, with at most three decimals, or START:STEP:STOP");
    }
    for (const char* text : {"5", "5:5", "5:4", ":", "-1:5", "a:b"}) {
        expectNotAllowed("--frames", text, "allowed is FROM:TO, two integers, with FROM below TO");
    }
}

TEST_F(Ber, RefusesValues)
{
    expectNotAllowed("--num-pu", "3", "expected 2, 4 or 8");
    expectNotAllowed("--num-pu", "2,", "", "expected 2, 4 or 8");
    expectNotAllowed("--algorithm", "3", "expected 0, 1, 2, max-log, scaled or table");
    for (const char* iterations : {"0", "16"}) {
        expectNotAllowed("--iterations", iterations, "expected an integer from 1 to 15");
    }
    for (const char* scale : {"0", "1000.001", "automatic"}) {
        expectNotAllowed(
            "--scale", scale, "expected auto or a number above 0 and up to 1000, with at most three decimals");
    }
    for (const char* option : {"--block-errors", "--bit-errors", "--max-blocks"}) {
        expectNotAllowed(option, "0", "expected an integer from 1 on");
        expectNotAllowed(option, "1e6", "expected an integer from 1 on");
    }
    for (const char* option : {"--max-time", "--checkpoint-interval"}) {
        for (const char* time : {"0", "-1", "5d", "m", "inf"}) {
            expectNotAllowed(option, time, "expected a number above 0, in seconds or with s, m or h after it");
        }
    }
    expectNotAllowed("--stop-bler", "2", "expected a number from 0 to 1");
    expectNotAllowed("--stop-bler", "nan", "expected a number from 0 to 1");
    expectNotAllowed("--seed", "18446744073709551616", "expected an integer from 0 to 18446744073709551615");
    expectNotAllowed("--threads", "0", "expected an integer from 1 to 1024");
    expectNotAllowed("--replay", "5", "allowed is POINT:FRAME, two integers as in the results");
    expectNotAllowed("--replay", "1:2:3", "allowed is POINT:FRAME, two integers as in the results");
}

TEST_F(Ber, RefusesValuesThatAreGivenTwice)
{
    expectNotAllowed("--ebn0", "1,0:0.5:1", "0:0.5:1", "it has been given before");
    expectNotAllowed("--algorithm", "1,scaled", "scaled", "it has been given before");
    expectNotAllowed("--scale", "8,auto,8.0", "8.0", "it has been given before");
}

TEST_F(Ber, RefusesOptionsThatDoNotGoTogether)
{
    expectUsageError(words("--block-size 40 --quiet"), "--quiet requires --output, --plot or --report");
    expectUsageError(words("--block-size 40 --resume"), "--resume requires --output");
    expectRefused(words("ber --block-size 40 --each-iteration --iterations 4,8"),
                  "morvik ber: --each-iteration counts up to one number of --iterations, give only the largest");
    const CommandResult mmx = morvik.run(words("ber --block-size 40 --instruction-set mmx"));
    EXPECT_EQ(mmx.status, 2);
    EXPECT_TRUE(std::regex_match(mmx.err,
                                 std::regex("morvik ber: --instruction-set: \"mmx\" is not allowed, this machine has "
                                            "([a-z0-9]+, )*generic, component\n")))
        << mmx.err;
}

// ---- One frame more closely

TEST_F(Ber, ReplaysAFrameForDecode)
{
    const Arguments sweep = words(
        "--block-size 40,512 --ebn0 0,0.5 --algorithm max-log,table --num-pu 8 --iterations 2 --max-blocks 300 "
        "--output "
        "runs.csv");
    ber(sweep + Arguments{"--quiet"});
    const std::string results = morvik.read("runs.csv");
    for (const CsvRow& row : csvRows(results)) {
        const std::string frame = words(row.at("failed_frames")).front();
        std::string place = row.at("point");
        place += ':' + frame;
        const std::string replayed = ber(sweep + Arguments{"--replay", place});

        std::smatch lines;
        ASSERT_TRUE(std::regex_match(replayed, lines, std::regex("([0-9]+) wrong bits?\nmorvik (decode .*)\n")))
            << replayed;
        const std::string wrongBits = lines[1];
        EXPECT_NE(wrongBits, "0");
        const CommandResult decoded = morvik.run(words(lines[2]));
        EXPECT_EQ(decoded.status, 1) << decoded.err;
        std::string summary = "1 block of ";
        summary += row.at("block_size") + " bits, " + wrongBits;
        summary += wrongBits == "1" ? " bit error, 1 block error" : " bit errors, 1 block error";
        EXPECT_TRUE(isSummary(decoded.err, summary));
    }
    EXPECT_EQ(morvik.read("runs.csv"), results);
}

TEST_F(Ber, ReplaysTheFrameThatWasCounted)
{
    const Arguments run = words("--block-size 104 --ebn0 0 --algorithm 0 --num-pu 2 --iterations 3");
    const std::string counted = csvRows(berFile(run + words("--frames 3:4")))[0].at("bit_errors");
    EXPECT_EQ(words(ber(run + words("--replay 0:3 --output a.csv"))).front(), counted);
    EXPECT_EQ(morvik.names(), (words("a.point0.frame3.bits a.point0.frame3.csv results.csv")));
}

TEST_F(Ber, ReplaysWithoutAnOutput)
{
    EXPECT_NE(ber(smallRun + words("--replay 1:18446744073709551615")), "");
    EXPECT_EQ(morvik.names(),
              (Arguments{"point1.frame18446744073709551615.bits", "point1.frame18446744073709551615.csv"}));
    expectRefused(Arguments{"ber"} + smallRun + words("--replay 2:0"),
                  "morvik ber: --replay: there is no point 2, the last one is 1");
}

}  // namespace
}  // namespace morvik::support
