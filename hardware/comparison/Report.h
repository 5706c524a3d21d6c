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

/// The input of a report. Everything referenced must outlive it.
struct Compared {
    const Comparison& comparison;
    const Coverage& coverage;
    const Model& model;
    const Dump& dump;
    std::string name;                    ///< of the dump in messages
    bool isPartial;                      ///< whether the dump may lack values
    std::vector<std::string> otherRuns;  ///< changes with which the model computes exactly this dump
};

/// Formats the report.
std::string textOf(const Compared& compared);

}  // namespace morvik::comparison

#endif
