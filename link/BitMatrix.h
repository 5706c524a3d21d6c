// BitMatrix: 64 by 64 bits, between blocks packed into words and words that hold one position of 64 blocks.
#ifndef MORVIK_LINK_BITMATRIX_H
#define MORVIK_LINK_BITMATRIX_H

#include <array>
#include <cstddef>
#include <cstdint>

namespace morvik::link {

/// Bit c of word r is row r's element of column c.
using BitMatrix = std::array<std::uint64_t, 64>;

/// One of six steps: interleaves the rows of the upper and of the lower half, whose elements change places as in
/// squares of 2 `half`. The pattern of rows is the same in each step, which suits vectors.
template <unsigned half>
void transposeStep(const BitMatrix& from, BitMatrix& to)
{
    constexpr std::uint64_t left =
        ~std::uint64_t{0} / ((std::uint64_t{1} << half) + 1);  // `half` of every 2 `half` bits
    for (std::size_t r = 0; r < 32; ++r) {
        const std::uint64_t upper = from[r];
        const std::uint64_t lower = from[r + 32];
        to[2 * r] = (upper & left) | (lower & left) << half;
        to[2 * r + 1] = (upper >> half & left) | (lower & ~left);
    }
}

/// Exchanges rows and columns.
inline void transpose(BitMatrix& matrix)
{
    BitMatrix other;
    transposeStep<32>(matrix, other);
    transposeStep<16>(other, matrix);
    transposeStep<8>(matrix, other);
    transposeStep<4>(other, matrix);
    transposeStep<2>(matrix, other);
    transposeStep<1>(other, matrix);
}

}  // namespace morvik::link

#endif
