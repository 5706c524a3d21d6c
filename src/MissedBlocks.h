// MissedBlocks: blocks decoded by the lanes, and the metric columns that they would have left.
#ifndef MORVIK_SRC_MISSEDBLOCKS_H
#define MORVIK_SRC_MISSEDBLOCKS_H

#include <vector>

#include "OriginalComponents.h"
#include "lanes/LaneDecoder.h"

/// Recomputes the metric columns of blocks decoded by the lanes, which write none, before the components decode again.
/// A trace also shows column entries that its own block does not write, left over from earlier blocks. Few blocks need
/// to be kept: each overwrites the columns of earlier blocks of its size or smaller.
class MissedBlocks {
public:
    explicit MissedBlocks(OriginalComponents& originals) : itsOriginals(originals) {}

    /// Adds a block decoded by the lanes.
    void add(morvik::lanes::LoadedBlock input, unsigned K, unsigned iterations);

    /// Drops the blocks that a decode of K bits overwrites.
    void overwrite(unsigned K);

    /// Drops all blocks: the state has another decoder.
    void forget();

    /// Sets the original decoder's columns as if it had decoded these blocks.
    void computeColumns();

private:
    struct Block {
        morvik::lanes::LoadedBlock input;
        unsigned K;
        unsigned iterations;
    };

    void decodeByTwin(const Block& block);

    OriginalComponents& itsOriginals;
    std::vector<Block> itsBlocks;  ///< each shorter than the one before
};

#endif
