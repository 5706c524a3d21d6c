// Words: vectors of 16-bit words, the value type over which the lanes run the trellis.
//
// `Eighths` counts eighths, the unit of soft values and metrics. Aligned words have four zero bits below that unit;
// here the four bits are headroom at the top, so no metric wraps and a plain maximum decides (proof in Bounds.h).
//
// Each instruction set compiles this header in its own namespace, MORVIK_LANES, so that no code is shared between
// instruction sets.
#ifndef MORVIK_LANES_WORDS_H
#define MORVIK_LANES_WORDS_H

#include <cstdint>
#include <cstring>
#include <utility>

#include "rules/Arithmetic.h"

namespace morvik::lanes::MORVIK_LANES {

template <unsigned count>
struct Raw {
    typedef std::int16_t Signed __attribute__((vector_size(2 * count)));
    typedef std::uint16_t Unsigned __attribute__((vector_size(2 * count)));
};

/// Eighths in each of `count` lanes. No operation may overflow 16 bits.
template <unsigned count>
struct Eighths {
    using Vector = typename Raw<count>::Signed;

    Vector v;

    static MORVIK_INLINE Eighths of(int value)
    {
        return {Vector{} + static_cast<std::int16_t>(value)};
    }

    /// Requires an address aligned to the vector's size.
    static MORVIK_INLINE Eighths load(const std::int16_t* from)
    {
        Vector v;
        std::memcpy(&v, __builtin_assume_aligned(from, sizeof v), sizeof v);
        return {v};
    }

    MORVIK_INLINE void store(std::int16_t* to) const
    {
        std::memcpy(__builtin_assume_aligned(to, sizeof v), &v, sizeof v);
    }

    static MORVIK_INLINE Eighths loadAnywhere(const std::int16_t* from)
    {
        Vector v;
        std::memcpy(&v, from, sizeof v);
        return {v};
    }

    MORVIK_INLINE void storeAnywhere(std::int16_t* to) const
    {
        std::memcpy(to, &v, sizeof v);
    }

    /// Loads half a vector into both halves.
    static MORVIK_INLINE Eighths twice(const std::int16_t* from)
    {
        static_assert(count == 8);
        typedef std::int64_t Halves __attribute__((vector_size(16)));
        std::int64_t half;
        std::memcpy(&half, from, sizeof half);
        return {reinterpret_cast<Vector>(Halves{half, half})};
    }

    friend MORVIK_INLINE Eighths operator+(Eighths a, Eighths b)
    {
        return {a.v + b.v};
    }

    friend MORVIK_INLINE Eighths operator-(Eighths a, Eighths b)
    {
        return {a.v - b.v};
    }

    friend MORVIK_INLINE Eighths operator&(Eighths a, Eighths b)
    {
        return {a.v & b.v};
    }

    friend MORVIK_INLINE Eighths operator|(Eighths a, Eighths b)
    {
        return {a.v | b.v};
    }

    /// Divided by 2^bits, rounded down.
    friend MORVIK_INLINE Eighths operator>>(Eighths a, int bits)
    {
        return {a.v >> bits};
    }

    friend MORVIK_INLINE Eighths max(Eighths a, Eighths b)
    {
        return {a.v > b.v ? a.v : b.v};
    }

    friend MORVIK_INLINE Eighths min(Eighths a, Eighths b)
    {
        return {a.v < b.v ? a.v : b.v};
    }

    friend MORVIK_INLINE Eighths clip(Eighths a, int lo, int hi)
    {
        return max(min(a, of(hi)), of(lo));
    }

    /// b where the mask is all ones, a where it is 0.
    friend MORVIK_INLINE Eighths blend(Eighths mask, Eighths a, Eighths b)
    {
        return {(a.v & ~mask.v) | (b.v & mask.v)};
    }

    // What rules/Trellis.h asks of a value type. Its words wrap; these cannot, so a plain maximum decides (Bounds.h).

    friend MORVIK_INLINE Eighths addWrap(Eighths a, Eighths b)
    {
        return a + b;
    }

    friend MORVIK_INLINE Eighths subWrap(Eighths a, Eighths b)
    {
        return a - b;
    }

    friend MORVIK_INLINE Eighths select(Eighths difference, Eighths c1, Eighths c2)
    {
        return {difference.v < 0 ? c2.v : c1.v};
    }

    friend MORVIK_INLINE Eighths maxWrap(Eighths c1, Eighths c2)
    {
        return max(c1, c2);
    }
};

/// Takes lanes of two vectors, counted through both.
template <unsigned count, int... lanes>
MORVIK_INLINE Eighths<sizeof...(lanes)> lanesOf(Eighths<count> a,
                                                Eighths<count> b,
                                                std::integer_sequence<int, lanes...>)
{
    return {__builtin_shufflevector(a.v, b.v, lanes...)};
}

/// Takes as many lanes of a vector, from `first` on.
template <int first, unsigned count, int... lanes>
MORVIK_INLINE Eighths<sizeof...(lanes)> lanesFrom(Eighths<count> a, std::integer_sequence<int, lanes...>)
{
    return {__builtin_shufflevector(a.v, a.v, (first + lanes)...)};
}

/// Concatenates two vectors.
template <unsigned count>
MORVIK_INLINE Eighths<2 * count> join(Eighths<count> a, Eighths<count> b)
{
    return lanesOf(a, b, std::make_integer_sequence<int, static_cast<int>(2 * count)>{});
}

/// Returns part `index` of a vector, in parts of `count` lanes.
template <unsigned count, unsigned index, unsigned wide>
MORVIK_INLINE Eighths<count> part(Eighths<wide> a)
{
    static_assert(wide % count == 0);
    if constexpr (count == wide) {
        return a;
    } else {
        constexpr int half = wide / 2;
        constexpr int first = index * count < wide / 2 ? 0 : half;
        return part<count, index % (wide / 2 / count)>(lanesFrom<first>(a, std::make_integer_sequence<int, half>{}));
    }
}

}  // namespace morvik::lanes::MORVIK_LANES

#endif
