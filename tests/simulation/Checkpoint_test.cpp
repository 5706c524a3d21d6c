// Checkpoint: it is read as it was written, or known to be damaged.
#include "simulation/Checkpoint.h"

#include <gtest/gtest.h>

#include "support/SyntheticFrames.h"

namespace {

using namespace simulation;

PointResult resultOf(std::size_t number, std::size_t counts)
{
    return {number, support::countOneByOne(support::SyntheticFrames(3), {0, 500}, StopRules(), counts), 1.5};
}

const Checkpoint example = {"1.2.3", "morvik ber", {resultOf(0, 1), resultOf(2, 3)}, resultOf(3, 2)};

void expectSame(const PointResult& got, const PointResult& expected)
{
    EXPECT_EQ(got.number, expected.number);
    EXPECT_EQ(got.seconds, expected.seconds);
    support::expectEqual(got.tally, expected.tally);
}

TEST(Checkpoint, IsReadAsItWasWritten)
{
    const auto checkpoint = parseCheckpoint(checkpointText(example));
    ASSERT_TRUE(checkpoint);
    EXPECT_EQ(checkpoint->version, "1.2.3");
    EXPECT_EQ(checkpoint->command, "morvik ber");
    ASSERT_EQ(checkpoint->ended.size(), 2U);
    expectSame(checkpoint->ended[0], example.ended[0]);
    expectSame(checkpoint->ended[1], example.ended[1]);
    ASSERT_TRUE(checkpoint->running);
    expectSame(*checkpoint->running, *example.running);
}

TEST(Checkpoint, NeedsNoPoints)
{
    const auto checkpoint = parseCheckpoint(checkpointText({"1", "", {}, {}}));
    ASSERT_TRUE(checkpoint);
    EXPECT_TRUE(checkpoint->ended.empty());
    EXPECT_FALSE(checkpoint->running);
}

TEST(Checkpoint, CutAnywhereIsDamaged)
{
    const std::string text = checkpointText(example);
    for (std::size_t length = 0; length < text.size(); ++length) {
        ASSERT_FALSE(parseCheckpoint(text.substr(0, length))) << length;
    }
}

TEST(Checkpoint, WithAnyByteChangedIsDamaged)
{
    const std::string text = checkpointText(example);
    for (std::size_t i = 0; i < text.size(); ++i) {
        std::string damaged = text;
        damaged[i] = static_cast<char>(damaged[i] ^ 1);
        ASSERT_FALSE(parseCheckpoint(damaged)) << i;
    }
}

TEST(Checkpoint, WithMoreBehindIsDamaged)
{
    EXPECT_FALSE(parseCheckpoint(checkpointText(example) + '\n'));
    EXPECT_FALSE(parseCheckpoint("{}"));
}

}  // namespace
