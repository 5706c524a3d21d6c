// Progress: the observer of a run.
#ifndef MORVIK_SIMULATION_PROGRESS_H
#define MORVIK_SIMULATION_PROGRESS_H

#include "Plan.h"

namespace morvik::simulation {

/// Observes a run. An exception thrown here ends the run.
class Progress {
public:
    Progress() = default;
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;
    virtual ~Progress() = default;

    /// Called several times a second with the counts so far of the running point.
    virtual void isAt(const PointResult& running) = 0;

    /// Called for each finished point, including those finished before the run was resumed.
    virtual void hasEnded(const PointResult& point) = 0;
};

}  // namespace morvik::simulation

#endif
