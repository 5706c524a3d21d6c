// Transpose: between the caller's arrays, position by position, and rows, step by step.
#ifndef MORVIK_LANES_TRANSPOSE_H
#define MORVIK_LANES_TRANSPOSE_H

#include <cstdint>
#include <cstring>

#include "Words.h"

namespace MORVIK_LANES {

/// Eight by eight words, in each of `halves` halves of eight vectors: vector i holds eight steps of lane i, and of
/// lane 8 + i, or a step of eight lanes, and of the next eight.
template <unsigned halves>
class Tile {
public:
    static constexpr unsigned size = 8;
    static constexpr unsigned lanes = halves * size;
    using Vector = typename Raw<lanes>::Signed;
    using Unsigned = typename Raw<lanes>::Unsigned;

    MORVIK_INLINE Vector& operator[](unsigned i)
    {
        return itsVectors[i];
    }

    MORVIK_INLINE void transpose()
    {
        Vector pairs[size];
        Vector quads[size];
        for (unsigned i = 0; i < 4; ++i) {
            pairs[2 * i] = alternate<0>(itsVectors[i], itsVectors[i + 4]);
            pairs[2 * i + 1] = alternate<4>(itsVectors[i], itsVectors[i + 4]);
        }
        for (unsigned i = 0; i < 4; ++i) {
            quads[2 * i] = alternate<0>(pairs[i], pairs[i + 4]);
            quads[2 * i + 1] = alternate<4>(pairs[i], pairs[i + 4]);
        }
        for (unsigned i = 0; i < 4; ++i) {
            itsVectors[2 * i] = alternate<0>(quads[i], quads[i + 4]);
            itsVectors[2 * i + 1] = alternate<4>(quads[i], quads[i + 4]);
        }
    }

private:
    /// Four words of each half from `from` on, of a and b in turn.
    template <int f>
    static MORVIK_INLINE Vector alternate(Vector a, Vector b)
    {
        if constexpr (halves == 1) {
            return __builtin_shufflevector(a, b, f, f + 8, f + 1, f + 9, f + 2, f + 10, f + 3, f + 11);
        } else {
            return __builtin_shufflevector(a,
                                           b,
                                           f,
                                           f + 16,
                                           f + 1,
                                           f + 17,
                                           f + 2,
                                           f + 18,
                                           f + 3,
                                           f + 19,
                                           f + 8,
                                           f + 24,
                                           f + 9,
                                           f + 25,
                                           f + 10,
                                           f + 26,
                                           f + 11,
                                           f + 27);
        }
    }

