// AliasTable: tests that every value is drawn with its exact probability.
#include "link/random/AliasTable.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <random>

namespace {

using morvik::link::AliasTable;
using Weights = AliasTable::Weights;

constexpr std::uint64_t whole = std::uint64_t{1} << AliasTable::weightBits;
constexpr std::uint64_t entryRoom = whole / AliasTable::size;

/// What the entries give to each value, all together.
Weights drawn(const AliasTable& table)
{
    Weights weights{};
    for (unsigned entry = 0; entry < AliasTable::size; ++entry) {
        weights[entry] += table.threshold(entry);
        weights[table.alias[entry]] += entryRoom - table.threshold(entry);
    }
    return weights;
}

void expectExact(const Weights& weights)
{
    EXPECT_EQ(drawn(AliasTable(weights)), weights);
}

}  // namespace

TEST(AliasTable, KeepsThresholdsInTwoParts)
{
    Weights weights{};
    weights[3] = 0x12FFFFFFFE;  // a poor one among 255 that share the rest
    weights[4] = whole - weights[3];
    const AliasTable table(weights);
    EXPECT_EQ(table.highThreshold[3], 0x12);
    EXPECT_EQ(table.lowThreshold[3], 0xFFFFFFFE);
    EXPECT_EQ(table.threshold(3), 0x12FFFFFFFE);
    EXPECT_EQ(table.alias[3], 4);
}

TEST(AliasTable, DrawsEqualWeights)
{
    Weights weights;
    weights.fill(entryRoom);
    expectExact(weights);
}

TEST(AliasTable, DrawsASingleValue)
{
    for (const unsigned value : {0U, 127U, 128U, 255U}) {
        Weights weights{};
        weights[value] = whole;
        expectExact(weights);
    }
}

TEST(AliasTable, DrawsWeightsOfVeryDifferentSize)
{
    Weights weights{};
    std::uint64_t left = whole;
    for (std::size_t value = 0; value < 48; ++value) {
        weights[5 * value] = left / 2;
        left -= left / 2;
    }
    weights[255] = left;
    EXPECT_EQ(left, 1U);
    expectExact(weights);
}

TEST(AliasTable, DrawsRandomWeights)
{
    std::mt19937_64 random(1);
    for (unsigned round = 0; round < 100; ++round) {
        Weights weights{};
        std::uint64_t left = whole;
        for (unsigned i = 0; i < 200; ++i) {
            const std::uint64_t part = random() % (left / 4 + 1);
            weights[random() % AliasTable::size] += part;
            left -= part;
        }
        weights[random() % AliasTable::size] += left;
        expectExact(weights);
    }
}
