// RowKernels: tests that all instruction sets give the bits of the generic one, and of what no other test can see.
#include "link/kernels/RowKernels.h"

#include <gtest/gtest.h>

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

TEST(RowKernelsTest, AddNoiseAndCountAlike)
{
    Random random(4);
    for (std::size_t count = 0; count < 200; count += 11) {
        const std::vector<float> start = randomNumbers(random, count);
        const auto d = randomIntegers<std::int8_t>(random, count);
        const auto u = randomIntegers<std::uint8_t>(random, count);
        const auto v = randomIntegers<std::uint8_t>(random, count);
        expectSame([&](const RowKernels& set) {
            std::vector<float> to = start;
            set.addNoise(d.data(), u.data(), v.data(), count, 0.1F, to.data());
            return to;
        });
        for (const RowKernels* const set : rowKernelSets()) {
            std::uint32_t outside = 0;
            for (const float number : start) {
                outside += number * 3 <= -20.5F || number * 3 >= 30 ? 1U : 0U;
            }
            EXPECT_EQ(set->countOutside(start.data(), count, 3, -20.5F, 30), outside) << set->name;
        }
    }
    const std::vector<float> ends = {-8, 8, 7.9375F, -7.9375F, std::numeric_limits<float>::quiet_NaN()};
    EXPECT_EQ(rowKernels().countOutside(ends.data(), ends.size(), 1, -8, 8), 3U) << "the limits are outside, as is NaN";
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
