// NoiseSampler: tests of the numbers one by one, of their distribution, and that they are those that have been
// promised.
#include "link/channel/NoiseSampler.h"

#include <gtest/gtest.h>

#include <cmath>
#include <numeric>

#include "support/ChiSquare.h"
#include "support/SamplerForms.h"

namespace morvik::link {
namespace {

const RandomKey key = randomKey(0x123456789ABCDEF);

std::vector<std::int16_t> numbersOf(NoiseSampler& sampler, const FrameRandom& random, std::uint32_t count)
{
    std::vector<std::int16_t> numbers(count);
    sampler.draw(random, 0, count, numbers.data());
    return numbers;
}

/// Number i of a frame by the definition.
int plainNumber(const AliasTable& table, const FrameRandom& random, std::uint32_t i)
{
    const auto byte = [i](const RandomBlock& block, unsigned half) {
        return block[2 * half + i % 8 / 4] >> 8 * (i % 4) & 0xFF;
    };
    const RandomBlock coarse = random.block(random_index::softValues + i / 8);
    const RandomBlock fine = random.block(random_index::fineNoise + i / 8);
    const unsigned entry = byte(coarse, 0);
    const std::uint64_t uniform = std::uint64_t{byte(coarse, 1)} << 32 | random.block(random_index::refinements + i)[0];
    const unsigned steps = uniform < table.threshold(entry) ? entry : table.alias[entry];
    return 256 * static_cast<std::int8_t>(steps) + static_cast<int>(byte(fine, 0) + byte(fine, 1)) - 255;
}

class EveryNoiseSampler : public testing::TestWithParam<SamplerForm> {};

}  // namespace

TEST(NoiseSamplerTest, CoarseNoiseIsADiscreteGaussian)
{
    const AliasTable::Weights weights = coarseNoise();
    EXPECT_EQ(std::accumulate(weights.begin(), weights.end(), std::uint64_t{0}),
              std::uint64_t{1} << AliasTable::weightBits);
    double variance = 0;
    double fourth = 0;
    for (int d = -128; d < 128; ++d) {
        const double probability = std::ldexp(static_cast<double>(weights[static_cast<std::uint8_t>(d)]), -48);
        EXPECT_NEAR(probability, std::exp(-d * d / 648.0) / (18 * std::sqrt(2 * std::acos(-1.0))), 5e-13) << d;
        variance += probability * d * d;
        fourth += probability * d * d * d * d;
    }
    EXPECT_NEAR(variance, 324, 1e-6);
    EXPECT_NEAR(fourth / (324 * 324), 3, 1e-8);
    EXPECT_NEAR(levelDeviation * levelDeviation, 256 * 256 * 324 + (256 * 256 - 1) / 6.0, 1e-5);
}

TEST_P(EveryNoiseSampler, NumbersAreThoseOfTheDefinition)
{
    NoiseSampler sampler(key, GetParam());
    const AliasTable table(coarseNoise());
    const FrameRandom random(key, 3, 0x123456789A);
    const std::vector<std::int16_t> numbers = numbersOf(sampler, random, 9001);
    for (std::uint32_t i = 0; i < numbers.size(); ++i) {
        ASSERT_EQ(numbers[i], plainNumber(table, random, i)) << i;
    }
    for (const std::uint32_t count : {0U, 1U, 7U, 8U, 63U, 65U, 4097U}) {
        EXPECT_EQ(numbersOf(sampler, random, count),
                  std::vector<std::int16_t>(numbers.begin(), numbers.begin() + static_cast<std::ptrdiff_t>(count)));
    }
    std::vector<std::int16_t> part(100);
    sampler.draw(random, 4008, 100, part.data());
    EXPECT_EQ(part, std::vector<std::int16_t>(numbers.begin() + 4008, numbers.begin() + 4108));
}

INSTANTIATE_TEST_SUITE_P(Forms, EveryNoiseSampler, everySamplerForm(), samplerFormName);

TEST(NoiseSamplerTest, NumbersAreGaussian)
{
    constexpr std::uint32_t count = 1U << 21;
    NoiseSampler sampler(key);
    const std::vector<std::int16_t> numbers = numbersOf(sampler, FrameRandom(key, 0, 7), count);
    constexpr int classes = 64;
    constexpr double width = 0.125;  // standard deviations
    std::vector<double> counted(classes);
    std::vector<double> expected(classes);
    const auto below = [](double x) {
        return std::erfc(-x / std::sqrt(2.0)) / 2;
    };
    for (int c = 0; c < classes; ++c) {
        const double from = (c - classes / 2) * width;
        expected[static_cast<std::size_t>(c)] =
            count * ((c + 1 < classes ? below(from + width) : 1) - (c > 0 ? below(from) : 0));
    }
    double sum = 0;
    double squares = 0;
    double fourths = 0;
    for (const std::int16_t number : numbers) {
        const double x = number / levelDeviation;
        sum += x;
        squares += x * x;
        fourths += x * x * x * x;
        const int place = static_cast<int>(std::floor(x / width)) + classes / 2;
        counted[static_cast<std::size_t>(std::clamp(place, 0, classes - 1))] += 1;
    }
    EXPECT_LT(std::abs(chiSquareExcess(counted, expected, false)), 4);
    const double root = std::sqrt(static_cast<double>(count));
    EXPECT_NEAR(sum / count, 0, 4 / root);
    EXPECT_NEAR(squares / count, 1, 4 * std::sqrt(2.0) / root);
    EXPECT_NEAR(fourths / count, 3, 4 * std::sqrt(96.0) / root);
}

TEST(NoiseSamplerTest, FramesPartsAndKeysDiffer)
{
    NoiseSampler sampler(key);
    const std::vector<std::int16_t> numbers = numbersOf(sampler, FrameRandom(key, 0, 1), 64);
    EXPECT_NE(numbersOf(sampler, FrameRandom(key, 1, 1), 64), numbers);
    EXPECT_NE(numbersOf(sampler, FrameRandom(key, 0, 2), 64), numbers);
    EXPECT_NE(numbersOf(sampler, FrameRandom(key, 0, std::uint64_t{1} << 32 | 1), 64), numbers);
    const RandomKey other = derivedKey(key, 1, 2);
    EXPECT_NE(other, derivedKey(key, 2, 1));
    NoiseSampler otherSampler(other);
    EXPECT_NE(numbersOf(otherSampler, FrameRandom(other, 0, 1), 64), numbers);
}

TEST(NoiseSamplerTest, NumbersAreThoseThatHaveBeenPromised)
{
    NoiseSampler sampler(key);
    std::uint64_t digest = 0xCBF29CE484222325ULL;  // FNV-1a
    for (const std::int16_t number : numbersOf(sampler, FrameRandom(key, 5, 99), 100000)) {
        digest = (digest ^ static_cast<std::uint16_t>(number)) * 0x100000001B3ULL;
    }
    EXPECT_EQ(digest, 0x428F6F15F1E0FB41U) << std::hex << digest;
}

}  // namespace morvik::link
