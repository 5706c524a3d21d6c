// Units: the units of the core, for the package.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_UNITS_H
#define MORVIK_BINDINGS_PYTHON_MODULE_UNITS_H

#include <pybind11/pybind11.h>

namespace morvik::python {

void addUnits(pybind11::module_& module);

}  // namespace morvik::python

#endif
