// Simulation: error rates for the package.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_SIMULATION_H
#define MORVIK_BINDINGS_PYTHON_MODULE_SIMULATION_H

#include <pybind11/pybind11.h>

namespace morvik::python {

void addSimulation(pybind11::module_& module);

}  // namespace morvik::python

#endif
