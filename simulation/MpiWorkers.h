// MpiWorkers: spreads the batches of rank 0 over the processes of an MPI job.
#ifndef MORVIK_SIMULATION_MPIWORKERS_H
#define MORVIK_SIMULATION_MPIWORKERS_H

#include <chrono>
#include <optional>
#include <string>
#include <vector>

#include "MpiWorld.h"
#include "Plan.h"
#include "ThreadWorkers.h"
#include "Workers.h"

namespace morvik::simulation {

/// The workers of rank 0: its own threads, and all other ranks with as many threads each. The calling thread mostly
/// waits, and is the one that exchanges messages with the other ranks.
class MpiWorkers : public Workers {
public:
    /// `world` and `plan` must outlive the workers. For the instruction set, see FrameSimulator.
    MpiWorkers(const MpiWorld& world, const Plan& plan, unsigned threads, const std::string& instructionSet);

    unsigned count() const override;
    void handOut(const FrameBatch& batch) override;
    std::optional<BatchResult> take(std::chrono::milliseconds patience) override;
    void forgetAll() override;

private:
    struct Rank {
        unsigned batchesOut = 0;  // handed out, not yet returned
        unsigned forgetsOut = 0;  // orders to forget, not yet answered: results until then are dropped
    };

    std::optional<BatchResult> takeFromOthers();

    const MpiWorld& itsWorld;
    ThreadWorkers itsThreads;
    std::vector<Rank> itsRanks;  // the first stands for this rank's threads
};

/// Runs a rank other than 0: simulates for rank 0, in `threads` threads, until dismissed. Without a plan it only waits
/// to be dismissed.
void workForRankZero(const Plan* plan, unsigned threads, const std::string& instructionSet);

/// Dismisses the other ranks, called by rank 0. Returns whether all have answered in time.
bool dismissOthers(const MpiWorld& world, std::chrono::milliseconds patience);

}  // namespace morvik::simulation

#endif
