// SoftValues, Algorithms, Formats, Correction and Starts: the rules at the edges of their ranges.
#include "rules/SoftValues.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "rules/Algorithms.h"
#include "rules/Correction.h"
#include "rules/Formats.h"
#include "rules/Starts.h"

namespace morvik::rules {
namespace {

constexpr std::int32_t stateMask = -16;

TEST(Formats, HaveTheRangesOfTheTable)
{
    EXPECT_EQ(smallestOf(inputBits), -128);
    EXPECT_EQ(largestOf(inputBits), 127);
    EXPECT_EQ(smallestOf(branchBits), -128);
    EXPECT_EQ(smallestOf(stateBits), -2048);
    EXPECT_EQ(largestOf(stateBits), 2047);
    EXPECT_EQ(branchSmallest, -2048);
    EXPECT_EQ(branchLargest, 2032);
    EXPECT_EQ(alignmentOf(inputBits), 8U);
    EXPECT_EQ(stateAlignment, 4U);
}

TEST(Formats, DropBitsBelowAnIntegerRoundingDown)
{
    EXPECT_EQ(integerOf(31, stateAlignment), 1);
    EXPECT_EQ(integerOf(-1, stateAlignment), -1);
    EXPECT_EQ(integerOf(-32768, stateAlignment), -2048);
}

TEST(SoftValues, InputsLoseTheirHighBitsAndAreClipped)
{
    const auto input = [](std::int32_t value) {
        return inputInteger(value, alignmentOf(inputBits), smallestOf(inputBits), largestOf(inputBits));
    };
    EXPECT_EQ(input(127).kept, 127);
    EXPECT_EQ(input(127).excess, 0);
    EXPECT_EQ(input(128).kept, 127);
    EXPECT_EQ(input(128).excess, 1);
    EXPECT_EQ(input(-130).kept, -128);
    EXPECT_EQ(input(-130).excess, -2);
    EXPECT_EQ(input(0x1000005).kept, 5);    // bit 24 is lost
    EXPECT_EQ(input(0x800000).kept, -128);  // bit 23 is the sign
    EXPECT_EQ(input(std::numeric_limits<std::int32_t>::min()).kept, 0);
}

TEST(SoftValues, IntrinsicValuesAreHalvedTwiceTowardZero)
{
    EXPECT_EQ(intrinsicValue(0, 0, stateMask), 0);
    EXPECT_EQ(intrinsicValue(-48, 0, stateMask), -16);  // -24 loses its low bits to -32
    EXPECT_EQ(intrinsicValue(48, 0, stateMask), 8);     // 24 loses them to 16
    EXPECT_EQ(intrinsicValue(-1, -16, stateMask), -8);
    EXPECT_EQ(intrinsicValue(2032, 2032, stateMask), 1520);
    EXPECT_EQ(twiceIntrinsicValue(-2048, -2048, stateMask), -3072);
}

TEST(SoftValues, ExtrinsicValuesAreScaledTruncatedAndClipped)
{
    const auto extrinsic = [](Value ratio, Value intrinsic, double scale) {
        return extrinsicValue(ratio, intrinsic, scale, branchSmallest, branchLargest);
    };
    EXPECT_EQ(extrinsic(100, 10, 1), 60);
    EXPECT_EQ(extrinsic(33, 8, 0.75), 0);
    EXPECT_EQ(extrinsic(-34, 0, 0.75), -25);  // -25.5, toward zero
    EXPECT_EQ(extrinsic(34, 0, 0.75), 25);
    EXPECT_EQ(extrinsic(32767, 0, 1), 2032);
    EXPECT_EQ(extrinsic(-32768, 16000, 1), -2048);
    EXPECT_EQ(extrinsic(32767, -32768, 1e300), 2032);
    EXPECT_EQ(extrinsic(1, 0, std::numeric_limits<double>::quiet_NaN()), -2048);
    EXPECT_EQ(extrinsicMask(1, -16), -1);
    EXPECT_EQ(extrinsicMask(0.75, -16), -16);
}

TEST(Algorithms, ScaleTheExtrinsicValuesOfTypeOne)
{
    EXPECT_EQ(extrinsicScale(0), 1);
    EXPECT_EQ(extrinsicScale(1), 0.75);
    EXPECT_EQ(extrinsicScale(2), 1);
    EXPECT_EQ(extrinsicScale(1), std::ldexp(scaleNumerator, -scaleBits));
}

TEST(SoftValues, RatiosOfZeroOrMoreDecideForOne)
{
    EXPECT_TRUE(decision(0));
    EXPECT_TRUE(decision(32767));
    EXPECT_FALSE(decision(-1));
    EXPECT_FALSE(decision(-32768));
}

TEST(SoftValues, TagsOfWidthsModulo32)
{
    EXPECT_EQ(tagMask(0), 0U);
    EXPECT_EQ(tagMask(1), 1U);
    EXPECT_EQ(tagMask(31), 0x7FFFFFFFU);
    EXPECT_EQ(tagMask(32), 0U);
    EXPECT_EQ(tagMask(40), 0xFFU);
}

/// The table of 16 points as docs/arithmetic.md has it, in eighths.
TEST(Correction, HasTheExampleOfTheDocuments)
{
    const std::uint32_t resolved = resolvedFractionBits(fractionBits, 4);
    EXPECT_EQ(resolved, 1U);
    const auto entry = [&](std::int32_t difference) {
        return correction(difference, fractionBits + stateAlignment - resolved, 16, stateAlignment, 1U << fractionBits);
    };
    for (const auto& [last, expected] : {std::pair(63, 6), {127, 4}, {191, 3}, {255, 2}, {383, 1}, {32767, 0}}) {
        EXPECT_EQ(entry(last), expected) << last;
        EXPECT_EQ(entry(-last - 1), expected) << "-1 reads like 0";
    }
    EXPECT_EQ(entry(64), 4);
    EXPECT_EQ(entry(384), 0);
    EXPECT_EQ(resolvedFractionBits(fractionBits, 3), 0U);
    EXPECT_EQ(resolvedFractionBits(fractionBits, 16), fractionBits);
}

TEST(Starts, FavourStateZeroOrNone)
{
    EXPECT_EQ(knownMetric<Value>(0, -32768), 0);
    EXPECT_EQ(knownMetric<Value>(7, -32768), -16384);
    EXPECT_EQ(unknownMetric, 0);
    EXPECT_EQ(borderMask, -128);
}

}  // namespace
}  // namespace morvik::rules
