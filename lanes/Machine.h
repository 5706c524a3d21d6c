// Machine: everything that differs between instruction sets, one section for each.
//
// A section inherits what it does not redefine from one before. It offers:
//
//   VectorLanes             the widths of its vectors
//   Kernels                 the shapes of its kernels, ascending in lanes
//   holdsTwoRecursions      whether its registers hold two recursions at once
//   liftsBranches           whether recursions without corrections are faster with lifted branch metrics (Rules.h)
//   pairsStates             whether the forward recursion over `count` lanes takes two states into a vector
//   halves<i, j>(a, b)      half i of a, and half j of b
//   tileHalves              halves of the widest tile that it transposes efficiently (Transpose.h)
//   Permutation<count>      gathers a vector with permuted lanes
//   Corrections<count>      looks up the correction of a decision difference in each lane
//   scaledHalf(a)           half of a scaled, rounded down: floor(3 a / 8), for any a with 3 a within 16 bits
//   saturated(values)       eight 32-bit values, saturated to 16 bits
//
// A permutation gathers vectors from slices. Their lanes form groups of `group`, each of which takes all its values
// from one group of the source slice; LaneOrder.h orders segments so that this holds for the interleaver. A vector's
// permutation consists of the addresses of `sources` such groups, in words, and a control of `bytes` bytes, which gives
// each lane's source lane within its group.
#ifndef MORVIK_LANES_MACHINE_H
#define MORVIK_LANES_MACHINE_H

#include <utility>

#include "Bounds.h"
#include "Words.h"
#include "rules/Algorithms.h"

#if defined(__SSE2__)
#include <immintrin.h>
#elif defined(MORVIK_NEON)
#include <arm_neon.h>
#endif

namespace morvik::lanes::MORVIK_LANES {

/// Slices of `vectors` vectors of `count` lanes. So many windows of one vector run side by side at most: `abreast`,
/// with corrections `correctedAbreast`.
template <unsigned count, unsigned vectors, unsigned abreast = 1, unsigned correctedAbreast = abreast>
struct Shape {
};

template <class... ofKernels>
struct Shapes {
};

/// Half of the scale of extrinsic values, times 2^16.
constexpr std::int16_t halfOfScale = rules::scaleNumerator << (15 - rules::scaleBits);

// ---- Any machine

struct Portable {
    using VectorLanes = std::integer_sequence<unsigned, 8>;
    using Kernels = Shapes<Shape<1, 1>, Shape<8, 1>, Shape<8, 2>, Shape<8, 4>>;
    static constexpr bool holdsTwoRecursions = false;
    static constexpr bool liftsBranches = false;
    static constexpr unsigned tileHalves = 1;

    static constexpr bool pairsStates(unsigned, bool)
    {
        return false;
    }

    /// The control holds the source lanes themselves.
    template <unsigned count>
    struct Permutation {
        static constexpr unsigned group = 8;
        static constexpr unsigned sources = count / group;
        static constexpr unsigned bytes = count;

        static void prepare(const std::uint8_t* source, std::uint8_t* control)
        {
            std::memcpy(control, source, count);
        }

        static MORVIK_INLINE Eighths<count> gather(const std::int16_t* slices,
                                                   const std::uint32_t* from,
                                                   const std::uint8_t* control)
        {
            Eighths<count> result{};
            for (unsigned lane = 0; lane < count; ++lane) {
                result.v[lane] = slices[from[lane / group] + control[lane]];
            }
            return result;
        }
    };

    /// Sums up the drops from entry to entry that the difference does not reach: a look-up of each lane would not
    /// vectorise.
    template <unsigned count>
    class Corrections {
    public:
        explicit MORVIK_INLINE Corrections(const std::uint8_t* entries)
        {
            for (int i = 0; i < drops; ++i) {
                itsDrops[i] = Eighths<count>::of(entries[i] - entries[i + 1]);
            }
        }

        MORVIK_INLINE Eighths<count> operator()(Eighths<count> difference) const
        {
            const Eighths<count> magnitude = max(difference, Eighths<count>::of(-1) - difference);  // -1 reads as 0
            Eighths<count> sum{};
            for (int i = 0; i < drops; ++i) {
                const Eighths<count> end = Eighths<count>::of(correctionStep * (i + 1));
                sum = sum + (Eighths<count>{end.v > magnitude.v} & itsDrops[i]);
            }
            return sum;
        }

    private:
        static constexpr int drops = correctionEntries - 1;
        Eighths<count> itsDrops[drops];
    };

