// NoiseSampler: Gaussian noise in integers, the same on every machine.
//
// A number is 256 d + u + v - 255: d is drawn from a discrete Gaussian distribution, exactly; u and v are uniform
// bytes, whose sum spreads each value of d as a triangle. The result has a Gaussian's moments but for 1e-7 of the
// fourth, and ends at 7 standard deviations, which one number in 4e11 would exceed.
#ifndef MORVIK_LINK_CHANNEL_NOISESAMPLER_H
#define MORVIK_LINK_CHANNEL_NOISESAMPLER_H

#include <cstdint>
#include <vector>

#include "link/random/AliasTable.h"
#include "link/random/Random.h"
#include "link/random/RandomBatch.h"
#include "link/random/SamplerForm.h"

namespace morvik::link {

/// The standard deviation of a number: sqrt(256^2 18^2 + (256^2 - 1) / 6).
constexpr double levelDeviation = 4609.1850147286927;

/// The largest absolute value.
constexpr int mostNoise = 126 * 256 + 255;

/// The probabilities of d times 2^48, those of negative ones in the upper half.
AliasTable::Weights coarseNoise();

class NoiseSampler {
public:
    /// `form` is for tests.
    explicit NoiseSampler(const RandomKey& key, const SamplerForm& form = samplerForms().front());

    /// Draws numbers `first` to `first` + `count` - 1 of a frame, all below 2^24; `first` is a multiple of 8. They do
    /// not depend on how a range is split.
    void draw(const FrameRandom& random, std::uint32_t first, std::uint32_t count, std::int16_t* numbers);

    /// Adds the same numbers, each times `unit`, to floats.
    void add(const FrameRandom& random, std::uint32_t first, std::uint32_t count, float unit, float* sums);

private:
    void drawPart(const FrameRandom& random, std::uint32_t first, std::uint32_t count);
    void decide(const FrameRandom& random, std::uint32_t first, std::size_t groups);

    AliasTable itsTable;
    RandomKey itsKey;
    SamplerForm itsForm;
    RandomBatch itsRefinements;
    std::vector<std::int16_t> itsNumbers;
    std::vector<std::int8_t> itsLevels;  ///< d
    std::vector<std::uint64_t> itsUndecided;
    std::vector<std::uint32_t> itsOpen;  ///< undecided numbers
};

}  // namespace morvik::link

#endif
