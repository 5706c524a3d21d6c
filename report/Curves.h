// Curves: error rates against Eb/N0 and against iterations, as they are drawn and tabulated.
#ifndef MORVIK_REPORT_CURVES_H
#define MORVIK_REPORT_CURVES_H

#include <cstddef>
#include <cstdint>
#include <limits>
#include <string>
#include <vector>

namespace morvik::report {

/// Stands for a figure that is not known.
constexpr double unknown = std::numeric_limits<double>::quiet_NaN();

/// One point of a curve. Bounds are those of the 95 % confidence interval; without them no bar is drawn.
struct Sample {
    double ebn0 = 0;  // in dB

    double ber = unknown;
    double berLow = unknown;
    double berHigh = unknown;
    double bler = unknown;
    double blerLow = unknown;
    double blerHigh = unknown;

    // No error was seen: all that is known of the rate is that it is below its upper bound.
    bool berBelow = false;
    bool blerBelow = false;

    // Zero blocks: how many there were, and how many errors, is not known.
    std::uint64_t blocks = 0;
    std::uint64_t bitErrors = 0;
    std::uint64_t blockErrors = 0;

    double clipped = unknown;  // the fraction of the soft values that were clipped
    unsigned iterations = 0;   // after which this was counted; 0 where it is not known
    std::size_t row = 0;       // where it is tabulated
};

/// A series of the plot.
struct Curve {
    std::string title;
    bool reference = false;  // to compare with: drawn dashed, after the others in the legend
    std::vector<Sample> samples;
    std::string family = {};  // the title that it shares with the curves that differ in one number alone, which ascends
};

/// What a point was simulated with. Zero and the empty text stand for what is not known.
struct Setting {
    unsigned blockSize = 0;
    unsigned numPu = 0;
    std::string algorithm;  // its name
    unsigned iterations = 0;
    std::string scale;  // steps for amplitude 1; empty or "auto" where it follows from the rest
};

/// A row of a result file.
struct Row {
    Setting setting;
    Sample sample;
};

/// The curves that the rows belong to, in the order of their first rows; samples are put in the order of Eb/N0. Rows of
/// one curve have the same setting, which is its title: "K = 512, 8 units, scaled, 6 iterations".
/// Those that differ in their iterations alone are a family.
std::vector<Curve> curvesOf(const std::vector<Row>& rows);

/// The same samples against iterations: a curve for each family and Eb/N0 at which there are several of them. Those
/// that differ in Eb/N0 alone are a family.
std::vector<Curve> againstIterations(const std::vector<Curve>& curves);

}  // namespace morvik::report

#endif
