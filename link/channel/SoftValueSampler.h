// SoftValueSampler: draws the soft values of transmitted bits directly from their distribution.
#ifndef MORVIK_LINK_CHANNEL_SOFTVALUESAMPLER_H
#define MORVIK_LINK_CHANNEL_SOFTVALUESAMPLER_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "Channel.h"
#include "link/random/AliasTable.h"
#include "link/random/Random.h"
#include "link/random/RandomBatch.h"
#include "link/random/SamplerForm.h"

namespace morvik::link {

/// Use: add the wanted values, of any frames, then draw them all at once.
class SoftValueSampler {
public:
    SoftValueSampler(const RoundedDistribution& distribution, const RandomKey& key, const SamplerForm& form);

    /// Adds the values of `count` bits of a frame, 64 per word. `number` is the index of the first one within the
    /// frame, a multiple of 8. Clipped values will be counted in `clipped`.
    void put(const FrameRandom& random,
             std::uint32_t number,
             const std::uint64_t* bits,
             unsigned count,
             std::int8_t* values,
             std::uint32_t& clipped);

    /// The number of groups added.
    std::size_t size() const
    {
        return itsGroupCount;
    }

    /// Draws all added values.
    void draw();

private:
    /// A value that needs its own random block: value i of group g is 64 g + i.
    using OpenValue = std::uint32_t;

    void collect(std::uint64_t ValueGroup::*marks);
    void decide(OpenValue open, std::uint32_t random);
    void divideEnd(OpenValue open, std::uint32_t random);

    AliasTable itsTable;
    RoundedDistribution itsDistribution;
    RandomKey itsKey;
    SamplerForm itsForm;
    std::vector<ValueGroup> itsGroups;
    std::size_t itsGroupCount = 0;  ///< used part of itsGroups
    std::vector<OpenValue> itsOpen;
    RandomBatch itsRefinements;
};

}  // namespace morvik::link

#endif
