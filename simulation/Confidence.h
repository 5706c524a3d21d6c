// Confidence: how far off a simulated error rate may be.
#ifndef MORVIK_SIMULATION_CONFIDENCE_H
#define MORVIK_SIMULATION_CONFIDENCE_H

#include <cstdint>

#include "Tally.h"

namespace morvik::simulation {

/// A confidence interval of 95 %. Where the rate seen is 0 or 1 it is one-sided: "below `high`", "above `low`".
struct Bounds {
    double low = 0;
    double high = 1;
};

/// The interval of Clopper and Pearson for a rate of which so many of so many trials were events. Both may be
/// fractions, as effective sizes are.
Bounds clopperPearson(double events, double trials);

/// The interval of the block error rate: blocks are independent trials.
Bounds blockErrorBounds(const ErrorCounts& errors, std::uint64_t blocks);

/// The interval of the bit error rate.
///
/// The bits of a block fail together, so they are not independent trials: taking them as such would give intervals
/// that are far too narrow. By the method of Korn and Graubard (Survey Methodology 24, 1998), the number of trials
/// is the one that a rate from independent bits would need for the variance that the blocks show, with the
/// correction for the variance being estimated from few blocks.
Bounds bitErrorBounds(const ErrorCounts& errors, std::uint64_t blocks, unsigned blockSize);

}  // namespace morvik::simulation

#endif
