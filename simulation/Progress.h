// Progress: whoever watches a run.
#ifndef MORVIK_SIMULATION_PROGRESS_H
#define MORVIK_SIMULATION_PROGRESS_H

#include "Plan.h"

namespace morvik::simulation {

/// Is told how a run goes on. Whatever it throws ends the run.
class Progress {
public:
    Progress() = default;
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;
    virtual ~Progress() = default;

    /// What has been counted so far at the running point; several times a second.
    virtual void isAt(const PointResult& running) = 0;

    /// A point has ended, in this run or before it was resumed.
    virtual void hasEnded(const PointResult& point) = 0;
};

}  // namespace morvik::simulation

#endif
