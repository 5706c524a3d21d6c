// Report: a comparison as text.
#ifndef MORVIK_HARDWARE_COMPARISON_REPORT_H
#define MORVIK_HARDWARE_COMPARISON_REPORT_H

#include <string>
#include <vector>

#include "Comparison.h"
#include "Coverage.h"
#include "Dump.h"
#include "Model.h"

namespace morvik::comparison {

/// What a report is about. What it refers to outlives it.
struct Compared {
    const Comparison& comparison;
    const Coverage& coverage;
    const Model& model;
    const Dump& dump;
    std::string name;                    ///< what messages call the dump
    bool isPartial;                      ///< the dump may lack values
    std::vector<std::string> otherRuns;  ///< how the model computes the dump as it is, if it does
};

/// What is printed.
std::string textOf(const Compared& compared);

}  // namespace morvik::comparison

#endif
