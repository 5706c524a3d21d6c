// Resumption: what a run can reuse of an earlier run's counts.
#ifndef MORVIK_SIMULATION_RESUMPTION_H
#define MORVIK_SIMULATION_RESUMPTION_H

#include <string>
#include <vector>

#include "Checkpoint.h"
#include "Plan.h"

namespace morvik::simulation {

/// Where a run resumes, so that it ends with the same counts as an uninterrupted run.
struct Standing {
    std::vector<PointResult> ended;  // the first points of the plan
    std::vector<PointResult> begun;  // later ones, in plan order; the first of them lacks frames
};

/// Resumes from a checkpoint of the same run, or of one with smaller limits. Throws Error, prefixed with the file's
/// name, unless the points are the plan's, in its order, with possible counts.
Standing standingOf(const Plan& plan, const Checkpoint& checkpoint, const std::string& fileName);

/// Resumes from the results of a complete run, possibly one with smaller limits. CSV does not record these limits, and
/// need not: rows have all counts, and the last frame of a point is simulated again to see whether a limit of the plan
/// was met before it. Throws Error, prefixed with the file's name, if so, or if the rows are those of another run, or
/// of a part of one.
Standing standingOf(const Plan& plan, const Results& results, const std::string& fileName);

}  // namespace morvik::simulation

#endif
