// Random: the random numbers of a frame, counter-based: each has an index and is drawn without the others.
#include "Random.h"

namespace morvik::link {

namespace {

std::uint32_t lowWord(std::uint64_t value)
{
    return static_cast<std::uint32_t>(value & 0xFFFFFFFF);
}

std::uint32_t highWord(std::uint64_t value)
{
    return static_cast<std::uint32_t>(value >> 32);
}

}  // namespace

RandomKey randomKey(std::uint64_t seed)
{
    return {lowWord(seed), highWord(seed)};
}

RandomKey derivedKey(const RandomKey& key, std::uint64_t low, std::uint64_t high)
{
    const RandomBlock block = randomBlock(key, low, high);
    return {block[0], block[1]};
}

FrameRandom::FrameRandom(const RandomKey& key, std::uint32_t part, std::uint64_t frame)
    : itsKey(key), itsLow(frame << 32), itsHigh(std::uint64_t{part} << 32 | frame >> 32)
{
}

FrameRandom::FrameRandom(const RandomKey& key, unsigned K, int milliDecibels, std::uint64_t frame)
    : itsKey(key),
      itsLow(frame << 32),
      itsHigh(std::uint64_t{K << 19 | (static_cast<std::uint32_t>(milliDecibels) & 0x7FFFF)} << 32 | frame >> 32)
{
}

}  // namespace morvik::link
