// ErrorRates: error rate simulations in this process, on threads.
#include "ErrorRates.h"

#include "simulation/Run.h"
#include "simulation/ThreadWorkers.h"

namespace morvik::python {

namespace {

/// Passes on the rows of completed points.
class EndedPoints : public simulation::Progress {
public:
    EndedPoints(const simulation::Plan& plan, const Listeners& listeners) : itsPlan(plan), itsListeners(listeners) {}

    void isAt(const simulation::PointResult&) override {}

    void hasEnded(const simulation::PointResult& point) override
    {
        itsListeners.hasEnded(simulation::resultsOf(itsPlan, {point}).rows);
    }

private:
    const simulation::Plan& itsPlan;
    const Listeners& itsListeners;
};

}  // namespace

std::vector<simulation::PointResult> errorRates(const simulation::Plan& plan,
                                                unsigned threads,
                                                const std::string& instructionSet,
                                                const Listeners& listeners)
{
    simulation::Journal inMemory(plan, {}, simulation::Journal::Earlier::refuse);
    simulation::ThreadWorkers workers(plan, threads, instructionSet);
    EndedPoints progress(plan, listeners);
    const auto isInterrupted = [&listeners] {
        listeners.isRunning();
        return false;
    };
    run(plan, {workers, inMemory, progress, isInterrupted});
    return inMemory.ended();
}

}  // namespace morvik::python
