// Crc: the cyclic redundancy checks of 3GPP TS 36.212, clause 5.1.1.
#ifndef MORVIK_LINK_CODING_CRC_H
#define MORVIK_LINK_CODING_CRC_H

#include <cstddef>
#include <cstdint>

namespace morvik::link {

/// Parity bits of a transport block and of each of several code blocks.
constexpr unsigned crcBits = 24;

/// The parity bits of `count` packed bits from `first` on: p_0, the first one sent, is bit 0, p_23 is bit 23.
///
/// crc24a: D^24 + D^23 + D^18 + D^17 + D^14 + D^11 + D^10 + D^7 + D^6 + D^5 + D^4 + D^3 + D + 1, of a transport block
/// crc24b: D^24 + D^23 + D^6 + D^5 + D + 1, of a code block, where a transport block has several
std::uint32_t crc24a(const std::uint64_t* row, std::size_t first, std::size_t count);
std::uint32_t crc24b(const std::uint64_t* row, std::size_t first, std::size_t count);

/// Whether one of these CRCs can fit although `wrong` of up to 2^23 - 1 bits, parity included, are. Both generators are
/// D + 1 times a primitive polynomial of degree 23, so odd numbers of errors, and two, always show.
constexpr bool crcCanMiss(std::size_t wrong)
{
    return wrong >= 4 && wrong % 2 == 0;
}

}  // namespace morvik::link

#endif
