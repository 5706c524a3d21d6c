// RandomBits: the information bits of a frame.
#include "RandomBits.h"

#include "link/coding/PackedBits.h"

namespace morvik::link {

void drawBits(RandomBatch& batch, const FrameRandom& random, std::size_t count, std::uint64_t* row)
{
    const std::size_t words = wordsOf(count);
    batch.clear();
    for (std::size_t word = 0; word < words; word += 2) {
        const auto index = static_cast<std::uint32_t>(word / 2);
        batch.put(random.counterLow(random_index::information + index), random.counterHigh());
    }
    batch.draw();
    for (std::size_t word = 0; word < words; ++word) {
        row[word] = word % 2 == 0 ? batch.low(word / 2) : batch.high(word / 2);
    }
    row[words - 1] &= lowBits(count - 64 * (words - 1));
}

}  // namespace morvik::link
