// SoftValueSampler: draws the soft values of sent bits straight from their distribution.
#ifndef MORVIK_LINK_SOFTVALUESAMPLER_H
#define MORVIK_LINK_SOFTVALUESAMPLER_H

#include <cstdint>
#include <vector>

#include "AliasTable.h"
#include "Channel.h"
#include "Random.h"
#include "SamplerForm.h"

namespace morvik::link {

class SoftValueSampler {
public:
    SoftValueSampler(const RoundedDistribution& distribution, const SamplerForm& form);

    /// Draws the values of a frame's `count` bits, 64 to a word, of which the first is number `first` of the frame, a
    /// multiple of 8. Returns how many were clipped.
    std::uint32_t draw(
        const FrameKey& frame, std::uint32_t first, const std::uint64_t* bits, unsigned count, std::int8_t* values);

private:
    SoftValue atEnd(bool top, bool bit, std::uint32_t random) const;

    AliasTable itsTable;
    RoundedDistribution itsDistribution;
    SamplerForm itsForm;
    std::vector<std::uint64_t> itsUndecided;
    std::vector<std::uint64_t> itsEnds;
};

}  // namespace morvik::link

#endif