    Vector itsVectors[size];
};

/// What the instruction set does best on rows of `lanes` lanes.
#if defined(__AVX2__)
template <unsigned lanes>
using TileOfRows = Tile<(lanes < 16 ? 1 : 2)>;
#else
template <unsigned lanes>
using TileOfRows = Tile<1>;
#endif

/// Eight of the caller's values, at any address. Those beyond 16 bits, of which only the low 24 count (rule 4), come
/// out as some others that are beyond the input format, too.
template <class Input>
MORVIK_INLINE Raw<8>::Signed inputWords(const Input* values)
{
    using Words = Raw<8>::Signed;
    if constexpr (sizeof(Input) == 4) {
#if defined(__SSE2__)
        const auto* const quads = reinterpret_cast<const __m128i*>(values);
        return (Words)_mm_packs_epi32(_mm_loadu_si128(quads), _mm_loadu_si128(quads + 1));
#else
        std::int32_t copies[8];
        std::memcpy(copies, values, sizeof copies);
        Words words;
        for (unsigned i = 0; i < 8; ++i) {
            words[i] = static_cast<std::int16_t>(copies[i] < -32768 ? -32768 : copies[i] > 32767 ? 32767 : copies[i]);
        }
        return words;
#endif
    } else if constexpr (sizeof(Input) == 2) {
        Words words;
        std::memcpy(&words, values, sizeof words);
        return words;
    } else {
        typedef std::int8_t Bytes __attribute__((vector_size(8)));
        Bytes bytes;
        std::memcpy(&bytes, values, sizeof bytes);
        return __builtin_convertvector(bytes, Words);
    }
}

/// Eight values for each half of a tile. Any beyond the input format, -128 to 127, leaves bits in `beyond` above
/// the low eight.
template <class AnyTile, class Input>
MORVIK_INLINE typename AnyTile::Vector inputSteps(const Input* const* arrays,
                                                  unsigned k,
                                                  typename AnyTile::Unsigned& beyond)
{
    typename AnyTile::Vector words;
    if constexpr (AnyTile::lanes == 8) {
        words = inputWords(arrays[0] + k);
    } else {
        words = __builtin_shufflevector(
            inputWords(arrays[0] + k), inputWords(arrays[8] + k), 0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15);
    }
    beyond |= reinterpret_cast<typename AnyTile::Unsigned>(words) + 128;
    return words;
}

/// Fills rows of `lanes` values, a multiple of eight, from as many arrays of `steps` values each, eight or
/// more. Returns whether all values were within the input format; else the rows are good for nothing.
template <unsigned lanes, class Input>
bool loadRows(const Input* const* arrays, unsigned steps, std::int16_t* rows)
{
    using RowTile = TileOfRows<lanes>;
    typename RowTile::Unsigned beyond{};
    for (unsigned lane = 0; lane < lanes; lane += RowTile::lanes) {
        for (unsigned next = 0; next < steps; next += RowTile::size) {
            const unsigned k = next + RowTile::size <= steps ? next : steps - RowTile::size;
            RowTile tile;
            for (unsigned i = 0; i < RowTile::size; ++i) {
                tile[i] = inputSteps<RowTile>(arrays + lane + i, k, beyond);
            }
            tile.transpose();
            for (unsigned i = 0; i < RowTile::size; ++i) {
                std::memcpy(rows + (k + i) * lanes + lane, &tile[i], sizeof tile[i]);
            }
        }
    }
    unsigned any = 0;
    for (unsigned i = 0; i < RowTile::lanes; ++i) {
        any |= beyond[i];
    }
    return any < 256;
}

/// Spreads rows of ratios over arrays, one for each lane: the aligned ratios, or the decisions they make.
template <unsigned lanes, class Output>
void storeRows(const std::int16_t* rows, unsigned steps, Output* const* arrays)
{
    using RowTile = TileOfRows<lanes>;
    typedef Output Outputs __attribute__((vector_size(RowTile::lanes * sizeof(Output))));
    for (unsigned lane = 0; lane < lanes; lane += RowTile::lanes) {
        for (unsigned next = 0; next < steps; next += RowTile::size) {
            const unsigned k = next + RowTile::size <= steps ? next : steps - RowTile::size;
            RowTile tile;
            for (unsigned i = 0; i < RowTile::size; ++i) {
                std::memcpy(&tile[i], rows + (k + i) * lanes + lane, sizeof tile[i]);
            }
            tile.transpose();
            for (unsigned i = 0; i < RowTile::size; ++i) {
                Outputs values;
                if constexpr (sizeof(Output) == 1) {
                    // A ratio of 0 or more decides for 1 (rule 16): its sign bit is clear.
                    values = __builtin_convertvector((tile[i] >> 15) + 1, Outputs);
                } else {
                    // A step is 16 in an aligned word, which wraps.
                    values = reinterpret_cast<Outputs>(reinterpret_cast<typename RowTile::Unsigned>(tile[i]) << 4);
                }
                for (unsigned half = 0; half < RowTile::lanes / 8; ++half) {
                    std::memcpy(arrays[lane + 8 * half + i] + k,
                                reinterpret_cast<const Output*>(&values) + 8 * half,
                                8 * sizeof(Output));
                }
            }
        }
    }
}

}  // namespace MORVIK_LANES

#endif
