// FadingChannel: tests of noise and gains, and that they are those that have been promised.
#include "link/channel/FadingChannel.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <stdexcept>

#include "support/SamplerForms.h"

namespace morvik::link {
namespace {

struct Received {
    std::vector<float> symbols;
    std::vector<float> gains;
};

/// What is received of symbols at 1 (and 0 in the second dimension).
Received received(FadingChannel& channel,
                  unsigned dimensions,
                  std::uint64_t frame,
                  unsigned transmission,
                  std::uint32_t count,
                  std::uint32_t first = 0)
{
    Received all{std::vector<float>(std::size_t{count} * dimensions), std::vector<float>(count, 1)};
    for (std::size_t i = 0; i < count; ++i) {
        all.symbols[i * dimensions] = 1;
    }
    channel.pass(frame, transmission, first, count, all.symbols.data(), all.gains.data());
    return all;
}

std::uint64_t digestOf(const std::vector<float>& values, std::uint64_t digest)
{
    for (const float value : values) {
        std::uint32_t bits;
        std::memcpy(&bits, &value, sizeof bits);
        digest = (digest ^ bits) * 0x100000001B3ULL;
    }
    return digest;
}

class EveryFadingChannel : public testing::TestWithParam<SamplerForm> {};

}  // namespace

TEST(FadingChannelTest, NamesAreThoseOfTheOption)
{
    for (const Fading fading : fadings) {
        EXPECT_EQ(fadingOf(nameOf(fading)), fading);
    }
    EXPECT_EQ(nameOf(Fading::constant), "block-rayleigh");
    EXPECT_EQ(fadingOf("rician"), std::nullopt);
    EXPECT_THROW(FadingChannel(Fading::none, 2, 262144, randomKey(1)), std::invalid_argument);
}

TEST(FadingChannelTest, NoiseHasTheVarianceOfEsN0)
{
    for (const unsigned dimensions : {1U, 2U}) {
        for (const int milliDecibels : {-6000, 0, 13000}) {
            FadingChannel channel(Fading::none, dimensions, milliDecibels, randomKey(5));
            constexpr std::uint32_t count = 1U << 17;
            const Received all = received(channel, dimensions, 3, 0, count);
            double energy = 0;
            for (std::size_t i = 0; i < all.symbols.size(); ++i) {
                const double noise = double{all.symbols[i]} - (i % dimensions == 0 ? 1 : 0);
                energy += noise * noise;
            }
            const double expected = std::pow(10, -milliDecibels / 10000.0) / 2;
            const auto numbers = static_cast<double>(all.symbols.size());
            EXPECT_NEAR(energy / numbers / expected, 1, 4 * std::sqrt(2 / numbers)) << milliDecibels;
            EXPECT_NEAR(channel.noiseVariance(), 2 * expected, 1e-6 * expected);
            EXPECT_EQ(all.gains, std::vector<float>(count, 1));
        }
    }
}

TEST(FadingChannelTest, GainsAreRayleighOfMeanEnergyOne)
{
    constexpr std::uint32_t count = 1U << 17;
    FadingChannel channel(Fading::symbol, 2, 60000, randomKey(5));
    double energy = 0;
    double below = 0;
    const Received all = received(channel, 2, 3, 1, count);
    for (std::size_t i = 0; i < count; ++i) {
        ASSERT_NEAR(all.symbols[2 * i], all.gains[i], 0.01);
        energy += double{all.gains[i]} * all.gains[i];
        below += all.gains[i] < 0.5 ? 1 : 0;
    }
    EXPECT_NEAR(energy / count, 1, 4 / std::sqrt(double{count}));
    EXPECT_NEAR(below / count, 1 - std::exp(-0.25), 4 * std::sqrt(0.25 / count));
}

TEST(FadingChannelTest, ABlockHasOneGain)
{
    FadingChannel channel(Fading::constant, 2, 10000, randomKey(5));
    double energy = 0;
    for (std::uint64_t frame = 0; frame < 4000; ++frame) {
        const std::vector<float> gains = received(channel, 2, frame, 0, 70).gains;
        ASSERT_EQ(gains, std::vector<float>(70, gains[0]));
        energy += double{gains[0]} * gains[0];
    }
    EXPECT_NEAR(energy / 4000, 1, 4 / std::sqrt(4000.0));
    EXPECT_NE(received(channel, 2, 1, 0, 1).gains, received(channel, 2, 1, 1, 1).gains);
}

TEST_P(EveryFadingChannel, IsTheOneThatHasBeenPromisedHoweverItIsCut)
{
    std::uint64_t digest = 0xCBF29CE484222325ULL;  // FNV-1a
    for (const Fading fading : fadings) {
        for (const unsigned dimensions : {1U, 2U}) {
            FadingChannel channel(fading, dimensions, 4321, randomKey(20260101), GetParam());
            const Received all = received(channel, dimensions, 0xFFFFFFFFFF, 2, 5000);
            digest = digestOf(all.gains, digestOf(all.symbols, digest));
            const Received part = received(channel, dimensions, 0xFFFFFFFFFF, 2, 500, 4032);
            EXPECT_EQ(part.gains, std::vector<float>(all.gains.begin() + 4032, all.gains.begin() + 4532));
            EXPECT_TRUE(std::equal(part.symbols.begin(),
                                   part.symbols.end(),
                                   all.symbols.begin() + static_cast<std::ptrdiff_t>(4032 * dimensions)));
        }
    }
    EXPECT_EQ(digest, 0xD21C33AF01B432DFU) << std::hex << digest;
}

INSTANTIATE_TEST_SUITE_P(Forms, EveryFadingChannel, everySamplerForm(), samplerFormName);

}  // namespace morvik::link
