// BlockLayout: what the subcommand info tells of a block size.
#include "info/BlockLayout.h"

#include <gtest/gtest.h>

namespace morvik {
namespace {

TEST(BlockLayout, HasTheExampleOfTheDocuments)
{
    const BlockLayout layout = layoutOf(1280);
    EXPECT_EQ(layout.f1, 199U);
    EXPECT_EQ(layout.f2, 240U);
    ASSERT_EQ(layout.cuts.size(), 3U);
    for (unsigned i = 0; i < 3; ++i) {
        EXPECT_EQ(layout.cuts[i].K(), 1280U);
        EXPECT_EQ(layout.cuts[i].units(), 2U << i);
        EXPECT_EQ(layout.cuts[i].segments(), i == 0 ? 8U : 16U);
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
}  // namespace morvik
