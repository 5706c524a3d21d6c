// TurboEncoder: the turbo encoder of 3GPP TS 36.212, clause 5.1.3.2, for up to 64 blocks at once.
#ifndef MORVIK_LINK_CODING_TURBOENCODER_H
#define MORVIK_LINK_CODING_TURBOENCODER_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "PackedBits.h"

namespace morvik::link {

class TurboEncoder {
public:
    /// The most blocks of one call. Encoding a single block takes about as long.
    static constexpr unsigned blocksAtOnce = 64;

    /// The three streams: systematic, first and second parity. Each block has K + 4 bits, its twelve tail bits last, in
    /// the order of include/morvik_v1_0_bitacc_cmodel.h.
    using Streams = std::array<PackedBlocks, 3>;

    /// Throws std::invalid_argument if K is not a block size.
    explicit TurboEncoder(unsigned K);

    /// Words of a packed block, with and without its tail.
    unsigned words() const
    {
        return itsWords;
    }

    /// Encodes `count` blocks, up to blocksAtOnce. The bits of `information` after a block's K must be 0; those of the
    /// streams after K + 4 become 0.
    void encode(const PackedBlocks& information, unsigned count, Streams& streams);

    /// The same in another order: block b becomes the packed row rows[b], whose bit i is bit order[i] of the block,
    /// counted through its three streams of K + 4 bits.
    void encode(const PackedBlocks& information,
                unsigned count,
                const std::vector<std::uint16_t>& order,
                std::uint64_t* const* rows);

private:
    using Slices = std::vector<std::uint64_t>;  ///< one word for each position: its bits of all blocks

    void encodeSlices(const PackedBlocks& information, unsigned count);
    void gather(const PackedBlocks& information, unsigned word, unsigned count);
    void scatter(unsigned stream, unsigned word, unsigned count, PackedBlocks& blocks) const;

    unsigned itsK;
    unsigned itsWords;
    std::vector<std::uint16_t> itsPermutation;
    std::array<Slices, 3> itsSlices;
};

}  // namespace morvik::link

#endif
