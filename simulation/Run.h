// Run: simulates the points of a plan.
#ifndef MORVIK_SIMULATION_RUN_H
#define MORVIK_SIMULATION_RUN_H

#include <functional>

#include "Journal.h"
#include "Plan.h"
#include "Progress.h"
#include "Workers.h"

namespace morvik::simulation {

/// The parts of a run.
struct RunParts {
    Workers& workers;
    Journal& journal;
    Progress& progress;
    std::function<bool()> isInterrupted;   // polled several times a second
    double secondsBetweenCheckpoints = 3;  // the most work that a crash can lose
};

/// Simulates the points that the journal lacks, and records them there. Returns whether the run completed: false if
/// interrupted, which leaves a checkpoint of all counts.
bool run(const Plan& plan, const RunParts& parts);

}  // namespace morvik::simulation

#endif
