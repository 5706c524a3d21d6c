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

/// Batches handed out in advance for each worker, so that it need not wait.
constexpr unsigned batchesAhead = 4;

/// Batches per worker by which counting may lag behind. Bounds the memory of results that wait for a slow worker's.
constexpr unsigned batchesWaiting = 64;

/// A batch takes some milliseconds: long compared with handing it out, short compared with what people notice.
std::uint32_t largestBatch(const Point& point)
{
    constexpr std::uint64_t bitIterations = 1U << 22;
    const std::uint64_t of = std::uint64_t{point.blockSize} * codeBlocksOf(point) * point.iterations;
    return std::max(static_cast<std::uint32_t>(bitIterations / of), smallestBatchOf(point));
}

double secondsSince(Clock::time_point start)
{
    return std::chrono::duration<double>(Clock::now() - start).count();
}

/// Saves the journal at intervals.
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

/// Simulates one point.
class PointRun {
public:
    PointRun(const Plan& plan, const RunParts& parts, Saving& saving, const PointResult& result)
        : itsPlan(plan),
          itsParts(parts),
          itsSaving(saving),
          itsResult(result),
          itsCount(plan.rules, plan.frames, result.tally),
          itsSmallestBatch(smallestBatchOf(plan.points[result.number])),
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

    /// The counts so far.
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

    /// Batches grow with the point, so that one that ends early wastes few frames.
    std::uint32_t batchSize() const
    {
        const std::uint64_t share =
            (itsNext - itsPlan.frames.from) / (std::uint64_t{2} * batchesAhead * itsParts.workers.count());
        const std::uint64_t size = std::clamp<std::uint64_t>(share, itsSmallestBatch, itsLargestBatch);
        const std::uint64_t unaligned = itsNext % itsSmallestBatch;  // if resumed within a batch
        return static_cast<std::uint32_t>(size / itsSmallestBatch * itsSmallestBatch - unaligned);
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
    std::uint32_t itsSmallestBatch;
    std::uint32_t itsLargestBatch;
    std::uint64_t itsNext;       // the first frame not yet handed out
    unsigned itsBatchesOut = 0;  // handed out, not yet returned
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
