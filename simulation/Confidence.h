// Confidence: confidence intervals of simulated error rates.
#ifndef MORVIK_SIMULATION_CONFIDENCE_H
#define MORVIK_SIMULATION_CONFIDENCE_H

#include <cstdint>

#include "Tally.h"

namespace morvik::simulation {

/// A 95 % confidence interval. One-sided ("below `high`", "above `low`") where the observed rate is 0 or 1.
struct Bounds {
    double low = 0;
    double high = 1;
};

/// The Clopper-Pearson interval for `events` out of `trials`. Both may be fractional, as effective sizes are.
Bounds clopperPearson(double events, double trials);

/// The interval of the block error rate: blocks are independent trials.
Bounds blockErrorBounds(const ErrorCounts& errors, std::uint64_t blocks);

/// The interval of the bit error rate.
///
/// Bit errors cluster in blocks: treating bits as independent trials would give far too narrow intervals. By the method
/// of Korn and Graubard (Survey Methodology 24, 1998), the number of trials is the effective sample size: the number of
/// independent bits whose rate would have the variance that the blocks show, corrected for estimating that variance
/// from few blocks.
Bounds bitErrorBounds(const ErrorCounts& errors, std::uint64_t blocks, unsigned blockSize);

}  // namespace morvik::simulation

#endif
