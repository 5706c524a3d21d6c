// Point: the parameters of one simulated error rate.
#ifndef MORVIK_SIMULATION_POINT_H
#define MORVIK_SIMULATION_POINT_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "LinkFormat.h"

namespace morvik::simulation {

/// The requested scale in thousandths: the soft value for amplitude 1 with plain code blocks over BPSK, otherwise for
/// a log-likelihood ratio of 1. Nothing selects the scale that suits the algorithm and the channel.
using ScaleOption = std::optional<int>;

/// The signal-to-noise ratio that is swept.
enum class Axis { ebn0, esn0 };

/// ebn0, esn0.
std::string_view nameOf(Axis axis);

/// A decoder and the channel before it.
struct Point {
    unsigned blockSize = 0;   // K; of transport blocks, that of their largest code blocks
    unsigned numPu = 0;       // processing units: 2, 4 or 8
    unsigned algorithm = 0;   // C_ALGORITHM_TYPE: 0 to 2
    ScaleOption scaleOption;  // as requested
    int milliScale = 0;       // as used, in thousandths
    unsigned iterations = 0;  // full iterations: 1 to 15
    int milliDecibels = 0;    // Eb/N0 in thousandths of a decibel
    LinkFormat link = {};
    Axis axis = Axis::ebn0;
    int milliEsn0 = 0;  // Es/N0 in thousandths of a decibel; 0 for plain code blocks over BPSK and Gaussian noise
};

/// Whether both have the same parameters and thus the same results.
bool operator==(const Point& a, const Point& b);

/// The order of results: by block size, units, algorithm, scale (automatic first), iterations, Eb/N0.
bool operator<(const Point& a, const Point& b);

/// Whether the points are on one curve: they differ only in Eb/N0.
bool onSameCurve(const Point& a, const Point& b);

/// Sizes of what the point decodes.
unsigned codeBlocksOf(const Point& point);          // of a block
std::uint32_t smallestBatchOf(const Point& point);  // the fewest blocks that fill the encoder
std::uint64_t countedBitsOf(const Point& point);    // that can be wrong in a block: with its CRCs, without filler bits
std::uint64_t countedBitsOf(const LinkFormat& format, unsigned blockSize);
std::uint64_t softValuesOf(const Point& point);  // that the decoder receives for a block and transmission

/// Symbols of one transmission.
std::uint64_t symbolsOf(const LinkFormat& link, unsigned blockSize);

/// Information bits of a symbol: the tail is counted as sent, CRCs are no information.
double bitsPerSymbolOf(const LinkFormat& link, unsigned blockSize);

/// The point's Es/N0 in thousandths of a decibel, of every kind of point.
int milliEsn0Of(const Point& point);

/// Puts a point on its axis, in thousandths of a decibel, and so on the other one.
void setPlace(Point& point, int milliDecibels);

/// Where the point is along its axis, in thousandths of a decibel.
int placeOf(const Point& point);

/// The scale that suits a transmission of a point that is not plain code blocks over BPSK and Gaussian noise: the soft
/// value for a log-likelihood ratio of 1.
double automaticScale(const Point& point, unsigned transmission);

/// Whether files of results show how the point's blocks are sent.
bool isWide(const Point& point);

/// "max-log", "scaled", "table".
std::string algorithmName(unsigned algorithm);

/// The algorithm of a name or number; nothing if there is none.
std::optional<unsigned> algorithmOf(std::string_view nameOrNumber);

/// "auto" or the number.
std::string scaleOptionText(const ScaleOption& option);

}  // namespace morvik::simulation

#endif
