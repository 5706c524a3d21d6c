// Link: encoder, interleaver and channel of the package, for plain code blocks.
#ifndef MORVIK_BINDINGS_PYTHON_MODULE_LINK_H
#define MORVIK_BINDINGS_PYTHON_MODULE_LINK_H

#include <pybind11/pybind11.h>

namespace morvik::python {

void addLink(pybind11::module_& module);

}  // namespace morvik::python

#endif
