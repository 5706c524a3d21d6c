// Random: the random numbers of a frame, from a counter: each has its place and is drawn without the others.
//
// The generator is Philox4x32-10 of Random123. Its key is the seed; its counter holds the frame, the point and an
// index, for which it gives 128 bits. So a frame comes out the same whatever was drawn before, by any thread.
#ifndef MORVIK_LINK_RANDOM_H
#define MORVIK_LINK_RANDOM_H

#include <array>
#include <cstdint>

namespace morvik::link {

/// 128 random bits; word 0 holds the lowest.
using RandomBlock = std::array<std::uint32_t, 4>;

/// What names a frame: the generator's key, and its counter but for the index, which is the counter's first word.
struct FrameKey {
    std::array<std::uint32_t, 2> key;
    std::array<std::uint32_t, 3> counter;
};

/// `K` below 8192; `milliDecibels`, the Eb/N0 in thousandths of a decibel, from -262144 to 262143.
FrameKey frameKey(std::uint64_t seed, unsigned K, int milliDecibels, std::uint64_t frame);

RandomBlock randomBlock(const FrameKey& frame, std::uint32_t index);

/// Where the indices of a frame's numbers begin, by what they are for.
namespace random_index {

constexpr std::uint32_t information = 0;         ///< one for every 128 information bits
constexpr std::uint32_t softValues = 1U << 24;   ///< one for every eight soft values
constexpr std::uint32_t refinements = 2U << 24;  ///< one for every soft value, seldom needed
constexpr std::uint32_t gaussian = 3U << 24;     ///< one for every Gaussian number

}  // namespace random_index

}  // namespace morvik::link

#endif
