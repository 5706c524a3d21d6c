// MissedBlocks: blocks that the lanes have decoded, and the metric columns that they would have left.
#ifndef MORVIK_SRC_MISSEDBLOCKS_H
#define MORVIK_SRC_MISSEDBLOCKS_H

#include <vector>

#include "OriginalComponents.h"
#include "lanes/LaneDecoder.h"

/// A trace also shows cells of the metric columns that its own block does not write: what earlier blocks left there.
/// The lanes write no columns. Before the components work again, this computes the columns of the blocks that they
/// missed. Few blocks are enough: each overwrites what earlier ones of its size or less have left.
class MissedBlocks {
public:
    explicit MissedBlocks(OriginalComponents& originals) : itsOriginals(originals) {}

    /// Adds a block that the lanes have decoded.
    void add(morvik::lanes::LoadedBlock input, unsigned K, unsigned iterations);

    /// Drops the blocks that a decode of K bits overwrites.
    void overwrite(unsigned K);

    /// Drops all blocks: the state has another decoder.
    void forget();

    /// Makes the columns of the original decoder what they would be had it decoded these blocks.
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
