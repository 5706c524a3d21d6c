// Permute: the steps that move values between lanes or look them up, as each instruction set does them best.
#ifndef MORVIK_LANES_PERMUTE_H
#define MORVIK_LANES_PERMUTE_H

#include "Words.h"
#include "rules/Trellis.h"

namespace MORVIK_LANES {

// Rows are taken from other rows, their lanes permuted. The lanes of a row form groups of `group`, each of which
// takes all of its values from one group of the source row: LaneOrder.h puts segments in an order for which the
// interleaver does so. A vector's permutation is prepared as `sources` places of such groups, in words from the
// beginning of the rows, and a control of `bytes` bytes, which says from which lane of its group each lane comes.

#if defined(__AVX512BW__) && defined(__AVX512VL__)

template <unsigned count>
MORVIK_INLINE Steps<count> permuteWords(Steps<count> a, typename Steps<count>::Vector index)
{
    using Vector = typename Steps<count>::Vector;
    if constexpr (count == 8) {
        return {(Vector)_mm_permutexvar_epi16((__m128i)index, (__m128i)a.v)};
    } else if constexpr (count == 16) {
        return {(Vector)_mm256_permutexvar_epi16((__m256i)index, (__m256i)a.v)};
    } else {
        return {(Vector)_mm512_permutexvar_epi16((__m512i)index, (__m512i)a.v)};
    }
}

/// An index word for each lane.
template <unsigned count>
struct Permutation {
    static constexpr unsigned group = count;
    static constexpr unsigned sources = 1;
    static constexpr unsigned bytes = 2 * count;

    static void prepare(const std::uint8_t* source, std::uint8_t* control)
    {
        for (unsigned lane = 0; lane < count; ++lane) {
            control[2 * lane] = source[lane];
            control[2 * lane + 1] = 0;
        }
    }

    static MORVIK_INLINE Steps<count> load(const std::int16_t* rows,
                                           const std::uint32_t* from,
                                           const std::uint8_t* control)
    {
        typename Steps<count>::Vector index;
        std::memcpy(&index, control, sizeof index);
        return permuteWords<count>(Steps<count>::load(rows + *from), index);
    }
};

#elif defined(__SSSE3__)

/// A byte shuffle within each sixteen bytes.
template <unsigned count>
struct Permutation {
    static constexpr unsigned group = 8;
    static constexpr unsigned sources = count / group;
    static constexpr unsigned bytes = 2 * count;

    static void prepare(const std::uint8_t* source, std::uint8_t* control)
    {
        for (unsigned lane = 0; lane < count; ++lane) {
            control[2 * lane] = static_cast<std::uint8_t>(2 * source[lane]);
            control[2 * lane + 1] = static_cast<std::uint8_t>(2 * source[lane] + 1);
        }
    }

    static MORVIK_INLINE Steps<count> load(const std::int16_t* rows,
                                           const std::uint32_t* from,
                                           const std::uint8_t* control)
    {
        using Vector = typename Steps<count>::Vector;
        Vector select;
        std::memcpy(&select, control, sizeof select);
        const __m128i first = (__m128i)Steps<group>::load(rows + from[0]).v;
        if constexpr (count == group) {
            return {(Vector)_mm_shuffle_epi8(first, (__m128i)select)};
        } else {
#if defined(__AVX2__)
            const __m128i second = (__m128i)Steps<group>::load(rows + from[1]).v;
            return {(Vector)_mm256_shuffle_epi8(_mm256_set_m128i(second, first), (__m256i)select)};
#endif
        }
    }
};

#else

/// The source lanes themselves.
template <unsigned count>
struct Permutation {
    static constexpr unsigned group = 8;
    static constexpr unsigned sources = count / group;
    static constexpr unsigned bytes = count;

    static void prepare(const std::uint8_t* source, std::uint8_t* control)
    {
        std::memcpy(control, source, count);
    }

    static MORVIK_INLINE Steps<count> load(const std::int16_t* rows,
                                           const std::uint32_t* from,
                                           const std::uint8_t* control)
    {
        Steps<count> result{};
        for (unsigned lane = 0; lane < count; ++lane) {
            result.v[lane] = rows[from[lane / group] + control[lane]];
        }
        return result;
    }
};

#endif

/// A table of sixteen small values, looked up in each lane.
template <unsigned count>
class Table {
public:
#if defined(__SSSE3__)
    explicit MORVIK_INLINE Table(const std::uint8_t* entries)
    {
        for (unsigned lane = 0; lane < count; ++lane) {
            if constexpr (byWords) {
                itsEntries[lane] = entries[lane % 16];
            } else {
                std::memcpy(reinterpret_cast<char*>(&itsEntries) + 2 * lane, entries + 2 * lane % 16, 2);
            }
        }
    }

    /// The entries at `index`, 0 to 15.
    MORVIK_INLINE Steps<count> at(Steps<count> index) const
    {
#if defined(__AVX512BW__)
        if constexpr (byWords) {
            return permuteWords<count>({itsEntries}, index.v);
        } else
#endif
        {
            // A byte shuffle gives 0 where the index byte's sign bit is set: the upper byte's.
            return shuffleBytes(index | Steps<count>::of(-0x8000));
        }
    }

private:
#if defined(__AVX512BW__)
    static constexpr bool byWords = count >= 16;
#else
    static constexpr bool byWords = false;
#endif
    typename Steps<count>::Vector itsEntries;

    MORVIK_INLINE Steps<count> shuffleBytes(Steps<count> control) const
    {
        using Vector = typename Steps<count>::Vector;
        if constexpr (count == 8) {
            return {(Vector)_mm_shuffle_epi8((__m128i)itsEntries, (__m128i)control.v)};
#if defined(__AVX2__)
        } else {
            return {(Vector)_mm256_shuffle_epi8((__m256i)itsEntries, (__m256i)control.v)};
#endif
        }
    }
#else
    explicit MORVIK_INLINE Table(const std::uint8_t* entries) : itsEntries(entries) {}

    /// The entries at `index`, 0 to 15.
    MORVIK_INLINE Steps<count> at(Steps<count> index) const
    {
        Steps<count> result{};
        for (unsigned lane = 0; lane < count; ++lane) {
            result.v[lane] = itsEntries[index.v[lane]];
        }
        return result;
    }

private:
    const std::uint8_t* itsEntries;
#endif
};

}  // namespace MORVIK_LANES

#endif
