// Channel: BPSK over additive white Gaussian noise, and the quantiser behind it.
//
// A bit 1 is sent as +1 and a bit 0 as -1. A soft value is the received value times a scale, rounded and clipped to
// -128 ... 127.
#ifndef MORVIK_LINK_CHANNEL_CHANNEL_H
#define MORVIK_LINK_CHANNEL_CHANNEL_H

#include <array>
#include <cstdint>

#include "Precise.h"
#include "link/random/AliasTable.h"

namespace morvik::link {

/// The noise's standard deviation for amplitude 1. Eb/N0 includes the tail's energy: the rate is K / (3 K + 12).
Precise noiseDeviation(unsigned K, int milliDecibels);

/// The distribution of the rounded value r of a bit sent as 1. That of a 0 is the distribution of -r.
struct RoundedDistribution {
    /// Probabilities of r times 2^48, indexed by the value's byte (r modulo 256). The end -128 includes all below it,
    /// 127 all above. The sum is exact.
    AliasTable::Weights weights;

    /// Thresholds for a uniform 32-bit number that splits the ends: below `top`[0], r is 127 rather than more; below
    /// `top`[1], r is 128 or less rather than more; below `bottom`, r is -128 rather than less.
    std::array<std::uint64_t, 2> top;
    std::uint64_t bottom;
};

/// `scale` above 0.
RoundedDistribution roundedDistribution(const Precise& deviation, double scale);

/// A soft value, and whether it was clipped.
struct SoftValue {
    std::int8_t value;
    bool clipped;

    static SoftValue of(int rounded)
    {
        if (rounded < -128) {
            return {-128, true};
        }
        return rounded > 127 ? SoftValue{127, true} : SoftValue{static_cast<std::int8_t>(rounded), false};
    }
};

}  // namespace morvik::link

#endif
