// The command morvik, run as a user runs it: what it decodes, prints and explains.
#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <regex>

#include "support/CommandTest.h"

namespace morvik::support {
namespace {

std::size_t occurrences(const std::string& text, const std::string& part)
{
    std::size_t count = 0;
    for (std::size_t at = text.find(part); at != std::string::npos; at = text.find(part, at + part.size())) {
        ++count;
    }
    return count;
}

class Command : public CommandTest {
protected:
    /// The trace of the first six half-iterations.
    std::string trace(const std::string& file, const std::vector<std::string>& options) const
    {
        std::vector<std::string> arguments = {"decode", vectors(file), "--trace", "6", "--output", "decided.bits"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        const CommandResult result = morvik.run(arguments);
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(occurrences(result.out, " siso="), 6U);
        return result.out;
    }

    /// Expects that the arguments are refused in one line, which opens so.
    void expectUsageError(const std::vector<std::string>& arguments, const std::string& beginning) const
    {
        const CommandResult result = morvik.run(arguments);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.err.substr(0, beginning.size()), beginning);
        EXPECT_EQ(std::count(result.err.begin(), result.err.end(), '\n'), 1) << result.err;
        EXPECT_EQ(result.out, "");
    }
};

/// The decoder's own line about a value below the range of the soft inputs.
const std::string saturated =
    "WARNING:decoder:RSC1 systematic value in position 3 saturated negatively, further saturation will not be "
    "reported\n";

// ---- Decoding

TEST_F(Command, DecodesTheVectorsWithEveryConfiguration)
{
    const struct {
        std::string name;
        std::string summary;
    } files[] = {{"k40", "8 blocks of 40 bits"},
                 {"k104", "6 blocks of 104 bits"},
                 {"k512", "4 blocks of 512 bits"},
                 {"k1024", "3 blocks of 1024 bits"},
                 {"k2048", "2 blocks of 2048 bits"},
                 {"k6144", "2 blocks of 6144 bits"}};
    for (const auto& [name, summary] : files) {
        const std::string bits = vectors(name + ".bits");
        for (const char* units : {"2", "4", "8"}) {
            for (const char* algorithm : {"max-log", "scaled", "table"}) {
                SCOPED_TRACE(name + ' ' + units + ' ' + algorithm);
                const CommandResult result = morvik.run({"decode",
                                                         vectors(name + ".csv"),
                                                         "--reference",
                                                         bits,
                                                         "--num-pu",
                                                         units,
                                                         "--algorithm",
                                                         algorithm});
                EXPECT_EQ(result.status, 0);
                EXPECT_EQ(result.out, morvik.read(bits));
                EXPECT_TRUE(isSummary(result.err, summary + ", 0 bit errors, 0 block errors"));
            }
        }
    }
}

TEST_F(Command, ReadsStandardInputWithoutAFile)
{
    const CommandResult result = morvik.run({"decode"}, vectors("k40.csv"));
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, morvik.read(vectors("k40.bits")));
    EXPECT_TRUE(isSummary(result.err, "8 blocks of 40 bits"));
}

TEST_F(Command, ReadsStandardInputForADash)
{
    const CommandResult result = morvik.run({"decode", "-"}, vectors("k40.csv"));
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, morvik.read(vectors("k40.bits")));
}