    /// Half i of a, and half j of b.
    template <unsigned i, unsigned j, unsigned count>
    static MORVIK_INLINE Eighths<count> halves(Eighths<count> a, Eighths<count> b)
    {
        return join(part<count / 2, i>(a), part<count / 2, j>(b));
    }

    template <unsigned count>
    static MORVIK_INLINE Eighths<count> scaledHalf(Eighths<count> a)
    {
        return Eighths<count>{a.v * Eighths<count>::of(rules::scaleNumerator).v} >> (rules::scaleBits + 1);
    }

    /// Accepts any alignment.
    static MORVIK_INLINE Raw<8>::Signed saturated(const std::int32_t* values)
    {
        std::int32_t copies[8];
        std::memcpy(copies, values, sizeof copies);
        Raw<8>::Signed words;
        for (unsigned i = 0; i < 8; ++i) {
            words[i] = static_cast<std::int16_t>(copies[i] < -32768 ? -32768 : copies[i] > 32767 ? 32767 : copies[i]);
        }
        return words;
    }
};

// ---- Byte shuffles, for machines that have `shuffleBytes` and `clippedFrom`: SSSE3 and NEON

/// Adds what byte shuffles do better to a section.
template <class Section>
struct ByteShuffles : Section {
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

        static MORVIK_INLINE Eighths<count> gather(const std::int16_t* slices,
                                                   const std::uint32_t* from,
                                                   const std::uint8_t* control)
        {
            typename Raw<count>::Signed shuffle;  // an Eighths would go through memory
            std::memcpy(&shuffle, control, sizeof shuffle);
            using Group = Eighths<count / sources>;
            const Group first = Group::load(slices + from[0]);
            if constexpr (sources == 1) {
                return shuffleBytes(first, Eighths<count>{shuffle});
            } else {
                const Group second = Group::load(slices + from[1]);
                return shuffleBytes(join(first, second), Eighths<count>{shuffle});
            }
        }
    };

    /// The entries for both signs fit the sixteen bytes of a shuffle. The first one is 0 and so serves the upper bytes
    /// of the index.
    template <unsigned count>
    class Corrections {
    public:
        explicit MORVIK_INLINE Corrections(const std::uint8_t* entries)
        {
            std::uint8_t bytes[sizeof itsEntries];
            for (unsigned i = 0; i < sizeof bytes; ++i) {
                bytes[i] = entries[correctionEntry(static_cast<int>(i % 16) - correctionEntries)];
            }
            std::memcpy(&itsEntries, bytes, sizeof bytes);
        }

        MORVIK_INLINE Eighths<count> operator()(Eighths<count> difference) const
        {
            constexpr int reach = correctionEntries * correctionStep;
            return shuffleBytes(itsEntries, clippedFrom(-reach, reach - 1, difference) >> correctionStepBits);
        }

    private:
        Eighths<count> itsEntries;
    };
};

// ---- SSE2, which `generic` has on x86-64

#if defined(__SSE2__)
struct Sse2 : Portable {
    static MORVIK_INLINE Eighths<8> scaledHalf(Eighths<8> a)
    {
        return {(Raw<8>::Signed)_mm_mulhi_epi16((__m128i)a.v, _mm_set1_epi16(halfOfScale))};
    }

    static MORVIK_INLINE Raw<8>::Signed saturated(const std::int32_t* values)
    {
        const auto* const quads = reinterpret_cast<const __m128i*>(values);
        return (Raw<8>::Signed)_mm_packs_epi32(_mm_loadu_si128(quads), _mm_loadu_si128(quads + 1));
    }
};
#endif

// ---- SSSE3

#if defined(__SSSE3__)
MORVIK_INLINE Eighths<8> shuffleBytes(Eighths<8> a, Eighths<8> control)
{
    return {(Raw<8>::Signed)_mm_shuffle_epi8((__m128i)a.v, (__m128i)control.v)};
}

/// Returns clip(a, lo, hi) - lo. Saturating operations clip; requires a >= hi - 32767.
MORVIK_INLINE Eighths<8> clippedFrom(int lo, int hi, Eighths<8> a)
{
    const __m128i raised = _mm_adds_epi16((__m128i)a.v, (__m128i)Eighths<8>::of(32767 - hi).v);
    return {(Raw<8>::Signed)_mm_subs_epu16(raised, (__m128i)Eighths<8>::of(32767 - hi + lo).v)};
}

struct Ssse3 : ByteShuffles<Sse2> {};
#endif

// ---- AVX2: vectors of sixteen lanes

#if defined(__AVX2__)
/// Preferred to the template, for which g++ finds longer ways.
MORVIK_INLINE Eighths<16> join(Eighths<8> a, Eighths<8> b)
{
    return {(Raw<16>::Signed)_mm256_set_m128i((__m128i)b.v, (__m128i)a.v)};
}

