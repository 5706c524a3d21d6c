// SoftValueSampler: tests of the drawn values, one by one and as a whole.
#include "link/channel/SoftValueSampler.h"

#include <gtest/gtest.h>

#include <random>
#include <string>

#include "support/ChiSquare.h"
#include "support/SamplerForms.h"

namespace morvik::link {
namespace {

constexpr unsigned K = 512;
constexpr int milliDecibels = 1000;

RoundedDistribution distributionAt(double scale)
{
    return roundedDistribution(noiseDeviation(K, milliDecibels), scale);
}

std::vector<std::uint64_t> randomBits(std::uint64_t seed, unsigned count)
{
    std::mt19937_64 random(seed);
    std::vector<std::uint64_t> words((count + 63) / 64);
    for (std::uint64_t& word : words) {
        word = random();
    }
    return words;
}

/// Value `number` of a frame by the definition: 40 random bits against the threshold, then what the ends take.
SoftValue plainValue(const RoundedDistribution& distribution,
                     const AliasTable& table,
                     const FrameRandom& random,
                     std::uint32_t number,
                     bool bit)
{
    const RandomBlock block = random.block(random_index::softValues + number / 8);
    const RandomBlock refinement = random.block(random_index::refinements + number);
    const auto byte = [&block](unsigned i) {
        return block[i / 4] >> 8 * (i % 4) & 0xFF;
    };
    const unsigned entry = byte(number % 8);
    const std::uint64_t uniform = std::uint64_t{byte(8 + number % 8)} << 32 | refinement[0];
    const unsigned symbol = uniform < table.threshold(entry) ? entry : table.alias[entry];
    int rounded = static_cast<int>(symbol) - (symbol < 128 ? 0 : 256);
    if (rounded == 127) {
        rounded += (refinement[1] >= distribution.top[0] ? 1 : 0) + (refinement[1] >= distribution.top[1] ? 1 : 0);
    } else if (rounded == -128) {
        rounded -= refinement[1] >= distribution.bottom ? 1 : 0;
    }
    return SoftValue::of(bit ? rounded : -rounded);
}

class EverySampler : public testing::TestWithParam<SamplerForm> {};

/// Soft values of all ones or all zeros, and how many were clipped.
struct Histogram {
    std::vector<double> counts = std::vector<double>(256);  ///< of -128 to 127
    double clipped = 0;
    double all = 0;
};

Histogram histogram(const SamplerForm& form, double scale, bool bit)
{
    constexpr unsigned count = 6400;
    SoftValueSampler sampler(distributionAt(scale), randomKey(7), form);
    const std::vector<std::uint64_t> bits(count / 64, bit ? ~std::uint64_t{0} : 0);
    std::vector<std::int8_t> values(count);
    Histogram made;
    for (std::uint64_t frame = 0; frame < 500; ++frame) {
        std::uint32_t clipped = 0;
        sampler.put({randomKey(7), K, milliDecibels, frame}, 0, bits.data(), count, values.data(), clipped);
        sampler.draw();
        for (const std::int8_t value : values) {
            made.counts[static_cast<std::size_t>(value + 128)] += 1;
        }
        made.clipped += clipped;
        made.all += count;
    }
    return made;
}

/// The probability that the rounded value of a 1 is `low` to `high`.
double probability(double scale, double low, double high)
{
    const auto deviation = static_cast<double>(noiseDeviation(K, milliDecibels));
    const auto below = [=](double r) {
        return std::erfc(-(r / scale - 1) / deviation / std::sqrt(2.0)) / 2;
    };
    return below(high + 0.5) - below(low - 0.5);
}

constexpr double infinity = 1e9;

}  // namespace

TEST_P(EverySampler, DrawsEachValueAsThe40BitsOfItsNumberSay)
{
    // Numbers begin anywhere, and neighbours in memory stay as they are.
    for (const double scale : {0.5, 8.0, 60.0, 300.0}) {
        const RoundedDistribution distribution = distributionAt(scale);
        const AliasTable table(distribution.weights);
        SoftValueSampler sampler(distribution, randomKey(3), GetParam());
        for (const unsigned count : {1U, 44U, 64U, 65U, 6148U}) {
            const std::vector<std::uint64_t> bits = randomBits(count, count);
            constexpr std::uint32_t number = 8192;
            const FrameRandom random(randomKey(3), K, milliDecibels, 12345678901);
            std::vector<std::int8_t> values(count + 64, 99);
            std::uint32_t clipped = 1000;
            sampler.put(random, number, bits.data(), count, values.data(), clipped);
            EXPECT_EQ(sampler.size(), (count + 63) / 64);
            sampler.draw();
            EXPECT_EQ(sampler.size(), 0U);
            std::uint32_t expectedClipped = 1000;
            for (unsigned i = 0; i < count; ++i) {
                const bool bit = (bits[i / 64] >> i % 64 & 1) != 0;
                const SoftValue plain = plainValue(distribution, table, random, number + i, bit);
                ASSERT_EQ(values[i], plain.value) << scale << ' ' << count << ' ' << i;
                expectedClipped += plain.clipped ? 1 : 0;
            }
            EXPECT_EQ(clipped, expectedClipped) << scale << ' ' << count;
            EXPECT_EQ(std::vector<std::int8_t>(&values[count], &values[count] + 64), std::vector<std::int8_t>(64, 99));
        }
    }
}

TEST_P(EverySampler, DrawsSeveralFramesTogether)
{
    const auto draw = [](unsigned together) {
        SoftValueSampler sampler(distributionAt(60), randomKey(4), GetParam());
        const std::vector<std::uint64_t> bits = randomBits(1, 300);
        std::vector<std::int8_t> values(1800);
        std::vector<std::uint32_t> clipped(6);
        for (std::size_t frame = 0; frame < 6; ++frame) {
            sampler.put(
                {randomKey(4), K, milliDecibels, frame}, 0, bits.data(), 300, &values[frame * 300], clipped[frame]);
            if (frame % together == together - 1) {
                sampler.draw();
            }
        }
        values.insert(values.end(), clipped.begin(), clipped.end());
        return values;
    };
    const std::vector<std::int8_t> alone = draw(1);
    EXPECT_GT(alone.back(), 10) << "some were clipped";
    EXPECT_EQ(draw(2), alone);
    EXPECT_EQ(draw(6), alone);
}

INSTANTIATE_TEST_SUITE_P(Forms, EverySampler, everySamplerForm(), samplerFormName);

TEST(SoftValueSampler, ValuesHaveTheirProbabilities)
{
    for (const double scale : {3.0, 8.0, 40.0, 127.0}) {
        for (const bool bit : {true, false}) {
            const Histogram drawn = histogram(samplerForms().front(), scale, bit);
            std::vector<double> expected;
            for (int value = -128; value <= 127; ++value) {
                const double r = bit ? value : -value;
                const double low = value == (bit ? -128 : 127) ? -infinity : r;
                const double high = value == (bit ? 127 : -128) ? infinity : r;
                expected.push_back(drawn.all * probability(scale, low, high));
            }
            EXPECT_LT(std::abs(chiSquareExcess(drawn.counts, expected, false)), 4) << scale << ' ' << bit;
        }
    }
}

TEST(SoftValueSampler, CountsClippedValues)
{
    for (const double scale : {8.0, 40.0, 127.0, 1000.0}) {
        for (const bool bit : {true, false}) {
            const Histogram drawn = histogram(samplerForms().front(), scale, bit);
            const double limit = bit ? 128 : 129;  // a 0 is negated: 128 becomes -128, which is within
            const double share = probability(scale, limit, infinity) + probability(scale, -infinity, limit - 257);
            const double deviation = std::sqrt(drawn.all * share * (1 - share));
            EXPECT_NEAR(drawn.clipped, drawn.all * share, 4 * deviation) << scale << ' ' << bit;
        }
    }
}

}  // namespace morvik::link
