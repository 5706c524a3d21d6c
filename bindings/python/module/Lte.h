// Lte: the chain of include/morvik_link.h on NumPy arrays.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_LTE_H
#define MORVIK_BINDINGS_PYTHON_MODULE_LTE_H

#include <pybind11/pybind11.h>

namespace morvik::python {

void addLte(pybind11::module_& module);

}  // namespace morvik::python

#endif
