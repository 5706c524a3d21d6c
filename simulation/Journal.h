// Journal: what a run has counted, kept in memory and on the disk.
#ifndef MORVIK_SIMULATION_JOURNAL_H
#define MORVIK_SIMULATION_JOURNAL_H

#include <cstddef>
#include <string>
#include <vector>

#include "Checkpoint.h"
#include "Plan.h"

namespace simulation {

/// Keeps the results of the ended points in a file, and beside it, until the run is complete, a checkpoint. Both are
/// there as a whole whenever the process is killed. All functions throw Error.
class Journal {
public:
    /// What becomes of an earlier, unfinished run's checkpoint: it is in the way, or this run goes on from it.
    enum class Earlier { refuse, resume };

    /// Opens the journal, and finds out whether it can be kept. Without an output it is kept in memory alone. The plan
    /// outlives the journal.
    Journal(const Plan& plan, std::string output, Earlier earlier);

    /// Whether there is a checkpoint that the run goes on from.
    bool isResumed() const;

    /// The points that have ended, in the order of the plan.
    const std::vector<PointResult>& ended() const;

    /// What has been counted at a point that has not ended, maybe nothing.
    PointResult resultSoFar(std::size_t point) const;

    /// Keeps what has been counted at a point that has not ended.
    void keep(const PointResult& running);

    /// Keeps a point that has ended.
    void end(const PointResult& point);

    /// The run is complete: the checkpoint goes.
    void complete();

    /// The name of the checkpoint.
    std::string checkpointName() const;

private:
    void readCheckpoint(Earlier earlier);
    void writeCheckpoint() const;
    void writeResults() const;

    const Plan& itsPlan;
    std::string itsOutput;
    bool itsIsResumed = false;
    Checkpoint itsCheckpoint;
};

}  // namespace simulation

#endif
