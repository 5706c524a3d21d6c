// Simulation: pieces of error-rate runs and what is counted of them, as functions that WebAssembly exports. Arguments
// have been checked by morvik.js.
#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <iterator>
#include <utility>

#include "Export.h"
#include "Points.h"
#include "base/Thousandths.h"
#include "link/channel/DefaultScale.h"
#include "rules/Tail.h"
#include "simulation/Confidence.h"
#include "simulation/PointCount.h"
#include "simulation/StopRules.h"

using namespace morvik;

namespace {

/// A point's counts, with what they are counted by.
struct Count {
    unsigned K;
    simulation::StopRules rules;
    simulation::PointCount counted;

    Count(unsigned blockSize, unsigned iterations, simulation::StopRules stop, std::uint64_t first)
        : K(blockSize), rules(stop), counted(rules, {first, UINT64_MAX}, simulation::Tally(iterations))
    {
    }
};

}  // namespace

/// The scale that suits the algorithm, in thousandths.
MORVIK_EXPORT int morvikDefaultScale(unsigned algorithm, unsigned K, int milliDecibels)
{
    const double scale = link::defaultScale(static_cast<int>(algorithm), K, milliDecibels);
    return std::max(static_cast<int>(std::lround(1000 * scale)), 1);
}

/// Makes and decodes blocks. Writes the wrong bits of each after each iteration, then the clipped values of each.
MORVIK_EXPORT std::int32_t morvikSimulate(const javascript::Point* point,
                                          unsigned units,
                                          unsigned algorithm,
                                          unsigned iterations,
                                          std::uint32_t firstLow,
                                          std::uint32_t firstHigh,
                                          std::uint32_t count,
                                          std::uint32_t* wrongBits)
{
    const link::Frames& frames = javascript::framesOf(*point, javascript::wide(firstLow, firstHigh), count);
    std::copy(frames.clipped.begin(), frames.clipped.end(), wrongBits + std::size_t{count} * iterations);
    return veltra_ip_morvik_v1_0_batch_count_errors_i8(javascript::decoderOf(units, algorithm),
                                                       frames.streams[0].data(),
                                                       frames.streams[1].data(),
                                                       frames.streams[2].data(),
                                                       static_cast<std::int32_t>(point->K + rules::tailPositions),
                                                       count,
                                                       iterations,
                                                       frames.sent.data(),
                                                       wrongBits,
                                                       std::size_t{count} * iterations);
}

/// Begins to count a point from block `first`. It ends with the block error or the block of these numbers.
MORVIK_EXPORT Count* morvikCountBegin(unsigned K,
                                      unsigned iterations,
                                      double blockErrors,
                                      double maxBlocks,
                                      std::uint32_t firstLow,
                                      std::uint32_t firstHigh)
{
    simulation::StopRules rules;
    rules.blockErrors = static_cast<std::uint64_t>(blockErrors);
    rules.maxBlocks = static_cast<std::uint64_t>(maxBlocks);
    return new Count(K, iterations, rules, javascript::wide(firstLow, firstHigh));
}

MORVIK_EXPORT void morvikCountEnd(Count* count)
{
    delete count;
}

/// Takes what morvikSimulate has written of a piece. Pieces may come in any order. Returns whether the point is
/// complete.
MORVIK_EXPORT bool morvikCountTake(
    Count* count, std::uint32_t firstLow, std::uint32_t firstHigh, std::uint32_t blocks, const std::uint32_t* wrongBits)
{
    const std::uint32_t* const clipped = wrongBits + blocks * count->counted.tally().errors.size();
    simulation::BatchResult result;
    result.batch = {0, javascript::wide(firstLow, firstHigh), blocks};
    result.wrongBits.assign(wrongBits, clipped);
    result.clipped.assign(clipped, clipped + blocks);
    count->counted.take(std::move(result));
    return count->counted.isComplete();
}

/// Writes what has been counted at an iteration, 1 or more: blocks, bit errors, block errors, clipped values, the bit
/// error rate with its bounds, and the block error rate with its. Without blocks, the rates are not numbers.
MORVIK_EXPORT void morvikCountRow(const Count* count, unsigned iteration, double* numbers)
{
    const simulation::Tally& tally = count->counted.tally();
    const simulation::ErrorCounts& errors = tally.errors[iteration - 1];
    const auto blocks = static_cast<double>(tally.blocks);
    const bool isKnown = tally.blocks > 0;
    const simulation::Bounds none;
    const simulation::Bounds bits = isKnown ? simulation::bitErrorBounds(errors, tally.blocks, count->K) : none;
    const simulation::Bounds failed = isKnown ? simulation::blockErrorBounds(errors, tally.blocks) : none;
    const double row[] = {blocks,
                          static_cast<double>(errors.bitErrors),
                          static_cast<double>(errors.blockErrors),
                          static_cast<double>(tally.clipped),
                          static_cast<double>(errors.bitErrors) / (blocks * count->K),
                          bits.low,
                          bits.high,
                          static_cast<double>(errors.blockErrors) / blocks,
                          failed.low,
                          failed.high};
    std::copy(std::begin(row), std::end(row), numbers);
}

/// A rate as text of at most 31 letters: "1.23e-04".
MORVIK_EXPORT void morvikRateText(double rate, int decimals, char* text)
{
    std::snprintf(text, 32, "%.*e", decimals, rate);
}
