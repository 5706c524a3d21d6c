// TransportBlockSizes: tests of the tables of 3GPP TS 36.213.
#include "link/tables/TransportBlockSizes.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace morvik::link {
namespace {

}  // namespace

TEST(TransportBlockSizesTest, SizesAreThoseOfTheStandard)
{
    EXPECT_EQ(transportBlockSize(0, 1), 16U);
    EXPECT_EQ(transportBlockSize(9, 6), 936U);
    EXPECT_EQ(transportBlockSize(26, 100), 75376U);
    EXPECT_EQ(transportBlockSize(33, 110), 97896U);
    std::uint64_t sum = 0;
    std::uint64_t weighted = 0;
    for (unsigned index = 0; index <= 33; ++index) {
        for (unsigned pairs = 1; pairs <= mostResourceBlocks; ++pairs) {
            sum += transportBlockSize(index, pairs);
            weighted += std::uint64_t{pairs} * transportBlockSize(index, pairs);
        }
    }
    EXPECT_EQ(sum, 82058216U);
    EXPECT_EQ(weighted, 6043621696U);
    EXPECT_THROW(transportBlockSize(34, 1), std::invalid_argument);
    EXPECT_THROW(transportBlockSize(0, 0), std::invalid_argument);
    EXPECT_THROW(transportBlockSize(0, 111), std::invalid_argument);
}

TEST(TransportBlockSizesTest, SchemesAreThoseOfTheStandard)
{
    ASSERT_EQ(countOf(McsTable::qam64), 29U);
    ASSERT_EQ(countOf(McsTable::qam256), 28U);
    const auto expectScheme = [](McsTable table, unsigned index, unsigned bits, unsigned sizeIndex) {
        EXPECT_EQ(mcsOf(table, index).bitsPerSymbol, bits) << index;
        EXPECT_EQ(mcsOf(table, index).sizeIndex, sizeIndex) << index;
    };
    expectScheme(McsTable::qam64, 0, 2, 0);
    expectScheme(McsTable::qam64, 9, 2, 9);
    expectScheme(McsTable::qam64, 10, 4, 9);
    expectScheme(McsTable::qam64, 16, 4, 15);
    expectScheme(McsTable::qam64, 17, 6, 15);
    expectScheme(McsTable::qam64, 28, 6, 26);
    expectScheme(McsTable::qam256, 4, 2, 8);
    expectScheme(McsTable::qam256, 19, 6, 24);
    expectScheme(McsTable::qam256, 20, 8, 25);
    expectScheme(McsTable::qam256, 27, 8, 33);
    EXPECT_THROW(mcsOf(McsTable::qam64, 29), std::invalid_argument);
    EXPECT_THROW(mcsOf(McsTable::qam256, 28), std::invalid_argument);
}

}  // namespace morvik::link
