// Curves: error rates against Eb/N0 and against iterations, for plots and tables.
#ifndef MORVIK_REPORT_CURVES_H
#define MORVIK_REPORT_CURVES_H

#include <cstddef>
#include <cstdint>
#include <limits>
#include <string>
#include <vector>

namespace morvik::report {

/// Marks an unknown figure.
constexpr double unknown = std::numeric_limits<double>::quiet_NaN();

/// One point of a curve. The bounds are the 95 % confidence interval; without them no bar is drawn.
struct Sample {
    double ebn0 = 0;        // in dB, or unknown
    double esn0 = unknown;  // in dB, of all samples of a picture over it, or of none

    double ber = unknown;
    double berLow = unknown;
    double berHigh = unknown;
    double bler = unknown;
    double blerLow = unknown;
    double blerHigh = unknown;

    // No error was seen: the rate is known only to be below its upper bound.
    bool berBelow = false;
    bool blerBelow = false;

    // Zero blocks: the numbers of blocks and errors are unknown.
    std::uint64_t blocks = 0;
    std::uint64_t bitErrors = 0;
    std::uint64_t blockErrors = 0;

    // Information bits for each symbol; unknown of plain code blocks.
    double throughput = unknown;
    double throughputLow = unknown;
    double throughputHigh = unknown;

    double clipped = unknown;  // fraction of clipped soft values
    unsigned iterations = 0;   // iterations before the count; 0 if unknown
    std::size_t row = 0;       // its row in the table

    /// Where it is drawn: Es/N0, if that is known, or Eb/N0.
    double place() const;
};

/// A series of the plot.
struct Curve {
    std::string title;
    bool reference = false;  // drawn dashed, after the others in the legend
    std::vector<Sample> samples;
    std::string family = {};  // common title of the curves that differ only in one number, in ascending order
};

/// The parameters of a point. Zero or an empty string means unknown.
struct Setting {
    unsigned blockSize = 0;
    unsigned numPu = 0;
    std::string algorithm;  // name
    unsigned iterations = 0;
    std::string scale;      // as requested; empty or "auto" if it follows from the rest
    std::string sent = {};  // what is sent, if it is not plain code blocks over BPSK; named instead of the block size
    std::string received = {};  // what is unusual about the receiver, after ", "
};

/// A row of a result file.
struct Row {
    Setting setting;
    Sample sample;
};

/// The curves of the rows, in the order of their first rows; samples are sorted by Eb/N0. The rows of one curve have
/// the same setting, which is its title: "K = 512, 8 units, scaled, 6 iterations". Curves that differ only in their
/// iterations form a family or, where all have the same number, those that differ only in what is sent.
std::vector<Curve> curvesOf(const std::vector<Row>& rows);

/// The same samples against iterations: a curve for each family and each Eb/N0 with several of them. Curves that differ
/// only in Eb/N0 form a family.
std::vector<Curve> againstIterations(const std::vector<Curve>& curves);

}  // namespace morvik::report

#endif
