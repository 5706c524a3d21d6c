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

/// What is found of the faults of one stage.
struct Finding {
    Stage stage;
    std::size_t faults = 0;
    bool isByChance = false;  ///< so few, or so much alike, that what is found may be chance
    std::string where;        ///< "at the starts of windows alone"
    /// The mistakes that give these values, all as many of them, and with which the right values are as they are.
    std::vector<std::string> how;
    std::string shared;    ///< "one LSB too high": what the wrong values have in common, where no mistake is found
    double explained = 0;  ///< the part of the faults for which that holds
};

/// A finding for each stage that has faults, in the order in which they appear first.
std::vector<Finding> findPatterns(const Model& model, const Values& dump, const Comparison& comparison);

/// The dump counts passes or steps in another way: what to change. With it, most wrong values are right, and most right
/// ones stay so. Several are found where they do that equally well.
std::vector<std::string> findShifts(const Model& model, const Values& dump);

}  // namespace morvik::comparison

#endif
