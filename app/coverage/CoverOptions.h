// CoverOptions: what 'morvik vectors' does about situations of the arithmetic.
#ifndef MORVIK_APP_COVERAGE_COVEROPTIONS_H
#define MORVIK_APP_COVERAGE_COVEROPTIONS_H

#include <CLI/CLI.hpp>
#include <string>

#include "hardware/coverage/Counts.h"
#include "hardware/vectors/Settings.h"

namespace morvik {

struct CoverOptions {
    bool isCounted = true;
    std::string counts;  ///< file for them, if any
};

/// Adds --cover, --cover-limit, --coverage and --no-situations. The first two set `settings`.
void addCoverOptions(CLI::App& command, CoverOptions& options, vectors::Settings& settings);

/// The first two as options of the command that makes the set again, each after a blank.
std::string coverText(const vectors::Settings& settings);

/// Throws base::Error if the options contradict each other or the file cannot be written.
void checkCoverOptions(const CoverOptions& options, const vectors::Settings& settings);

/// Writes the counts of a set to their file, and words them as lines. `isCovered` tells whether all that --cover names
/// has been met.
std::string tellSituations(const CoverOptions& options,
                           const vectors::Settings& settings,
                           const coverage::Counts& counts,
                           bool& isCovered);

}  // namespace morvik

#endif
