// Words: vectors of 16-bit words, the value type over which the lanes run the trellis.
//
// `Steps` holds whole steps of the formats, which is an aligned word divided by 16, and is never wrapped: four
// spare bits let a plain maximum decide (Bounds.h proves it).
//
// This text is compiled once for each instruction set, in a namespace of its own, MORVIK_LANES, so that
// nothing that is compiled for one can serve another.
#ifndef MORVIK_LANES_WORDS_H
#define MORVIK_LANES_WORDS_H

#include <cstdint>
#include <cstring>

#include "rules/Arithmetic.h"

#if defined(__SSE2__)
#include <immintrin.h>
#endif

namespace MORVIK_LANES {

namespace rules = morvik::rules;

template <unsigned count>
struct Raw {
    typedef std::int16_t Signed __attribute__((vector_size(2 * count)));
    typedef std::uint16_t Unsigned __attribute__((vector_size(2 * count)));
};

/// Whole steps, in each of `count` lanes. No operation leaves 16 bits.
template <unsigned count>
struct Steps {
    using Vector = typename Raw<count>::Signed;

    Vector v;

    static MORVIK_INLINE Steps of(int value)
    {
        return {Vector{} + static_cast<std::int16_t>(value)};
    }

    /// From an address that is a multiple of the vector's size.
    static MORVIK_INLINE Steps load(const std::int16_t* from)
    {
        Vector v;
        std::memcpy(&v, __builtin_assume_aligned(from, sizeof v), sizeof v);
        return {v};
    }

    MORVIK_INLINE void store(std::int16_t* to) const
    {
        std::memcpy(__builtin_assume_aligned(to, sizeof v), &v, sizeof v);
    }

    friend MORVIK_INLINE Steps operator+(Steps a, Steps b)
    {
        return {a.v + b.v};
    }

    friend MORVIK_INLINE Steps operator-(Steps a, Steps b)
    {
        return {a.v - b.v};
    }

    friend MORVIK_INLINE Steps operator&(Steps a, Steps b)
    {
        return {a.v & b.v};
    }

    friend MORVIK_INLINE Steps operator|(Steps a, Steps b)
    {
        return {a.v | b.v};
    }

    /// Divided by 2^bits, rounded down.
    friend MORVIK_INLINE Steps operator>>(Steps a, int bits)
    {
        return {a.v >> bits};
    }

    friend MORVIK_INLINE Steps max(Steps a, Steps b)
    {
        return {a.v > b.v ? a.v : b.v};
    }

    friend MORVIK_INLINE Steps min(Steps a, Steps b)
    {
        return {a.v < b.v ? a.v : b.v};
    }

    friend MORVIK_INLINE Steps clip(Steps a, int lo, int hi)
    {
        return max(min(a, of(hi)), of(lo));
    }

    /// b where mask is all ones, a where it is 0.
    friend MORVIK_INLINE Steps blend(Steps mask, Steps a, Steps b)
    {
        return {(a.v & ~mask.v) | (b.v & mask.v)};
    }

    friend MORVIK_INLINE Steps addWrap(Steps a, Steps b)
    {
        return a + b;
    }

    friend MORVIK_INLINE Steps subWrap(Steps a, Steps b)
    {
        return a - b;
    }

    friend MORVIK_INLINE Steps select(Steps difference, Steps c1, Steps c2)
    {
        return {difference.v < 0 ? c2.v : c1.v};
    }

    friend MORVIK_INLINE Steps maxWrap(Steps c1, Steps c2)
    {
        return max(c1, c2);
    }
};

/// The lanes of two vectors, side by side in one.
template <unsigned count>
MORVIK_INLINE Steps<2 * count> join(Steps<count> a, Steps<count> b)
{
    static_assert(count == 8);
    return {__builtin_shufflevector(a.v, b.v, 0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15)};
}

/// Part `index` of a vector of which each has `count` lanes.
template <unsigned count, unsigned index, unsigned wide>
MORVIK_INLINE Steps<count> part(Steps<wide> a)
{
    if constexpr (count == wide) {
        return a;
    } else {
        static_assert(count == 8);
        constexpr int o = index * count;
        return {__builtin_shufflevector(a.v, a.v, o, o + 1, o + 2, o + 3, o + 4, o + 5, o + 6, o + 7)};
    }
}

/// floor(3 a / 8), for any a whose threefold fits 16 bits.
template <unsigned count>
MORVIK_INLINE Steps<count> threeEighths(Steps<count> a)
{
#if defined(__AVX512BW__)
    if constexpr (count == 32) {
        return {(typename Steps<count>::Vector)_mm512_mulhi_epi16((__m512i)a.v, _mm512_set1_epi16(3 << 13))};
    }
#endif
#if defined(__AVX2__)
    if constexpr (count == 16) {
        return {(typename Steps<count>::Vector)_mm256_mulhi_epi16((__m256i)a.v, _mm256_set1_epi16(3 << 13))};
    }
#endif
#if defined(__SSE2__)
    if constexpr (count == 8) {
        return {(typename Steps<count>::Vector)_mm_mulhi_epi16((__m128i)a.v, _mm_set1_epi16(3 << 13))};
    }
#endif
    return (a + a + a) >> 3;
}

}  // namespace MORVIK_LANES

#endif
