// Random: the random numbers of a frame, from a counter: each has its place and is drawn without the others.
#include "Random.h"

#include <Random123/philox.h>

namespace morvik::link {

FrameKey frameKey(std::uint64_t seed, unsigned K, int milliDecibels, std::uint64_t frame)
{
    const auto low = [](std::uint64_t value) {
        return static_cast<std::uint32_t>(value & 0xFFFFFFFF);
    };
    return {{low(seed), low(seed >> 32)},
            {low(frame), low(frame >> 32), K << 19 | (static_cast<std::uint32_t>(milliDecibels) & 0x7FFFF)}};
}

RandomBlock randomBlock(const FrameKey& frame, std::uint32_t index)
{
    const philox4x32_ctr_t counter = {{index, frame.counter[0], frame.counter[1], frame.counter[2]}};
    const philox4x32_key_t key = {{frame.key[0], frame.key[1]}};
    const philox4x32_ctr_t words = philox4x32(counter, key);
    return {words.v[0], words.v[1], words.v[2], words.v[3]};
}

}  // namespace morvik::link