TEST_F(Command, WritesDecisionsToTheOutputFile)
{
    morvik.write("decided.bits", "what an earlier run has left");
    const CommandResult result = morvik.run({"decode", vectors("k104.csv"), "--output", "decided.bits"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(morvik.read("decided.bits"), morvik.read(vectors("k104.bits")));
}

TEST_F(Command, WritesToStandardOutputForADash)
{
    const CommandResult result = morvik.run({"decode", vectors("k104.csv"), "--output", "-"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, morvik.read(vectors("k104.bits")));
}

TEST_F(Command, ReadsAFileThatBearsTheNameOfASubcommand)
{
    morvik.write("decode", twoBlocks());
    const CommandResult result = morvik.run({"decode", "decode"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, zeroDecision + zeroDecision);
}

TEST_F(Command, SummaryTellsTheSmallestAndTheLargestSize)
{
    const CommandResult result =
        decode(header + '\n' + zeroRows("0", 48 + 4) + zeroRows("1", 40 + 4) + zeroRows("2", 64 + 4));
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, std::string(48, '0') + '\n' + zeroDecision + std::string(64, '0') + '\n');
    EXPECT_TRUE(isSummary(result.err, "3 blocks of 40 to 64 bits"));
}

TEST_F(Command, DecodesTheLargestBlock)
{
    const CommandResult result = decode(header + '\n' + zeroRows("0", 6148));
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, std::string(6144, '0') + '\n');
    EXPECT_TRUE(isSummary(result.err, "1 block of 6144 bits"));
}

TEST_F(Command, WritesABlockBeforeTheNextOneHasArrived)
{
    int input[2];
    int output[2];
    ASSERT_EQ(pipe2(input, O_CLOEXEC), 0);
    ASSERT_EQ(pipe2(output, O_CLOEXEC), 0);
    const int silent = open("/dev/null", O_WRONLY | O_CLOEXEC);
    const int streams[] = {input[0], output[1], silent};
    Process process(morvik.program(), {"decode"}, morvik.directory(), streams);
    for (const int stream : streams) {
        close(stream);
    }
    const auto send = [&](const std::string& text) {
        EXPECT_EQ(write(input[1], text.data(), text.size()), static_cast<ssize_t>(text.size()));
    };
    const auto receive = [&]() -> std::string {
        char text[64];
        pollfd readable = {output[0], POLLIN, 0};
        const ssize_t length = poll(&readable, 1, 60000) == 1 ? read(output[0], text, sizeof text) : 0;
        return std::string(text, static_cast<std::size_t>(std::max<ssize_t>(length, 0)));
    };

    send(header + '\n' + zeroRows("0", 44) + zeroRows("1", 1));
    EXPECT_EQ(receive(), zeroDecision);
    send(zeroRows("1", 43));
    close(input[1]);
    EXPECT_EQ(receive(), zeroDecision);
    close(output[0]);
    EXPECT_EQ(process.wait(), 0);
}

// ---- What the decoder prints

TEST_F(Command, KeepsWarningsOutOfTheDecisions)
{
    const CommandResult result = decode(withLine(twoBlocks(), 5, "0,-1000,-64,-64"));
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, zeroDecision + zeroDecision);
    EXPECT_EQ(result.err.substr(0, saturated.size()), saturated);
    EXPECT_TRUE(isSummary(result.err.substr(saturated.size()), "2 blocks of 40 bits"));
}

TEST_F(Command, PrintsWarningsOnStandardOutputWhenTheDecisionsGoToAFile)
{
    const CommandResult result = decode(withLine(twoBlocks(), 5, "0,-1000,-64,-64"), {"--output", "decided.bits"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, saturated);
    EXPECT_TRUE(isSummary(result.err, "2 blocks of 40 bits"));
    EXPECT_EQ(morvik.read("decided.bits"), zeroDecision + zeroDecision);
}

TEST_F(Command, TracesAsManyHalfIterationsAsAskedFor)
{
    const std::string file = vectors("k40.csv");
    EXPECT_EQ(occurrences(morvik.run({"decode", file, "--trace", "0"}).err, " siso="), 0U);
    EXPECT_EQ(occurrences(morvik.run({"decode", file, "--trace", "3"}).err, " siso="), 3U);
    EXPECT_EQ(occurrences(morvik.run({"decode", file, "--trace", "17"}).err, " siso="), 17U) << "two blocks";
}

TEST_F(Command, TraceGoesWhereTheDecisionsDoNot)
{
    const std::string bits = morvik.read(vectors("k40.bits"));
    const CommandResult shown = morvik.run({"decode", vectors("k40.csv"), "--trace", "2"});
    EXPECT_EQ(shown.status, 0);
    EXPECT_EQ(shown.out, bits);

    const CommandResult kept = morvik.run({"decode", vectors("k40.csv"), "--trace", "2", "--output", "decided.bits"});
    EXPECT_EQ(kept.status, 0);
    EXPECT_EQ(morvik.read("decided.bits"), bits);
    EXPECT_TRUE(isSummary(kept.err, "8 blocks of 40 bits"));
    EXPECT_EQ(occurrences(kept.out, " siso="), 2U);
    EXPECT_EQ(shown.err.substr(0, kept.out.size()), kept.out);
    EXPECT_TRUE(isSummary(shown.err.substr(kept.out.size()), "8 blocks of 40 bits"));
}

// ---- Options

TEST_F(Command, RunsAsManyIterationsAsAskedFor)
{
    const std::string file = vectors("k40.csv");
    const auto passesOfOneBlock = [&](const std::vector<std::string>& options) {
        std::vector<std::string> arguments = {"decode", "--trace", "100", "-"};
        arguments.insert(arguments.end(), options.begin(), options.end());
        return occurrences(morvik.run(arguments, "one.csv").err, " siso=");
    };
    morvik.write("one.csv", header + '\n' + zeroRows("0", 44));
    EXPECT_EQ(passesOfOneBlock({}), 16U);
    EXPECT_EQ(passesOfOneBlock({"--iterations", "1"}), 2U);
    EXPECT_EQ(passesOfOneBlock({"--iterations=15"}), 30U);
    EXPECT_EQ(passesOfOneBlock({"--iterations", "010"}), 20U) << "decimal, not octal";
}

TEST_F(Command, AlgorithmsHaveNumbersAndNames)
{
    const std::string maxLog = trace("k104.csv", {"--algorithm", "0"});
    const std::string scaled = trace("k104.csv", {"--algorithm", "1"});
    const std::string table = trace("k104.csv", {"--algorithm", "2"});
    EXPECT_TRUE(maxLog == trace("k104.csv", {"--algorithm", "max-log"}));
    EXPECT_TRUE(scaled == trace("k104.csv", {"--algorithm", "scaled"}));
    EXPECT_TRUE(table == trace("k104.csv", {"--algorithm", "table"}));
    EXPECT_TRUE(maxLog != scaled && maxLog != table && scaled != table);
}

TEST_F(Command, DefaultsAreThoseOfTheCore)
{
    const std::string defaults = trace("k2048.csv", {});
    EXPECT_TRUE(defaults == trace("k2048.csv", {"--num-pu", "2", "--algorithm", "1", "--iterations", "8"}));
    EXPECT_FALSE(defaults == trace("k2048.csv", {"--num-pu", "4"}));
    EXPECT_FALSE(defaults == trace("k2048.csv", {"--num-pu", "8"}));
    EXPECT_FALSE(defaults == trace("k2048.csv", {"--algorithm", "0"}));
}

TEST_F(Command, TagsCountUpWithinTheirWidth)
{
    const auto truncated = [](const std::string& width) {
        return "WARNING:decoder:Input block tag has been truncated to " + width +
               " bits, further truncation will not be reported\n";
    };
    const auto warnings = [&](const std::string& width, const std::string& tag) {
        const CommandResult result =
            decode(twoBlocks() + zeroRows("2", 44), {"--tag-width", width, "--tag", tag, "--output", "decided.bits"});
        EXPECT_EQ(result.status, 0);
        return result.out;
    };
    EXPECT_EQ(warnings("4", "14"), "") << "14, 15, 0";
    EXPECT_EQ(warnings("4", "16"), truncated("4")) << "the user's own tag is too wide";
    EXPECT_EQ(warnings("4", "4294967295"), truncated("4"));
    EXPECT_EQ(warnings("0", "0"), "");
    EXPECT_EQ(warnings("32", "0"), "");
    EXPECT_EQ(warnings("32", "1"), truncated("32"));
}

TEST_F(Command, RefusesOptionValuesThatAreNotAllowed)
{
    const std::string start = "morvik decode: ";
    expectUsageError({"decode", "--num-pu", "3"}, start + "--num-pu: \"3\" is not allowed, expected 2, 4 or 8");
    expectUsageError({"decode", "--algorithm", "best"},
                     start + "--algorithm: \"best\" is not allowed, expected 0, 1, 2, max-log, scaled or table");
    expectUsageError({"decode", "--algorithm", "3"}, start + "--algorithm: \"3\" is not allowed");
    expectUsageError({"decode", "--iterations", "0"},
                     start + "--iterations: \"0\" is not allowed, expected an integer from 1 to 15");
    expectUsageError({"decode", "--iterations", "16"}, start + "--iterations: \"16\" is not allowed");
    expectUsageError({"decode", "--iterations", "8x"}, start + "--iterations: \"8x\" is not allowed");
    expectUsageError({"decode", "--tag-width", "33"},
                     start + "--tag-width: \"33\" is not allowed, expected an integer from 0 to 32");
    expectUsageError({"decode", "--tag-width", "-1"}, start + "--tag-width: \"-1\" is not allowed");
    expectUsageError({"decode", "--tag", "4294967296"},
                     start + "--tag: \"4294967296\" is not allowed, expected an integer from 0 to 4294967295");
    expectUsageError({"decode", "--tag", "-1"}, start + "--tag: \"-1\" is not allowed");
    expectUsageError({"decode", "--trace", "all"},
                     start + "--trace: \"all\" is not allowed, expected an integer from 0 to 4294967295");
}

TEST_F(Command, RefusesArgumentsThatItDoesNotKnow)
{
    expectUsageError({"decode", "--frobnicate"}, "morvik decode: ");
    expectUsageError({"decode", "one.csv", "two.csv"}, "morvik decode: ");
    expectUsageError({"decode", "--output"}, "morvik decode: --output");
    expectUsageError({"modulate"}, "morvik: ");
    expectUsageError({"--frobnicate"}, "morvik: ");
}

// ---- Help

TEST_F(Command, TellsItsVersion)
{
    const CommandResult result = morvik.run({"--version"});
    EXPECT_EQ(result.status, 0);
    EXPECT_TRUE(std::regex_match(result.out, std::regex("morvik [0-9]+\\.[0-9]+\\.[0-9]+\n"))) << result.out;
    EXPECT_EQ(result.err, "");
}

TEST_F(Command, HelpHasAnExample)
{
    const CommandResult result = morvik.run({"--help"});
    EXPECT_EQ(result.status, 0);
    EXPECT_NE(result.out.find("decode "), std::string::npos);
    EXPECT_NE(result.out.find("Example:\n  morvik decode "), std::string::npos);
    EXPECT_EQ(result.err, "");
}

TEST_F(Command, HelpOfDecodeNamesEveryOptionAndHasAnExample)
{
    const CommandResult result = morvik.run({"decode", "--help"});
    EXPECT_EQ(result.status, 0);
    for (const char* option : {"--num-pu",
                               "--algorithm",
                               "--iterations",
                               "--tag-width",
                               "--tag ",
                               "--output",
                               "--reference",
                               "--trace",
                               "max-log",
                               "scaled",
                               "table",
                               "Example:",
                               "  morvik decode k40.csv"}) {
        EXPECT_NE(result.out.find(option), std::string::npos) << option;
    }
    EXPECT_EQ(result.err, "");
}

TEST_F(Command, ShowsHelpWithoutASubcommand)
{
    const CommandResult result = morvik.run({});
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.err, morvik.run({"--help"}).out);
}

}  // namespace
}  // namespace morvik::support
