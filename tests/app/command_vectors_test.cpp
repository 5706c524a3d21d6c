// The command morvik vectors: its options, what it prints, and its exit status.
#include <algorithm>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>

#include "base/Checksum.h"
#include "support/CommandTest.h"

namespace morvik::support {
namespace {

class Vectors : public CommandTest {
protected:
    CommandResult vectors(const std::vector<std::string>& arguments) const
    {
        std::vector<std::string> all = {"vectors"};
        all.insert(all.end(), arguments.begin(), arguments.end());
        return morvik.run(all);
    }

    void expectRefused(const std::vector<std::string>& arguments, const std::string& message) const
    {
        const CommandResult result = vectors(arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.out, "");
        EXPECT_EQ(result.err, "morvik vectors: " + message + '\n');
    }

    /// Replaces the last field of a line, counted from 0, and the file's digest in its description.
    void replaceWithChecksum(const std::string& file,
                             const std::string& description,
                             unsigned line,
                             const std::string& value) const
    {
        const std::string before = morvik::base::sha256(morvik.directory() + '/' + file);
        std::istringstream lines(morvik.read(file));
        std::string changed;
        std::string text;
        for (unsigned i = 0; std::getline(lines, text); ++i) {
            changed += (i == line ? text.substr(0, text.rfind(',') + 1) + value : text) + '\n';
        }
        morvik.write(file, changed);
        const std::string place = file.substr(0, file.rfind('/') + 1) + description;
        std::string digests = morvik.read(place);
        digests.replace(digests.find(before), before.size(), morvik::base::sha256(morvik.directory() + '/' + file));
        morvik.write(place, digests);
    }
};

TEST_F(Vectors, MakesASetAndChecksIt)
{
    const CommandResult made = vectors({"--out", "set", "--block-size", "48,40", "--blocks", "2", "--no-directed"});
    EXPECT_EQ(made.status, 0) << made.err;
    const std::string core = "core: 2 units, scaled, 8 iterations\n";
    EXPECT_EQ(made.out,
              core +
                  "set: 4 blocks in memh\nsituations: 86 of 130 met; missing: input.systematic.highest, "
                  "input.systematic.lowest, input.parity.highest, input.parity.lowest and 40 more\n");
    const CommandResult checked = vectors({"--check", "set"});
    EXPECT_EQ(checked.status, 0) << checked.err;
    EXPECT_EQ(checked.out,
              core +
                  "set: 4 blocks in memh, all as the model decodes them: 4 tags, 176 decisions, 0 ratios, 0 internal "
                  "values\n");
    const CommandResult one =
        vectors({"--out", "set", "--block-size", "40", "--blocks", "1", "--no-directed", "--no-situations"});
    EXPECT_EQ(one.out, core + "set: 1 block in memh\n");
}

TEST_F(Vectors, WritesWhatDecodeReads)
{
    vectors({"--out", "set", "--block-size", "40", "--format", "csv", "--num-pu", "8", "--algorithm", "table"});
    const CommandResult decoded = morvik.run({"decode", "set/stimulus.csv", "--num-pu", "8", "--algorithm", "table"});
    EXPECT_EQ(decoded.status, 0) << decoded.err;
    std::string expected;
    const std::string rows = morvik.read("set/expected.csv");
    std::string block = "0";
    for (std::size_t line = rows.find('\n') + 1; line < rows.size(); line = rows.find('\n', line) + 1) {
        const std::size_t comma = rows.find(',', line);
        if (rows.substr(line, comma - line) != block) {
            block = rows.substr(line, comma - line);
            expected += '\n';
        }
        expected += rows[comma + 1];
    }
    EXPECT_EQ(decoded.out, expected + '\n');
}

/// The half-iteration, step and signals of a row of `morvik trace`, behind the number of the block.
std::string withoutPlace(const std::string& row)
{
    std::istringstream fields(row);
    std::string kept;
    std::string field;
    for (unsigned i = 0; std::getline(fields, field, ','); ++i) {
        const bool isPlace = i == 2 || (i >= 4 && i < 8);  // code; segment, window, unit and thread
        kept += isPlace ? "" : ',' + field;
    }
    return kept.substr(1);
}

TEST_F(Vectors, ExpectsInsideWhatTraceShows)
{
    vectors({"--out", "set", "--block-size", "512", "--blocks", "1", "--no-directed", "--format", "csv", "--internal"});
    const CommandResult traced = morvik.run({"trace", "set/stimulus.csv", "--format", "csv"});
    ASSERT_EQ(traced.status, 0) << traced.err;
    std::istringstream internal(morvik.read("set/internal.csv"));
    std::istringstream trace(traced.out);
    unsigned rows = 0;
    std::string step;
    for (std::string row; std::getline(internal, row); ++rows) {
        ASSERT_TRUE(std::getline(trace, step)) << rows;
        ASSERT_EQ(row, withoutPlace(step));
    }
    EXPECT_EQ(rows, 1 + 16 * (512 + 3U));
    EXPECT_FALSE(std::getline(trace, step)) << step;
}

TEST_F(Vectors, NamesTheCommandThatMakesTheSetAgain)
{
    const std::vector<std::string> arguments = {
        "--block-size",  "40",       "--num-pu", "4",       "--algorithm", "max-log",   "--iterations", "3",
        "--tag-width",   "4",        "--blocks", "1",       "--ebn0",      "-0.5",      "--seed",       "9",
        "--no-directed", "--format", "csv,memh", "--width", "16",          "--streams", "separate",     "--soft",
        "--internal"};
    std::vector<std::string> first = {"--out", "first"};
    first.insert(first.end(), arguments.begin(), arguments.end());
    ASSERT_EQ(vectors(first).status, 0);
    std::string expected = "morvik vectors";
    for (const std::string& argument : arguments) {
        expected += ' ' + argument;
    }
    EXPECT_EQ(nlohmann::json::parse(morvik.read("first/manifest.json"))["command"], expected);
}

TEST_F(Vectors, HoldTransportBlocksOfASimulation)
{
    const std::vector<std::string> link = {"--transport-block-size",
                                           "6121",
                                           "--code-rate",
                                           "0.6",
                                           "--modulation",
                                           "16qam",
                                           "--channel",
                                           "rayleigh",
                                           "--esn0",
                                           "12"};
    std::vector<std::string> arguments = {"--out", "set", "--format", "csv", "--blocks", "3", "--no-directed"};
    arguments.insert(arguments.end(), link.begin(), link.end());
    const CommandResult made = vectors(arguments);
    ASSERT_EQ(made.status, 0) << made.err;
    EXPECT_EQ(made.out,
              "core: 2 units, scaled, 8 iterations\nset: 6 blocks in csv\nsituations: 107 of 130 met; missing: "
              "tail.sum.below, tail.natural.0, tail.natural.2, tail.natural.3 and 19 more\n");
    EXPECT_EQ(
        nlohmann::json::parse(morvik.read("set/manifest.json"))["command"],
        "morvik vectors --transport-block-size 6121 --code-rate 0.6 --modulation 16qam --channel rayleigh --num-pu "
        "2 --algorithm scaled --iterations 8 --tag-width 8 --blocks 3 --esn0 12 --seed 1 --no-directed --format "
        "csv --width 8");
    EXPECT_EQ(vectors({"--check", "set"}).out,
              "core: 2 units, scaled, 8 iterations\nset: 6 blocks in csv, all as the model decodes them: 6 tags, 18624 "
              "decisions, 0 ratios, 0 internal values, 6 CRC results\n");
    // The second frame's code blocks are blocks 2 and 3 of the set, 0 and 1 of the file of a replay.
    std::vector<std::string> replay = {"ber", "--replay", "0:1"};
    replay.insert(replay.end(), link.begin(), link.end());
    ASSERT_EQ(morvik.run(replay).status, 0);
    std::istringstream rows(morvik.read("point0.frame1.csv"));
    std::string expected;
    for (std::string row; std::getline(rows, row);) {
        expected += row[0] == 'b' ? "" : std::to_string(std::stoi(row) + 2) + row.substr(1) + '\n';
    }
    EXPECT_NE(morvik.read("set/stimulus.csv").find('\n' + expected + "4,"), std::string::npos);
}

TEST_F(Vectors, TellsADifference)
{
    const CommandResult made =
        vectors({"--out", "set", "--block-size", "40", "--blocks", "1", "--no-directed", "--format", "csv", "--soft"});
    EXPECT_EQ(made.status, 0) << made.err;
    // Another algorithm gives other ratios.
    auto manifest = nlohmann::json::parse(morvik.read("set/manifest.json"));
    manifest["parameters"]["algorithm"] = "max-log";
    morvik.write("set/manifest.json", manifest.dump());
    const CommandResult checked = vectors({"--check", "set"});
    EXPECT_EQ(checked.status, 1) << checked.err;
    const std::string told = "core: 2 units, max-log, 8 iterations\nset: csv, block 0 (random, K = 40): ratio 0 is ";
    EXPECT_EQ(checked.out.rfind(told, 0), 0U) << checked.out;
}

TEST_F(Vectors, MakesCasesForUnits)
{
    const CommandResult made = vectors(
        {"--unit", "forward,border", "--out", "u", "--algorithm", "table", "--cases", "5", "--format", "memh,csv"});
    EXPECT_EQ(made.status, 0) << made.err;
    EXPECT_EQ(
        made.out.rfind("u: for the algorithm table\nforward: 5189 cases in csv,memh: 5184 directed, 5 random\n", 0), 0U)
        << made.out;
    EXPECT_NE(made.out.find("\nborder: 4096 cases in csv,memh, exhaustive\n"), std::string::npos) << made.out;
    const auto description = nlohmann::json::parse(morvik.read("u/forward.json"));
    EXPECT_EQ(description["cases"], 5189);
    EXPECT_EQ(description["exhaustive"], false);
    EXPECT_EQ(description["columns"].size(), 8 + 8 + 4 + 8 + 8U);
    EXPECT_EQ(description["files"].size(), 2U);
    const std::string rows = morvik.read("u/forward.csv");
    EXPECT_EQ(std::count(rows.begin(), rows.end(), '\n'), 5190);
    const CommandResult again =
        vectors({"--unit", "forward", "--out", "again", "--algorithm", "table", "--cases", "5"});
    EXPECT_EQ(again.status, 0) << again.err;
    EXPECT_EQ(morvik.read("again/forward.memh"), morvik.read("u/forward.memh"));
}

TEST_F(Vectors, MakesCasesForUnitsWithoutPendingCorrections)
{
    vectors({"--unit", "address,backward", "--out", "u", "--block-size", "48", "--cases", "0", "--format", "csv"});
    const std::string rows = morvik.read("u/backward.csv");
    EXPECT_EQ(rows.substr(0, rows.find('\n')),
              "block,beta0,beta1,beta2,beta3,beta4,beta5,beta6,beta7,g0,g1,g2,g3,"
              "previous0,previous1,previous2,previous3,previous4,previous5,previous6,previous7");
    const std::string addresses = morvik.read("u/address.csv");
    EXPECT_EQ(addresses.substr(0, 54), "block,block_size,step,address\n0,48,0,0\n0,48,1,19\n0,48,");
}

TEST_F(Vectors, ChecksCasesOfUnits)
{
    vectors({"--unit", "all", "--out", "u", "--cases", "1", "--block-size", "40", "--format", "csv,c,npy"});
    const CommandResult checked = vectors({"--check", "u"});
    EXPECT_EQ(checked.status, 0) << checked.err;
    EXPECT_EQ(std::count(checked.out.begin(), checked.out.end(), '\n'), 9);
    EXPECT_EQ(checked.out.rfind("u: intrinsic: 65536 cases in c,csv,npy, all as the model computes them\n", 0), 0U)
        << checked.out;
    // A set in the same folder is checked, too.
    vectors({"--unit", "tail", "--out", "both", "--cases", "0", "--algorithm", "table"});
    morvik.write("both/manifest.json", "{}");
    EXPECT_EQ(vectors({"--check", "both"}).err, "morvik vectors: both/manifest.json: lacks \"version\"\n");
}

TEST_F(Vectors, FindsWrongCasesOfUnits)
{
    const auto make = [this] {
        vectors({"--unit", "forward", "--out", "u", "--cases", "1", "--algorithm", "table", "--format", "csv"});
    };
    make();
    replaceWithChecksum("u/forward.csv", "forward.json", 4, "7");
    const CommandResult wrong = vectors({"--check", "u"});
    EXPECT_EQ(wrong.status, 1) << wrong.err;
    EXPECT_EQ(wrong.out.rfind("u: forward: 5185 cases in csv: csv, case 3: next_pending7 is ", 0), 0U) << wrong.out;
    EXPECT_NE(wrong.out.find(", forward says 7\n"), std::string::npos) << wrong.out;
    make();
    morvik.write("u/forward.csv", morvik.read("u/forward.csv") + "0\n");
    expectRefused({"--check", "u"},
                  "u/forward.csv: has changed since it was written: its sha256 differs from forward.json");
    make();
    morvik.write("u/forward.memh", "");
    expectRefused({"--check", "u"}, "u/forward.memh: is not a file that forward.json names, and cannot be checked");
}

TEST_F(Vectors, RefusesDescriptionsOfUnitsThatTellOtherCases)
{
    vectors({"--unit", "border", "--out", "u", "--format", "csv"});
    const std::string right = morvik.read("u/border.json");
    const auto expect = [&](const char* name, const nlohmann::json& value, const std::string& message) {
        auto json = nlohmann::json::parse(right);
        json[name] = value;
        morvik.write("u/border.json", json.dump());
        expectRefused({"--check", "u"}, "u/border.json: " + message);
    };
    auto json = nlohmann::json::parse(right);
    json["cases"] = 4095;
    json["directed"] = 4095;
    morvik.write("u/border.json", json.dump());
    expectRefused({"--check", "u"}, "u/border.json: tells 4095 cases, csv has 4096");
    json = nlohmann::json::parse(right);
    json["situations"][0]["count"] = json["situations"][0]["count"].get<unsigned>() + 1;
    auto& places = json["situations"][0]["in_each_state"];
    places[2] = places[2].get<unsigned>() + 1;
    expect("situations", json["situations"], "has another count of \"low bits cleared\" than the cases in csv");
    expect("unit", "tail", "\"unit\" is \"tail\", expected border");
    expect("cases", 4095, "\"cases\" is 4095, expected directed and random ones, or exhaustive directed ones");
    expect("columns", nlohmann::json::array(), "\"columns\" is a list, expected those of the unit");
    expect("files", nlohmann::json::array(), "\"files\" is a list, expected at least one");
    expect("files",
           {{{"name", "../border.csv"}, {"sha256", ""}}},
           "file 0 \"../border.csv\" begins no further format of the unit");
    morvik.write("u/border.json", right.substr(0, 100));
    EXPECT_EQ(vectors({"--check", "u"}).status, 2);
}

TEST_F(Vectors, RefusesWhatUnitsHaveNoUseFor)
{
    const std::string help = "; see 'morvik vectors --help'";
    expectRefused({"--unit", "gamma", "--out", "u"},
                  "--unit: \"gamma\" is not allowed, expected intrinsic, branch, forward, backward, ratio, extrinsic, "
                  "address, tail, border or all" +
                      help);
    expectRefused({"--unit", "branch"}, "--unit requires --out");
    expectRefused({"--unit", "branch", "--out", "u", "--num-pu", "4"},
                  "--num-pu cannot be combined with --unit, as a unit does not depend on it");
    expectRefused({"--unit", "branch", "--out", "u", "--block-size", "40"},
                  "--block-size is for the unit address alone");
    expectRefused({"--out", "u", "--block-size", "40", "--cases", "3"}, "--cases requires --unit" + help);
}

TEST_F(Vectors, RefusesWhatIsNotAllowed)
{
    const std::string help = "; see 'morvik vectors --help'";
    const std::string required =
        "--out and --block-size, --transport-block-size, --mcs, --cover or --unit, or --check, are required; see "
        "'morvik "
        "vectors --help'";
    expectRefused({}, required);
    expectRefused({"--out", "set"}, required);
    expectRefused({"--block-size", "40"}, required);
    expectRefused({"--out", "set", "--check", "set"}, "--out excludes --check" + help);
    expectRefused({"--check", "set", "--num-pu", "8"},
                  "--num-pu cannot be combined with --check, which takes it from the manifest");
    expectRefused({"--check", "set", "--soft"},
                  "--soft cannot be combined with --check, which takes it from the manifest");
    expectRefused(
        {"--out", "set", "--block-size", "41"},
        "--block-size: \"41\" is not allowed, the nearest block sizes of 3GPP TS 36.212 are 40 and 48" + help);
    expectRefused({"--out", "set", "--block-size", "40", "--format", "memh,vhdl"},
                  "--format: \"vhdl\" is not allowed, expected memh, csv, npy or c" + help);
    expectRefused({"--out", "set", "--block-size", "40", "--width", "12"},
                  "--width: \"12\" is not allowed, expected 8 or 16" + help);
    expectRefused({"--out", "set", "--block-size", "40", "--streams", "both"},
                  "--streams: \"both\" is not allowed, expected packed or separate" + help);
    expectRefused({"--out", "set", "--block-size", "40", "--ebn0", "1dB"},
                  "--ebn0: \"1dB\" is not allowed, expected -50 to 50 dB, with at most three decimals" + help);
    expectRefused({"--out", "set", "--block-size", "40", "--seed", "-1"},
                  "--seed: \"-1\" is not allowed, expected an integer from 0 to 18446744073709551615" + help);
    expectRefused({"--out", "set", "--block-size", "40", "--blocks", "0", "--no-directed"},
                  "--blocks 0 and --no-directed together leave no block");
    expectRefused({"--out", "set", "--block-size", "40", "--transport-block-size", "40", "--coded-bits", "120"},
                  "--block-size sends plain code blocks, --transport-block-size transport blocks: only one of them can "
                  "be given");
    expectRefused({"--out", "set", "--block-size", "40", "--esn0", "3"},
                  "--modulation, --channel, --demapper and --esn0 need transport blocks, by --transport-block-size or "
                  "--mcs: plain code blocks are sent over BPSK and Gaussian noise");
    expectRefused({"--out", "set", "--transport-block-size", "40", "--coded-bits", "121"},
                  "--coded-bits 121 is no multiple of the 2 bits of --modulation qpsk, the nearest are 120 and 122");
    expectRefused({"--check", "nowhere"}, "nowhere/manifest.json: cannot be opened: No such file or directory");
}

TEST_F(Vectors, ReportsAFullDisk)
{
    const CommandResult result =
        morvik.run({"vectors", "--out", "set", "--block-size", "40"}, "/dev/null", "/dev/full");
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.err, "morvik vectors: <stdout>: cannot be written: No space left on device\n");
}

}  // namespace
}  // namespace morvik::support
