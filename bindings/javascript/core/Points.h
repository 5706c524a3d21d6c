// Points: the points that JavaScript asks about, and the decoders and frames that serve them.
#ifndef MORVIK_BINDINGS_JAVASCRIPT_POINTS_H
#define MORVIK_BINDINGS_JAVASCRIPT_POINTS_H

#include <cstdint>

#include "link/FrameSource.h"
#include "morvik_v1_0_batch.h"

namespace morvik::javascript {

constexpr std::uint64_t wide(std::uint32_t low, std::uint32_t high)
{
    return std::uint64_t{high} << 32 | low;
}

/// A channel: five numbers, as morvik.js writes them.
struct Point {
    std::uint32_t K;
    std::int32_t milliDecibels;  ///< Eb/N0 in thousandths of a decibel
    std::int32_t milliScale;     ///< the soft value for amplitude 1, in thousandths
    std::uint32_t seedLow;
    std::uint32_t seedHigh;

    std::uint64_t seed() const
    {
        return wide(seedLow, seedHigh);
    }

    double scale() const;
};

/// Makes frames `first` to `first` + `count` - 1. They stay until the next call.
const link::Frames& framesOf(const Point& point, std::uint64_t first, unsigned count);

/// A decoder of this configuration.
veltra_ip_morvik_v1_0_state* decoderOf(unsigned units, unsigned algorithm);

}  // namespace morvik::javascript

#endif
