// StopRules: when a point has been simulated for long enough.
#include "simulation/StopRules.h"

#include <gtest/gtest.h>

namespace morvik::simulation {
namespace {

ErrorCounts countsOf(std::uint64_t bitErrors, std::uint64_t blockErrors)
{
    ErrorCounts errors;
    errors.bitErrors = bitErrors;
    errors.blockErrors = blockErrors;
    return errors;
}

TEST(StopRules, WithoutLimitsNeverEnd)
{
    EXPECT_FALSE(isReached(StopRules(), UINT64_MAX, countsOf(UINT64_MAX, UINT64_MAX)));
    EXPECT_EQ(progressOf(StopRules(), 1000, countsOf(10, 10), 100), 0);
}

TEST(StopRules, EachEndsAtItsLimit)
{
    StopRules blocks;
    blocks.maxBlocks = 10;
    EXPECT_FALSE(isReached(blocks, 9, countsOf(99, 9)));
    EXPECT_TRUE(isReached(blocks, 10, countsOf(0, 0)));
    StopRules blockErrors;
    blockErrors.blockErrors = 10;
    EXPECT_FALSE(isReached(blockErrors, 99, countsOf(99, 9)));
    EXPECT_TRUE(isReached(blockErrors, 99, countsOf(99, 10)));
    StopRules bitErrors;
    bitErrors.bitErrors = 10;
    EXPECT_FALSE(isReached(bitErrors, 99, countsOf(9, 9)));
    EXPECT_TRUE(isReached(bitErrors, 99, countsOf(11, 1)));
}

TEST(StopRules, TheNearestLimitTellsTheProgress)
{
    StopRules rules;
    rules.maxBlocks = 1000;
    rules.blockErrors = 100;
    rules.bitErrors = 1000;
    rules.maxSeconds = 10;
    EXPECT_DOUBLE_EQ(progressOf(rules, 100, countsOf(50, 5), 2), 0.2);
    EXPECT_DOUBLE_EQ(progressOf(rules, 100, countsOf(50, 30), 2), 0.3);
    EXPECT_DOUBLE_EQ(progressOf(rules, 100, countsOf(400, 30), 2), 0.4);
    EXPECT_DOUBLE_EQ(progressOf(rules, 500, countsOf(400, 30), 2), 0.5);
    EXPECT_DOUBLE_EQ(progressOf(rules, 500, countsOf(400, 30), 20), 1);
}

}  // namespace
}  // namespace morvik::simulation
