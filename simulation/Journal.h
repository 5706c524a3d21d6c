// Journal: what a run has counted, kept in memory and on the disk.
#ifndef MORVIK_SIMULATION_JOURNAL_H
#define MORVIK_SIMULATION_JOURNAL_H

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "Checkpoint.h"
#include "Plan.h"
#include "base/OwnFile.h"

namespace morvik::simulation {

/// Keeps the results of the ended points in a file, and beside it, until the run is complete, a checkpoint. Both are
/// there as a whole whenever the process is killed, as they were saved last. All functions throw Error.
class Journal {
public:
    /// What becomes of an earlier run: its checkpoint or its results are in the way, this run goes on from them, or
    /// takes their place. A complete run has no checkpoint, but results; going on from there, nothing is left to do,
    /// unless this run has larger limits.
    enum class Earlier { refuse, resume, overwrite };

    /// Opens the journal, for no other run to open it, too, and finds out whether it can be kept. Without an output it
    /// is kept in memory alone. The plan outlives the journal.
    Journal(const Plan& plan, std::string output, Earlier earlier);

    /// Writes the files as they are at the beginning of a run.
    void begin();

    /// Whether nothing has been counted yet.
    bool isEmpty() const;

    /// The points that have ended, in the order of the plan.
    const std::vector<PointResult>& ended() const;

    /// What has been counted at a point that has not ended, maybe nothing.
    PointResult resultSoFar(std::size_t point) const;

    /// Takes note of a point that has ended.
    void end(const PointResult& point);

    /// Writes the files, with what has been counted at the running point, if one is.
    void save(const std::optional<PointResult>& running);

    /// The run is complete: writes the results, and the checkpoint goes.
    void complete();

    /// The name of the checkpoint.
    std::string checkpointName() const;

private:
    void refuseIf(bool isUnfinished, bool hasResults) const;
    Checkpoint resumable(const std::string& checkpointFile) const;
    void forgetBegun(std::size_t last);

    const Plan& itsPlan;
    std::string itsOutput;
    Checkpoint itsCheckpoint;
    std::optional<base::OwnFile> itsFile;  // that the checkpoint is kept in
    std::size_t itsResultsSaved = 0;       // how many points the results had when they were written last
};

}  // namespace morvik::simulation

#endif
