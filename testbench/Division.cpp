// Division: which segment, window, unit and thread of the core works on a trellis step.
#include "Division.h"

#include <algorithm>

#include "src/TDecoder3GPU.h"

namespace morvik {

Division::Division(const TDecoder3GPU& decoder)
    : itsSegments(decoder.itsNT),
      itsSegmentLength(decoder.itsAlphaSegment.front().to),
      itsSegmentsPerUnit(std::max(decoder.itsNT / decoder.itsNumPU, 1U))
{
    for (std::size_t window = 0; window < decoder.itsBetaSegment.size(); window += itsSegments) {
        itsWindowEnds.push_back(decoder.itsBetaSegment[window].from);
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

std::uint32_t Division::units() const
{
    return itsSegments / itsSegmentsPerUnit;
}

StepPlace Division::placeOf(std::uint32_t step) const
{
    const std::uint32_t within = std::min(step, K() - 1);
    const auto end = std::lower_bound(itsWindowEnds.begin(), itsWindowEnds.end(), within % itsSegmentLength);
    StepPlace place;
    place.segment = within / itsSegmentLength;
    place.window = static_cast<std::uint32_t>(end - itsWindowEnds.begin());
    place.unit = place.segment / itsSegmentsPerUnit;
    place.thread = place.segment % itsSegmentsPerUnit;
    return place;
}

}  // namespace morvik
