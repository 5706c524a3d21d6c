// Report: a comparison as text.
#ifndef MORVIK_COMPARISON_REPORT_H
#define MORVIK_COMPARISON_REPORT_H

#include <string>

#include "Comparison.h"
#include "Dump.h"
#include "Model.h"

namespace morvik::comparison {

/// What is printed; `name` is what messages call the dump.
std::string textOf(const Comparison& comparison, const Model& model, const Dump& dump, const std::string& name);

}  // namespace morvik::comparison

#endif
