// Batch: the blocks of a call, all of one size, in the caller's memory.
#ifndef MORVIK_SRC_BATCH_H
#define MORVIK_SRC_BATCH_H

#include <cstddef>
#include <cstdint>
#include <variant>

#include "lanes/LaneDecoder.h"
#include "lanes/Unaligned.h"
#include "rules/Tail.h"

namespace morvik::simulation_call {

/// A call for a single block is a batch of one.
struct Batch {
    using Streams = std::variant<morvik::lanes::Streams<std::int32_t>,
                                 morvik::lanes::Streams<std::int16_t>,
                                 morvik::lanes::Streams<std::int8_t>>;

    Streams streams;  ///< of all blocks, one block after the other
    std::int32_t dinSize;
    std::uint32_t blocks;
    std::uint32_t iterations;
    const std::uint32_t* tags;  ///< null: all are 0

    /// K; 0 also if there are too few positions for the tail.
    unsigned blockSize() const
    {
        return dinSize < std::int32_t{morvik::rules::tailPositions}
                   ? 0
                   : static_cast<unsigned>(dinSize) - morvik::rules::tailPositions;
    }

    std::uint32_t tag(std::size_t block) const
    {
        return tags == nullptr ? 0 : morvik::lanes::valueAt(tags, block);
    }

    /// Returns the streams of one block.
    template <class Input>
    morvik::lanes::Streams<Input> streamsOf(const morvik::lanes::Streams<Input>& all, std::size_t block) const
    {
        const std::size_t first = block * static_cast<std::size_t>(dinSize);
        return {all.systematic + first, all.parity1 + first, all.parity2 + first};
    }
};

}  // namespace morvik::simulation_call

#endif
