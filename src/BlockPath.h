// BlockPath: a way to decode blocks; the components are one, the lanes the other.
#ifndef MORVIK_SRC_BLOCKPATH_H
#define MORVIK_SRC_BLOCKPATH_H

#include <cstddef>
#include <cstdint>

#include "Batch.h"
#include "Status.h"

/// Use: take some blocks in; run their passes by `decode` or by `countErrors`; fetch what they give.
class BlockPath {
public:
    virtual ~BlockPath() = default;

    /// Takes in blocks from block `first` on, at most `most` and at least 1; returns how many. Warns of a value that is
    /// clipped, and first of the tag of an earlier block. Exhausted memory throws std::bad_alloc.
    virtual unsigned take(const morvik::simulation_call::Batch& batch, std::size_t first, unsigned most) = 0;

    virtual morvik::simulation_call::Status decode(unsigned iterations) = 0;

    /// Decodes, and after each full iteration counts the decisions of each block that differ from `sent`. Both arrays
    /// begin with the first block that was taken.
    virtual morvik::simulation_call::Status countErrors(unsigned iterations,
                                                        const std::uint8_t* sent,
                                                        std::uint32_t* errors) = 0;

    /// Decisions of each block.
    virtual std::size_t blockSize() const = 0;

    /// What the blocks that were taken give, one block after the other.
    virtual void decisions(std::uint8_t* to) = 0;
    virtual void ratios(std::int16_t* to) = 0;

protected:
    BlockPath() = default;
    BlockPath(const BlockPath&) = delete;
    BlockPath& operator=(const BlockPath&) = delete;
};

#endif
