// Tally: what is counted of a frame, and of two parts of a run.
#include "simulation/Tally.h"

#include <gtest/gtest.h>

#include <numeric>

namespace morvik::simulation {
namespace {

TEST(Tally, CountsBitsBlocksAndSquares)
{
    ErrorCounts errors;
    errors.add(0, 0);
    errors.add(1, 3);
    errors.add(2, 6144);
    EXPECT_EQ(errors.bitErrors, 6147U);
    EXPECT_EQ(errors.blockErrors, 2U);
    EXPECT_EQ(errors.bitErrorSquares, 9U + 6144U * 6144U);
    EXPECT_EQ(errors.failures, (std::vector<std::uint64_t>{1, 2}));
}

TEST(Tally, KeepsTheFirstFailures)
{
    ErrorCounts errors;
    for (std::uint64_t frame = 100; frame < 200; ++frame) {
        errors.add(frame, 1);
    }
    std::vector<std::uint64_t> first(ErrorCounts::keptFailures);
    std::iota(first.begin(), first.end(), 100);
    EXPECT_EQ(errors.failures, first);
}

TEST(Tally, OfTwoPartsIsThatOfAllFrames)
{
    ErrorCounts all;
    ErrorCounts parts[2];
    for (std::uint64_t frame = 0; frame < 30; ++frame) {
        const auto wrongBits = static_cast<std::uint32_t>(frame % 3);
        all.add(frame, wrongBits);
        parts[frame / 5 % 2].add(frame, wrongBits);
    }
    parts[1].add(parts[0]);
    EXPECT_EQ(parts[1].bitErrors, all.bitErrors);
    EXPECT_EQ(parts[1].blockErrors, all.blockErrors);
    EXPECT_EQ(parts[1].bitErrorSquares, all.bitErrorSquares);
    EXPECT_EQ(parts[1].failures, all.failures);
}

}  // namespace
}  // namespace morvik::simulation
