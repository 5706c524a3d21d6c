// Decibels: tests of ratios against the mathematical library, and of their inverse.
#include "link/channel/Decibels.h"

#include <gtest/gtest.h>

#include <cmath>

namespace morvik::link {
namespace {

}  // namespace

TEST(DecibelsTest, RatiosArePowersOfTen)
{
    for (int milliDecibels = -mostMilliDecibels; milliDecibels <= mostMilliDecibels; milliDecibels += 37) {
        const double exact = static_cast<double>(std::pow(10.0L, milliDecibels / 10000.0L));
        ASSERT_NEAR(ratioOf(milliDecibels) / exact, 1, 1e-15) << milliDecibels;
    }
    EXPECT_EQ(ratioOf(0), 1);
    EXPECT_EQ(ratioOf(30000), 1000);
    EXPECT_EQ(ratioOf(-20000), 0.01);
    EXPECT_DOUBLE_EQ(ratioOf(3010), 1.9998618696327441);
}

TEST(DecibelsTest, DecibelsOfRatiosAreRounded)
{
    for (int milliDecibels = -mostMilliDecibels; milliDecibels <= mostMilliDecibels; milliDecibels += 7919) {
        const double ratio = ratioOf(milliDecibels);
        ASSERT_EQ(milliDecibelsOf(ratio), milliDecibels);
        ASSERT_EQ(milliDecibelsOf(ratio * 1.0001), milliDecibels);
        ASSERT_EQ(milliDecibelsOf(ratio * 1.00012), milliDecibels + 1);
        ASSERT_EQ(milliDecibelsOf(ratio / 1.0001), milliDecibels);
        ASSERT_EQ(milliDecibelsOf(ratio / 1.00012), milliDecibels - 1);
    }
    EXPECT_EQ(milliDecibelsOf(2), 3010);
    EXPECT_EQ(milliDecibelsOf(0.5), -3010);
}

}  // namespace morvik::link
