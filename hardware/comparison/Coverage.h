// Coverage: how many of the core's values a dump has.
#ifndef MORVIK_HARDWARE_COMPARISON_COVERAGE_H
#define MORVIK_HARDWARE_COMPARISON_COVERAGE_H

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "Dump.h"
#include "Model.h"
#include "Values.h"

namespace morvik::comparison {

/// A dump may lack whole signals. Of those that it has, it should have every value that the core computes.
struct Coverage {
    std::uint64_t computed = 0;           ///< values of the core, in the dump or not
    std::vector<unsigned> absentSignals;  ///< indices in passSignals, except those copied from their twin
    std::vector<unsigned> copiedSignals;  ///< those copied from their twin
    std::vector<unsigned> absentPasses;   ///< half-iterations without any value
    std::uint64_t gaps = 0;               ///< values missing from the dump's half-iterations and signals
    std::optional<Place> firstGap;
    std::vector<unsigned> gapSignals;

    /// The number of iterations in the dump, if it has all their half-iterations and none after them.
    std::optional<unsigned> iterations;

    bool isComplete() const
    {
        return absentPasses.empty() && gaps == 0;
    }
};

Coverage coverageOf(const Model& model, const Dump& dump);

/// What the dump lacks, as "half-iterations 2 to 15".
std::vector<std::string> lacksOf(const Coverage& coverage);

}  // namespace morvik::comparison

#endif
