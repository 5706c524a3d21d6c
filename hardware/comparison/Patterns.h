// Patterns: what the faults of a dump have in common.
#ifndef MORVIK_HARDWARE_COMPARISON_PATTERNS_H
#define MORVIK_HARDWARE_COMPARISON_PATTERNS_H

#include <cstddef>
#include <string>
#include <vector>

#include "Comparison.h"
#include "Model.h"
#include "Values.h"

namespace morvik::comparison {

/// What explains the faults of one stage.
struct Finding {
    Stage stage;
    std::size_t faults = 0;
    bool isByChance = false;  ///< so few or so alike that the finding may be chance
    std::string where;        ///< "at the starts of windows alone"
    /// The mistakes that explain these values equally well and keep the right ones right.
    std::vector<std::string> how;
    std::string shared;    ///< "one LSB too high": what the wrong values share, if no mistake is found
    double explained = 0;  ///< the fraction of the faults that this explains
};

/// A finding for each stage that has faults, in order of first appearance.
std::vector<Finding> findPatterns(const Model& model, const Values& dump, const Comparison& comparison);

/// Detects a dump that numbers passes or steps differently, and returns what to change: most wrong values become right
/// by it, and most right ones stay so. Several if they do that equally well.
std::vector<std::string> findShifts(const Model& model, const Values& dump);

}  // namespace morvik::comparison

#endif
