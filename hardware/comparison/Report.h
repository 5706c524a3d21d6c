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
    const char* values = "the dump";     ///< what the values are called
    bool countsAlways = false;           ///< whether signals are counted even if nothing differs
};

/// A comparison in words.
struct Report {
    std::string text;
    std::vector<std::string> findings;  ///< the mistakes in it, each in a line: "branch metrics: the sign is flipped"
};

Report reportOf(const Compared& compared);

/// Its text alone.
std::string textOf(const Compared& compared);

/// Formats the first difference alone: its place, what its inputs say, and what explains it.
std::string firstDifferenceOf(const Compared& compared);

/// The same in a line: "alpha0 of half-iteration 2, step 64: expected 920, got 927".
std::string headlineOf(const Compared& compared);

}  // namespace morvik::comparison

#endif
