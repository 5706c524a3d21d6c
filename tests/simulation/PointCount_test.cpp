// PointCount: whatever the order in which results come, what counts is what counting frame by frame gives.
#include "simulation/PointCount.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>

#include "support/Environment.h"
#include "support/SyntheticFrames.h"

namespace morvik::simulation {
namespace {

using morvik::support::countOneByOne;
using morvik::support::expectEqual;
using morvik::support::SyntheticFrames;

TEST(PointCount, OfAnEmptyRangeIsComplete)
{
    const StopRules rules;
    EXPECT_TRUE(PointCount(rules, {5, 5}, Tally()).isComplete());
    EXPECT_FALSE(PointCount(rules, {5, 6}, Tally()).isComplete());
}

TEST(PointCount, WaitsForTheFramesBefore)
{
    const StopRules rules;
    const SyntheticFrames frames(1);
    PointCount count(rules, {100, 200}, Tally());
    count.take(frames.result({0, 110, 10}, 1));
    EXPECT_EQ(count.tally().blocks, 0U);
    count.take(frames.result({0, 130, 10}, 1));
    count.take(frames.result({0, 100, 10}, 1));
    EXPECT_EQ(count.tally().blocks, 20U);
    EXPECT_FALSE(count.isComplete());
    expectEqual(count.tally(), countOneByOne(frames, {100, 120}, rules, 1));
}

TEST(PointCount, LeavesOutFramesAfterTheOneThatEndsThePoint)
{
    StopRules rules;
    rules.maxBlocks = 13;
    const SyntheticFrames frames(1);
    PointCount count(rules, {0, 1000}, Tally());
    count.take(frames.result({0, 0, 100}, 1));
    EXPECT_TRUE(count.isComplete());
    EXPECT_EQ(count.tally().blocks, 13U);
    count.take(frames.result({0, 100, 100}, 1));
    EXPECT_EQ(count.tally().blocks, 13U);
}

TEST(PointCount, IsTheOneOfFrameByFrame)
{
    std::mt19937 random(fromEnvironment("MORVIK_TEST_SEED", 1));
    const auto below = [&random](unsigned limit) {
        return static_cast<unsigned>(random() % limit);
    };
    for (unsigned trial = 0; trial < fromEnvironment("MORVIK_TEST_BLOCKS", 300); ++trial) {
        SCOPED_TRACE(trial);
        const SyntheticFrames frames(below(UINT32_MAX));
        StopRules rules;
        if (below(2) == 0) {
            rules.blockErrors = 1 + below(40);
        }
        if (below(2) == 0) {
            rules.bitErrors = 1 + below(200);
        }
        if (below(2) == 0) {
            rules.maxBlocks = 1 + below(600);
        }
        const std::uint64_t from = below(1000);
        const FrameRange range = {from, from + 1 + below(500)};
        const std::size_t counts = 1 + below(3);

        // Starts where another run was stopped, and gets batches of any size in any order.
        const FrameRange before = {from, std::min(from + below(50), range.to)};
        const Tally start = countOneByOne(frames, before, rules, counts);
        std::vector<FrameBatch> batches;
        for (std::uint64_t next = from + start.blocks; next < range.to;) {
            const auto size = static_cast<std::uint32_t>(std::min<std::uint64_t>(1 + below(60), range.to - next));
            batches.push_back({0, next, size});
            next += size;
        }
        std::shuffle(batches.begin(), batches.end(), random);
        PointCount count(rules, range, start);
        for (const FrameBatch& batch : batches) {
            count.take(frames.result(batch, counts));
        }
        EXPECT_TRUE(count.isComplete());
        expectEqual(count.tally(), countOneByOne(frames, range, rules, counts));
    }
}

}  // namespace
}  // namespace morvik::simulation
