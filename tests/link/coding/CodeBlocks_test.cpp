// CodeBlocks: tests of every transport block size against the clause, and of what is refused.
#include "link/coding/CodeBlocks.h"

#include <gtest/gtest.h>

#include <stdexcept>

#include "support/PlainLink.h"

namespace {

using morvik::link::CodeBlocks;
using morvik::link::codeBlocksOf;

}  // namespace

TEST(CodeBlocksTest, AgreesWithTheClause)
{
    for (unsigned A = 1; A < 100000; A += A < 13000 ? 1 : 37) {
        const CodeBlocks blocks = codeBlocksOf(A);
        const morvik::plain::CodeBlockSizes plain = morvik::plain::codeBlockSizes(A);
        ASSERT_EQ(blocks.bits, A);
        ASSERT_EQ(blocks.count, plain.C) << A;
        ASSERT_EQ(blocks.fillers, plain.F) << A;
        ASSERT_EQ(blocks.sizePlus, plain.Kplus) << A;
        ASSERT_EQ(blocks.countPlus, plain.Cplus) << A;
        ASSERT_EQ(blocks.sizeMinus, plain.Kminus) << A;
        ASSERT_EQ(blocks.countMinus, plain.Cminus) << A;
    }
}

TEST(CodeBlocksTest, CodeBlocksCarryTheTransportBlockAndItsCrc)
{
    for (const unsigned A : {1U, 16U, 17U, 6120U, 6121U, 29314U, 97896U, 97897U, 1000001U, 1U << 24}) {
        const CodeBlocks blocks = codeBlocksOf(A);
        unsigned carried = 0;
        for (unsigned r = 0; r < blocks.count; ++r) {
            carried += blocks.payload(r);
            EXPECT_EQ(blocks.fillersOf(r) + blocks.payload(r) + blocks.ownCrcBits(), blocks.size(r));
        }
        EXPECT_EQ(carried, A + 24) << A;
    }
}

TEST(CodeBlocksTest, RefusesWhatIsNoTransportBlock)
{
    EXPECT_THROW(codeBlocksOf(0), std::invalid_argument);
    EXPECT_THROW(codeBlocksOf((1U << 24) + 1), std::invalid_argument);
}
