// Checkpoint: it is read as it was written, or known to be damaged.
#include "simulation/Checkpoint.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <iomanip>
#include <regex>
#include <sstream>
#include <string>

#include "base/Error.h"
#include "support/SyntheticFrames.h"

namespace morvik::simulation {
namespace {

PointResult resultOf(std::size_t number, std::size_t counts)
{
    return {number,
            morvik::support::countOneByOne(morvik::support::SyntheticFrames(3), {0, 500}, StopRules(), counts),
            1.5};
}

const Checkpoint example = {"1.2.3", "morvik ber", {resultOf(0, 1), resultOf(2, 3)}, resultOf(3, 2), {resultOf(4, 1)}};

std::optional<Checkpoint> parsed(const std::string& text)
{
    return parseCheckpoint(text, "a.checkpoint");
}

void expectSame(const PointResult& got, const PointResult& expected)
{
    EXPECT_EQ(got.number, expected.number);
    EXPECT_EQ(got.seconds, expected.seconds);
    morvik::support::expectEqual(got.tally, expected.tally);
}

TEST(Checkpoint, IsReadAsItWasWritten)
{
    const auto checkpoint = parsed(checkpointText(example));
    ASSERT_TRUE(checkpoint);
    EXPECT_EQ(checkpoint->version, "1.2.3");
    EXPECT_EQ(checkpoint->command, "morvik ber");
    ASSERT_EQ(checkpoint->ended.size(), 2U);
    expectSame(checkpoint->ended[0], example.ended[0]);
    expectSame(checkpoint->ended[1], example.ended[1]);
    ASSERT_TRUE(checkpoint->running);
    expectSame(*checkpoint->running, *example.running);
    ASSERT_EQ(checkpoint->begun.size(), 1U);
    expectSame(checkpoint->begun[0], example.begun[0]);
}

TEST(Checkpoint, NeedsNoPoints)
{
    const auto checkpoint = parsed(checkpointText({"1", "", {}, {}, {}}));
    ASSERT_TRUE(checkpoint);
    EXPECT_TRUE(checkpoint->ended.empty());
    EXPECT_FALSE(checkpoint->running);
}

TEST(Checkpoint, CutAnywhereIsDamaged)
{
    const std::string text = checkpointText(example);
    for (std::size_t length = 0; length < text.size(); ++length) {
        ASSERT_FALSE(parsed(text.substr(0, length))) << length;
    }
}

TEST(Checkpoint, WithAnyByteChangedIsDamaged)
{
    const std::string text = checkpointText(example);
    for (std::size_t i = 0; i < text.size(); ++i) {
        std::string damaged = text;
        damaged[i] = static_cast<char>(damaged[i] ^ 1);
        ASSERT_FALSE(parsed(damaged)) << i;
    }
}

TEST(Checkpoint, WithMoreBehindIsDamaged)
{
    EXPECT_FALSE(parsed(checkpointText(example) + '\n'));
    EXPECT_FALSE(parsed("{}"));
}

/// A text with the right checksum, FNV-1a.
std::string signedText(const std::string& body)
{
    std::uint64_t hash = 0xcbf29ce484222325;
    for (const char c : body) {
        hash = (hash ^ static_cast<unsigned char>(c)) * 0x100000001b3;
    }
    std::ostringstream text;
    text << "morvik checkpoint " << std::hex << std::setw(16) << std::setfill('0') << hash << '\n' << body;
    return text.str();
}

std::string refusal(const std::string& body)
{
    try {
        return parsed(signedText(body)) ? "none" : "damaged";
    } catch (const morvik::base::Error& error) {
        return error.what();
    }
}

TEST(Checkpoint, OfBytesThatAreNoUtf8IsWrittenAndRead)
{
    const auto checkpoint = parsed(checkpointText({"1", "morvik \xff ber", {}, {}, {}}));
    ASSERT_TRUE(checkpoint);
    EXPECT_EQ(checkpoint->command, "morvik \xef\xbf\xbd ber");
}

TEST(Checkpoint, IsTakenOnNoTrustThoughItsChecksumIsRight)
{
    const std::string text = checkpointText(example);
    const std::string good = text.substr(text.find('\n') + 1);
    EXPECT_EQ(refusal(good), "none");
    const auto with = [&good](const std::string& part, const std::string& other) {
        return refusal(std::regex_replace(good, std::regex(part), other, std::regex_constants::format_first_only));
    };
    EXPECT_EQ(refusal(std::string(100000, '[')),
              "a.checkpoint:2: character 33 opens more than 32 levels of lists and objects");
    EXPECT_EQ(refusal("{"), "a.checkpoint:2: no JSON, character 2 is not expected there");
    EXPECT_EQ(refusal("{}"), "a.checkpoint: lacks \"version\"");
    EXPECT_NE(refusal(good.substr(0, 2) + "\"version\": \"2\", " + good.substr(2)).find(": \"version\" appears twice"),
              std::string::npos);
    EXPECT_EQ(
        with("\"blocks\": 500", "\"blocks\": 18446744073709551615"),
        "a.checkpoint: begun 1: \"blocks\" is 18446744073709551615, expected an integer from 0 to 281474976710656");
    EXPECT_EQ(with("\"blocks\": 500", "\"blocks\": -1").substr(0, 38), "a.checkpoint: begun 1: \"blocks\" is -1,");
    EXPECT_EQ(with("\"seconds\": 1.5", "\"seconds\": -1.5"),
              "a.checkpoint: begun 1: \"seconds\" is -1.5, which is no time of a run");
    EXPECT_EQ(with("\"seconds\": 1.5", "\"seconds\": 1e300").substr(0, 37), "a.checkpoint: begun 1: \"seconds\" is 1");
    EXPECT_EQ(with("\"bit_errors\": [0-9]+", "\"bit_errors\": 1.5").substr(0, 50),
              "a.checkpoint: begun 1: errors: \"bit_errors\" is 1.5");
    EXPECT_EQ(with("\"errors\": \\[", "\"errors\": 1, \"other\": ["),
              "a.checkpoint: begun 1: \"errors\" is 1, expected a list");
    EXPECT_EQ(with("\"failures\": \\[", "\"failures\": [0, "),
              "a.checkpoint: begun 1: errors: \"failures\" is a list, expected at most 10 frame numbers");
}

}  // namespace
}  // namespace morvik::simulation
