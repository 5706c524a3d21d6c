// PointCount: counts a point's frames in the order of their numbers, whatever order results arrive in.
#include "PointCount.h"

#include <utility>

namespace morvik::simulation {

PointCount::PointCount(const StopRules& rules, FrameRange frames, Tally tally)
    : itsRules(rules),
      itsFrames(frames),
      itsTally(std::move(tally)),
      itsIsComplete(frames.from + itsTally.blocks >= frames.to ||
                    isReached(rules, itsTally.blocks, itsTally.errors.back()))
{
}

void PointCount::take(BatchResult result)
{
    const std::uint64_t first = result.batch.first;
    itsWaiting.emplace(first, std::move(result));
    while (!itsIsComplete && !itsWaiting.empty() && itsWaiting.begin()->first == itsFrames.from + itsTally.blocks) {
        countInOrder(itsWaiting.begin()->second);
        itsWaiting.erase(itsWaiting.begin());
    }
}

bool PointCount::isComplete() const
{
    return itsIsComplete;
}

const Tally& PointCount::tally() const
{
    return itsTally;
}

void PointCount::countInOrder(const BatchResult& result)
{
    const std::uint32_t* wrongBits = result.wrongBits.data();
    auto reception = result.receptions.begin();
    for (std::uint32_t i = 0; i < result.batch.count && !itsIsComplete; ++i) {
        const std::uint64_t frame = result.batch.first + i;
        for (ErrorCounts& errors : itsTally.errors) {
            errors.add(frame, *wrongBits++);
            if (reception != result.receptions.end()) {
                errors.reception.add(*reception++);
            }
        }
        itsTally.clipped += result.clipped[i];
        itsTally.blocks += 1;
        itsIsComplete = frame + 1 == itsFrames.to || isReached(itsRules, itsTally.blocks, itsTally.errors.back());
    }
}

}  // namespace morvik::simulation
