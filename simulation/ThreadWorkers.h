// ThreadWorkers: simulates the batches of a run in threads of this process.
#ifndef MORVIK_SIMULATION_THREADWORKERS_H
#define MORVIK_SIMULATION_THREADWORKERS_H

#include <condition_variable>
#include <deque>
#include <exception>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "Plan.h"
#include "Workers.h"

namespace morvik::simulation {

class FrameSimulator;

/// Threads, each with its own decoder state.
class ThreadWorkers : public Workers {
public:
    /// Starts `threads` threads; throws Error if the system has none left. `plan` must outlive the workers. For the
    /// instruction set, see FrameSimulator.
    ThreadWorkers(const Plan& plan, unsigned threads, const std::string& instructionSet);
    ~ThreadWorkers() override;

    unsigned count() const override;
    void handOut(const FrameBatch& batch) override;
    std::optional<BatchResult> take(std::chrono::milliseconds patience) override;
    void forgetAll() override;

private:
    void endThreads();
    void work(const Plan& plan, const std::string& instructionSet);
    void simulateUntilEnd(FrameSimulator& simulator);

    std::mutex itsMutex;  // guards all members below
    std::condition_variable itsHasBatch;
    std::condition_variable itsHasResult;
    std::deque<FrameBatch> itsBatches;
    std::deque<BatchResult> itsResults;
    std::exception_ptr itsFailure;
    unsigned itsGeneration = 0;  // increases whenever all batches are dropped
    bool itsIsEnding = false;

    std::vector<std::thread> itsThreads;
};

}  // namespace morvik::simulation

#endif
