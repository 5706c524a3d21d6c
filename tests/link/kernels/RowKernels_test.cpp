// RowKernels: tests that all instruction sets give the bits of the generic one, and of what no other test can see.
#include "link/kernels/RowKernels.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>
#include <set>
#include <string>

#include "support/Blocks.h"

namespace {

using morvik::blocks::between;
using morvik::blocks::Random;
using morvik::link::DimensionRow;
using morvik::link::RowKernels;
using morvik::link::rowKernels;
using morvik::link::rowKernelSets;

std::vector<float> randomNumbers(Random& random, std::size_t count)
{
    std::vector<float> numbers(count);
    for (float& number : numbers) {
        number = static_cast<float>(between(random, -100000, 100000)) / 4096;
    }
    return numbers;
}

template <typename Integer>
std::vector<Integer> randomIntegers(Random& random, std::size_t count)
{
    std::vector<Integer> integers(count);
    for (Integer& integer : integers) {
        integer = static_cast<Integer>(random());
    }
    return integers;
}

/// Whether all bits are the same, of NaN and of zeros, too.
template <typename Value>
bool areSame(const std::vector<Value>& a, const std::vector<Value>& b)
{
    return a.size() == b.size() && (a.empty() || std::memcmp(a.data(), b.data(), a.size() * sizeof(Value)) == 0);
}

/// Calls `compute` with each set; all must return the same.
template <typename Compute>
void expectSame(Compute compute)
{
    const auto expected = compute(*rowKernelSets().back());
    for (const RowKernels* const set : rowKernelSets()) {
        EXPECT_TRUE(areSame(compute(*set), expected)) << set->name;
    }
}

}  // namespace

TEST(RowKernelsTest, HaveNamesAndEndWithTheGenericSet)
{
    std::set<std::string> names;
    for (const RowKernels* const set : rowKernelSets()) {
        EXPECT_TRUE(names.insert(set->name).second);
    }
    EXPECT_STREQ(rowKernelSets().back()->name, "generic");
    EXPECT_EQ(&rowKernels(), rowKernelSets().front());
}

TEST(RowKernelsTest, AddAndRoundAlike)
{
    Random random(1);
    for (std::size_t count = 0; count < 150; count += 7) {
        const std::vector<float> start = randomNumbers(random, count);
        std::vector<float> numbers = randomNumbers(random, count);
        if (count > 20) {
            numbers[3] = std::numeric_limits<float>::quiet_NaN();
            numbers[5] = std::numeric_limits<float>::infinity();
            numbers[7] = -numbers[5];
            numbers[20] = 0.49999997F;
        }
        const auto integers = randomIntegers<std::int16_t>(random, count);
        const auto sums = randomIntegers<std::int16_t>(random, count);
        expectSame([&](const RowKernels& set) {
            std::vector<float> to = start;
            set.add(numbers.data(), count, to.data());
            return to;
        });
        expectSame([&](const RowKernels& set) {
            std::vector<std::int16_t> to = sums;
            set.addClipped(integers.data(), count, 1000, to.data());
            return to;
        });
        for (const float scale : {1.0F, 3.7F, 1e30F}) {
            expectSame([&](const RowKernels& set) {
                std::vector<std::int8_t> to(count);
                set.roundToBytes(numbers.data(), count, scale, 32, to.data());
                return to;
            });
            expectSame([&](const RowKernels& set) {
                std::vector<std::int16_t> to(count);
                set.roundToWords(numbers.data(), count, scale, 32768, to.data());
                return to;
            });
        }
    }
}

TEST(RowKernelsTest, RoundAsTheMathematicalLibraryAndCountWhatIsClipped)
{
    // Around every integer and half in range, and beyond its ends.
    std::vector<float> numbers = {std::numeric_limits<float>::quiet_NaN(), 1e30F, -1e30F, -0.0F};
    for (int twice = -2 * 32770; twice <= 2 * 32770; ++twice) {
        const float middle = static_cast<float>(twice) / 2;
        const float below = std::nextafter(middle, -1e9F);
        const float above = std::nextafter(middle, 1e9F);
        numbers.insert(numbers.end(),
                       {std::nextafter(below, -1e9F), below, middle, above, std::nextafter(above, 1e9F)});
    }
    for (const float end : {2.0F, 32.0F, 128.0F, 32768.0F}) {
        std::vector<std::int16_t> expected;
        std::uint32_t expectedClipped = 0;
        for (const float number : numbers) {
            const float rounded = std::round(number);
            const bool isKept = rounded >= -end && rounded <= end - 1;
            expectedClipped += isKept ? 0U : 1U;
            expected.push_back(static_cast<std::int16_t>(isKept ? rounded : rounded > 0 ? end - 1 : -end));
        }
        for (const RowKernels* const set : rowKernelSets()) {
            std::vector<std::int16_t> words(numbers.size());
            EXPECT_EQ(set->roundToWords(numbers.data(), numbers.size(), 1, end, words.data()), expectedClipped)
                << set->name << ' ' << end;
            EXPECT_EQ(words, expected) << set->name << ' ' << end;
            if (end <= 128) {
                std::vector<std::int8_t> bytes(numbers.size());
                EXPECT_EQ(set->roundToBytes(numbers.data(), numbers.size(), 1, end, bytes.data()), expectedClipped);
                EXPECT_TRUE(std::equal(bytes.begin(), bytes.end(), expected.begin())) << set->name << ' ' << end;
            }
        }
    }
}

