// SamplerFormX86: draws quantised values with vector instructions.
//
// One vector holds words 0 and 1 of its random blocks, side by side, which select the table entries of as many values
// as it has bytes. Another holds words 2 and 3, which are compared with the thresholds.
//
// Functions are compiled for their instruction set one by one, so that no other code uses it.
#include "SamplerFormX86.h"

#if defined(MORVIK_LINK_X86)

#if !defined(__clang__)
// g++ 12 warns about the undefined operands in its own AVX-512 header.
#pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#endif
#include <immintrin.h>

#include <algorithm>
#include <cstring>

#define MORVIK_AVX512 __attribute__((target("avx512f,avx512bw,avx512vbmi")))
#define MORVIK_AVX2 __attribute__((target("avx2")))
#define MORVIK_INLINE inline __attribute__((always_inline))

namespace morvik::link {

namespace {

constexpr unsigned rounds = 10;

// Philox4x32: the multipliers of words 0 and 2.
constexpr std::uint32_t multiplier0 = 0xD2511F53;
constexpr std::uint32_t multiplier2 = 0xCD9E8D57;

/// The two key words of each round.
struct RoundKeys {
    std::array<int, rounds> word0{};
    std::array<int, rounds> word1{};

    explicit RoundKeys(const RandomKey& key)
    {
        constexpr std::uint32_t step0 = 0x9E3779B9;
        constexpr std::uint32_t step1 = 0xBB67AE85;
        for (unsigned r = 0; r < rounds; ++r) {
            word0[r] = static_cast<int>(key[0] + r * step0);
            word1[r] = static_cast<int>(key[1] + r * step1);
        }
    }
};

std::uint64_t lowBits(unsigned count)
{
    return ~std::uint64_t{0} >> (64 - count);
}

// 512 bits: 64 values.

/// Words 0 and 1 of eight random blocks, and words 2 and 3.
struct Random512 {
    __m512i low;
    __m512i high;
};

/// From counters to random blocks. A round multiplies word 0 and word 2. The low half of each product becomes the odd
/// word of the other pair; the high half, XORed with that pair's odd word and a key word, becomes its even word.
template <std::size_t count>
MORVIK_AVX512 MORVIK_INLINE void philox(const RoundKeys& keys, Random512 (&random)[count])
{
    constexpr __mmask16 odd = 0xAAAA;
    constexpr int sum = 0x96;
    const __m512i times0 = _mm512_set1_epi64(multiplier0);
    const __m512i times2 = _mm512_set1_epi64(multiplier2);
    for (unsigned r = 0; r < rounds; ++r) {
        const __m512i key0 = _mm512_set1_epi32(keys.word0[r]);
        const __m512i key1 = _mm512_set1_epi32(keys.word1[r]);
        for (auto& [low, high] : random) {
            const __m512i product0 = _mm512_mul_epu32(low, times0);
            const __m512i product2 = _mm512_mul_epu32(high, times2);
            low = _mm512_mask_ternarylogic_epi32(product2, odd, low, key0, sum);
            high = _mm512_mask_ternarylogic_epi32(product0, odd, high, key1, sum);
            low = _mm512_shuffle_epi32(low, _MM_PERM_CDAB);
            high = _mm512_shuffle_epi32(high, _MM_PERM_CDAB);
        }
    }
}

/// A table of 256 bytes.
struct Table512 {
    __m512i quarter[4];
};

MORVIK_AVX512 MORVIK_INLINE Table512 loadTable512(const std::array<std::uint8_t, 256>& bytes)
{
    return {{_mm512_loadu_si512(bytes.data()),
             _mm512_loadu_si512(&bytes[64]),
             _mm512_loadu_si512(&bytes[128]),
             _mm512_loadu_si512(&bytes[192])}};
}

/// Looks up the bytes of a table at `entries`; `upper` marks those in the table's second half.
MORVIK_AVX512 MORVIK_INLINE __m512i lookUp(const Table512& table, __m512i entries, __mmask64 upper)
{
    return _mm512_mask_mov_epi8(_mm512_permutex2var_epi8(table.quarter[0], entries, table.quarter[1]),
                                upper,
                                _mm512_permutex2var_epi8(table.quarter[2], entries, table.quarter[3]));
}

/// Values, and which of them are undecided.
struct Values512 {
    __m512i values;
    __mmask64 undecided;
};

MORVIK_AVX512 MORVIK_INLINE Values512 valuesOf(const Table512& thresholds,
                                               const Table512& aliases,
                                               const Random512& random)
{
    const __mmask64 upper = _mm512_movepi8_mask(random.low);
    const __m512i threshold = lookUp(thresholds, random.low, upper);
    const __mmask64 own = _mm512_cmple_epu8_mask(random.high, threshold);
    return {_mm512_mask_mov_epi8(lookUp(aliases, random.low, upper), own, random.low),
            _mm512_cmpeq_epu8_mask(random.high, threshold)};
}

MORVIK_AVX512 MORVIK_INLINE void drawGroup(const Table512& thresholds,
                                           const Table512& aliases,
                                           const Random512& random,
                                           ValueGroup& group)
{
    const auto [value, undecided] = valuesOf(thresholds, aliases, random);
    const __m512i sent = _mm512_mask_sub_epi8(value, ~group.bits, _mm512_setzero_si512(), value);
    const __mmask64 used = lowBits(group.count);
    _mm512_mask_storeu_epi8(group.values, used, sent);
    group.undecided = undecided & used;
    group.ends = _mm512_cmplt_epi8_mask(_mm512_add_epi8(value, _mm512_set1_epi8(1)), _mm512_set1_epi8(-126)) & used;
}

template <std::size_t count>
MORVIK_AVX512 MORVIK_INLINE void drawGroups(const RoundKeys& keys,
                                            const Table512& thresholds,
                                            const Table512& aliases,
                                            ValueGroup* groups)
{
    Random512 random[count];
    for (std::size_t g = 0; g < count; ++g) {
        random[g] = {_mm512_add_epi64(_mm512_set1_epi64(static_cast<long long>(groups[g].counterLow)),
                                      _mm512_setr_epi64(0, 1, 2, 3, 4, 5, 6, 7)),
                     _mm512_set1_epi64(static_cast<long long>(groups[g].counterHigh))};
    }
    philox(keys, random);
    for (std::size_t g = 0; g < count; ++g) {
        drawGroup(thresholds, aliases, random[g], groups[g]);
    }
}

MORVIK_AVX512 MORVIK_INLINE __m512i countersFrom(std::uint64_t first, __m512i order)
{
    return _mm512_add_epi64(_mm512_set1_epi64(static_cast<long long>(first)), order);
}

/// Numbers of noise. Bytes become words by unpacking, which takes the even and then the odd blocks: so the fine blocks
/// are drawn, and the levels put, in an order that unpacks to that of the numbers.
template <std::size_t count>
MORVIK_AVX512 MORVIK_INLINE void noiseGroups(const RoundKeys& keys,
                                             const Table512& thresholds,
                                             const Table512& aliases,
                                             const NoiseCounters& counters,
                                             const DrawnNoise& drawn,
                                             std::size_t group)
{
    const __m512i inOrder = _mm512_setr_epi64(0, 1, 2, 3, 4, 5, 6, 7);
    const __m512i unpacked = _mm512_setr_epi64(0, 4, 1, 5, 2, 6, 3, 7);
    const __m512i high = _mm512_set1_epi64(static_cast<long long>(counters.high));
    Random512 random[2 * count];
    for (std::size_t g = 0; g < count; ++g) {
        random[2 * g] = {countersFrom(counters.coarseLow + 8 * (group + g), inOrder), high};
        random[2 * g + 1] = {countersFrom(counters.fineLow + 8 * (group + g), unpacked), high};
    }
    philox(keys, random);
    for (std::size_t g = 0; g < count; ++g) {
        const auto [values, undecided] = valuesOf(thresholds, aliases, random[2 * g]);
        const Random512& fine = random[2 * g + 1];
        const __m512i levels = _mm512_permutexvar_epi64(unpacked, values);
        const __m512i less = _mm512_andnot_si512(fine.high, _mm512_set1_epi8(-1));  // 255 - v
        std::int16_t* const numbers = drawn.numbers + 64 * (group + g);
        _mm512_storeu_si512(numbers,
                            _mm512_sub_epi16(_mm512_unpacklo_epi8(fine.low, levels),
                                             _mm512_unpacklo_epi8(less, _mm512_setzero_si512())));
        _mm512_storeu_si512(numbers + 32,
                            _mm512_sub_epi16(_mm512_unpackhi_epi8(fine.low, levels),
                                             _mm512_unpackhi_epi8(less, _mm512_setzero_si512())));
        _mm512_storeu_si512(drawn.levels + 64 * (group + g), values);
        drawn.undecided[group + g] = undecided;
    }
}

}  // namespace

MORVIK_AVX512 void drawAvx512(const AliasTable& table, const RandomKey& key, ValueGroup* groups, std::size_t count)
{
    const RoundKeys keys(key);
    const Table512 thresholds = loadTable512(table.highThreshold);
    const Table512 aliases = loadTable512(table.alias);
    std::size_t done = 0;
    for (; done + 4 <= count; done += 4) {
        drawGroups<4>(keys, thresholds, aliases, groups + done);
    }
    for (; done < count; ++done) {
        drawGroups<1>(keys, thresholds, aliases, groups + done);
    }
}

MORVIK_AVX512 void randomBlocksAvx512(const RandomKey& key, std::uint64_t* low, std::uint64_t* high, std::size_t count)
{
    const RoundKeys keys(key);
    std::size_t done = 0;
    for (; done + 32 <= count; done += 32) {  // four vectors hide each other's latency
        Random512 random[4];
        for (std::size_t v = 0; v < 4; ++v) {
            random[v] = {_mm512_loadu_si512(low + done + 8 * v), _mm512_loadu_si512(high + done + 8 * v)};
        }
        philox(keys, random);
        for (std::size_t v = 0; v < 4; ++v) {
            _mm512_storeu_si512(low + done + 8 * v, random[v].low);
            _mm512_storeu_si512(high + done + 8 * v, random[v].high);
        }
    }
    for (; done < count; done += 8) {
        const auto used = static_cast<__mmask8>(lowBits(static_cast<unsigned>(std::min<std::size_t>(8, count - done))));
        Random512 random[] = {
            {_mm512_maskz_loadu_epi64(used, low + done), _mm512_maskz_loadu_epi64(used, high + done)}};
        philox(keys, random);
        _mm512_mask_storeu_epi64(low + done, used, random[0].low);
        _mm512_mask_storeu_epi64(high + done, used, random[0].high);
    }
}

MORVIK_AVX512 void noiseAvx512(const AliasTable& table,
                               const RandomKey& key,
                               const NoiseCounters& counters,
                               std::size_t groups,
                               const DrawnNoise& drawn)
{
    const RoundKeys keys(key);
    const Table512 thresholds = loadTable512(table.highThreshold);
    const Table512 aliases = loadTable512(table.alias);
    std::size_t done = 0;
    for (; done + 4 <= groups; done += 4) {
        noiseGroups<4>(keys, thresholds, aliases, counters, drawn, done);
    }
    for (; done < groups; ++done) {
        noiseGroups<1>(keys, thresholds, aliases, counters, drawn, done);
    }
}

// 256 bits: 32 values.

namespace {

struct Random256 {
    __m256i low;
    __m256i high;
};

/// As above.
template <std::size_t count>
MORVIK_AVX2 MORVIK_INLINE void philox(const RoundKeys& keys, Random256 (&random)[count])
{
    const __m256i odd = _mm256_set1_epi64x(static_cast<long long>(0xFFFFFFFF00000000));
    const __m256i times0 = _mm256_set1_epi64x(multiplier0);
    const __m256i times2 = _mm256_set1_epi64x(multiplier2);
    for (unsigned r = 0; r < rounds; ++r) {
        const __m256i key0 = _mm256_set1_epi32(keys.word0[r]);
        const __m256i key1 = _mm256_set1_epi32(keys.word1[r]);
        for (auto& [low, high] : random) {
            const __m256i product0 = _mm256_mul_epu32(low, times0);
            const __m256i product2 = _mm256_mul_epu32(high, times2);
            low = _mm256_xor_si256(product2, _mm256_and_si256(_mm256_xor_si256(low, key0), odd));
            high = _mm256_xor_si256(product0, _mm256_and_si256(_mm256_xor_si256(high, key1), odd));
            low = _mm256_shuffle_epi32(low, 0xB1);
            high = _mm256_shuffle_epi32(high, 0xB1);
        }
    }
}

/// Looks up bytes in half of a table by the entries' seven low bits, in `count` sixteenths from `bytes` on. The highest
/// bit of `choice` selects the half of what is left, its next bit the half of that. Entries with their highest bit set
/// get zeros.
template <unsigned count>
MORVIK_AVX2 MORVIK_INLINE __m256i lookUpHalf(const std::uint8_t* bytes, __m256i entries, __m256i choice)
{
    if constexpr (count == 1) {
        const __m128i sixteenth = _mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes));
        return _mm256_shuffle_epi8(_mm256_broadcastsi128_si256(sixteenth), entries);
    } else {
        const __m256i next = _mm256_add_epi8(choice, choice);
        return _mm256_blendv_epi8(lookUpHalf<count / 2>(bytes, entries, next),
                                  lookUpHalf<count / 2>(bytes + std::size_t{8} * count, entries, next),
                                  choice);
    }
}

