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

    /// Takes in up to `most` blocks, 1 or more, from block `first` on; returns how many. Reports the first value of a
    /// state's life that is clipped, and before it a tag that is truncated, of a block before. Exhausted memory
    /// leaves it as an exception.
    virtual unsigned take(const simulation_call::Batch& batch, std::size_t first, unsigned most) = 0;

    virtual simulation_call::Status decode(unsigned iterations) = 0;

    /// Decodes, and counts for each block the decisions that differ from `sent` after each full iteration. `sent`
    /// and `errors` begin with the first block that was taken.
    virtual simulation_call::Status countErrors(unsigned iterations,
                                                const std::uint8_t* sent,
                                                std::uint32_t* errors) = 0;

    /// Decisions of each block.
    virtual std::size_t blockSize() const = 0;

    /// Of the blocks that were taken, one after the other.
    virtual void decisions(std::uint8_t* to) = 0;
    virtual void ratios(std::int16_t* to) = 0;

protected:
    BlockPath() = default;
    BlockPath(const BlockPath&) = delete;
    BlockPath& operator=(const BlockPath&) = delete;
};

#endif
