// Warnings: what a user should know of a run beside its results.
#ifndef MORVIK_SIMULATION_WARNINGS_H
#define MORVIK_SIMULATION_WARNINGS_H

#include <string>
#include <vector>

#include "Plan.h"

namespace morvik::simulation {

/// A line for the formats whose code rate is above that at which a terminal may leave out decoding (3GPP TS 36.213,
/// 7.1.7): how many have it, and the highest. Empty if none has.
std::string highRateWarning(const Plan& plan);

/// A line for the narrowest soft buffer that the default scale fills up too soon. Empty if there is none.
std::string narrowBufferWarning(const Plan& plan);

/// A line for the curves that have not fallen over the range of Es/N0 or Eb/N0 that was chosen for them. Empty if all
/// have.
std::string unfallenWarning(const Plan& plan, const std::vector<PointResult>& ended);

}  // namespace morvik::simulation

#endif
