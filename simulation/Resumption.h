// Resumption: what a run can go on with of what an earlier one has counted.
#ifndef MORVIK_SIMULATION_RESUMPTION_H
#define MORVIK_SIMULATION_RESUMPTION_H

#include <string>
#include <vector>

#include "Checkpoint.h"
#include "Plan.h"

namespace morvik::simulation {

/// Where a run starts, so that it ends with the counts of a run from the beginning.
struct Standing {
    std::vector<PointResult> ended;  // the first points of the plan
    std::vector<PointResult> begun;  // later ones, in the order of the plan; frames are missing at the first of them
};

/// From a checkpoint of the same run, or of one with smaller limits. Throws Error, which opens with the file's name,
/// unless the points are those of the plan, in its order, with counts that can be.
Standing standingOf(const Plan& plan, const Checkpoint& checkpoint, const std::string& fileName);

/// From the results of a complete run, maybe of one with smaller limits. CSV does not tell what these were, and it need
/// not: rows have all that was counted, and the last frame of a point is simulated once more to see whether a limit of
/// the plan was met before it. Throws Error, which opens with the file's name, if so, or if the rows are those of
/// another run, or of a part of one.
Standing standingOf(const Plan& plan, const Results& results, const std::string& fileName);

}  // namespace morvik::simulation

#endif
