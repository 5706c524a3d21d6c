// SoftValues: tests of rounding and clipping.
#include "link/coding/SoftValues.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

namespace {

using morvik::link::softValues;

std::vector<int> rounded(const std::vector<float>& ratios, float scale)
{
    std::vector<std::int8_t> values(ratios.size());
    softValues(ratios.data(), ratios.size(), scale, values.data());
    return {values.begin(), values.end()};
}

}  // namespace

TEST(LinkSoftValuesTest, RoundsHalvesAwayFromZero)
{
    EXPECT_EQ(rounded({0, 0.5F, -0.5F, 1.5F, -1.5F, 2.5F, -2.5F, 0.49999997F, -0.49999997F, 126.5F, -127.5F}, 1),
              (std::vector<int>{0, 1, -1, 2, -2, 3, -3, 0, 0, 127, -128}));
    for (float x = -130; x < 130; x += 1.0F / 64) {
        const auto expected = static_cast<int>(std::round(std::fmin(std::fmax(x, -128.0F), 127.0F)));
        ASSERT_EQ(rounded({x / 4}, 4).front(), expected) << x;
    }
}

TEST(LinkSoftValuesTest, ClipsToTheEnds)
{
    constexpr float infinity = std::numeric_limits<float>::infinity();
    EXPECT_EQ(rounded({200, -200, 3e38F, -3e38F, infinity, -infinity}, 8),
              (std::vector<int>{127, -128, 127, -128, 127, -128}));
    EXPECT_EQ(rounded({std::numeric_limits<float>::quiet_NaN()}, 8), std::vector<int>{-128});
}

TEST(LinkSoftValuesTest, TakesTheWidthOfASoftBuffer)
{
    const std::vector<float> ratios = {-1e9F, -40000, -32.5F, -31.5F, 31.4F, 31.5F, 40000, 1e9F};
    std::vector<std::int16_t> values(ratios.size());
    softValues(ratios.data(), ratios.size(), 1, 6, values.data());
    EXPECT_EQ(values, (std::vector<std::int16_t>{-32, -32, -32, -32, 31, 31, 31, 31}));
    softValues(ratios.data(), ratios.size(), 1, 16, values.data());
    EXPECT_EQ(values, (std::vector<std::int16_t>{-32768, -32768, -33, -32, 31, 32, 32767, 32767}));
}

TEST(LinkSoftValuesTest, ClipsSumsToTheCoresInput)
{
    const std::vector<std::int16_t> sums = {-32768, -129, -128, 0, 127, 128, 32767};
    std::vector<std::int8_t> values(sums.size(), 99);
    softValues(sums.data(), sums.size() - 1, values.data());
    EXPECT_EQ(values, (std::vector<std::int8_t>{-128, -128, -128, 0, 127, 127, 99}));
    softValues(sums.data(), sums.size(), values.data());
    EXPECT_EQ(values, (std::vector<std::int8_t>{-128, -128, -128, 0, 127, 127, 127}));
}
