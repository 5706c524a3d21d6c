// Replay: reproduces one frame of a run for inspection.
#ifndef MORVIK_SIMULATION_REPLAY_H
#define MORVIK_SIMULATION_REPLAY_H

#include <cstddef>
#include <cstdint>
#include <string>

#include "Plan.h"

namespace morvik::simulation {

/// A frame as texts in the formats of `morvik decode`.
struct ReplayedTexts {
    std::string softValues;
    std::string sentBits;
    std::uint32_t wrongBits = 0;  // left by the decoder of the point
};

/// Makes the frame of the point and decodes it. For the instruction set, see FrameSimulator.
ReplayedTexts replay(const Plan& plan, std::size_t point, std::uint64_t frame, const std::string& instructionSet);

}  // namespace morvik::simulation

#endif
