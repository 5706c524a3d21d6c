// CompleteResults: whether a run needs to be run, told from a result file.
#ifndef MORVIK_SIMULATION_COMPLETERESULTS_H
#define MORVIK_SIMULATION_COMPLETERESULTS_H

#include <optional>
#include <vector>

#include "Plan.h"

namespace simulation {

/// What the points of the plan ended with, from the results of a complete run; nothing if they are those of another
/// plan, or of a part of a run.
std::optional<std::vector<PointResult>> pointsOfComplete(const Plan& plan, const Results& results);

}  // namespace simulation

#endif
