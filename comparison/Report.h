// Report: a comparison as text.
#ifndef MORVIK_COMPARISON_REPORT_H
#define MORVIK_COMPARISON_REPORT_H

#include <optional>
#include <string>

#include "Comparison.h"
#include "Dump.h"
#include "Model.h"

namespace morvik::comparison {

/// What is printed; `name` is what messages call the dump, `otherRun` how the model computes the dump as it is, if it
/// does.
std::string textOf(const Comparison& comparison,
                   const Model& model,
                   const Dump& dump,
                   const std::string& name,
                   const std::optional<std::string>& otherRun);

}  // namespace morvik::comparison

#endif
