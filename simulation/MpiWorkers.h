// MpiWorkers: the processes of an MPI job at work for a run of rank 0.
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

/// What rank 0 needs: threads of its own, which simulate, too, and all other ranks, which have as many each. The
/// thread that calls it waits most of the time, and is the one that talks to the other ranks.
class MpiWorkers : public Workers {
public:
    /// World and plan outlive the workers. For the instruction set, see FrameSimulator.
    MpiWorkers(const MpiWorld& world, const Plan& plan, unsigned threads, const std::string& instructionSet);

    unsigned count() const override;
    void handOut(const FrameBatch& batch) override;
    std::optional<BatchResult> take(std::chrono::milliseconds patience) override;
    void forgetAll() override;

private:
    struct Rank {
        unsigned batchesOut = 0;  // handed out, and not given back
        unsigned forgetsOut = 0;  // told to forget, and not answered: the results until then are forgotten ones
    };

    std::optional<BatchResult> takeFromOthers();

    const MpiWorld& itsWorld;
    ThreadWorkers itsThreads;
    std::vector<Rank> itsRanks;  // the first one stands for the threads
};

/// What all other ranks do: they work for rank 0, each in so many threads, until it dismisses them. Without a plan they
/// only wait for that.
void workForRankZero(const Plan* plan, unsigned threads, const std::string& instructionSet);

/// Rank 0 ends the work of the others. Returns whether all of them have answered in time.
bool dismissOthers(const MpiWorld& world, std::chrono::milliseconds patience);

}  // namespace morvik::simulation

#endif
