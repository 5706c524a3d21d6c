// SentBlocks: the blocks of tests/data/vectors, made by another encoder, with the bits sent.
#ifndef MORVIK_TESTS_SUPPORT_SENTBLOCKS_H
#define MORVIK_TESTS_SUPPORT_SENTBLOCKS_H

#include <string>
#include <vector>

#include "Blocks.h"

namespace morvik::blocks {

struct SentBlock {
    Block soft;
    std::string bits;  ///< K characters, 0 or 1
};

/// The names of all files of blocks.
const std::vector<std::string>& sentBlockNames();

std::vector<SentBlock> readSentBlocks(const std::string& name);

}  // namespace morvik::blocks

#endif
