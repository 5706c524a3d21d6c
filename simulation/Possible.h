// Possible: plausibility checks of counts read from files.
#ifndef MORVIK_SIMULATION_POSSIBLE_H
#define MORVIK_SIMULATION_POSSIBLE_H

#include <cstdint>
#include <optional>
#include <string>

#include "Frames.h"
#include "Point.h"
#include "Tally.h"

namespace morvik::simulation {

/// Years of work, yet small enough to compute rates and bounds: products with the bits of a code block fit in 64 bits.
constexpr std::uint64_t mostBlocks = std::uint64_t{1} << 48;

/// Checks the errors and clipped soft values of these frames of a point. Returns what is impossible, in words that
/// begin with the column's name; nothing if all is possible.
std::optional<std::string> impossibleCount(const FrameSet& frames,
                                           const Point& point,
                                           const ErrorCounts& errors,
                                           std::uint64_t clipped);

/// Whether a run can take this long.
bool isPossibleTime(double seconds);

}  // namespace morvik::simulation

#endif
