// StopRules: when to end a point and a curve.
#ifndef MORVIK_SIMULATION_STOPRULES_H
#define MORVIK_SIMULATION_STOPRULES_H

#include <cstdint>
#include <optional>

#include "Tally.h"

namespace morvik::simulation {

/// A point ends after the first frame, in the order of their numbers, that reaches one of its limits. All limits but
/// the time depend on the frames alone, so that the same frames count whatever runs in parallel.
struct StopRules {
    std::optional<std::uint64_t> blockErrors;
    std::optional<std::uint64_t> bitErrors;
    std::optional<std::uint64_t> maxBlocks;
    std::optional<double> maxSeconds;  // per point; ends it after the frames counted by then
    double stopBler = 0;               // a curve ends after its first point with a block error rate below this
};

/// Whether one of the limits on blocks and errors is reached. `errors` are those of the last iteration.
bool isReached(const StopRules& rules, std::uint64_t blocks, const ErrorCounts& errors);

/// The progress towards the nearest limit, 0 to 1.
double progressOf(const StopRules& rules, std::uint64_t blocks, const ErrorCounts& errors, double seconds);

}  // namespace morvik::simulation

#endif
