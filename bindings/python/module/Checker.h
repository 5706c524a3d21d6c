// Checker: the checker of a simulation, for the package.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_CHECKER_H
#define MORVIK_BINDINGS_PYTHON_MODULE_CHECKER_H

#include <pybind11/pybind11.h>

namespace morvik::python {

void addChecker(pybind11::module_& module);

}  // namespace morvik::python

#endif
