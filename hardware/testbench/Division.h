// Division: which segment, window, unit and thread of the core works on a trellis step.
#ifndef MORVIK_HARDWARE_TESTBENCH_DIVISION_H
#define MORVIK_HARDWARE_TESTBENCH_DIVISION_H

#include <cstdint>
#include <vector>

class TDecoder3GPU;

namespace morvik {

/// Trellis steps of the termination tail.
constexpr std::uint32_t tailSteps = 3;

/// A window of the backward recursion, which runs from its last step down to its first.
struct Window {
    std::uint32_t row = 0;  ///< which window of its segment, from the segment's start
    std::uint32_t segment = 0;
    std::uint32_t first = 0;  ///< trellis step
    std::uint32_t last = 0;
};

/// Where a trellis step is computed.
struct StepPlace {
    std::uint32_t segment = 0;
    std::uint32_t window = 0;  ///< of the segment, from its start: the row in which the core takes it
    std::uint32_t unit = 0;
    std::uint32_t thread = 0;  ///< of the unit
};

/// How the core cuts a block (docs/arithmetic.md, rules 17 and 18). Neighbouring segments share a unit; where there are
/// fewer segments than threads, they are dealt to as many units as there are, since those compute at the same time.
class Division {
public:
    /// As the decoder has cut its current block.
    explicit Division(const TDecoder3GPU& decoder);

    std::uint32_t K() const;
    std::uint32_t segments() const;
    std::uint32_t segmentLength() const;

    /// In the order in which they are computed: one of each segment, row by row.
    const std::vector<Window>& windows() const;

    /// Units that have a segment.
    std::uint32_t units() const;

    /// Of a step from 0 to K + 2; the tail belongs to the last window.
    StepPlace placeOf(std::uint32_t step) const;

private:
    std::uint32_t itsSegments;
    std::uint32_t itsSegmentLength;
    std::uint32_t itsSegmentsPerUnit;
    std::vector<Window> itsWindows;
};

}  // namespace morvik

#endif
