// Journal: the counts of a run, in memory and on disk.
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

/// Keeps the results of finished points in a file and, until the run is complete, a checkpoint beside it. Whenever the
/// process is killed, both are whole, as last saved. All functions throw Error.
class Journal {
public:
    /// What to do about an earlier run's checkpoint or results: refuse to start, resume from them, or overwrite them. A
    /// complete run has results but no checkpoint; resuming it leaves nothing to do unless this run has larger limits.
    enum class Earlier { refuse, resume, overwrite };

    /// Opens the journal, locks it against other runs and checks that it can be written. Without an output it is kept
    /// in memory only. `plan` must outlive the journal.
    Journal(const Plan& plan, std::string output, Earlier earlier);

    /// Writes the initial files of a run.
    void begin();

    /// Whether nothing has been counted yet.
    bool isEmpty() const;

    /// The finished points, in plan order.
    const std::vector<PointResult>& ended() const;

    /// The counts so far of an unfinished point, possibly none.
    PointResult resultSoFar(std::size_t point) const;

    /// Records a finished point.
    void end(const PointResult& point);

    /// Writes the files, with the counts so far of the running point, if any.
    void save(const std::optional<PointResult>& running);

    /// Completes the run: writes the results and removes the checkpoint.
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
    std::optional<base::OwnFile> itsFile;  // holds the checkpoint
    std::size_t itsResultsSaved = 0;       // points in the results when last written
};

}  // namespace morvik::simulation

#endif
