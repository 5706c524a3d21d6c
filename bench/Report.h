// Report: the tables, as Markdown that reads well in a terminal.
#ifndef MORVIK_BENCH_REPORT_H
#define MORVIK_BENCH_REPORT_H

#include <ostream>

#include "Limits.h"
#include "Measure.h"

namespace morvik::bench {

/// Prints lines as they come; a table's header comes with its first line.
class Report {
public:
    Report(std::ostream& os, const Limits& limits);

    void add(const Work& work, const Figures& figures);

    /// Prints what follows the tables.
    void finish();

private:
    void addLine(const Work& work, const Figures& figures);
    void addCompared(const Work& work, const Figures& figures);
    void printLimits();

    std::ostream& itsStream;
    const Limits& itsLimits;
    bool itsLinesBegun = false;
    bool itsComparisonBegun = false;
};

}  // namespace morvik::bench

#endif
