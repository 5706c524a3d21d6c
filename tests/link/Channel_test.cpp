// Channel: tests of the noise and of the distribution of what the quantiser makes of it.
#include "link/channel/Channel.h"

#include <gtest/gtest.h>

#include <cmath>
#include <numeric>

namespace morvik::link {
namespace {

constexpr std::uint64_t whole = std::uint64_t{1} << AliasTable::weightBits;

/// The probability that a Gaussian number lies between two limits, by Simpson's rule over its density.
double between(double low, double high)
{
    constexpr int steps = 2000;
    const double width = (high - low) / steps;
    double sum = 0;
    for (int i = 0; i <= steps; ++i) {
        const double x = low + i * width;
        const int factor = i == 0 || i == steps ? 1 : i % 2 == 0 ? 2 : 4;
        sum += factor * std::exp(-x * x / 2);
    }
    return sum * width / 3 / std::sqrt(2 * std::acos(-1.0));
}

double probability(const RoundedDistribution& distribution, int value)
{
    return std::ldexp(static_cast<double>(distribution.weights[static_cast<std::uint8_t>(value)]),
                      -static_cast<int>(AliasTable::weightBits));
}

}  // namespace

TEST(Channel, CountsTheTailInTheEnergyOfABit)
{
    // K = 40: 132 values carry 40 bits. At 0 dB the variance is 132 / (2 * 40).
    EXPECT_NEAR(static_cast<double>(noiseDeviation(40, 0)), std::sqrt(1.65), 1e-15);
    EXPECT_NEAR(static_cast<double>(noiseDeviation(40, 10000)), std::sqrt(0.165), 1e-15);
    EXPECT_NEAR(static_cast<double>(noiseDeviation(40, -10000)), std::sqrt(16.5), 1e-14);
    EXPECT_NEAR(static_cast<double>(noiseDeviation(6144, 0)), std::sqrt(18444.0 / (2 * 6144)), 1e-15);
    EXPECT_NEAR(static_cast<double>(noiseDeviation(6144, 1) / noiseDeviation(6144, 0)), std::pow(10, -0.00005), 1e-15);
}

TEST(Channel, ProbabilitiesSumToOneExactly)
{
    for (const double scale : {1e-6, 0.1, 1.0, 7.3, 8.0, 31.5, 200.0, 1e9}) {
        for (const int milliDecibels : {-20000, -1234, 0, 500, 4000, 20000, 60000}) {
            const RoundedDistribution distribution = roundedDistribution(noiseDeviation(512, milliDecibels), scale);
            const auto& weights = distribution.weights;
            EXPECT_EQ(std::accumulate(weights.begin(), weights.end(), std::uint64_t{0}), whole)
                << scale << ' ' << milliDecibels;
        }
    }
}

TEST(Channel, ProbabilitiesAreThoseOfTheDensity)
{
    for (const double scale : {2.0, 8.0, 40.0}) {
        const double deviation = 0.9;
        const RoundedDistribution distribution = roundedDistribution(0.9, scale);
        const auto border = [&](double r) {
            return (r / scale - 1) / deviation;
        };
        for (int r = -127; r <= 126; ++r) {
            EXPECT_NEAR(probability(distribution, r), between(border(r - 0.5), border(r + 0.5)), 1e-12) << scale << r;
        }
        EXPECT_NEAR(probability(distribution, 127), between(border(126.5), border(126.5) + 12), 1e-9) << scale;
        EXPECT_NEAR(probability(distribution, -128), between(border(-127.5) - 12, border(-127.5)), 1e-9) << scale;
    }
}

TEST(Channel, TheEndsAreDividedUp)
{
    constexpr double scale = 100;
    const double deviation = 0.8;
    const RoundedDistribution distribution = roundedDistribution(0.8, scale);
    const auto border = [&](double r) {
        return (r / scale - 1) / deviation;
    };
    const double top = between(border(126.5), border(126.5) + 12);
    EXPECT_NEAR(
        std::ldexp(static_cast<double>(distribution.top[0]), -32), between(border(126.5), border(127.5)) / top, 1e-8);
    EXPECT_NEAR(
        std::ldexp(static_cast<double>(distribution.top[1]), -32), between(border(126.5), border(128.5)) / top, 1e-8);
    const double bottom = between(border(-127.5) - 12, border(-127.5));
    EXPECT_NEAR(std::ldexp(static_cast<double>(distribution.bottom), -32),
                between(border(-128.5), border(-127.5)) / bottom,
                1e-6);
}

TEST(Channel, EndsThatAreNeverReachedAreNotDivided)
{
    const RoundedDistribution distribution = roundedDistribution(0.001, 8);
    EXPECT_EQ(distribution.weights[8], whole);
    EXPECT_EQ(distribution.top[0], std::uint64_t{1} << 32);
    EXPECT_EQ(distribution.top[1], std::uint64_t{1} << 32);
    EXPECT_EQ(distribution.bottom, std::uint64_t{1} << 32);
}

// The same on every machine, as the frames of a simulation are.
TEST(Channel, WeightsAreThePromisedOnes)
{
    std::uint64_t digest = 0xCBF29CE484222325;  // FNV-1a over words
    for (const unsigned K : {40U, 512U, 6144U}) {
        for (int milliDecibels = -3000; milliDecibels <= 12000; milliDecibels += 500) {
            const Precise deviation = noiseDeviation(K, milliDecibels);
            const auto matching = static_cast<double>(Precise(8) / (deviation * deviation));
            for (const double scale : {8.0, matching}) {
                const RoundedDistribution distribution = roundedDistribution(deviation, scale);
                for (const std::uint64_t weight : distribution.weights) {
                    digest = (digest ^ weight) * 0x100000001B3;
                }
            }
        }
    }
    EXPECT_EQ(digest, 0xFFAAE0F35232AE97U);
}

TEST(Channel, ClipsToEightBits)
{
    for (int rounded = -200; rounded <= 200; ++rounded) {
        const SoftValue soft = SoftValue::of(rounded);
        EXPECT_EQ(soft.value, rounded < -128 ? -128 : rounded > 127 ? 127 : rounded);
        EXPECT_EQ(soft.clipped, soft.value != rounded);
    }
}

}  // namespace morvik::link
