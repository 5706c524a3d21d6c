// Schedule, Tail and Interleaver: the order of passes, of the tail's values, and of the second code.
#include "rules/Schedule.h"

#include <gtest/gtest.h>

#include <array>
#include <set>

#include "rules/Interleaver.h"
#include "rules/Tail.h"
#include "support/PlainDecoder.h"

namespace morvik::rules {
namespace {

TEST(Schedule, BeginsInInterleavedOrderAndEndsInNaturalOrder)
{
    EXPECT_EQ(constituentOf(0), 1U);
    for (const unsigned iterations : {1U, 2U, 15U}) {
        EXPECT_EQ(constituentOf(halfIterations(iterations) - 1), 0U);
    }
    for (unsigned h = 2; h < 30; ++h) {
        EXPECT_NE(constituentOf(h), constituentOf(h - 1));
        EXPECT_EQ(constituentOf(passBefore(h)), constituentOf(h));
        EXPECT_EQ(passBefore(h) + 2, h);
        EXPECT_FALSE(isFirstPass(h));
    }
    EXPECT_TRUE(isFirstPass(0));
    EXPECT_TRUE(isFirstPass(1));
}

TEST(Tail, HasTheOrderOfTheStandard)
{
    // x z x z x z of the first encoder, then of the second; the streams are filled position by position.
    EXPECT_EQ(tailPlace(0, 0, false), 0U);
    EXPECT_EQ(tailPlace(0, 0, true), 1U);
    EXPECT_EQ(tailPlace(0, 2, true), 5U);
    EXPECT_EQ(tailPlace(1, 0, false), 6U);
    std::set<unsigned> places;
    for (const unsigned d : {0U, 1U}) {
        for (unsigned step = 0; step < tailSteps; ++step) {
            places.insert({tailPlace(d, step, false), tailPlace(d, step, true)});
        }
    }
    EXPECT_EQ(places.size(), tailValues);
    EXPECT_EQ(*places.rbegin(), tailValues - 1);
}

TEST(Interleaver, IsThatOfThePlainDecoder)
{
    for (const auto& size : morvik::rules::blockSizes) {
        const std::vector<unsigned> plain = morvik::plain::permutation(size.K);
        ASSERT_EQ(plain.size(), size.K);
        InterleaverAddress address(size);
        for (const unsigned position : plain) {
            ASSERT_EQ(address.next(), position) << size.K;
        }
    }
}

}  // namespace
}  // namespace morvik::rules
