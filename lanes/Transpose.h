// Transpose: converts between the caller's arrays, one for each lane, and slices, one for each step.
#ifndef MORVIK_LANES_TRANSPOSE_H
#define MORVIK_LANES_TRANSPOSE_H

#include <cstdint>
#include <cstring>

#include "Machine.h"
#include "rules/Formats.h"

namespace morvik::lanes::MORVIK_LANES {

/// Eight by eight words in each of `halves` halves of eight vectors. Vector i holds eight steps of lane i and, in its
/// other half, of lane 8 + i; transposed, step i of eight lanes, and of the next eight.
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
    /// Interleaves four words of a and b, from `f` on, in each half.
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

/// The best tile for vectors of `count` lanes.
template <unsigned count>
using TileOf = Tile<(count < 16 ? 1 : Machine::tileHalves)>;

/// Loads eight of the caller's values, at any alignment. Only their low 24 bits count (rule 4); a value beyond 16 bits
/// becomes another value outside the input format.
template <class Input>
MORVIK_INLINE Raw<8>::Signed inputWords(const Input* values)
{
    using Words = Raw<8>::Signed;
    if constexpr (sizeof(Input) == 4) {
        return Machine::saturated(values);
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

/// Loads eight values for each half of a tile. A value outside the input format, -128 to 127, sets bits of `beyond`
/// above the low eight.
template <class AnyTile, class Input>
MORVIK_INLINE typename AnyTile::Vector inputVector(const Input* const* arrays,
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

/// Whether no value set a bit above the low eight (inputVector).
template <class AnyTile>
bool allWithin(const typename AnyTile::Unsigned& beyond)
{
    unsigned any = 0;
    for (unsigned i = 0; i < AnyTile::lanes; ++i) {
        any |= beyond[i];
    }
    return any < 256;
}

/// Calls take(k) for the first of each eight steps. The last eight may overlap those before them.
template <class Take>
MORVIK_INLINE void byEight(unsigned steps, Take take)
{
    for (unsigned next = 0; next < steps; next += 8) {
        take(next + 8 <= steps ? next : steps - 8);
    }
}

/// Fills slices of `count` values, a multiple of eight, from as many arrays of `steps` values each, eight or more.
/// Returns false if a value was outside the input format: the slices are then invalid.
template <unsigned count, class Input>
bool fillSlices(const Input* const* arrays, unsigned steps, std::int16_t* slices)
{
    using BestTile = TileOf<count>;
    typename BestTile::Unsigned beyond{};
    for (unsigned lane = 0; lane < count; lane += BestTile::lanes) {
        byEight(steps, [&](unsigned k) MORVIK_INLINE_LAMBDA {
            BestTile tile;
            for (unsigned i = 0; i < BestTile::size; ++i) {
                tile[i] = inputVector<BestTile>(arrays + lane + i, k, beyond);
            }
            tile.transpose();
            for (unsigned i = 0; i < BestTile::size; ++i) {
                std::memcpy(slices + (k + i) * count + lane, &tile[i], sizeof tile[i]);
            }
        });
    }
    return allWithin<BestTile>(beyond);
}

/// Fills slices of one value from an array, as above.
template <class Input>
bool fillSteps(const Input* array, unsigned steps, std::int16_t* slices)
{
    Tile<1>::Unsigned beyond{};
    byEight(steps, [&](unsigned k) MORVIK_INLINE_LAMBDA {
        const Tile<1>::Vector words = inputVector<Tile<1>>(&array, k, beyond);
        std::memcpy(slices + k, &words, sizeof words);
    });
    return allWithin<Tile<1>>(beyond);
}

template <class Output, unsigned lanes>
struct OutputsOf {
    typedef Output Outputs __attribute__((vector_size(lanes * sizeof(Output))));

    /// Ratios as aligned words or as decisions.
    static MORVIK_INLINE Outputs from(typename Raw<lanes>::Signed ratios)
    {
        if constexpr (sizeof(Output) == 1) {
            // A ratio of 0 or more decides for 1 (rule 16): the sign bit is clear.
            return __builtin_convertvector((ratios >> 15) + 1, Outputs);
        } else {
            // Aligned words wrap (rule 8).
            return reinterpret_cast<Outputs>(reinterpret_cast<typename Raw<lanes>::Unsigned>(ratios)
                                             << static_cast<int>(rules::stateAlignment));
        }
    }
};

/// Writes slices of ratios to arrays, one for each lane, as aligned words or as decisions.
template <unsigned count, class Output>
void spreadSlices(const std::int16_t* slices, unsigned steps, Output* const* arrays)
{
    using BestTile = TileOf<count>;
    using Conversion = OutputsOf<Output, BestTile::lanes>;
    for (unsigned lane = 0; lane < count; lane += BestTile::lanes) {
        byEight(steps, [&](unsigned k) MORVIK_INLINE_LAMBDA {
            BestTile tile;
            for (unsigned i = 0; i < BestTile::size; ++i) {
                std::memcpy(&tile[i], slices + (k + i) * count + lane, sizeof tile[i]);
            }
            tile.transpose();
            for (unsigned i = 0; i < BestTile::size; ++i) {
                const typename Conversion::Outputs values = Conversion::from(tile[i]);
                for (unsigned half = 0; half < BestTile::lanes / 8; ++half) {
                    std::memcpy(arrays[lane + 8 * half + i] + k,
                                reinterpret_cast<const Output*>(&values) + 8 * half,
                                8 * sizeof(Output));
                }
            }
        });
    }
}

/// Writes slices of one ratio to an array, as above.
template <class Output>
void spreadSteps(const std::int16_t* slices, unsigned steps, Output* array)
{
    byEight(steps, [&](unsigned k) MORVIK_INLINE_LAMBDA {
        Raw<8>::Signed ratios;
        std::memcpy(&ratios, slices + k, sizeof ratios);
        const typename OutputsOf<Output, 8>::Outputs values = OutputsOf<Output, 8>::from(ratios);
        std::memcpy(array + k, &values, sizeof values);
    });
}

}  // namespace morvik::lanes::MORVIK_LANES

#endif
