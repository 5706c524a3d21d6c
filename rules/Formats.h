// Formats: the core's fixed-point formats, and how their values sit in 16-bit words.
//
// The numbered rules are those of docs/arithmetic.md.
#ifndef MORVIK_RULES_FORMATS_H
#define MORVIK_RULES_FORMATS_H

#include <cstdint>

#include "rules/Arithmetic.h"

namespace morvik::rules {

constexpr std::uint32_t inputBits = 8;
constexpr std::uint32_t branchBits = 8;
constexpr std::uint32_t stateBits = 12;

/// Fraction bits of all three: values count eighths.
constexpr std::uint32_t fractionBits = 3;

/// How far an integer of so many bits is shifted left in its word, so that the word wraps where the register does
/// (rule 1).
constexpr std::uint32_t alignmentOf(std::uint32_t bits)
{
    return 16U - bits;
}

/// The ends of the range of so many bits, as integers. The bits count modulo 32, so that it is defined for any width.
constexpr std::int32_t smallestOf(std::uint32_t bits)
{
    return shiftLeftWrap(-1, bits - 1U);
}

constexpr std::int32_t largestOf(std::uint32_t bits)
{
    return ~smallestOf(bits);
}

/// What aligned words, kept in the state format, are shifted by. An eighth is 16 in them.
constexpr std::uint32_t stateAlignment = alignmentOf(stateBits);

/// The limits of branch metrics and extrinsic values, as aligned words of the state format: -2048 and 2032 (rules 5
/// and 14).
constexpr std::int32_t branchSmallest = shiftLeftWrap(smallestOf(branchBits), stateAlignment);
constexpr std::int32_t branchLargest = shiftLeftWrap(largestOf(branchBits), stateAlignment);

/// The integer that an aligned word stands for: bits below it are dropped (rule 22).
constexpr std::int32_t integerOf(Value aligned, std::uint32_t alignment)
{
    return shiftRight(aligned, alignment);
}

}  // namespace morvik::rules

#endif
