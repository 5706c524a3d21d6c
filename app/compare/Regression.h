// Regression: compares the dumps of all blocks of sets of vectors.
#ifndef MORVIK_APP_COMPARE_REGRESSION_H
#define MORVIK_APP_COMPARE_REGRESSION_H

#include <string>
#include <vector>

#include "BlockCase.h"
#include "CompareOptions.h"

namespace morvik {

/// A set of vectors whose dumps have been compared.
struct ComparedSet {
    std::string folder;
    std::string core;                ///< "2 units, scaled, 8 iterations"
    std::vector<std::string> files;  ///< of the vectors
    std::vector<BlockCase> cases;
    std::vector<CaseResult> results;  ///< of the cases, in their order
};

/// The sums of what the dumps of the sets have met, if it was counted.
coverage::Counts situationsOf(const std::vector<ComparedSet>& sets);

/// Compares the dumps of each set's blocks, in several threads. What cannot be read is a result. Throws base::Error if
/// a set itself cannot be read.
std::vector<ComparedSet> compareSets(const CompareOptions& options, const comparison::NameMap& map);

}  // namespace morvik

#endif