/// Looks up the bytes of a table at `entries`.
MORVIK_AVX2 MORVIK_INLINE __m256i lookUp(const std::array<std::uint8_t, 256>& table, __m256i entries)
{
    const __m256i choice = _mm256_add_epi8(entries, entries);
    const __m256i others = _mm256_xor_si256(entries, _mm256_set1_epi8(-128));
    return _mm256_or_si256(lookUpHalf<8>(table.data(), entries, choice), lookUpHalf<8>(&table[128], others, choice));
}

/// A byte of ones for each 0 bit.
MORVIK_AVX2 MORVIK_INLINE __m256i bytesOfZeros(std::uint32_t bits)
{
    const __m256i spread = _mm256_setr_epi8(
        0, 0, 0, 0, 0, 0, 0, 0, 1, 1, 1, 1, 1, 1, 1, 1, 2, 2, 2, 2, 2, 2, 2, 2, 3, 3, 3, 3, 3, 3, 3, 3);
    const __m256i place = _mm256_set1_epi64x(static_cast<long long>(0x8040201008040201));
    const __m256i bytes = _mm256_shuffle_epi8(_mm256_set1_epi32(static_cast<int>(bits)), spread);
    return _mm256_cmpeq_epi8(_mm256_and_si256(bytes, place), _mm256_setzero_si256());
}

