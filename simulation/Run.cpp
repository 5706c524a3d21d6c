// Run: simulates the points of a plan.
#include "Run.h"

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <optional>
#include <utility>

#include "PointCount.h"

namespace morvik::simulation {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds patience(100);

/// Batches for each worker that are handed out at a time, so that it need not wait for the next.
constexpr unsigned batchesAhead = 4;

/// Batches for each worker by which the count of the frames may lag behind: what the results that wait for a slow
/// worker's may take of the memory.
constexpr unsigned batchesWaiting = 64;

/// A batch takes some milliseconds: long beside what handing it out takes, short beside what people notice.
std::uint32_t largestBatch(const Point& point)
{
    constexpr unsigned bitIterations = 1U << 22;
    return std::max(bitIterations / (point.blockSize * point.iterations), smallestBatch);
}

double secondsSince(Clock::time_point start)
{
    return std::chrono::duration<double>(Clock::now() - start).count();
}

/// When the journal is saved.
class Saving {
public:
    explicit Saving(const RunParts& parts) : itsJournal(parts.journal), itsInterval(parts.secondsBetweenCheckpoints) {}

    void saveIfDue(const std::optional<PointResult>& running)
    {
        if (secondsSince(itsLast) >= itsInterval) {
            itsJournal.save(running);
            itsLast = Clock::now();
        }
    }

private:
    Journal& itsJournal;
    double itsInterval;
    Clock::time_point itsLast = Clock::now();
};

/// The simulation of one point.
class PointRun {
public:
    PointRun(const Plan& plan, const RunParts& parts, Saving& saving, const PointResult& result)
        : itsPlan(plan),
          itsParts(parts),
          itsSaving(saving),
          itsResult(result),
          itsCount(plan.rules, plan.frames, result.tally),
          itsLargestBatch(largestBatch(plan.points[result.number])),
          itsNext(plan.frames.from + itsResult.tally.blocks)
    {
    }

    /// Simulates until the point ends; false if it was interrupted.
    bool go()
    {
        bool isInterrupted = false;
        while (!isInterrupted && !itsCount.isComplete() && !isTimeUp()) {
            handOut();
            takeResult();
            isInterrupted = itsParts.isInterrupted();
        }
        itsParts.workers.forgetAll();
        update();
        return !isInterrupted;
    }

    /// What has been counted.
    const PointResult& result() const
    {
        return itsResult;
    }

private:
    void handOut()
    {
        const unsigned workers = itsParts.workers.count();
        const std::uint64_t counted = itsPlan.frames.from + itsCount.tally().blocks;
        const std::uint64_t furthestAhead = std::uint64_t{batchesWaiting} * workers * itsLargestBatch;
        const std::uint64_t end = itsPlan.frames.from + itsPlan.mostFrames();
        while (itsBatchesOut < batchesAhead * workers && itsNext < end && itsNext - counted < furthestAhead) {
            const auto count = static_cast<std::uint32_t>(std::min<std::uint64_t>(batchSize(), end - itsNext));
            itsParts.workers.handOut({itsResult.number, itsNext, count});
            itsNext += count;
            itsBatchesOut += 1;
        }
    }

    /// Batches grow with the point: one that ends early shall not have many frames handed out for nothing.
    std::uint32_t batchSize() const
    {
        const std::uint64_t share =
            (itsNext - itsPlan.frames.from) / (std::uint64_t{2} * batchesAhead * itsParts.workers.count());
        const std::uint64_t size = std::clamp<std::uint64_t>(share, smallestBatch, itsLargestBatch);
        const std::uint64_t unaligned = itsNext % smallestBatch;  // of a run that was resumed anywhere
        return static_cast<std::uint32_t>(size / smallestBatch * smallestBatch - unaligned);
    }

    void takeResult()
    {
        auto result = itsParts.workers.take(patience);
        if (result) {
            itsCount.take(*std::move(result));
            itsBatchesOut -= 1;
        }
        update();
        itsParts.progress.isAt(itsResult);
        itsSaving.saveIfDue(itsResult);
    }

    void update()
    {
        itsResult.tally = itsCount.tally();
        itsResult.seconds = itsSecondsBefore + secondsSince(itsStart);
    }

    bool isTimeUp() const
    {
        const auto& limit = itsPlan.rules.maxSeconds;
        return limit && itsResult.tally.blocks > 0 && itsResult.seconds >= *limit;
    }

    const Plan& itsPlan;
    const RunParts& itsParts;
    Saving& itsSaving;
    PointResult itsResult;
    PointCount itsCount;
    std::uint32_t itsLargestBatch;
    std::uint64_t itsNext;       // the first frame that has not been handed out
    unsigned itsBatchesOut = 0;  // handed out, and not taken back
    double itsSecondsBefore = itsResult.seconds;
    Clock::time_point itsStart = Clock::now();
};

}  // namespace

bool run(const Plan& plan, const RunParts& parts)
{
    Journal& journal = parts.journal;
    journal.begin();
    Saving saving(parts);
    for (const PointResult& point : journal.ended()) {
        parts.progress.hasEnded(point);
    }
    for (std::size_t point = nextPoint(plan, journal.ended()); point < plan.points.size();
         point = nextPoint(plan, journal.ended())) {
        PointRun pointRun(plan, parts, saving, journal.resultSoFar(point));
        if (!pointRun.go()) {
            journal.save(pointRun.result());
            return false;
        }
        journal.end(pointRun.result());
        saving.saveIfDue(std::nullopt);
        parts.progress.hasEnded(pointRun.result());
    }
    journal.complete();
    return true;
}

}  // namespace morvik::simulation
