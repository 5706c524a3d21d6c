// Run: points end as frame-by-frame counting says, whoever works in whatever order, and go on after an interruption.
#include "simulation/Run.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <deque>
#include <random>
#include <stdexcept>

#include "base/Error.h"
#include "simulation/ResultFiles.h"
#include "support/SyntheticFrames.h"
#include "support/TemporaryFolder.h"

namespace morvik::simulation {
namespace {

using morvik::support::countOneByOne;
using morvik::support::SyntheticFrames;

/// The frames of a point of a plan: each has other ones.
SyntheticFrames framesOf(std::size_t point)
{
    return SyntheticFrames(static_cast<std::uint32_t>(100 * point));
}

/// Gives results back in a random order, and nothing now and then.
class ShufflingWorkers : public Workers {
public:
    ShufflingWorkers(const Plan& plan, unsigned count, unsigned seed) : itsPlan(plan), itsCount(count), itsRandom(seed)
    {
    }

    unsigned count() const override
    {
        return itsCount;
    }

    void handOut(const FrameBatch& batch) override
    {
        EXPECT_GT(batch.count, 0U);
        EXPECT_GE(batch.first, itsPlan.frames.from);
        EXPECT_LE(batch.first + batch.count, itsPlan.frames.to);
        itsFramesOut += batch.count;
        itsBatches.push_back(batch);
    }

    std::optional<BatchResult> take(std::chrono::milliseconds) override
    {
        if (itsBatches.empty() || itsRandom() % 4 == 0) {
            return std::nullopt;
        }
        std::swap(itsBatches[itsRandom() % itsBatches.size()], itsBatches.back());
        const FrameBatch batch = itsBatches.back();
        itsBatches.pop_back();
        return framesOf(batch.point).result(batch, itsPlan.countsOf(itsPlan.points[batch.point]));
    }

    void forgetAll() override
    {
        itsBatches.clear();
    }

    /// How many frames have been handed out in all.
    std::uint64_t framesOut() const
    {
        return itsFramesOut;
    }

    bool isIdle() const
    {
        return itsBatches.empty();
    }

private:
    const Plan& itsPlan;
    unsigned itsCount;
    std::mt19937 itsRandom;
    std::deque<FrameBatch> itsBatches;
    std::uint64_t itsFramesOut = 0;
};

/// Notes what it is told.
class NotedProgress : public Progress {
public:
    void isAt(const PointResult& running) override
    {
        EXPECT_GE(running.tally.blocks, itsBlocks);
        itsBlocks = running.tally.blocks;
    }

    void hasEnded(const PointResult& point) override
    {
        ended.push_back(point.number);
        itsBlocks = 0;
    }

