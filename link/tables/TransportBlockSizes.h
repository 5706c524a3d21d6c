// TransportBlockSizes: 3GPP TS 36.213, tables 7.1.7.1-1, 7.1.7.1-1A and 7.1.7.2.1-1.
#ifndef MORVIK_LINK_TABLES_TRANSPORTBLOCKSIZES_H
#define MORVIK_LINK_TABLES_TRANSPORTBLOCKSIZES_H

#include <cstdint>

namespace morvik::link {

/// The tables of the downlink's modulation and coding schemes: up to 64QAM (7.1.7.1-1) or 256QAM (7.1.7.1-1A).
enum class McsTable { qam64, qam256 };

/// A modulation and coding scheme.
struct Mcs {
    unsigned bitsPerSymbol;  ///< 2, 4, 6 or 8 (Q_m)
    unsigned sizeIndex;      ///< row of the transport block sizes (I_TBS)
};

/// The number of schemes of a table, without those reserved for retransmissions.
unsigned countOf(McsTable table);

/// Throws std::invalid_argument if the table has no such index.
Mcs mcsOf(McsTable table, unsigned index);

/// The most pairs of resource blocks that a transport block can take.
constexpr unsigned mostResourceBlocks = 110;

/// Bits of a transport block on one layer (table 7.1.7.2.1-1), without its CRC. Throws std::invalid_argument for a size
/// index above 33, or for 0 or more than 110 pairs of resource blocks.
unsigned transportBlockSize(unsigned sizeIndex, unsigned resourceBlocks);

}  // namespace morvik::link

#endif