MORVIK_AVX2 MORVIK_INLINE std::uint64_t maskOf(__m256i bytes)
{
    return static_cast<std::uint32_t>(_mm256_movemask_epi8(bytes));
}

/// Values, and which of them are undecided.
struct Values256 {
    __m256i values;
    std::uint64_t undecided;
};

MORVIK_AVX2 MORVIK_INLINE Values256 valuesOf(const AliasTable& table, const Random256& random)
{
    const __m256i threshold = lookUp(table.highThreshold, random.low);
    const __m256i own = _mm256_cmpeq_epi8(_mm256_min_epu8(random.high, threshold), random.high);
    return {_mm256_blendv_epi8(lookUp(table.alias, random.low), random.low, own),
            maskOf(_mm256_cmpeq_epi8(random.high, threshold))};
}

/// The masks left to the caller, for 32 values.
struct Left32 {
    std::uint64_t undecided;
    std::uint64_t ends;
};

/// Draws half a group.
MORVIK_AVX2 MORVIK_INLINE Left32 drawHalf(const AliasTable& table,
                                          const Random256& random,
                                          std::uint32_t bits,
                                          std::int8_t* values)
{
    const auto [value, undecided] = valuesOf(table, random);
    const __m256i negated = bytesOfZeros(bits);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(values), _mm256_sub_epi8(_mm256_xor_si256(value, negated), negated));
    return {undecided, maskOf(_mm256_cmpgt_epi8(_mm256_set1_epi8(-126), _mm256_add_epi8(value, _mm256_set1_epi8(1))))};
}