    std::vector<std::size_t> ended;

private:
    std::uint64_t itsBlocks = 0;
};

bool never()
{
    return false;
}

Plan planOf(std::vector<unsigned> iterations, std::vector<int> milliDecibels)
{
    Plan plan;
    plan.points = pointsOf({{6144}, {4}, {1}, {std::nullopt}, std::move(iterations), std::move(milliDecibels)});
    plan.version = "1.2.3";
    plan.command = "morvik ber";
    plan.rules.maxBlocks = 3000;
    return plan;
}

/// The text of results without times.
std::string textOf(const Plan& plan, std::vector<PointResult> points)
{
    for (PointResult& point : points) {
        point.seconds = 0;
    }
    return csvText(resultsOf(plan, points));
}

std::string definition(const Plan& plan)
{
    std::vector<PointResult> points;
    for (std::size_t i = 0; i < plan.points.size(); ++i) {
        if (!isCurveEnded(plan, i, points)) {
            points.push_back(
                {i, countOneByOne(framesOf(i), plan.frames, plan.rules, plan.countsOf(plan.points[i])), 0});
        }
    }
    return textOf(plan, points);
}

TEST(Run, GivesWhatFrameByFrameGives)
{
    Plan plans[4] = {planOf({8}, {0, 500}), planOf({4, 8}, {0}), planOf({3}, {0, 1, 2}), planOf({8}, {0})};
    plans[0].rules.blockErrors = 77;
    plans[1].rules.bitErrors = 1234;
    plans[1].rules.maxBlocks.reset();
    plans[2].eachIteration = true;
    plans[3].frames = {1000, 2345};
    plans[3].rules.maxBlocks.reset();
    for (const Plan& plan : plans) {
        for (const unsigned workers : {1U, 2U, 3U, 16U}) {
            ShufflingWorkers shuffling(plan, workers, workers);
            NotedProgress progress;
            Journal journal(plan, "", Journal::Earlier::refuse);
            EXPECT_TRUE(run(plan, {shuffling, journal, progress, never}));
            EXPECT_EQ(textOf(plan, journal.ended()), definition(plan));
            EXPECT_EQ(progress.ended.size(), plan.points.size());
            EXPECT_TRUE(shuffling.isIdle());
        }
    }
}

TEST(Run, HandsOutNoFramesBehindTheLastThatCanCount)
{
    const Plan plan = planOf({8}, {0});
    ShufflingWorkers workers(plan, 8, 1);
    NotedProgress progress;
    Journal journal(plan, "", Journal::Earlier::refuse);
    run(plan, {workers, journal, progress, never});
    EXPECT_EQ(workers.framesOut(), 3000U);
}

TEST(Run, CountsTheLastFramesThatHaveNumbers)
{
    Plan plan = planOf({8}, {0});
    plan.frames = {UINT64_MAX - 1000, UINT64_MAX};
    plan.rules = StopRules();
    ShufflingWorkers workers(plan, 3, 1);
    NotedProgress progress;
    Journal journal(plan, "", Journal::Earlier::refuse);
    EXPECT_TRUE(run(plan, {workers, journal, progress, never}));
    EXPECT_EQ(textOf(plan, journal.ended()), definition(plan));
}

TEST(Run, HandsOutFewFramesForAPointThatEndsEarly)
{
    Plan plan = planOf({1}, {0});
    plan.rules = StopRules();
    plan.rules.blockErrors = 10;
    ShufflingWorkers workers(plan, 2, 1);
    NotedProgress progress;
    Journal journal(plan, "", Journal::Earlier::refuse);
    run(plan, {workers, journal, progress, never});
    EXPECT_LE(workers.framesOut(), 2000U);
}

TEST(Run, LeavesOutTheRestOfACurveThatHasEnded)
{
    Plan plan = planOf({4, 8}, {0, 1, 2, 3});
    plan.rules.stopBler = 1;  // every point is below it
    ShufflingWorkers workers(plan, 2, 1);
    NotedProgress progress;
    Journal journal(plan, "", Journal::Earlier::refuse);
    EXPECT_TRUE(run(plan, {workers, journal, progress, never}));
    EXPECT_EQ(progress.ended, (std::vector<std::size_t>{0, 4}));
}

TEST(Run, EndsAPointWhenItsTimeIsUpButNotWithoutAFrame)
{
    Plan plan = planOf({8}, {0, 1});
    plan.rules = StopRules();
    plan.rules.maxSeconds = 1e-9;
    ShufflingWorkers workers(plan, 2, 1);
    NotedProgress progress;
    Journal journal(plan, "", Journal::Earlier::refuse);
    EXPECT_TRUE(run(plan, {workers, journal, progress, never}));
    ASSERT_EQ(journal.ended().size(), 2U);
    for (const PointResult& point : journal.ended()) {
        EXPECT_GT(point.tally.blocks, 0U);
        EXPECT_GT(point.seconds, 0);
        morvik::support::expectEqual(point.tally,
                                     countOneByOne(framesOf(point.number), {0, point.tally.blocks}, StopRules(), 1));
    }
}

TEST(Run, InterruptedAnywhereEndsInTheSameResults)
{
    Plan plan = planOf({8}, {0, 1, 2});
    plan.rules.blockErrors = 100;
    const morvik::support::TemporaryFolder folder;
    const std::string output = folder.path("results.csv");
    std::mt19937 random(1);
    int interruptions = 0;
    bool isComplete = false;
    for (auto earlier = Journal::Earlier::refuse; !isComplete; earlier = Journal::Earlier::resume) {
        ASSERT_LT(++interruptions, 1000);
        ShufflingWorkers workers(plan, static_cast<unsigned>(1 + random() % 4), static_cast<unsigned>(interruptions));
        NotedProgress progress;
        Journal journal(plan, output, earlier);
        EXPECT_TRUE(interruptions > 1 || journal.isEmpty());
        int steps = static_cast<int>(random() % 15);
        const auto isInterrupted = [&steps] {
            return steps-- == 0;
        };
        isComplete = run(plan, {workers, journal, progress, isInterrupted, 1e9});
        if (isComplete) {
            EXPECT_EQ(textOf(plan, journal.ended()), definition(plan));
            EXPECT_EQ(progress.ended.size(), 3U) << "points of earlier runs are told, too";
        }
    }
    EXPECT_GT(interruptions, 5);
    EXPECT_EQ(folder.names(), std::vector<std::string>{"results.csv"});
}

TEST(Run, ExtendedAnywhereEndsInTheSameResults)
{
    int extended = 0;
    for (unsigned seed = 1; seed <= 8; ++seed) {
        Plan plan = planOf({2}, {0, 1, 2, 3, 4});
        plan.eachIteration = seed % 2 == 0;
        plan.rules.stopBler = 0.13;  // where about half of the points are
        const morvik::support::TemporaryFolder folder;
        std::mt19937 random(seed);
        auto earlier = Journal::Earlier::refuse;
        for (const unsigned limit : {20U, 50U, 120U, 300U}) {
            plan.rules.maxBlocks = 10 * limit;
            plan.rules.blockErrors = limit;
            plan.command =
                "morvik ber --block-errors " + std::to_string(limit) + " --max-blocks " + std::to_string(10 * limit);
            ShufflingWorkers workers(plan, static_cast<unsigned>(1 + random() % 4), seed);
            NotedProgress progress;
            Journal journal(plan, folder.path("results.json"), earlier);
            earlier = Journal::Earlier::resume;
            int steps = limit == 300 ? 1000000 : static_cast<int>(random() % 6);
            const bool isComplete = run(plan, {workers, journal, progress, [&steps] { return steps-- == 0; }, 1e9});
            if (isComplete) {
                EXPECT_EQ(textOf(plan, journal.ended()), definition(plan));
                extended += limit == 300 ? 1 : 0;
                break;  // for the last frame of results is decoded, and these frames cannot be
            }
        }
    }
    EXPECT_GT(extended, 4);
}

/// Fails after some batches.
class FailingWorkers : public ShufflingWorkers {
public:
    using ShufflingWorkers::ShufflingWorkers;

    std::optional<BatchResult> take(std::chrono::milliseconds patience) override
    {
        if (framesOut() > 1000) {
            throw std::runtime_error("no more");
        }
        return ShufflingWorkers::take(patience);
    }
};

TEST(Run, LeavesACheckpointWhenAWorkerFails)
{
    const Plan plan = planOf({8}, {0});
    const morvik::support::TemporaryFolder folder;
    const std::string output = folder.path("results.csv");
    {
        FailingWorkers workers(plan, 2, 1);
        NotedProgress progress;
        Journal journal(plan, output, Journal::Earlier::refuse);
        EXPECT_THROW(run(plan, {workers, journal, progress, never, 0}), std::runtime_error);
    }
    ShufflingWorkers workers(plan, 2, 1);
    NotedProgress progress;
    Journal journal(plan, output, Journal::Earlier::resume);
    EXPECT_GT(journal.resultSoFar(0).tally.blocks, 0U);
    EXPECT_TRUE(run(plan, {workers, journal, progress, never}));
    EXPECT_EQ(textOf(plan, journal.ended()), definition(plan));
}

}  // namespace
}  // namespace morvik::simulation
