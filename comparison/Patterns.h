// Patterns: what the faults of a dump have in common.
#ifndef MORVIK_COMPARISON_PATTERNS_H
#define MORVIK_COMPARISON_PATTERNS_H

#include <cstddef>
#include <optional>
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
    std::string where;     ///< "at the starts of windows alone"
    std::string how;       ///< the mistake by which the values are as they are; empty when none explains them
    double explained = 0;  ///< the part of the faults that the mistake gives
};

/// A finding for each stage that has faults, in the order in which they appear first.
std::vector<Finding> findPatterns(const Model& model, const Values& dump, const Comparison& comparison);

/// The dump counts passes or steps in another way: what to change, when most values fit then.
std::optional<std::string> findShift(const Model& model, const Values& dump);

}  // namespace morvik::comparison

#endif
