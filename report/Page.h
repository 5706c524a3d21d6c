// Page: the report on a run, as one self-contained HTML file.
#ifndef MORVIK_REPORT_PAGE_H
#define MORVIK_REPORT_PAGE_H

#include <string>
#include <utility>
#include <vector>

#include "Curves.h"

namespace morvik::report {

/// The report's content besides the curves. All strings are plain text; none is taken as HTML.
struct RunDescription {
    std::string title;
    std::vector<std::pair<std::string, std::string>> parameters;  // name and value
    std::string command;                                          // the command that repeats the run
};

/// Throws base::Error with the reason if the file cannot be written.
void checkReport(const std::string& fileName);

/// Writes the report: the interactive curves, a table of all points, the parameters and the command. The file appears
/// complete or not at all. Throws base::Error.
void writeReport(const std::string& fileName, const std::vector<Curve>& curves, const RunDescription& run);

}  // namespace morvik::report

#endif
