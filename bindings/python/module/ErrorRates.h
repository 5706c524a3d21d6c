// ErrorRates: error rate simulations in this process, on threads.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_ERRORRATES_H
#define MORVIK_BINDINGS_PYTHON_MODULE_ERRORRATES_H

#include <functional>
#include <string>
#include <vector>

#include "simulation/Plan.h"

namespace morvik::python {

/// Callbacks in the thread that runs the simulation. An exception from one ends it.
struct Listeners {
    std::function<void()> isRunning;                                          ///< several times a second
    std::function<void(const std::vector<simulation::ResultRow>&)> hasEnded;  ///< the rows of a point
};

/// All points. With an empty instruction set, the decoder chooses.
std::vector<simulation::PointResult> errorRates(const simulation::Plan& plan,
                                                unsigned threads,
                                                const std::string& instructionSet,
                                                const Listeners& listeners);

}  // namespace morvik::python

#endif
