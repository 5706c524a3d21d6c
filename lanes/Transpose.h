// Transpose: between the caller's arrays, position by position, and rows, step by step.
#ifndef MORVIK_LANES_TRANSPOSE_H
#define MORVIK_LANES_TRANSPOSE_H

#include <cstdint>
#include <cstring>

#include "Words.h"

namespace MORVIK_LANES {

/// Eight by eight words: one vector for each lane with eight steps, or for each step with eight lanes.
class Tile {
public:
    using Vector = Raw<8>::Signed;
    using Unsigned = Raw<8>::Unsigned;

    static constexpr unsigned size = 8;

    MORVIK_INLINE Vector& operator[](unsigned i)
    {
        return itsVectors[i];
    }

    MORVIK_INLINE void transpose()
    {
        Vector pairs[size];
        Vector quads[size];
        for (unsigned i = 0; i < 4; ++i) {
            pairs[2 * i] = __builtin_shufflevector(itsVectors[i], itsVectors[i + 4], 0, 8, 1, 9, 2, 10, 3, 11);
            pairs[2 * i + 1] = __builtin_shufflevector(itsVectors[i], itsVectors[i + 4], 4, 12, 5, 13, 6, 14, 7, 15);
        }
        for (unsigned i = 0; i < 4; ++i) {
            quads[2 * i] = __builtin_shufflevector(pairs[i], pairs[i + 4], 0, 8, 1, 9, 2, 10, 3, 11);
            quads[2 * i + 1] = __builtin_shufflevector(pairs[i], pairs[i + 4], 4, 12, 5, 13, 6, 14, 7, 15);
        }
        for (unsigned i = 0; i < 4; ++i) {
            itsVectors[2 * i] = __builtin_shufflevector(quads[i], quads[i + 4], 0, 8, 1, 9, 2, 10, 3, 11);
            itsVectors[2 * i + 1] = __builtin_shufflevector(quads[i], quads[i + 4], 4, 12, 5, 13, 6, 14, 7, 15);
        }
    }

private:
    Vector itsVectors[size];
};

/// Eight of the caller's values. Those beyond the input format, -128 to 127, leave bits in `beyond` above the low
/// eight and come out as anything; values beyond 16 bits, of which only the low 24 count (rule 4), do so, too.
template <class Input>
MORVIK_INLINE Tile::Vector inputSteps(const Input* values, Tile::Unsigned& beyond)
{
    Tile::Vector words;
    if constexpr (sizeof(Input) == 4) {
#if defined(__SSE2__)
        const auto* const quads = reinterpret_cast<const __m128i*>(values);
        words = (Tile::Vector)_mm_packs_epi32(_mm_loadu_si128(quads), _mm_loadu_si128(quads + 1));
#else
        for (unsigned i = 0; i < Tile::size; ++i) {
            words[i] = static_cast<std::int16_t>(values[i] < -32768 ? -32768 : values[i] > 32767 ? 32767 : values[i]);
        }
#endif
    } else if constexpr (sizeof(Input) == 2) {
        std::memcpy(&words, values, sizeof words);
    } else {
        typedef std::int8_t Bytes __attribute__((vector_size(8)));
        Bytes bytes;
        std::memcpy(&bytes, values, sizeof bytes);
        return __builtin_convertvector(bytes, Tile::Vector);
    }
    beyond |= reinterpret_cast<Tile::Unsigned>(words) + 128;
    return words;
}

/// Fills rows of `lanes` values, a multiple of eight, from as many arrays of `steps` values each, eight or
/// more. Returns whether all values were within the input format.
template <unsigned lanes, class Input>
bool loadRows(const Input* const* arrays, unsigned steps, std::int16_t* rows)
{
    Tile::Unsigned beyond{};
    for (unsigned lane = 0; lane < lanes; lane += Tile::size) {
        for (unsigned next = 0; next < steps; next += Tile::size) {
            const unsigned k = next + Tile::size <= steps ? next : steps - Tile::size;
            Tile tile;
            for (unsigned i = 0; i < Tile::size; ++i) {
                tile[i] = inputSteps(arrays[lane + i] + k, beyond);
            }
            tile.transpose();
            for (unsigned i = 0; i < Tile::size; ++i) {
                std::memcpy(rows + (k + i) * lanes + lane, &tile[i], sizeof tile[i]);
            }
        }
    }
    unsigned any = 0;
    for (unsigned i = 0; i < Tile::size; ++i) {
        any |= beyond[i];
    }
    return any < 256;
}

/// Spreads rows of ratios over arrays, one for each lane: the aligned ratios, or the decisions they make.
template <unsigned lanes, class Output>
void storeRows(const std::int16_t* rows, unsigned steps, Output* const* arrays)
{
    for (unsigned lane = 0; lane < lanes; lane += Tile::size) {
        for (unsigned next = 0; next < steps; next += Tile::size) {
            const unsigned k = next + Tile::size <= steps ? next : steps - Tile::size;
            Tile tile;
            for (unsigned i = 0; i < Tile::size; ++i) {
                std::memcpy(&tile[i], rows + (k + i) * lanes + lane, sizeof tile[i]);
            }
            tile.transpose();
            for (unsigned i = 0; i < Tile::size; ++i) {
                typedef Output Outputs __attribute__((vector_size(Tile::size * sizeof(Output))));
                Outputs values;
                if constexpr (sizeof(Output) == 1) {
                    // A ratio of 0 or more decides for 1 (rule 16): its sign bit is clear.
                    values = __builtin_convertvector((tile[i] >> 15) + 1, Outputs);
                } else {
                    // A step is 16 in an aligned word, which wraps.
                    values = reinterpret_cast<Outputs>(reinterpret_cast<Tile::Unsigned>(tile[i]) << 4);
                }
                std::memcpy(arrays[lane + i] + k, &values, sizeof values);
            }
        }
    }
}

}  // namespace MORVIK_LANES

#endif