MORVIK_AVX2 MORVIK_INLINE __m256i countersFrom(std::uint64_t first, __m256i order)
{
    return _mm256_add_epi64(_mm256_set1_epi64x(static_cast<long long>(first)), order);
}

MORVIK_AVX2 MORVIK_INLINE void drawGroup(const AliasTable& table,
                                         const Random256& lower,
                                         const Random256& upper,
                                         ValueGroup& group)
{
    std::int8_t values[64];
    const Left32 first = drawHalf(table, lower, static_cast<std::uint32_t>(group.bits & 0xFFFFFFFF), values);
    const Left32 second = drawHalf(table, upper, static_cast<std::uint32_t>(group.bits >> 32), values + 32);
    if (group.count == sizeof values) {  // nearly always, and then no call
        std::memcpy(group.values, values, sizeof values);
    } else {
        std::memcpy(group.values, values, group.count);
    }
    const std::uint64_t used = lowBits(group.count);
    group.undecided = (first.undecided | second.undecided << 32) & used;
    group.ends = (first.ends | second.ends << 32) & used;
}

template <std::size_t count>
MORVIK_AVX2 MORVIK_INLINE void drawGroups(const RoundKeys& keys, const AliasTable& table, ValueGroup* groups)
{
    Random256 random[2 * count];
    for (std::size_t g = 0; g < count; ++g) {
        const __m256i high = _mm256_set1_epi64x(static_cast<long long>(groups[g].counterHigh));
        random[2 * g] = {countersFrom(groups[g].counterLow, _mm256_setr_epi64x(0, 1, 2, 3)), high};
        random[2 * g + 1] = {countersFrom(groups[g].counterLow, _mm256_setr_epi64x(4, 5, 6, 7)), high};
    }
    philox(keys, random);
    for (std::size_t g = 0; g < count; ++g) {
        drawGroup(table, random[2 * g], random[2 * g + 1], groups[g]);
    }
}