TEST(RowKernelsTest, AddNoiseAndFadeAlike)
{
    Random random(4);
    for (std::size_t count = 0; count < 200; count += 11) {
        const std::vector<float> start = randomNumbers(random, 2 * count);
        const std::vector<float> gains = randomNumbers(random, count);
        auto integers = randomIntegers<std::int16_t>(random, 2 * count);
        for (std::int16_t& integer : integers) {
            integer = std::max<std::int16_t>(integer, -32511);
        }
        for (const RowKernels* const set : rowKernelSets()) {
            std::vector<float> sums = start;
            std::vector<float> faded = start;
            std::vector<float> fadedOnes(start.begin(), start.begin() + static_cast<std::ptrdiff_t>(count));
            std::vector<float> roots(count);
            set->addNoise(integers.data(), 2 * count, 0.1F, sums.data());
            set->fade(gains.data(), count, 2, faded.data());
            set->fade(gains.data(), count, 1, fadedOnes.data());
            set->amplitudes(integers.data(), count, 1e-7F, roots.data());
            for (std::size_t i = 0; i < count; ++i) {
                const std::int32_t a = integers[2 * i];
                const std::int32_t b = integers[2 * i + 1];
                const float noise = static_cast<float>(a) * 0.1F;
                EXPECT_EQ(sums[2 * i], start[2 * i] + noise) << set->name;
                EXPECT_EQ(faded[2 * i], start[2 * i] * gains[i]) << set->name;
                EXPECT_EQ(faded[2 * i + 1], start[2 * i + 1] * gains[i]) << set->name;
                EXPECT_EQ(fadedOnes[i], start[i] * gains[i]) << set->name;
                EXPECT_EQ(roots[i], std::sqrt(static_cast<float>(a * a + b * b) * 1e-7F)) << set->name;
            }
        }
    }
}

TEST(RowKernelsTest, MapBitsOfAnyNumberOfSymbols)
{
    Random random(5);
    for (unsigned bits = 1; bits <= 4; ++bits) {
        for (std::size_t count = 0; count < 300; count += 2) {
            const auto row = randomIntegers<std::uint64_t>(random, (count * bits + 63) / 64);
            std::vector<float> expected;
            for (std::size_t n = 0; n < count; ++n) {
                const auto sign = [&](unsigned i) {
                    const std::size_t bit = n / 2 * 2 * bits + n % 2 + std::size_t{2} * i;
                    return (row[bit / 64] >> bit % 64 & 1) != 0 ? -1 : 1;
                };
                int level = 1;
                for (unsigned i = bits - 1; i > 0; --i) {
                    level = (1 << (bits - i)) - sign(i) * level;
                }
                expected.push_back(static_cast<float>(sign(0) * level) * 0.3F);
            }
            for (const RowKernels* const set : rowKernelSets()) {
                std::vector<float> numbers(count);
                set->map(row.data(), bits, count, 0.3F, numbers.data());
                EXPECT_EQ(numbers, expected) << set->name << ' ' << bits << ' ' << count;
            }
        }
    }
}

TEST(RowKernelsTest, MakeRowsOfColumnsAlike)
{
    Random random(2);
    for (const std::size_t rows : {2U, 3U, 17U, 193U}) {
        const auto columns = randomIntegers<std::uint8_t>(random, 64 * rows);
        expectSame([&](const RowKernels& set) {
            std::vector<std::uint8_t> from = columns;
            std::vector<std::uint8_t> to(32 * rows);
            set.rowsOfOne(from.data(), rows, to.data());
            return to;
        });
        expectSame([&](const RowKernels& set) {
            std::vector<std::uint8_t> from = columns;
            std::vector<std::uint8_t> to(64 * rows);
            set.rowsOfTwo(from.data(), rows, to.data(), &to[32 * rows]);
            return to;
        });
    }
}

TEST(RowKernelsTest, DemapAlike)
{
    Random random(3);
    for (const std::size_t symbols : {1U, 63U, 64U, 65U, 300U}) {
        const std::vector<float> received = randomNumbers(random, 2 * symbols);
        std::vector<float> gains = randomNumbers(random, symbols);
        for (float& gain : gains) {
            gain = gain > 0 ? gain : 0;
        }
        for (const float* const each : {static_cast<const float*>(nullptr), static_cast<const float*>(gains.data())}) {
            for (unsigned bits = 1; bits <= 4; ++bits) {
                const unsigned across = bits == 1 && symbols % 2 != 0 ? 1 : 2;
                const DimensionRow row = {received.data(), each, symbols, across, bits, 0.8F, 0.1F};
                for (const bool exact : {false, true}) {
                    expectSame([&](const RowKernels& set) {
                        std::vector<float> ratios(symbols * across * bits);
                        (exact ? set.exactRatios : set.maxLogRatios)(row, ratios.data());
                        return ratios;
                    });
                }
            }
        }
    }
}

TEST(RowKernelsTest, LogOnePlusExpIsCloseEverywhere)
{
    std::vector<float> x;
    for (unsigned i = 0; i < 1000000; ++i) {
        x.push_back(static_cast<float>(i) / 10000);
    }
    x.push_back(1e30F);
    expectSame([&](const RowKernels& set) {
        std::vector<float> logarithms(x.size());
        set.logOnePlusExp(x.data(), x.size(), logarithms.data());
        long double worst = 0;
        for (std::size_t i = 0; i < x.size(); ++i) {
            const long double exact = std::log1p(std::exp(-static_cast<long double>(x[i])));
            worst = std::fmax(worst, std::fabs(logarithms[i] - exact));
        }
        EXPECT_LT(worst, 2e-7L) << set.name;
        return logarithms;
    });
}