/// Shuffles within each sixteen bytes.
MORVIK_INLINE Eighths<16> shuffleBytes(Eighths<16> a, Eighths<16> control)
{
    return {(Raw<16>::Signed)_mm256_shuffle_epi8((__m256i)a.v, (__m256i)control.v)};
}

MORVIK_INLINE Eighths<16> clippedFrom(int lo, int hi, Eighths<16> a)
{
    const __m256i raised = _mm256_adds_epi16((__m256i)a.v, (__m256i)Eighths<16>::of(32767 - hi).v);
    return {(Raw<16>::Signed)_mm256_subs_epu16(raised, (__m256i)Eighths<16>::of(32767 - hi + lo).v)};
}

struct Avx2 : Ssse3 {
    using VectorLanes = std::integer_sequence<unsigned, 8, 16>;
    using Kernels = Shapes<Shape<1, 1>, Shape<8, 1, 2>, Shape<16, 1>, Shape<16, 2>>;
    static constexpr bool liftsBranches = sizeof(void*) == 4;
    static constexpr unsigned tileHalves = 2;

    static constexpr bool pairsStates(unsigned count, bool)
    {
        return count == 8;
    }

    template <unsigned i, unsigned j>
    static MORVIK_INLINE Eighths<16> halves(Eighths<16> a, Eighths<16> b)
    {
        if constexpr (i == 0 && j == 1) {
            return {(Raw<16>::Signed)_mm256_blend_epi32((__m256i)a.v, (__m256i)b.v, 0xF0)};
        } else {
            return {(Raw<16>::Signed)_mm256_permute2x128_si256((__m256i)a.v, (__m256i)b.v, i | (2 + j) << 4)};
        }
    }

    using Ssse3::scaledHalf;
    static MORVIK_INLINE Eighths<16> scaledHalf(Eighths<16> a)
    {
        return {(Raw<16>::Signed)_mm256_mulhi_epi16((__m256i)a.v, _mm256_set1_epi16(halfOfScale))};
    }
};
#endif

// ---- AVX-512: vectors of 32 lanes, 32 registers, permutations of whole vectors

#if defined(__AVX512BW__) && defined(__AVX512VL__)
MORVIK_INLINE Eighths<8> permuteWords(Eighths<8> a, Eighths<8> index)
{
    return {(Raw<8>::Signed)_mm_permutexvar_epi16((__m128i)index.v, (__m128i)a.v)};
}

MORVIK_INLINE Eighths<16> permuteWords(Eighths<16> a, Eighths<16> index)
{
    return {(Raw<16>::Signed)_mm256_permutexvar_epi16((__m256i)index.v, (__m256i)a.v)};
}

MORVIK_INLINE Eighths<32> permuteWords(Eighths<32> a, Eighths<32> index)
{
    return {(Raw<32>::Signed)_mm512_permutexvar_epi16((__m512i)index.v, (__m512i)a.v)};
}

/// Takes the words of `a` for indices whose low six bits are below 32, else those of `b`.
MORVIK_INLINE Eighths<32> permuteWords(Eighths<32> a, Eighths<32> b, Eighths<32> index)
{
    return {(Raw<32>::Signed)_mm512_permutex2var_epi16((__m512i)a.v, (__m512i)index.v, (__m512i)b.v)};
}

struct Avx512 : Avx2 {
    using VectorLanes = std::integer_sequence<unsigned, 8, 16, 32>;
    static constexpr bool holdsTwoRecursions = sizeof(void*) == 8;  // 32-bit code has eight registers
    static constexpr bool liftsBranches = true;
    using Kernels = Shapes<Shape<1, 1>,
                           Shape<8, 1, 2, 4>,
                           Shape<16, 1, (holdsTwoRecursions ? 1 : 2), 2>,
                           Shape<32, 1>,
                           Shape<32, 2>>;

    static constexpr bool pairsStates(unsigned count, bool corrects)
    {
        return count == 8 || (count == 16 && !holdsTwoRecursions && !corrects);
    }

