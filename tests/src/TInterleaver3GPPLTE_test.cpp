// TInterleaver3GPPLTE: tests of the block sizes and of the permutations.
#include "TInterleaver3GPPLTE.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <numeric>

#include "support/CapturedStreams.h"
#include "support/PlainDecoder.h"

namespace {

using Table = std::vector<unsigned>;

std::unique_ptr<TInterleaver> made()
{
    return std::unique_ptr<TInterleaver>(TInterleaver3GPPLTE::create(""));
}

Table first(const Table& table, std::size_t count)
{
    return Table(table.begin(), table.begin() + static_cast<std::ptrdiff_t>(count));
}

Table last(const Table& table, std::size_t count)
{
    return Table(table.end() - static_cast<std::ptrdiff_t>(count), table.end());
}

}  // namespace

TEST(TInterleaver3GPPLTE, TakesNoProperties)
{
    const CapturedStreams streams;
    EXPECT_EQ(std::unique_ptr<TInterleaver>(TInterleaver3GPPLTE::create("x")), nullptr);
    EXPECT_EQ(streams.err(), "ERROR:TInterleaver3GPPLTE:Unexpected properties:x\n");
    EXPECT_EQ(streams.out(), "");
}

TEST(TInterleaver3GPPLTE, KnowsTheBlockSizesAtTheBordersOfTheirSteps)
{
    const auto interleaver = made();
    for (const unsigned K : {40U, 512U, 528U, 1024U, 1056U, 2048U, 2112U, 6144U}) {
        EXPECT_TRUE(interleaver->valid(K)) << K;
    }
    for (const unsigned K : {0U, 8U, 32U, 41U, 520U, 1040U, 2080U, 6145U, 6152U, 6208U, 4294967288U}) {
        EXPECT_FALSE(interleaver->valid(K)) << K;
    }
}

TEST(TInterleaver3GPPLTE, PermutesEveryBlockSizeAsThePolynomialSaysAndEmptiesTheTableForOthers)
{
    const auto interleaver = made();
    unsigned sizes = 0;
    for (unsigned K = 0; K <= 6208; ++K) {
        Table table{9, 9, 9};
        const bool known = morvik::plain::knownBlockSize(K);
        ASSERT_EQ(interleaver->valid(K), known) << K;
        ASSERT_EQ(interleaver->calcInterleaver(table, K), known) << K;
        ASSERT_EQ(table, morvik::plain::permutation(K)) << K;
        std::sort(table.begin(), table.end());
        Table positions(table.size());
        std::iota(positions.begin(), positions.end(), 0U);
        ASSERT_EQ(table, positions) << K << ": not each position once";
        sizes += known ? 1 : 0;
    }
    EXPECT_EQ(sizes, 188U);
}

TEST(TInterleaver3GPPLTE, GivesTheKnownPermutationsOfTheSmallestAndTheLargestBlock)
{
    const auto interleaver = made();
    Table pi;
    interleaver->calcInterleaver(pi, 40);
    EXPECT_EQ(first(pi, 10), (Table{0, 13, 6, 19, 12, 25, 18, 31, 24, 37}));
    EXPECT_EQ(last(pi, 3), (Table{1, 34, 7}));
    interleaver->calcDeinterleaver(interleaver->itsPiInv, 40);
    EXPECT_EQ(first(interleaver->itsPiInv, 10), (Table{0, 37, 14, 11, 28, 25, 2, 39, 16, 13}));
    interleaver->calcInterleaver(pi, 6144);
    EXPECT_EQ(first(pi, 6), (Table{0, 743, 2446, 5109, 2588, 1027}));
    EXPECT_EQ(last(pi, 3), (Table{3531, 1394, 217}));
}
