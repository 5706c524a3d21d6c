// ErrorRates: simulations of error rates in this process, on threads.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_ERRORRATES_H
#define MORVIK_BINDINGS_PYTHON_MODULE_ERRORRATES_H

#include <functional>
#include <string>
#include <vector>

#include "simulation/Plan.h"

namespace morvik::python {

/// Who hears of a simulation, in the thread that runs it. What they throw ends it.
struct Listeners {
    std::function<void()> isRunning;                                          ///< several times a second
    std::function<void(const std::vector<simulation::ResultRow>&)> hasEnded;  ///< the rows of a point
};

/// The rows of all points. An empty instruction set leaves the choice to the decoder.
std::vector<simulation::ResultRow> errorRates(const simulation::Plan& plan,
                                              unsigned threads,
                                              const std::string& instructionSet,
                                              const Listeners& listeners);

}  // namespace morvik::python

#endif
