// Arithmetic: tests of the number rules at the edges of their ranges.
#include "rules/Arithmetic.h"

#include <gtest/gtest.h>

#include <limits>

namespace morvik::rules {
namespace {

constexpr std::int32_t least = std::numeric_limits<std::int32_t>::min();
constexpr std::int32_t greatest = std::numeric_limits<std::int32_t>::max();
constexpr Value least16 = -32768;
constexpr Value greatest16 = 32767;

}  // namespace

TEST(Arithmetic, WrapsToSixteenBits)
{
    for (std::int32_t value = -32768; value <= 32767; ++value) {
        ASSERT_EQ(wrap16(value), value);
        ASSERT_EQ(wrap16(value + 65536), value);
        ASSERT_EQ(wrap16(value - 65536), value);
    }
    EXPECT_EQ(wrap16(greatest), -1);
    EXPECT_EQ(wrap16(least), 0);
}

TEST(Arithmetic, ShiftsLeftAndLosesWhatLeavesTheWord)
{
    EXPECT_EQ(shiftLeftWrap(-3, 4), -48);
    EXPECT_EQ(shiftLeftWrap(1, 31), least);
    EXPECT_EQ(shiftLeftWrap(greatest, 1), -2);
    EXPECT_EQ(shiftLeftWrap(least, 1), 0);
}

TEST(Arithmetic, ShiftsRightRoundingDown)
{
    EXPECT_EQ(shiftRight(-1, 4), -1);
    EXPECT_EQ(shiftRight(-17, 4), -2);
    EXPECT_EQ(shiftRight(31, 4), 1);
    EXPECT_EQ(shiftRight(least, 31), -1);
}

TEST(Arithmetic, TakesShiftCountsModulo32)
{
    EXPECT_EQ(shiftLeftWrap(5, 32), 5);
    EXPECT_EQ(shiftLeftWrap(5, 0U - 31U), 10);
    EXPECT_EQ(shiftRight(-5, 33), -3);
}

TEST(Arithmetic, ClipsToTheLimitsAndKeepsThem)
{
    EXPECT_EQ(clip(-2049, -2048, 2032), -2048);
    EXPECT_EQ(clip(-2048, -2048, 2032), -2048);
    EXPECT_EQ(clip(2032, -2048, 2032), 2032);
    EXPECT_EQ(clip(2033, -2048, 2032), 2032);
    EXPECT_EQ(clip(7, 7, 7), 7);
}

TEST(Arithmetic, AddsAndSubtractsModulo65536)
{
    EXPECT_EQ(addWrap(greatest16, 1), least16);
    EXPECT_EQ(addWrap(least16, least16), 0);
    EXPECT_EQ(subWrap(least16, 1), greatest16);
    EXPECT_EQ(subWrap(0, least16), least16);
    EXPECT_EQ(subWrap(-5, 7), -12);
}

TEST(Arithmetic, TakesTheGreaterMetricByTheSignOfTheWrappedDifference)
{
    EXPECT_EQ(maxWrap(3, 5), 5);
    EXPECT_EQ(maxWrap(5, 3), 5);
    EXPECT_EQ(maxWrap(greatest16, least16), least16);  // one step apart across the wrap point
    EXPECT_EQ(maxWrap(least16, greatest16), least16);
    EXPECT_EQ(maxWrap(0, least16), least16);  // half the circle apart: the difference reads as negative
    EXPECT_EQ(maxWrap(least16, 0), 0);
}

TEST(Arithmetic, MasksBitsOfNegativeValuesToo)
{
    EXPECT_EQ(maskBits(-1, -16), -16);
    EXPECT_EQ(maskBits(47, -16), 32);
}

}  // namespace morvik::rules
