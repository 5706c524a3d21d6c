// Possible: whether numbers that were read from a file can have been counted.
#ifndef MORVIK_SIMULATION_POSSIBLE_H
#define MORVIK_SIMULATION_POSSIBLE_H

#include <cstdint>
#include <optional>
#include <string>

#include "Frames.h"
#include "Tally.h"

namespace morvik::simulation {

/// Years of work, and so few that rates and bounds can be computed: products with the bits of a block stay within 64
/// bits.
constexpr std::uint64_t mostBlocks = std::uint64_t{1} << 48;

/// Which of the numbers cannot be the errors, and the clipped soft values, of these frames of K bits, in words that
/// begin with the name of its column; nothing if they can all be.
std::optional<std::string> impossibleCount(const FrameSet& frames,
                                           unsigned K,
                                           const ErrorCounts& errors,
                                           std::uint64_t clipped);

/// Whether a run can have taken so long.
bool isPossibleTime(double seconds);

}  // namespace morvik::simulation

#endif
