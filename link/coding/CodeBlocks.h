// CodeBlocks: how a transport block is divided into code blocks: 3GPP TS 36.212, clauses 5.1.1 and 5.1.2.
#ifndef MORVIK_LINK_CODING_CODEBLOCKS_H
#define MORVIK_LINK_CODING_CODEBLOCKS_H

#include "Crc.h"

namespace morvik::link {

/// Names in brackets are the standard's. The first countMinus code blocks have sizeMinus bits, the others sizePlus.
struct CodeBlocks {
    unsigned bits;        ///< of the transport block, without its CRC (A)
    unsigned count;       ///< code blocks (C)
    unsigned fillers;     ///< zeros before the first code block's bits, which are not sent (F)
    unsigned sizePlus;    ///< K+
    unsigned countPlus;   ///< C+
    unsigned sizeMinus;   ///< K-, or 0
    unsigned countMinus;  ///< C-

    /// Bits of code block r, 40 to 6144: fillers, bits of the transport block and its CRC, and CRC (K_r).
    unsigned size(unsigned r) const
    {
        return r < countMinus ? sizeMinus : sizePlus;
    }

    /// Filler bits of code block r.
    unsigned fillersOf(unsigned r) const
    {
        return r == 0 ? fillers : 0;
    }

    /// Bits of each code block's own CRC; a single code block has none.
    unsigned ownCrcBits() const
    {
        return count > 1 ? crcBits : 0;
    }

    /// Bits of the transport block and its CRC that code block r carries.
    unsigned payload(unsigned r) const
    {
        return size(r) - fillersOf(r) - ownCrcBits();
    }
};

/// The largest transport block: 2^24 bits, 170 times that of the standard.
constexpr unsigned mostTransportBits = 1U << 24;

/// Divides a transport block of 1 to mostTransportBits bits. Throws std::invalid_argument for other sizes.
CodeBlocks codeBlocksOf(unsigned bits);

}  // namespace morvik::link

#endif
