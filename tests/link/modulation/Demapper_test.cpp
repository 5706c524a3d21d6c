// Demapper: tests against sums over all points in long double, at all modulations, gains and noise variances.
#include "link/modulation/Demapper.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <limits>
#include <vector>

#include "link/modulation/Mapper.h"
#include "support/Blocks.h"

namespace {

using morvik::link::Demapper;
using morvik::link::Modulation;

/// The ratio of one bit of a received symbol, from the distances to all points.
long double plainRatio(
    Modulation modulation, Demapper demapper, const float* received, float gain, float N0, unsigned bit)
{
    std::array<std::vector<long double>, 2> exponents;
    for (std::uint64_t row = 0; row < 1U << bitsPerSymbol(modulation); ++row) {
        std::array<float, 2> point{};
        morvik::link::mapSymbols(modulation, &row, 1, point.data());
        long double distance = 0;
        for (unsigned d = 0; d < dimensions(modulation); ++d) {
            distance += std::pow(received[d] - static_cast<long double>(gain) * point[d], 2.0L);
        }
        exponents[row >> bit & 1].push_back(-distance / N0);
    }
    std::array<long double, 2> logarithms{};
    for (unsigned value = 0; value < 2; ++value) {
        const long double most = *std::max_element(exponents[value].begin(), exponents[value].end());
        long double sum = 0;
        for (const long double exponent : exponents[value]) {
            sum += std::exp(exponent - most);
        }
        logarithms[value] = most + (demapper == Demapper::exact ? std::log(sum) : 0);
    }
    return logarithms[1] - logarithms[0];
}

struct Received {
    std::vector<float> symbols;
    std::vector<float> gains;
};

/// Points of all kinds: in the middle of the plane, at its ends, far outside, at gain 0.
Received randomSymbols(morvik::blocks::Random& random, Modulation modulation, unsigned count)
{
    Received received;
    for (unsigned n = 0; n < count; ++n) {
        received.gains.push_back(n % 10 == 0 ? 0 : static_cast<float>(morvik::blocks::between(random, 1, 300)) / 128);
        for (unsigned d = 0; d < dimensions(modulation); ++d) {
            const int most = n % 3 == 0 ? 512 : 160;
            received.symbols.push_back(static_cast<float>(morvik::blocks::between(random, -most, most)) / 128);
        }
    }
    return received;
}

}  // namespace

TEST(DemapperTest, AgreesWithSumsOverAllPoints)
{
    morvik::blocks::Random random(1);
    constexpr unsigned count = 60;
    for (const Modulation modulation : morvik::link::modulations) {
        const unsigned bits = bitsPerSymbol(modulation);
        for (const float N0 : {8.0F, 1.0F, 0.1F, 0.003F}) {
            const Received received = randomSymbols(random, modulation, count);
            for (const Demapper demapper : morvik::link::demappers) {
                std::vector<float> ratios(count * bits);
                demapSymbols(
                    modulation, demapper, received.symbols.data(), received.gains.data(), N0, count, ratios.data());
                for (unsigned i = 0; i < count * bits; ++i) {
                    const unsigned n = i / bits;
                    const float* const symbol = &received.symbols[n * dimensions(modulation)];
                    const long double plain = plainRatio(modulation, demapper, symbol, received.gains[n], N0, i % bits);
                    // Floats are rounded where the largest exponents are added.
                    const long double reach =
                        std::fmax(std::fabs(symbol[0]), std::fabs(symbol[dimensions(modulation) - 1])) +
                        received.gains[n];
                    ASSERT_LE(std::fabs(ratios[i] - plain), 1e-6L * (1 + reach * reach / N0))
                        << nameOf(modulation) << ' ' << nameOf(demapper) << ' ' << N0 << ' ' << i;
                }
            }
        }
    }
}

TEST(DemapperTest, WithoutGainsAllAreOne)
{
    morvik::blocks::Random random(2);
    for (const Modulation modulation : morvik::link::modulations) {
        const Received received = randomSymbols(random, modulation, 50);
        const std::vector<float> ones(50, 1.0F);
        std::vector<float> far = received.symbols;
        far.back() = -3e38F;
        for (const Demapper demapper : morvik::link::demappers) {
            std::vector<float> with(std::size_t{50} * bitsPerSymbol(modulation));
            std::vector<float> without(with.size());
            demapSymbols(modulation, demapper, received.symbols.data(), ones.data(), 0.5F, 50, with.data());
            demapSymbols(modulation, demapper, received.symbols.data(), nullptr, 0.5F, 50, without.data());
            EXPECT_EQ(with, without);
            for (const std::vector<float>& symbols : {received.symbols, far}) {
                demapAnySymbols(modulation, demapper, symbols.data(), ones.data(), 0.5F, 50, with.data());
                demapAnySymbols(modulation, demapper, symbols.data(), nullptr, 0.5F, 50, without.data());
                EXPECT_EQ(with, without);
            }
        }
    }
}

