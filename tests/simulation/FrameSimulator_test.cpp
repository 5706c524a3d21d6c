// FrameSimulator, ThreadWorkers and Replay: what comes of frames is what decoding them one at a time gives.
#include "simulation/FrameSimulator.h"

#include <gtest/gtest.h>

#include <map>
#include <sstream>
#include <stdexcept>

#include "base/Thousandths.h"
#include "link/FrameSource.h"
#include "simulation/Replay.h"
#include "simulation/ThreadWorkers.h"
#include "support/Blocks.h"

namespace morvik::simulation {
namespace {

/// Wrong bits of each frame after each count of iterations, decoded one at a time.
BatchResult oneByOne(const Plan& plan, const FrameBatch& batch)
{
    const Point& point = plan.points[batch.point];
    morvik::link::FrameSource source(
        point.blockSize, point.milliDecibels, morvik::base::fromThousandths(point.milliScale), plan.seed);
    morvik::link::Frames frames;
    BatchResult result;
    result.batch = batch;
    for (std::uint64_t frame = batch.first; frame < batch.first + batch.count; ++frame) {
        source.make(frame, 1, frames);
        const std::size_t counts = plan.countsOf(point);
        for (std::size_t i = 0; i < counts; ++i) {
            morvik::blocks::Decoder decoder(static_cast<int>(point.numPu), static_cast<int>(point.algorithm));
            morvik::blocks::Block block;
            block.sys.assign(frames.streams[0].begin(), frames.streams[0].end());
            block.par1.assign(frames.streams[1].begin(), frames.streams[1].end());
            block.par2.assign(frames.streams[2].begin(), frames.streams[2].end());
            const auto iterations = point.iterations - static_cast<unsigned>(counts - 1 - i);
            const auto bits = decoder.decode(block, iterations).bits;
            std::uint32_t wrong = 0;
            for (std::size_t bit = 0; bit < bits.size(); ++bit) {
                wrong += bits[bit] != frames.sent[bit] ? 1U : 0U;
            }
            result.wrongBits.push_back(wrong);
        }
        result.clipped.push_back(frames.clipped[0]);
    }
    return result;
}

Plan planOf(bool eachIteration)
{
    Plan plan;
    plan.points = pointsOf({{40, 512}, {2, 8}, {0, 1, 2}, {std::nullopt, 40000}, {3}, {0}});
    plan.eachIteration = eachIteration;
    plan.seed = 3;
    return plan;
}

void expectEqual(const BatchResult& got, const BatchResult& expected)
{
    EXPECT_EQ(got.batch.point, expected.batch.point);
    EXPECT_EQ(got.batch.first, expected.batch.first);
    EXPECT_EQ(got.batch.count, expected.batch.count);
    EXPECT_EQ(got.wrongBits, expected.wrongBits);
    EXPECT_EQ(got.clipped, expected.clipped);
}

/// All results, in the order of points.
std::map<std::size_t, BatchResult> takeAll(Workers& workers, std::size_t batches)
{
    std::map<std::size_t, BatchResult> results;
    for (int patience = 0; results.size() < batches && patience < 6000; ++patience) {
        auto result = workers.take(std::chrono::milliseconds(100));
        if (result) {
            const std::size_t point = result->batch.point;
            results.emplace(point, *std::move(result));
        }
    }
    return results;
}

TEST(FrameSimulator, GivesWhatDecodingFrameByFrameGives)
{
    for (const bool eachIteration : {false, true}) {
        const Plan plan = planOf(eachIteration);
        FrameSimulator simulator(plan, "");
        for (std::size_t point = 0; point < plan.points.size(); ++point) {
            SCOPED_TRACE(point);
            const FrameBatch batch = {point, (std::uint64_t{1} << 40) + 5, 20};
            BatchResult result = simulator.begin(batch);
            while (simulator.proceed(result)) {
            }
            expectEqual(result, oneByOne(plan, batch));
        }
    }
}

TEST(FrameSimulator, TakesBatchesOfAnySize)
{
    const Plan plan = planOf(false);
    FrameSimulator simulator(plan, "");
    BatchResult whole = simulator.begin({0, 0, 5000});
    int calls = 0;
    while (simulator.proceed(whole)) {
        ++calls;
    }
    EXPECT_GT(calls, 1) << "a batch can be left";
    BatchResult parts;
    for (std::uint32_t first = 0; first < 5000; first += 1000) {
        BatchResult part = simulator.begin({0, first, 1000});
        while (simulator.proceed(part)) {
        }
        parts.wrongBits.insert(parts.wrongBits.end(), part.wrongBits.begin(), part.wrongBits.end());
        parts.clipped.insert(parts.clipped.end(), part.clipped.begin(), part.clipped.end());
    }
    EXPECT_EQ(whole.wrongBits, parts.wrongBits);
    EXPECT_EQ(whole.clipped, parts.clipped);
}

TEST(FrameSimulator, GivesTheSameWithEachInstructionSet)
{
    const Plan plan = planOf(true);
    const FrameBatch batch = {plan.points.size() - 1, 0, 10};
    for (const char* name : {"generic", "component"}) {
        FrameSimulator simulator(plan, name);
        BatchResult result = simulator.begin(batch);
        while (simulator.proceed(result)) {
        }
        expectEqual(result, oneByOne(plan, batch));
    }
}

TEST(ThreadWorkers, GiveAllResults)
{
    const Plan plan = planOf(false);
    for (const unsigned threads : {1U, 3U}) {
        ThreadWorkers workers(plan, threads, "");
        EXPECT_EQ(workers.count(), threads);
        for (std::size_t point = 0; point < plan.points.size(); ++point) {
            workers.handOut({point, 100, 10});
        }
        const auto results = takeAll(workers, plan.points.size());
        ASSERT_EQ(results.size(), plan.points.size());
        for (const auto& [point, result] : results) {
            expectEqual(result, oneByOne(plan, {point, 100, 10}));
        }
        EXPECT_FALSE(workers.take(std::chrono::milliseconds(0)));
    }
}

TEST(ThreadWorkers, AreNoMoreThanThereAreBatches)
{
    Plan plan = planOf(false);
    plan.rules.maxBlocks = 5;
    EXPECT_EQ(ThreadWorkers(plan, 3, "").count(), 1U);
    plan.rules.maxBlocks = 65;
    EXPECT_EQ(ThreadWorkers(plan, 3, "").count(), 2U);
    plan.frames = {7, 71};
    EXPECT_EQ(ThreadWorkers(plan, 3, "").count(), 1U);
    plan.frames = {0, UINT64_MAX};
    plan.rules.maxBlocks.reset();
    EXPECT_EQ(ThreadWorkers(plan, 3, "").count(), 3U);
}

TEST(ThreadWorkers, GiveNothingOfWhatIsForgotten)
{
    const Plan plan = planOf(false);
    ThreadWorkers workers(plan, 2, "");
    for (std::size_t point = 0; point < plan.points.size(); ++point) {
        workers.handOut({point, 0, 1000});
    }
    workers.forgetAll();
    workers.handOut({7, 0, 3});
    const auto results = takeAll(workers, 1);
    ASSERT_EQ(results.size(), 1U);
    expectEqual(results.begin()->second, oneByOne(plan, {7, 0, 3}));
    EXPECT_FALSE(workers.take(std::chrono::milliseconds(50)));
}

TEST(ThreadWorkers, PassOnWhatGoesWrong)
{
    Plan plan = planOf(false);
    plan.points[0].numPu = 3;
    ThreadWorkers workers(plan, 2, "");
    workers.handOut({0, 0, 10});
    EXPECT_THROW(workers.take(std::chrono::seconds(60)), std::runtime_error);
}

TEST(Replay, WritesWhatWasSentAndReceived)
{
    const Plan plan = planOf(false);
    const std::uint64_t frame = std::uint64_t{1} << 33;
    const ReplayedTexts texts = replay(plan, 2, frame, "");
    EXPECT_EQ(texts.wrongBits, oneByOne(plan, {2, frame, 1}).wrongBits[0]);

    const Point& point = plan.points[2];
    morvik::link::FrameSource source(
        point.blockSize, point.milliDecibels, morvik::base::fromThousandths(point.milliScale), plan.seed);
    morvik::link::Frames frames;
    source.make(frame, 1, frames);
    std::ostringstream soft;
    soft << "block,rsc1_sys,rsc1_par,rsc2_par\n";
    for (std::size_t i = 0; i < frames.streams[0].size(); ++i) {
        soft << "8589934592," << int{frames.streams[0][i]} << ',' << int{frames.streams[1][i]} << ','
             << int{frames.streams[2][i]} << '\n';
    }
    EXPECT_EQ(texts.softValues, soft.str());
    ASSERT_EQ(texts.sentBits.size(), 41U);
    for (std::size_t i = 0; i < 40; ++i) {
        EXPECT_EQ(texts.sentBits[i] - '0', frames.sent[i]);
    }
}

}  // namespace
}  // namespace morvik::simulation
