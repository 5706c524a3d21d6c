// RatioScale: tests of the default scale of log-likelihood ratios.
#include "link/RatioScale.h"

#include <gtest/gtest.h>

namespace morvik::link {
namespace {

}  // namespace

TEST(RatioScaleTest, FallsWithRateAndLevels)
{
    for (const Modulation modulation : modulations) {
        EXPECT_EQ(ratioScale(1, modulation, 0.01), ratioScale(1, modulation, 1.0 / 3)) << "repetition changes nothing";
        EXPECT_EQ(ratioScale(1, modulation, 0.9), ratioScale(1, modulation, 1.5));
        EXPECT_EQ(ratioScale(0, modulation, 0.7), ratioScale(1, modulation, 0.7));
        EXPECT_EQ(ratioScale(2, modulation, 0.7), 4.5) << "the correction table is right for one unit";
        EXPECT_LT(ratioScale(1, modulation, 0.75), ratioScale(1, modulation, 0.2));
    }
    EXPECT_GT(ratioScale(1, Modulation::qpsk, 0.5), ratioScale(1, Modulation::qam16, 0.5));
    EXPECT_GT(ratioScale(1, Modulation::qam16, 0.5), ratioScale(1, Modulation::qam64, 0.5));
    EXPECT_GT(ratioScale(1, Modulation::qam64, 0.5), ratioScale(1, Modulation::qam256, 0.5));
}

TEST(RatioScaleTest, IsAStraightLineBetweenMeasuredRates)
{
    EXPECT_DOUBLE_EQ(ratioScale(1, Modulation::qam16, 0.5), 4.3);
    EXPECT_DOUBLE_EQ(ratioScale(1, Modulation::qam16, 0.8), 2.7);
    EXPECT_NEAR(ratioScale(1, Modulation::qam16, 0.85), (2.7 + 2.4) / 2, 1e-12);
    EXPECT_NEAR(ratioScale(1, Modulation::qam16, 0.49999), 4.3, 1e-3);
}

}  // namespace morvik::link