TEST(DemapperTest, FindsTheSentBits)
{
    for (const Modulation modulation : morvik::link::modulations) {
        const unsigned bits = bitsPerSymbol(modulation);
        for (std::uint64_t row = 0; row < 1U << bits; ++row) {
            std::array<float, 2> symbol{};
            morvik::link::mapSymbols(modulation, &row, 1, symbol.data());
            for (const Demapper demapper : morvik::link::demappers) {
                std::array<float, 8> ratios{};
                demapSymbols(modulation, demapper, symbol.data(), nullptr, 0.01F, 1, ratios.data());
                for (unsigned i = 0; i < bits; ++i) {
                    EXPECT_EQ(ratios[i] > 0, (row >> i & 1) != 0) << nameOf(modulation) << ' ' << row << ' ' << i;
                }
            }
        }
    }
}

TEST(DemapperTest, GivesTheSameBitsOnEveryMachine)
{
    morvik::blocks::Random random(3);
    std::uint64_t digest = 0xCBF29CE484222325;  // FNV-1a of all ratios' bits
    for (const Modulation modulation : morvik::link::modulations) {
        const Received received = randomSymbols(random, modulation, 500);
        for (const Demapper demapper : morvik::link::demappers) {
            std::vector<float> ratios(std::size_t{500} * bitsPerSymbol(modulation));
            demapSymbols(
                modulation, demapper, received.symbols.data(), received.gains.data(), 0.07F, 500, ratios.data());
            for (const float ratio : ratios) {
                std::uint32_t bits;
                std::memcpy(&bits, &ratio, sizeof bits);
                digest = (digest ^ bits) * 0x100000001B3;
            }
        }
    }
    EXPECT_EQ(digest, 879404587039299059U);
}

TEST(DemapperTest, KeepsRatiosInTheRangeOfAFloat)
{
    constexpr float most = std::numeric_limits<float>::max();
    constexpr float least = std::numeric_limits<float>::denorm_min();
    const std::vector<float> numbers = {0, least, -1e-20F, 0.3F, -1, 1e15F, -1e19F, 1e30F, -most};
    for (const Modulation modulation : morvik::link::modulations) {
        const unsigned bits = bitsPerSymbol(modulation);
        for (const float number : numbers) {
            for (const float gain : {0.0F, 1e-38F, 1.0F, 1e10F, 1e19F, 1e25F, most}) {
                for (const float N0 : {least, 1e-38F, 1e-20F, 1.0F, 1e30F, most}) {
                    const std::array<float, 4> symbols = {number, -number / 3, 0.1F, 0.2F};
                    const std::array<float, 2> gains = {gain, 1};
                    for (const Demapper demapper : morvik::link::demappers) {
                        std::array<float, 16> ratios{};
                        demapAnySymbols(modulation, demapper, symbols.data(), gains.data(), N0, 2, ratios.data());
                        for (unsigned i = 0; i < bits; ++i) {
                            ASSERT_TRUE(std::isfinite(ratios[i])) << number << ' ' << gain << ' ' << N0;
                            const long double plain =
                                plainRatio(modulation, Demapper::maxLog, symbols.data(), gain, N0, i);
                            const long double clipped = std::fmin(std::fmax(plain, -1.0L * most), 1.0L * most);
                            const long double reach = std::fmax(std::fabs(number), gain);
                            const long double largest = reach * reach / N0;
                            // Sums are rounded as floats where these hold them, otherwise as doubles.
                            ASSERT_LE(std::fabs(ratios[i] - clipped),
                                      4 + 1e-6L * (std::fabs(clipped) + std::fmin(largest, 1e35L)) + 1e-14L * largest)
                                << nameOf(modulation) << ' ' << number << ' ' << gain << ' ' << N0 << ' ' << i;
                        }
                    }
                }
            }
        }
    }
}

TEST(DemapperTest, OneSymbolOutOfRangeLeavesTheOthersAsTheyAre)
{
    morvik::blocks::Random random(4);
    for (const Modulation modulation : morvik::link::modulations) {
        const unsigned bits = bitsPerSymbol(modulation);
        Received received = randomSymbols(random, modulation, 30);
        for (const Demapper demapper : morvik::link::demappers) {
            std::vector<float> alone(std::size_t{30} * bits);
            std::vector<float> among(alone.size());
            const float* const gains = received.gains.data();
            received.symbols.back() = 0.5F;
            demapSymbols(modulation, demapper, received.symbols.data(), gains, 0.1F, 30, alone.data());
            demapAnySymbols(modulation, demapper, received.symbols.data(), gains, 0.1F, 30, among.data());
            EXPECT_EQ(among, alone);
            received.symbols.back() = -3e38F;
            std::fill(among.begin(), among.end(), 0.0F);
            demapAnySymbols(modulation, demapper, received.symbols.data(), gains, 0.1F, 30, among.data());
            alone.resize(std::size_t{29} * bits);
            EXPECT_GT(std::fabs(among.back() + among[among.size() - 2]), 1e30F);
            among.resize(alone.size());
            EXPECT_EQ(among, alone);
        }
    }
}

TEST(DemapperTest, HasNames)
{
    for (const Demapper demapper : morvik::link::demappers) {
        EXPECT_EQ(morvik::link::demapperOf(nameOf(demapper)), demapper);
    }
    EXPECT_EQ(nameOf(Demapper::exact), "exact");
    EXPECT_EQ(morvik::link::demapperOf("best"), std::nullopt);
}