/// Half a group of noise, as above. Returns which values are undecided.
MORVIK_AVX2 MORVIK_INLINE std::uint64_t noiseHalf(
    const AliasTable& table, const Random256& coarse, const Random256& fine, std::int16_t* numbers, std::int8_t* levels)
{
    const auto [values, undecided] = valuesOf(table, coarse);
    const __m256i unpacked = _mm256_permute4x64_epi64(values, 0xD8);
    const __m256i zero = _mm256_setzero_si256();
    const __m256i less = _mm256_andnot_si256(fine.high, _mm256_set1_epi8(-1));  // 255 - v
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(levels), values);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(numbers),
                        _mm256_sub_epi16(_mm256_unpacklo_epi8(fine.low, unpacked), _mm256_unpacklo_epi8(less, zero)));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(numbers + 16),
                        _mm256_sub_epi16(_mm256_unpackhi_epi8(fine.low, unpacked), _mm256_unpackhi_epi8(less, zero)));
    return undecided;
}

}  // namespace

MORVIK_AVX2 void drawAvx2(const AliasTable& table, const RandomKey& key, ValueGroup* groups, std::size_t count)
{
    const RoundKeys keys(key);
    std::size_t done = 0;
    for (; done + 2 <= count; done += 2) {  // four vectors hide each other's latency
        drawGroups<2>(keys, table, groups + done);
    }
    for (; done < count; ++done) {
        drawGroups<1>(keys, table, groups + done);
    }
}

MORVIK_AVX2 void randomBlocksAvx2(const RandomKey& key, std::uint64_t* low, std::uint64_t* high, std::size_t count)
{
    const RoundKeys keys(key);
    for (std::size_t done = 0; done < count; done += 4) {
        const __m256i left = _mm256_set1_epi64x(static_cast<long long>(count - done));
        const __m256i used = _mm256_cmpgt_epi64(left, _mm256_setr_epi64x(0, 1, 2, 3));
        auto* const lows = reinterpret_cast<long long*>(low + done);
        auto* const highs = reinterpret_cast<long long*>(high + done);
        Random256 random[] = {{_mm256_maskload_epi64(lows, used), _mm256_maskload_epi64(highs, used)}};
        philox(keys, random);
        _mm256_maskstore_epi64(lows, used, random[0].low);
        _mm256_maskstore_epi64(highs, used, random[0].high);
    }
}

MORVIK_AVX2 void noiseAvx2(const AliasTable& table,
                           const RandomKey& key,
                           const NoiseCounters& counters,
                           std::size_t groups,
                           const DrawnNoise& drawn)
{
    const RoundKeys keys(key);
    const __m256i high = _mm256_set1_epi64x(static_cast<long long>(counters.high));
    for (std::size_t g = 0; g < groups; ++g) {
        const std::uint64_t coarse = counters.coarseLow + 8 * g;
        const std::uint64_t fine = counters.fineLow + 8 * g;
        Random256 random[] = {{countersFrom(coarse, _mm256_setr_epi64x(0, 1, 2, 3)), high},
                              {countersFrom(coarse, _mm256_setr_epi64x(4, 5, 6, 7)), high},
                              {countersFrom(fine, _mm256_setr_epi64x(0, 2, 1, 3)), high},
                              {countersFrom(fine, _mm256_setr_epi64x(4, 6, 5, 7)), high}};
        philox(keys, random);
        std::int16_t* const numbers = drawn.numbers + 64 * g;
        std::int8_t* const levels = drawn.levels + 64 * g;
        drawn.undecided[g] = noiseHalf(table, random[0], random[2], numbers, levels) |
                             noiseHalf(table, random[1], random[3], numbers + 32, levels + 32) << 32;
    }
}

}  // namespace morvik::link

#endif
