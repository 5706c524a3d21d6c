// Confidence: intervals against published values, against their definition, and against simulated counts.
#include "simulation/Confidence.h"

#include <gtest/gtest.h>

#include <cmath>
#include <random>

namespace morvik::simulation {
namespace {

/// The probability of at most `events` of `trials` that happen with the given rate each.
double atMost(int events, int trials, double rate)
{
    double sum = 0;
    for (int k = 0; k <= events; ++k) {
        const double ways = std::lgamma(trials + 1.0) - std::lgamma(k + 1.0) - std::lgamma(trials - k + 1.0);
        sum += std::exp(ways + k * std::log(rate) + (trials - k) * std::log1p(-rate));
    }
    return sum;
}

void expectBounds(double events, double trials, double low, double high)
{
    const Bounds bounds = clopperPearson(events, trials);
    EXPECT_NEAR(bounds.low, low, 5e-5) << events << " of " << trials;
    EXPECT_NEAR(bounds.high, high, 5e-5) << events << " of " << trials;
}

/// Counts blocks of which some have the given number of wrong bits.
ErrorCounts countsOf(std::uint64_t failed, std::uint32_t wrongBits)
{
    ErrorCounts errors;
    for (std::uint64_t i = 0; i < failed; ++i) {
        errors.add(i, wrongBits);
    }
    return errors;
}

// Values of the tables in C. Clopper and E. S. Pearson, Biometrika 26 (1934), as R's binom.test gives them.
TEST(Confidence, IsThatOfClopperAndPearson)
{
    expectBounds(1, 10, 0.0025, 0.4450);
    expectBounds(5, 10, 0.1871, 0.8129);
    expectBounds(9, 10, 0.5550, 0.9975);
    expectBounds(10, 100, 0.0490, 0.1762);
    expectBounds(50, 100, 0.3983, 0.6017);
}

TEST(Confidence, MissesTheRateInAFortiethOfTheCasesOnEachSide)
{
    for (const int trials : {3, 20, 1000}) {
        for (int events = 1; events < trials; events += 1 + trials / 7) {
            const Bounds bounds = clopperPearson(events, trials);
            EXPECT_NEAR(atMost(events, trials, bounds.high), 0.025, 1e-9) << events << " of " << trials;
            EXPECT_NEAR(1 - atMost(events - 1, trials, bounds.low), 0.025, 1e-9) << events << " of " << trials;
        }
    }
}

TEST(Confidence, IsOneSidedWhereNothingOrEverythingHappened)
{
    const Bounds none = clopperPearson(0, 1000);
    EXPECT_EQ(none.low, 0);
    EXPECT_NEAR(none.high, 1 - std::pow(0.05, 1.0 / 1000), 1e-12);
    const Bounds all = clopperPearson(1000, 1000);
    EXPECT_NEAR(all.low, std::pow(0.05, 1.0 / 1000), 1e-12);
    EXPECT_EQ(all.high, 1);
}

TEST(Confidence, StandsTheNumbersOfLongRuns)
{
    const Bounds rare = clopperPearson(1, 1e15);
    EXPECT_NEAR(rare.low, 0.0253178e-15, 1e-20);
    EXPECT_NEAR(rare.high, 5.57164e-15, 1e-19);
    const Bounds many = clopperPearson(1e10, 1e14);  // as good as normal
    EXPECT_NEAR(many.low, 1e-4 - 1.959964 * 1e-9, 2e-13);
    EXPECT_NEAR(many.high, 1e-4 + 1.959964 * 1e-9, 2e-13);
}

TEST(Confidence, OfBlocksIsThatOfIndependentTrials)
{
    const Bounds bounds = blockErrorBounds(countsOf(10, 3), 100);
    EXPECT_NEAR(bounds.low, 0.0490, 5e-5);
    EXPECT_NEAR(bounds.high, 0.1762, 5e-5);
}

TEST(Confidence, OfBitsIsBelowThatOfBlocksWithoutErrors)
{
    EXPECT_EQ(bitErrorBounds(ErrorCounts(), 500, 40).low, 0);
    EXPECT_EQ(bitErrorBounds(ErrorCounts(), 500, 40).high, blockErrorBounds(ErrorCounts(), 500).high);
}

TEST(Confidence, OfBitsThatFailAlwaysTogetherIsThatOfBlocks)
{
    // Blocks fail as a whole, so that K bits tell no more than one.
    const Bounds bits = bitErrorBounds(countsOf(100, 40), 100000, 40);
    const Bounds blocks = blockErrorBounds(countsOf(100, 40), 100000);
    EXPECT_NEAR(bits.low / blocks.low, 1, 1e-3);
    EXPECT_NEAR(bits.high / blocks.high, 1, 1e-3);
}

TEST(Confidence, OfBitsThatFailOneByOneIsThatOfIndependentBits)
{
    const Bounds bounds = bitErrorBounds(countsOf(100, 1), 100000, 40);
    const Bounds independent = clopperPearson(100, 4e6);
    EXPECT_NEAR(bounds.low / independent.low, 1, 1e-3);
    EXPECT_NEAR(bounds.high / independent.high, 1, 1e-3);
}

TEST(Confidence, OfBitsTakesFewBlocksForWhatTheyAre)
{
    ErrorCounts one;
    one.add(0, 7);
    EXPECT_GT(bitErrorBounds(one, 1, 40).high, 0.9);
    ErrorCounts alike = countsOf(2, 7);
    EXPECT_GT(bitErrorBounds(alike, 2, 40).high, 0.8);
    EXPECT_LE(bitErrorBounds(alike, 2, 40).high, 1);
}

// Bursts of bits: the interval has the rate in it in about 95 % of the runs. One for independent bits has it in
// less than half of them.
TEST(Confidence, OfBitsHasTheRateInIt)
{
    std::mt19937 random(1);
    constexpr unsigned K = 512;
    constexpr std::uint64_t blocks = 400;
    constexpr int runs = 1000;
    const double rate = 0.1 * 20.5 / K;  // a tenth of the blocks fail, with 1 to 40 wrong bits
    int covered = 0;
    for (int run = 0; run < runs; ++run) {
        ErrorCounts errors;
        for (std::uint64_t block = 0; block < blocks; ++block) {
            if (random() % 10 == 0) {
                errors.add(block, static_cast<std::uint32_t>(1 + random() % 40));
            }
        }
        const Bounds bounds = bitErrorBounds(errors, blocks, K);
        covered += bounds.low <= rate && rate <= bounds.high ? 1 : 0;
    }
    EXPECT_GE(covered, runs * 93 / 100);
    EXPECT_LE(covered, runs * 99 / 100);
}

}  // namespace
}  // namespace morvik::simulation
