// Point: the parameters of one simulated error rate.
#ifndef MORVIK_SIMULATION_POINT_H
#define MORVIK_SIMULATION_POINT_H

#include <optional>
#include <string>
#include <string_view>

namespace morvik::simulation {

/// The requested soft-value steps for amplitude 1, in thousandths; nothing selects the scale that suits the algorithm
/// and Eb/N0.
using ScaleOption = std::optional<int>;

/// A decoder and the channel before it.
struct Point {
    unsigned blockSize = 0;   // K
    unsigned numPu = 0;       // processing units: 2, 4 or 8
    unsigned algorithm = 0;   // C_ALGORITHM_TYPE: 0 to 2
    ScaleOption scaleOption;  // as requested
    int milliScale = 0;       // as used: thousandths of a soft-value step
    unsigned iterations = 0;  // full iterations: 1 to 15
    int milliDecibels = 0;    // Eb/N0 in thousandths of a decibel
};

/// Whether both have the same parameters and thus the same results.
bool operator==(const Point& a, const Point& b);

/// The order of results: by block size, units, algorithm, scale (automatic first), iterations, Eb/N0.
bool operator<(const Point& a, const Point& b);

/// Whether the points are on one curve: they differ only in Eb/N0.
bool onSameCurve(const Point& a, const Point& b);

/// "max-log", "scaled", "table".
std::string algorithmName(unsigned algorithm);

/// The algorithm of a name or number; nothing if there is none.
std::optional<unsigned> algorithmOf(std::string_view nameOrNumber);

/// "auto" or the number.
std::string scaleOptionText(const ScaleOption& option);

}  // namespace morvik::simulation

#endif
