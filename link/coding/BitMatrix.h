// BitMatrix: transposes 64 x 64 bits, between words of one block and words that hold one position of 64 blocks.
#ifndef MORVIK_LINK_CODING_BITMATRIX_H
#define MORVIK_LINK_CODING_BITMATRIX_H

#include <array>
#include <cstddef>
#include <cstdint>

namespace morvik::link {

/// Bit c of word r is row r's element of column c.
using BitMatrix = std::array<std::uint64_t, 64>;

/// One of six steps: interleaves the rows of the upper and the lower half, and swaps bits within squares of 2 `half`.
/// Every step accesses the rows in the same pattern, which suits vectors.
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

/// Transposes in place.
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