    /// Of the intrinsic for any choice, g++ warns in its own header.
    using Avx2::halves;
    template <unsigned i, unsigned j>
    static MORVIK_INLINE Eighths<32> halves(Eighths<32> a, Eighths<32> b)
    {
        if constexpr (i == 0 && j == 1) {
            return {(Raw<32>::Signed)_mm512_mask_blend_epi64(0xF0, (__m512i)a.v, (__m512i)b.v)};
        } else {
            typedef std::int64_t Quads __attribute__((vector_size(64)));
            constexpr int m = 4 * i;
            constexpr int n = 8 + 4 * j;
            return {reinterpret_cast<Raw<32>::Signed>(
                __builtin_shufflevector((Quads)a.v, (Quads)b.v, m, m + 1, m + 2, m + 3, n, n + 1, n + 2, n + 3))};
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

        static MORVIK_INLINE Eighths<count> gather(const std::int16_t* slices,
                                                   const std::uint32_t* from,
                                                   const std::uint8_t* control)
        {
            typename Raw<count>::Signed index;
            std::memcpy(&index, control, sizeof index);
            return permuteWords(Eighths<count>::load(slices + *from), Eighths<count>{index});
        }
    };

    /// Entries for both signs: of each step in the words of one vector of sixteen lanes, or of each difference in those
    /// of two vectors of 32, which saves the shift to steps. A permutation takes the low bits of its index.
    template <unsigned count>
    class Corrections {
    public:
        explicit MORVIK_INLINE Corrections(const std::uint8_t* entries)
        {
            for (int i = 0; i < indices; ++i) {
                const int index = i < indices / 2 ? i : i - indices;
                const int steps = index >> (correctionStepBits - indexShift);
                itsEntries[i / int{words}].v[i % int{words}] = entries[correctionEntry(steps)];
            }
        }

        MORVIK_INLINE Eighths<count> operator()(Eighths<count> difference) const
        {
            const Eighths<count> index = clip(difference, -reach, reach - 1) >> indexShift;
            if constexpr (vectors == 2) {
                return permuteWords(itsEntries[0], itsEntries[1], index);
            } else if constexpr (count == words) {
                return permuteWords(itsEntries[0], index);
            } else {
                return part<count, 0>(permuteWords(itsEntries[0], join(index, index)));
            }
        }

    private:
        static constexpr int reach = correctionEntries * correctionStep;
        static constexpr unsigned words = count < 16 ? 16 : count;
        static constexpr unsigned vectors = words == 32 ? 2 : 1;
        static constexpr int indices = vectors * words;
        static constexpr int indexShift = vectors == 2 ? 0 : correctionStepBits;
        static_assert(indices << indexShift == 2 * reach);
        Eighths<words> itsEntries[vectors];
    };

    using Avx2::scaledHalf;
    static MORVIK_INLINE Eighths<32> scaledHalf(Eighths<32> a)
    {
        return {(Raw<32>::Signed)_mm512_mulhi_epi16((__m512i)a.v, _mm512_set1_epi16(halfOfScale))};
    }
};
#endif

// ---- NEON of 64-bit ARM, in little-endian order: 32 registers

#if defined(MORVIK_NEON)
MORVIK_INLINE Eighths<8> shuffleBytes(Eighths<8> a, Eighths<8> control)
{
    return {(Raw<8>::Signed)vqtbl1q_u8((uint8x16_t)a.v, (uint8x16_t)control.v)};
}

MORVIK_INLINE Eighths<8> clippedFrom(int lo, int hi, Eighths<8> a)
{
    const int16x8_t raised = vqaddq_s16((int16x8_t)a.v, (int16x8_t)Eighths<8>::of(32767 - hi).v);
    return {(Raw<8>::Signed)vqsubq_u16((uint16x8_t)raised, (uint16x8_t)Eighths<8>::of(32767 - hi + lo).v)};
}

struct Neon : ByteShuffles<Portable> {
    static constexpr bool holdsTwoRecursions = true;
    static constexpr bool liftsBranches = true;

    /// The high half of the doubled product.
    static MORVIK_INLINE Eighths<8> scaledHalf(Eighths<8> a)
    {
        static_assert(halfOfScale % 2 == 0);
        return {(Raw<8>::Signed)vqdmulhq_n_s16((int16x8_t)a.v, halfOfScale / 2)};
    }

    static MORVIK_INLINE Raw<8>::Signed saturated(const std::int32_t* values)
    {
        int32x4_t quads[2];
        std::memcpy(quads, values, sizeof quads);
        return (Raw<8>::Signed)vqmovn_high_s32(vqmovn_s32(quads[0]), quads[1]);
    }
};
#endif

// ---- The machine of this compilation

#if defined(__AVX512BW__) && defined(__AVX512VL__)
using Machine = Avx512;
#elif defined(__AVX2__)
using Machine = Avx2;
#elif defined(__SSSE3__)
using Machine = Ssse3;
#elif defined(__SSE2__)
using Machine = Sse2;
#elif defined(MORVIK_NEON)
using Machine = Neon;
#else
using Machine = Portable;
#endif

}  // namespace morvik::lanes::MORVIK_LANES

#endif
