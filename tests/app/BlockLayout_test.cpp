// BlockLayout: segments, windows and their order are those of docs/arithmetic.md, rules 17 and 18.
#include "info/BlockLayout.h"

#include <gtest/gtest.h>

#include <set>

#include "rules/BlockSizes.h"

namespace {

using namespace morvik;
using Lengths = std::vector<std::uint32_t>;

const UnitLayout& with(const BlockLayout& layout, int numPu)
{
    for (const UnitLayout& division : layout.divisions) {
        if (division.numPu == numPu) {
            return division;
        }
    }
    throw std::invalid_argument("no such number of units");
}

TEST(BlockLayout, HasTheExampleOfTheDocuments)
{
    const BlockLayout layout = layoutOf(1280);
    EXPECT_EQ(layout.f1, 199U);
    EXPECT_EQ(layout.f2, 240U);
    const UnitLayout& two = with(layout, 2);
    EXPECT_EQ(two.threads, 8U);
    EXPECT_EQ(two.segments, 8U);
    EXPECT_EQ(two.segmentLength, 160U);
    EXPECT_EQ(two.lengths, (Lengths{64, 48, 48}));
    ASSERT_EQ(two.windows.size(), 24U);
    EXPECT_EQ(two.windows[10].row, 1U);
    EXPECT_EQ(two.windows[10].segment, 2U);
    EXPECT_EQ(two.windows[10].first, 2 * 160 + 64U);
    EXPECT_EQ(two.windows[10].last, 2 * 160 + 111U);
    EXPECT_EQ(with(layout, 4).segments, 16U);
    EXPECT_EQ(with(layout, 8).segments, 16U);
    EXPECT_EQ(with(layout, 8).threads, 32U);
    EXPECT_EQ(with(layout, 8).lengths, (Lengths{40, 40}));
}

TEST(BlockLayout, HasTheSmallestAndTheLargestBlock)
{
    const BlockLayout smallest = layoutOf(40);
    for (const int units : {2, 4, 8}) {
        EXPECT_EQ(with(smallest, units).segments, 1U);
        EXPECT_EQ(with(smallest, units).lengths, Lengths{40});
    }
    const BlockLayout largest = layoutOf(6144);
    EXPECT_EQ(with(largest, 2).lengths, Lengths(12, 64));
    EXPECT_EQ(with(largest, 4).lengths, Lengths(6, 64));
    EXPECT_EQ(with(largest, 8).lengths, Lengths(3, 64));
    EXPECT_EQ(with(largest, 8).segments, 32U);
}

TEST(BlockLayout, WindowsCoverEachStepOnceRowByRow)
{
    for (const standard::BlockSize& size : standard::blockSizes) {
        for (const UnitLayout& division : layoutOf(size.K).divisions) {
            std::vector<unsigned> covered(size.K);
            ASSERT_EQ(division.windows.size(), division.segments * division.lengths.size());
            for (std::size_t i = 0; i < division.windows.size(); ++i) {
                const Window& window = division.windows[i];
                ASSERT_EQ(window.row, i / division.segments);
                ASSERT_EQ(window.segment, i % division.segments);
                ASSERT_EQ(window.last - window.first + 1, division.lengths[window.row]);
                ASSERT_EQ(window.first / division.segmentLength, window.segment);
                for (std::uint32_t step = window.first; step <= window.last; ++step) {
                    ++covered[step];
                }
            }
            ASSERT_EQ(covered, std::vector<unsigned>(size.K, 1)) << size.K << ' ' << division.numPu;
        }
    }
}

TEST(BlockLayout, InterleaverIsThePolynomial)
{
    const BlockLayout layout = layoutOf(6144);
    ASSERT_EQ(layout.interleaver.size(), 6144U);
    for (unsigned i = 0; i < 6144; ++i) {
        ASSERT_EQ(layout.interleaver[i], (263 + std::uint64_t{480} * i) * i % 6144);
    }
}

TEST(BlockLayout, RefusesOtherSizes)
{
    for (const std::uint32_t K : {0U, 39U, 41U, 6145U, 4294967295U}) {
        EXPECT_THROW(layoutOf(K), std::invalid_argument) << K;
    }
}

TEST(BlockLayout, NumberFormatsHaveTheirRanges)
{
    const std::vector<NumberFormat> formats = numberFormats();
    ASSERT_EQ(formats.size(), 3U);
    EXPECT_EQ(formats[0].text, "Fix_8_3");
    EXPECT_EQ(formats[0].smallest, -16);
    EXPECT_EQ(formats[0].largest, 15.875);
    EXPECT_EQ(formats[2].bits, 12U);
    EXPECT_EQ(formats[2].fraction, 3U);
    EXPECT_EQ(formats[2].smallest, -256);
    EXPECT_EQ(formats[2].largest, 255.875);
}

}  // namespace
