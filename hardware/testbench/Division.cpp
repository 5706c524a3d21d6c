// Division: which segment, window, unit and thread of the core works on a trellis step.
#include "Division.h"

#include <algorithm>
#include <cstddef>

#include "src/TDecoder3GPU.h"

namespace morvik {

Division::Division(const TDecoder3GPU& decoder)
    : itsSegments(decoder.itsNT),
      itsSegmentLength(decoder.itsAlphaSegment.front().to),
      itsSegmentsPerUnit(std::max(decoder.itsNT / decoder.itsNumPU, 1U))
{
    for (const TDecoder3GPU::ABSegment& each : decoder.itsBetaSegment) {
        Window window;
        window.row = static_cast<std::uint32_t>(itsWindows.size()) / itsSegments;
        window.segment = each.from / itsSegmentLength;
        window.first = itsWindows.empty() ? 0 : each.to + 1;  // the block's first window ends at its own step 0
        window.last = each.from;
        itsWindows.push_back(window);
    }
}

std::uint32_t Division::K() const
{
    return itsSegments * itsSegmentLength;
}

std::uint32_t Division::segments() const
{
    return itsSegments;
}

std::uint32_t Division::segmentLength() const
{
    return itsSegmentLength;
}

const std::vector<Window>& Division::windows() const
{
    return itsWindows;
}

std::uint32_t Division::units() const
{
    return itsSegments / itsSegmentsPerUnit;
}

StepPlace Division::placeOf(std::uint32_t step) const
{
    const std::uint32_t within = std::min(step, K() - 1);
    StepPlace place;
    place.segment = within / itsSegmentLength;
    while (itsWindows[std::size_t{place.window} * itsSegments].last < within % itsSegmentLength) {
        ++place.window;
    }
    place.unit = place.segment / itsSegmentsPerUnit;
    place.thread = place.segment % itsSegmentsPerUnit;
    return place;
}

}  // namespace morvik
