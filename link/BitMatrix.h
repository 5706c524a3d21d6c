// BitMatrix: 64 by 64 bits, between blocks packed into words and words that hold one position of 64 blocks.
#ifndef MORVIK_LINK_BITMATRIX_H
#define MORVIK_LINK_BITMATRIX_H

#include <array>
#include <cstdint>

namespace morvik::link {

/// Bit c of word r is row r's element of column c.
using BitMatrix = std::array<std::uint64_t, 64>;

/// Exchanges rows and columns: in halves of the matrix, then in halves of these, down to single bits.
inline void transpose(BitMatrix& matrix)
{
    std::uint64_t low = 0xFFFFFFFF;  // the columns of the left half of each square of 2 `half`
    for (unsigned half = 32; half > 0; half /= 2, low ^= low << half) {
        for (unsigned top = 0; top < 64; top += 2 * half) {
            for (unsigned r = top; r < top + half; ++r) {
                const std::uint64_t exchanged = (matrix[r] >> half ^ matrix[r + half]) & low;
                matrix[r] ^= exchanged << half;
                matrix[r + half] ^= exchanged;
            }
        }
    }
}

}  // namespace morvik::link

#endif
