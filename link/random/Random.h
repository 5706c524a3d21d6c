// Random: the random numbers of a frame, counter-based: each has an index and is drawn without the others.
//
// The generator is Philox4x32-10 of Random123. Its key is the seed; its counter holds the frame, the point and an
// index, and gives 128 bits. So a frame does not depend on what was drawn before, or by which thread.
#ifndef MORVIK_LINK_RANDOM_RANDOM_H
#define MORVIK_LINK_RANDOM_RANDOM_H

#include <Random123/philox.h>

#include <array>
#include <cstdint>

namespace morvik::link {

using RandomKey = std::array<std::uint32_t, 2>;

/// 128 random bits; word 0 is the lowest.
using RandomBlock = std::array<std::uint32_t, 4>;

/// The random block of a counter, given as words 0 and 1, word 0 lowest, and words 2 and 3.
inline RandomBlock randomBlock(const RandomKey& key, std::uint64_t counterLow, std::uint64_t counterHigh)
{
    const auto low = [](std::uint64_t words) {
        return static_cast<std::uint32_t>(words & 0xFFFFFFFF);
    };
    const philox4x32_ctr_t counter = {
        {low(counterLow), low(counterLow >> 32), low(counterHigh), low(counterHigh >> 32)}};
    const philox4x32_ctr_t words = philox4x32(counter, (philox4x32_key_t{{key[0], key[1]}}));
    return {words.v[0], words.v[1], words.v[2], words.v[3]};
}

RandomKey randomKey(std::uint64_t seed);

/// A key that depends on another key and two words.
RandomKey derivedKey(const RandomKey& key, std::uint64_t low, std::uint64_t high);

/// The random numbers of a frame. Word 0 of the counter is the index, the others name the frame and its point.
class FrameRandom {
public:
    /// `K` below 8192; `milliDecibels`, the Eb/N0 in thousandths of a decibel, from -262144 to 262143.
    FrameRandom(const RandomKey& key, unsigned K, int milliDecibels, std::uint64_t frame);

    /// With a key that names the point. `part` distinguishes the transmissions of a frame.
    FrameRandom(const RandomKey& key, std::uint32_t part, std::uint64_t frame);

    RandomBlock block(std::uint32_t index) const
    {
        return randomBlock(itsKey, counterLow(index), itsHigh);
    }

    std::uint64_t counterLow(std::uint32_t index) const
    {
        return itsLow | index;
    }

    std::uint64_t counterHigh() const
    {
        return itsHigh;
    }

private:
    RandomKey itsKey;
    std::uint64_t itsLow;
    std::uint64_t itsHigh;
};

/// First indices of a frame's random numbers, by purpose.
namespace random_index {

constexpr std::uint32_t information = 0;         ///< one per 128 information bits
constexpr std::uint32_t softValues = 1U << 24;   ///< one per eight soft values
constexpr std::uint32_t refinements = 2U << 24;  ///< one per soft value, seldom needed
constexpr std::uint32_t gaussian = 3U << 24;     ///< one per Gaussian number
constexpr std::uint32_t fineNoise = 4U << 24;    ///< one per eight numbers of noise

}  // namespace random_index

}  // namespace morvik::link

#endif
