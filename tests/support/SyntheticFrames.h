// SyntheticFrames: frames whose errors follow from their numbers, without a decoder, and their count one frame at a
// time, which defines what counts at a point.
#ifndef MORVIK_TESTS_SUPPORT_SYNTHETICFRAMES_H
#define MORVIK_TESTS_SUPPORT_SYNTHETICFRAMES_H

#include <cstddef>
#include <cstdint>

#include "simulation/Frames.h"
#include "simulation/StopRules.h"
#include "simulation/Tally.h"
#include "simulation/Workers.h"

namespace morvik::support {

class SyntheticFrames {
public:
    explicit SyntheticFrames(std::uint32_t seed) : itsSeed(seed) {}

    /// Wrong bits of a frame at one of the iteration counts under test.
    std::uint32_t wrongBits(std::uint64_t frame, std::size_t count) const;
    std::uint32_t clipped(std::uint64_t frame) const;

    /// The result of a batch.
    simulation::BatchResult result(const simulation::FrameBatch& batch, std::size_t counts) const;

private:
    std::uint32_t itsSeed;
};

/// Counts the frames of a point one by one until a stop rule ends it.
simulation::Tally countOneByOne(const SyntheticFrames& frames,
                                simulation::FrameRange range,
                                const simulation::StopRules& rules,
                                std::size_t counts);

void expectEqual(const simulation::Tally& got, const simulation::Tally& expected);

}  // namespace morvik::support

#endif
