// BlockPath: the interface of the two ways to decode blocks, components and lanes.
#ifndef MORVIK_SRC_BLOCKPATH_H
#define MORVIK_SRC_BLOCKPATH_H

#include <cstddef>
#include <cstdint>

#include "Batch.h"
#include "Status.h"

/// Usage: take blocks, run their passes with `decode` or `countErrors`, then fetch the results.
class BlockPath {
public:
    virtual ~BlockPath() = default;

    /// Loads 1 to `most` blocks from block `first` on and returns how many. Warns of a clipped value, after the tag
    /// warnings of earlier blocks. Throws std::bad_alloc.
    virtual unsigned take(const morvik::simulation_call::Batch& batch, std::size_t first, unsigned most) = 0;

    virtual morvik::simulation_call::Status decode(unsigned iterations) = 0;

    /// Decodes, and counts after each full iteration the decisions of each block that differ from `sent`. Both arrays
    /// begin with the first block taken.
    virtual morvik::simulation_call::Status countErrors(unsigned iterations,
                                                        const std::uint8_t* sent,
                                                        std::uint32_t* errors) = 0;

    /// Decisions per block.
    virtual std::size_t blockSize() const = 0;

    /// The results of the blocks taken, one block after the other.
    virtual void decisions(std::uint8_t* to) = 0;
    virtual void ratios(std::int16_t* to) = 0;

protected:
    BlockPath() = default;
    BlockPath(const BlockPath&) = delete;
    BlockPath& operator=(const BlockPath&) = delete;
};

#endif
