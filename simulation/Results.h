// Results: rows of result files, one for each point and iteration count.
#ifndef MORVIK_SIMULATION_RESULTS_H
#define MORVIK_SIMULATION_RESULTS_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "Confidence.h"
#include "Frames.h"
#include "Point.h"
#include "Tally.h"

namespace morvik::simulation {

/// A row. Rates and bounds follow from its counts.
struct ResultRow {
    std::size_t pointNumber = 0;
    Point point;
    FrameSet frames;  // counted
    ErrorCounts errors;
    std::uint64_t clipped = 0;
    double seconds = 0;
    std::uint64_t seed = 0;
    std::string version;
};

/// The content of a result file. Rows are in the order of their points.
struct Results {
    std::string version;  // of the program that wrote them
    std::string command;  // that repeats the run
    std::vector<ResultRow> rows;
};

/// The rates of a row.
double bitErrorRate(const ResultRow& row);
double blockErrorRate(const ResultRow& row);
double clippedFraction(const ResultRow& row);

/// The cost of the blocks. Plain code blocks are sent once, with all iterations and without a CRC.
Reception receptionOf(const ResultRow& row);
double meanIterations(const ResultRow& row);     // of a code block, each time it is decoded
double meanTransmissions(const ResultRow& row);  // of a block

/// Information bits of error-free blocks per symbol sent.
double throughput(const ResultRow& row);

/// The bounds of its rates.
Bounds bitErrorBounds(const ResultRow& row);
Bounds blockErrorBounds(const ResultRow& row);

}  // namespace morvik::simulation

#endif
