// Run: simulates the points of a plan.
#ifndef MORVIK_SIMULATION_RUN_H
#define MORVIK_SIMULATION_RUN_H

#include <functional>

#include "Journal.h"
#include "Plan.h"
#include "Progress.h"
#include "Workers.h"

namespace morvik::simulation {

/// What a run is made with.
struct RunParts {
    Workers& workers;
    Journal& journal;
    Progress& progress;
    std::function<bool()> isInterrupted;   // asked several times a second
    double secondsBetweenCheckpoints = 3;  // at most that much work is lost in a crash
};

/// Simulates the points of the plan that the journal does not have, and keeps them there. Returns whether the run is
/// complete: false after an interruption, which leaves a checkpoint of all that has been counted.
bool run(const Plan& plan, const RunParts& parts);

}  // namespace morvik::simulation

#endif
