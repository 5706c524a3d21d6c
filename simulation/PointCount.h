// PointCount: counts a point's frames in the order of their numbers, whatever order results arrive in.
#ifndef MORVIK_SIMULATION_POINTCOUNT_H
#define MORVIK_SIMULATION_POINTCOUNT_H

#include <cstdint>
#include <map>

#include "Frames.h"
#include "StopRules.h"
#include "Tally.h"
#include "Workers.h"

namespace morvik::simulation {

/// Counts frames until a stop rule ends the point or the frames run out. Results of later frames wait for those before
/// them.
class PointCount {
public:
    /// Continues from a tally of the first frames of `frames`. `rules` must outlive the count.
    PointCount(const StopRules& rules, FrameRange frames, Tally tally);

    /// Takes the result of a batch. Batches must not overlap.
    void take(BatchResult result);

    /// Whether the last frame that counts has been counted.
    bool isComplete() const;

    const Tally& tally() const;

private:
    void countInOrder(const BatchResult& result);

    const StopRules& itsRules;
    FrameRange itsFrames;
    Tally itsTally;
    std::map<std::uint64_t, BatchResult> itsWaiting;  // by first frame
    bool itsIsComplete;
};

}  // namespace morvik::simulation

#endif
