// CoveragePage: which situations of the arithmetic have been met, as one self-contained HTML file.
#ifndef MORVIK_REPORT_COVERAGEPAGE_H
#define MORVIK_REPORT_COVERAGEPAGE_H

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

namespace morvik::report {

/// A situation, and how often it has been met.
struct CoverageRow {
    unsigned rule;  ///< of docs/arithmetic.md
    std::string name;
    std::string text;
    std::uint64_t count;
    std::string whyImpossible;  ///< empty if it can be met
};

/// All strings are plain text; none is taken as HTML.
struct CoverageDescription {
    std::string lead;                                          ///< the line below the title
    std::vector<std::pair<std::string, std::uint64_t>> cores;  ///< and their blocks
    std::vector<CoverageRow> rows;                             ///< those of a rule are neighbours
};

/// Writes the page: a table of the situations by their rules. The file appears complete or not at all. Throws
/// base::Error.
void writeCoveragePage(const std::string& fileName, const CoverageDescription& coverage);

}  // namespace morvik::report

#endif
