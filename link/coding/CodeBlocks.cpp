// CodeBlocks: how a transport block is divided into code blocks: 3GPP TS 36.212, clauses 5.1.1 and 5.1.2.
#include "CodeBlocks.h"

#include <algorithm>
#include <stdexcept>
#include <string>

#include "rules/BlockSizes.h"

namespace morvik::link {

CodeBlocks codeBlocksOf(unsigned bits)
{
    if (bits == 0 || bits > mostTransportBits) {
        throw std::invalid_argument("a transport block has 1 to " + std::to_string(mostTransportBits) + " bits, not " +
                                    std::to_string(bits));
    }
    constexpr unsigned largest = rules::blockSizes.back().K;  // Z
    const unsigned B = bits + crcBits;
    const unsigned count = B <= largest ? 1 : (B + largest - crcBits - 1) / (largest - crcBits);
    const unsigned total = B + (count > 1 ? count * crcBits : 0);  // B'
    const auto* const plus = std::find_if(
        rules::blockSizes.begin(), rules::blockSizes.end(), [=](const auto& row) { return count * row.K >= total; });
    CodeBlocks blocks{bits, count, 0, plus->K, count, 0, 0};
    if (count > 1) {
        blocks.sizeMinus = (plus - 1)->K;
        blocks.countMinus = (count * plus->K - total) / (blocks.sizePlus - blocks.sizeMinus);
        blocks.countPlus = count - blocks.countMinus;
    }
    blocks.fillers = blocks.countPlus * blocks.sizePlus + blocks.countMinus * blocks.sizeMinus - total;
    return blocks;
}

}  // namespace morvik::link
