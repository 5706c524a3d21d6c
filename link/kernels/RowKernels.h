// RowKernels: loops over rows of numbers, compiled once for each instruction set.
//
// All sets give the same bits: integers, and IEEE operations one by one.
#ifndef MORVIK_LINK_KERNELS_ROWKERNELS_H
#define MORVIK_LINK_KERNELS_ROWKERNELS_H

#include <cstddef>
#include <cstdint>
#include <vector>

namespace morvik::link {

/// Received symbols, dimension by dimension.
struct DimensionRow {
    const float* received;  ///< numbers of `across` dimensions of each symbol
    const float* gains;     ///< of each symbol, or null: all are 1
    std::size_t symbols;
    unsigned across;  ///< 1 or 2
    unsigned bits;    ///< of each dimension, 1 to 4

    /// The logarithm of the probability of level l at a received y is slope l y - energy l^2 but for a constant, for a
    /// gain of 1. A negative level has a first bit of 1.
    float slope;
    float energy;
};

struct RowKernels {
    const char* name;

    /// Adds `count` numbers.
    void (*add)(const float* numbers, std::size_t count, float* sums);

    /// Adds, and clips to -most - 1 ... most.
    void (*addClipped)(const std::int16_t* numbers, std::size_t count, std::int32_t most, std::int16_t* sums);

    /// Adds numbers times a unit.
    void (*addNoise)(const std::int16_t* numbers, std::size_t count, float unit, float* sums);

    /// Products with a scale, rounded with halves away from 0, clipped to -end ... end - 1; returns how many are
    /// clipped. NaN becomes -end, and counts. `end` is at most 128 of bytes, 32768 of words.
    std::uint32_t (*roundToBytes)(
        const float* numbers, std::size_t count, float scale, float end, std::int8_t* rounded);
    std::uint32_t (*roundToWords)(
        const float* numbers, std::size_t count, float scale, float end, std::int16_t* rounded);

    /// Of pairs of numbers, the amplitudes: the square root of the sum of squares times a unit. The sums fit in 31
    /// bits.
    void (*amplitudes)(const std::int16_t* numbers, std::size_t count, float unit, float* roots);

    /// Multiplies the numbers of `across` dimensions, 1 or 2, of each symbol by its gain.
    void (*fade)(const float* gains, std::size_t symbols, unsigned across, float* numbers);

    /// The numbers of packed bits: `bits` of them, 1 to 4, for each of I and Q in turn; of one dimension, with `bits`
    /// 1, they are the same. They are (1 - 2 b0) (8 - (1 - 2 b1) (4 - ...)) units, b0 being the first bit.
    void (*map)(const std::uint64_t* row, unsigned bits, std::size_t count, float unit, float* numbers);

    /// Undoes the columns of the sub-block interleaver (3GPP TS 36.212, 5.1.4.1.1): 32 columns of `rows` values, in the
    /// order in which they are sent, become rows of 32. Destroys the columns. The first form has one stream, the second
    /// alternating values of two.
    void (*rowsOfOne)(std::uint8_t* columns, std::size_t rows, std::uint8_t* values);
    void (*rowsOfTwo)(std::uint8_t* columns, std::size_t rows, std::uint8_t* first, std::uint8_t* second);

    /// The ratios ln(P(1) / P(0)) of each symbol's bits, by the nearest levels or by all of them.
    void (*maxLogRatios)(const DimensionRow& row, float* ratios);
    void (*exactRatios)(const DimensionRow& row, float* ratios);

    /// ln(1 + exp(-x)) for x of at least 0, off by at most 2e-7; exactRatios adds up levels by it.
    void (*logOnePlusExp)(const float* x, std::size_t count, float* logarithms);
};

/// Those that this machine can run, the best one first. The last one, "generic", runs everywhere.
std::vector<const RowKernels*> rowKernelSets();

/// The best one.
const RowKernels& rowKernels();

}  // namespace morvik::link

#endif
