// TransportBlock: turns transport blocks into the coded bits of a transmission, and received values into code blocks:
// 3GPP TS 36.212, clauses 5.1.1 to 5.1.5.
#ifndef MORVIK_LINK_CODING_TRANSPORTBLOCK_H
#define MORVIK_LINK_CODING_TRANSPORTBLOCK_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <map>
#include <vector>

#include "CodeBlocks.h"
#include "PackedBits.h"
#include "RateMatching.h"
#include "TurboEncoder.h"

namespace morvik::link {

/// How a transport block is sent. Names in brackets are the standard's.
struct TransportFormat {
    unsigned bits;                              ///< of the transport block, without its CRC (A)
    unsigned codedBits;                         ///< of one transmission (G)
    unsigned bitsPerSymbol;                     ///< 1, 2, 4, 6 or 8 (Q_m)
    unsigned layers = 1;                        ///< 1 to 4 (N_L)
    unsigned softBufferSize = unlimitedBuffer;  ///< positions for the transport block (N_IR)
};

/// The code of one format. Rows of a batch are transport blocks; each has C code blocks.
class TransportBlockCode {
public:
    /// Throws std::invalid_argument for a format that cannot be sent; the text says what would fit.
    explicit TransportBlockCode(const TransportFormat& format);

    const TransportFormat& format() const
    {
        return itsFormat;
    }

    const CodeBlocks& blocks() const
    {
        return itsBlocks;
    }

    /// Coded bits of code block r in one transmission (E_r), and the first of them in the transmission.
    unsigned codedBits(unsigned r) const
    {
        return codedOffset(r + 1) - codedOffset(r);
    }
    unsigned codedOffset(unsigned r) const;

    const RateMatching& matching(unsigned r) const
    {
        return itsKinds[itsKindOf[r]];
    }

    /// The first bit of the transport block and its CRC that code block r carries.
    std::size_t payloadOffset(unsigned r) const
    {
        return itsPayloadOffsets[r];
    }

    /// Words of the packed circular buffers of one transport block. Each buffer starts at a new word.
    std::size_t bufferWords() const
    {
        return itsWordOffsets.back();
    }

    /// Encodes packed transport blocks: fills the packed circular buffers of each.
    void encode(const PackedBlocks& information, unsigned count, PackedBlocks& buffers);

    /// The coded bits of one transmission of each transport block.
    void select(const PackedBlocks& buffers, unsigned count, unsigned version, PackedBlocks& coded) const;

    /// The same for one transport block. `coded` must be all zeros.
    void select(const std::uint64_t* buffers, unsigned version, std::uint64_t* coded) const;

    /// Code block r of a packed transport block as it enters the encoder: filler bits, its part of the transport block
    /// and of its CRC, its own CRC. `block` must be all zeros.
    void frame(const std::uint64_t* row, unsigned r, std::uint64_t* block) const;

    /// Values of a soft buffer; that of code block r starts at softOffset(r).
    std::size_t softSize() const
    {
        return itsSoftOffsets.back();
    }
    std::size_t softOffset(unsigned r) const
    {
        return itsSoftOffsets[r];
    }

    /// Adds one transmission of codedBits values to a soft buffer of softSize() values.
    void recover(const float* received, unsigned version, float* buffer) const;

    /// The same in integers, each sum clipped to `width` bits, 2 to 16.
    void recover(const std::int16_t* received, unsigned version, unsigned width, std::int16_t* buffer) const;

    /// Whether a transmission sends no bit of the circular buffers twice.
    bool sendsOnce() const;

    /// Puts one transmission that does so into a soft buffer of softSize() values, and 0 for what it does not send.
    void place(const std::int8_t* received, unsigned version, std::int8_t* buffer) const;

    /// Puts the decisions of code block r, a byte each, into a packed row of the transport block and its CRC, and
    /// returns whether the code block's CRC fits: its own or, if it is alone, that of the transport block.
    bool join(const std::uint8_t* decisions, unsigned r, std::uint64_t* row) const;

    /// Whether the transport block's CRC fits in such a row.
    bool fits(const std::uint64_t* row) const;

private:
    /// Code block r of transport block b.
    struct Place {
        unsigned b;
        unsigned r;
    };

    void layOut();
    void encodePlaces(const PackedBlocks& information, PackedBlocks& buffers);

    TransportFormat itsFormat;
    CodeBlocks itsBlocks;
    std::vector<RateMatching> itsKinds;  ///< of each size of code blocks, with and without filler bits
    std::vector<std::uint8_t> itsKindOf;
    std::vector<std::size_t> itsWordOffsets;
    std::vector<std::size_t> itsSoftOffsets;
    std::vector<std::size_t> itsPayloadOffsets;
    std::map<unsigned, TurboEncoder> itsEncoders;  ///< by block size
    std::vector<Place> itsPlaces;                  ///< of the code blocks encoded at once
    PackedBlocks itsFramed;                        ///< their bits
};

}  // namespace morvik::link

#endif
