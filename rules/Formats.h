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

/// Fraction bits of all three formats: values are in eighths.
constexpr std::uint32_t fractionBits = 3;

/// Returns the left shift that aligns an integer of `bits` bits in its word, so that the word wraps where the register
/// does (rule 1).
constexpr std::uint32_t alignmentOf(std::uint32_t bits)
{
    return 16U - bits;
}

/// The range limits of `bits` bits, as integers. The width is taken modulo 32, so any width is defined.
constexpr std::int32_t smallestOf(std::uint32_t bits)
{
    return shiftLeftWrap(-1, bits - 1U);
}

constexpr std::int32_t largestOf(std::uint32_t bits)
{
    return ~smallestOf(bits);
}

/// The shift of aligned words, which use the state format: an eighth is 16.
constexpr std::uint32_t stateAlignment = alignmentOf(stateBits);

/// The limits of branch metrics and extrinsic values, as aligned words of the state format: -2048 and 2032 (rules 5
/// and 14).
constexpr std::int32_t branchSmallest = shiftLeftWrap(smallestOf(branchBits), stateAlignment);
constexpr std::int32_t branchLargest = shiftLeftWrap(largestOf(branchBits), stateAlignment);

/// Returns the integer of an aligned word; the bits below it are dropped (rule 22).
constexpr std::int32_t integerOf(Value aligned, std::uint32_t alignment)
{
    return shiftRight(aligned, alignment);
}

}  // namespace morvik::rules

#endif
