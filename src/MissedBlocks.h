// MissedBlocks: blocks that the lanes have decoded, and the metric columns that they would have left.
#ifndef MORVIK_SRC_MISSEDBLOCKS_H
#define MORVIK_SRC_MISSEDBLOCKS_H

#include <vector>

#include "OriginalComponents.h"
#include "lanes/LaneDecoder.h"

/// A trace shows cells of the metric columns that no computation of its own block writes, with what earlier blocks
/// left there. The lanes write no columns; so before the components work again, those of the blocks that they missed
/// are computed. Only few are needed: a block leaves nothing of earlier ones that are not longer.
class MissedBlocks {
public:
    explicit MissedBlocks(OriginalComponents& originals) : itsOriginals(originals) {}

    /// Adds a block that the lanes have decoded.
    void add(lanes::LoadedBlock input, unsigned K, unsigned iterations);

    /// A block of K bits is going to be decoded over them.
    void overwrite(unsigned K);

    /// The columns are those of a decoder that has not decoded them.
    void forget();

    /// Leaves the columns of the original decoder as they would be had it decoded these blocks.
    void computeColumns();

private:
    struct Block {
        lanes::LoadedBlock input;
        unsigned K;
        unsigned iterations;
    };

    void decodeByTwin(const Block& block);

    OriginalComponents& itsOriginals;
    std::vector<Block> itsBlocks;  ///< each shorter than the one before
};

#endif
