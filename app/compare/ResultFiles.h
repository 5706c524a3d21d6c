// ResultFiles: the results of comparisons as text, JSON and JUnit.
#ifndef MORVIK_APP_COMPARE_RESULTFILES_H
#define MORVIK_APP_COMPARE_RESULTFILES_H

#include <string>
#include <vector>

#include "Regression.h"

namespace morvik {

/// What has been found in the sets: each block that does not agree, and how often which signals and mistakes are
/// concerned.
std::string summaryText(const std::vector<ComparedSet>& sets);

std::string jsonText(const std::vector<ComparedSet>& sets);

/// A file that CI servers read: a test suite for each set, a test case for each block.
std::string junitText(const std::vector<ComparedSet>& sets);

}  // namespace morvik

#endif
