// RateMatching: rate matching of one code block and its reverse: 3GPP TS 36.212, clause 5.1.4.1.
//
// The circular buffer is kept without its dummy and filler bits (<NULL>). So a transmission is a run of consecutive
// bits that may wrap around, and all redundancy versions share one order of bits.
#ifndef MORVIK_LINK_CODING_RATEMATCHING_H
#define MORVIK_LINK_CODING_RATEMATCHING_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <vector>

namespace morvik::link {

/// Redundancy versions are 0 to 3.
constexpr unsigned redundancyVersions = 4;

/// The size of a soft buffer that holds whole code blocks.
constexpr unsigned unlimitedBuffer = std::numeric_limits<unsigned>::max();

class RateMatching {
public:
    /// K             one of the 188 block sizes
    /// fillers       filler bits at its start, fewer than K (F)
    /// bufferSize    positions of the circular buffer, dummy and filler bits included, or unlimitedBuffer (N_cb)
    ///
    /// Throws std::invalid_argument for other values, and if the buffer holds no bit of the block.
    RateMatching(unsigned K, unsigned fillers, unsigned bufferSize = unlimitedBuffer);

    /// Bits of the circular buffer, without dummy and filler bits.
    unsigned size() const
    {
        return static_cast<unsigned>(itsPositions.size());
    }

    /// Where a redundancy version starts in it (k_0).
    unsigned start(unsigned version) const
    {
        return itsStarts[version];
    }

    /// For each bit of the circular buffer: its stream times K + 4, plus its position in the stream.
    const std::vector<std::uint16_t>& positions() const
    {
        return itsPositions;
    }

    /// Puts the three packed streams of K + 4 bits into a packed circular buffer, bit by bit. TurboEncoder does this
    /// for many blocks at once.
    void interleave(const std::array<const std::uint64_t*, 3>& streams, std::uint64_t* buffer) const;

    /// Writes `count` bits (E) of a redundancy version to a packed row, from bit `to` on.
    void select(
        const std::uint64_t* buffer, unsigned version, std::size_t count, std::uint64_t* row, std::size_t to) const;

    /// Adds `count` received values to a soft buffer of size() values.
    void recover(const float* received, unsigned version, std::size_t count, float* buffer) const;

    /// The same in integers, each sum clipped to `width` bits, 2 to 16.
    void recover(
        const std::int16_t* received, unsigned version, std::size_t count, unsigned width, std::int16_t* buffer) const;

    /// Puts received values, at most size(), into a soft buffer of size() values, and 0 where there are none.
    void place(const std::int8_t* received, unsigned version, std::size_t count, std::int8_t* buffer) const;

    /// Puts values of the circular buffer into the three streams of K + 4 values. Filler bits become `filler`,
    /// positions outside the buffer 0.
    void deinterleave(const float* buffer, float filler, const std::array<float*, 3>& streams) const;
    void deinterleave(const std::int8_t* buffer, std::int8_t filler, const std::array<std::int8_t*, 3>& streams) const;

private:
    /// Values that are consecutive in the circular buffer with and without dummy and filler bits.
    struct Run {
        std::uint16_t from;  ///< in the buffer without them
        std::uint16_t to;    ///< in the one with them
        std::uint16_t count;
    };

    unsigned itsK;
    unsigned itsFillers;
    unsigned itsRows;  ///< of the sub-block interleaver
    std::vector<Run> itsRuns;
    std::array<unsigned, redundancyVersions> itsStarts{};
    std::vector<std::uint16_t> itsPositions;
};

}  // namespace morvik::link

#endif
