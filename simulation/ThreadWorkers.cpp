// ThreadWorkers: simulates the batches of a run in threads of this process.
#include "ThreadWorkers.h"

#include <algorithm>
#include <cstdint>
#include <limits>
#include <string>
#include <system_error>
#include <utility>

#include "FrameSimulator.h"
#include "base/Error.h"

namespace morvik::simulation {

ThreadWorkers::ThreadWorkers(const Plan& plan, unsigned threads, const std::string& instructionSet)
{
    std::uint32_t batch = std::numeric_limits<std::uint32_t>::max();
    for (const Point& point : plan.points) {
        batch = std::min(batch, smallestBatchOf(point));
    }
    const std::uint64_t batches = (plan.mostFrames() - 1) / batch + 1;
    const auto useful = static_cast<unsigned>(std::min<std::uint64_t>(threads, batches));
    try {
        for (unsigned i = 0; i < useful; ++i) {
            itsThreads.emplace_back([this, &plan, instructionSet] { work(plan, instructionSet); });
        }
    } catch (const std::system_error& error) {
        endThreads();
        throw base::Error(std::to_string(useful) + " threads cannot be started: " + error.code().message());
    }
}

ThreadWorkers::~ThreadWorkers()
{
    endThreads();
}

void ThreadWorkers::endThreads()
{
    {
        const std::lock_guard lock(itsMutex);
        itsIsEnding = true;
        itsGeneration += 1;
    }
    itsHasBatch.notify_all();
    for (std::thread& thread : itsThreads) {
        thread.join();
    }
}

unsigned ThreadWorkers::count() const
{
    return static_cast<unsigned>(itsThreads.size());
}

void ThreadWorkers::handOut(const FrameBatch& batch)
{
    {
        const std::lock_guard lock(itsMutex);
        itsBatches.push_back(batch);
    }
    itsHasBatch.notify_one();
}

std::optional<BatchResult> ThreadWorkers::take(std::chrono::milliseconds patience)
{
    std::unique_lock lock(itsMutex);
    itsHasResult.wait_for(lock, patience, [this] { return !itsResults.empty() || itsFailure; });
    if (itsFailure) {
        std::rethrow_exception(itsFailure);
    }
    if (itsResults.empty()) {
        return std::nullopt;
    }
    BatchResult result = std::move(itsResults.front());
    itsResults.pop_front();
    return result;
}

void ThreadWorkers::forgetAll()
{
    const std::lock_guard lock(itsMutex);
    itsBatches.clear();
    itsResults.clear();
    itsGeneration += 1;
}

void ThreadWorkers::work(const Plan& plan, const std::string& instructionSet)
{
    try {
        FrameSimulator simulator(plan, instructionSet);
        simulateUntilEnd(simulator);
    } catch (...) {
        const std::lock_guard lock(itsMutex);
        itsFailure = std::current_exception();
        itsHasResult.notify_one();
    }
}

void ThreadWorkers::simulateUntilEnd(FrameSimulator& simulator)
{
    std::unique_lock lock(itsMutex);
    for (;;) {
        itsHasBatch.wait(lock, [this] { return itsIsEnding || !itsBatches.empty(); });
        if (itsIsEnding) {
            return;
        }
        BatchResult result = simulator.begin(itsBatches.front());
        itsBatches.pop_front();
        const unsigned generation = itsGeneration;
        bool goesOn = true;
        while (goesOn && generation == itsGeneration) {
            lock.unlock();
            goesOn = simulator.proceed(result);
            lock.lock();
        }
        if (generation == itsGeneration) {
            itsResults.push_back(std::move(result));
            itsHasResult.notify_one();
        }
    }
}

}  // namespace morvik::simulation
