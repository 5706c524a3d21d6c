// Arithmetic: the wraps, shifts, clips and masks of the hardware's numbers, each stated once.
//
// The numbered rules are those of docs/arithmetic.md. All functions are defined for every argument:
// register overflow is computed in unsigned arithmetic.
#ifndef MORVIK_RULES_ARITHMETIC_H
#define MORVIK_RULES_ARITHMETIC_H

#include <cstdint>

// Trellis steps are short and run millions of times, so all their calls are inlined. Unoptimised and
// sanitizer builds keep the calls: inlined, they would take far too long to compile.
#if defined(__has_feature)
#define MORVIK_HAS_FEATURE(name) __has_feature(name)
#else
#define MORVIK_HAS_FEATURE(name) 0
#endif
#if defined(__OPTIMIZE__) && !defined(__SANITIZE_ADDRESS__) && !defined(__SANITIZE_THREAD__) && \
    !MORVIK_HAS_FEATURE(address_sanitizer) && !MORVIK_HAS_FEATURE(thread_sanitizer)
#define MORVIK_INLINE inline __attribute__((always_inline))
#define MORVIK_INLINE_LAMBDA __attribute__((always_inline))
#define MORVIK_INLINE_CALLS __attribute__((flatten, noinline))
#else
#define MORVIK_INLINE inline
#define MORVIK_INLINE_LAMBDA
#define MORVIK_INLINE_CALLS
#endif

namespace morvik::rules {

/// A soft value or metric: a signed 16-bit word, left-aligned in its format (rule 1).
using Value = std::int16_t;

/// The low 16 bits of a word, read as a two's complement number (rule 2).
constexpr Value wrap16(std::int32_t value)
{
    return static_cast<Value>(static_cast<std::uint16_t>(static_cast<std::uint32_t>(value) & 0xFFFFU));
}

/// value * 2^count modulo 2^32; count is taken modulo 32, as by a five-bit barrel shifter.
constexpr std::int32_t shiftLeftWrap(std::int32_t value, std::uint32_t count)
{
    return static_cast<std::int32_t>(static_cast<std::uint32_t>(value) << (count & 31U));
}

/// value / 2^count rounded down (arithmetic shift), count modulo 32.
constexpr std::int32_t shiftRight(std::int32_t value, std::uint32_t count)
{
    return value >> (count & 31U);
}

/// value clamped to lo ... hi, lo <= hi. (If lo > hi, which no format in use gives, a value below lo becomes lo.)
template <class Number>
constexpr Number clip(Number value, Number lo, Number hi)
{
    return value < lo ? lo : (hi < value ? hi : value);
}

/// a + b modulo 2^16: metrics are never normalised and never saturated (rule 2).
constexpr Value addWrap(Value a, Value b)
{
    return wrap16(std::int32_t{a} + b);
}

/// a - b modulo 2^16 (rule 2).
constexpr Value subWrap(Value a, Value b)
{
    return wrap16(std::int32_t{a} - b);
}

/// c2 if the wrapped difference of the two candidates is negative, else c1 (rule 3).
constexpr Value select(Value difference, Value c1, Value c2)
{
    return difference < 0 ? c2 : c1;
}

/// The greater of two metrics by the sign of their wrapped difference; c1 on a tie (rule 3).
constexpr Value maxWrap(Value c1, Value c2)
{
    return select(subWrap(c1, c2), c1, c2);
}

/// The bits of value that mask selects.
constexpr Value maskBits(Value value, Value mask)
{
    return static_cast<Value>(value & mask);
}

}  // namespace morvik::rules

#endif
