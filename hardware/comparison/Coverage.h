// Coverage: how much a dump has of what the core computes.
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

/// A dump may lack signals. Of those that it has, it should have every value that the core computes.
struct Coverage {
    std::uint64_t computed = 0;           ///< values of the core, whatever the dump has
    std::vector<unsigned> absentSignals;  ///< places in passSignals, without those for which their twin stands
    std::vector<unsigned> copiedSignals;  ///< these
    std::vector<unsigned> absentPasses;   ///< half-iterations without any value
    std::uint64_t gaps = 0;               ///< values that half-iterations and signals of the dump lack
    std::optional<Place> firstGap;
    std::vector<unsigned> gapSignals;

    /// The iterations that the dump has when it has all of these, and nothing of those behind them.
    std::optional<unsigned> iterations;

    bool isComplete() const
    {
        return absentPasses.empty() && gaps == 0;
    }
};

Coverage coverageOf(const Model& model, const Dump& dump);

/// What is not in the dump, as "half-iterations 2 to 15".
std::vector<std::string> lacksOf(const Coverage& coverage);

}  // namespace morvik::comparison

#endif
