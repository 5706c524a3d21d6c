// Correction: the entries of the correction table ln(1 + e^-|d|) (rule 9 of docs/arithmetic.md).
#ifndef MORVIK_RULES_CORRECTION_H
#define MORVIK_RULES_CORRECTION_H

#include <algorithm>
#include <cmath>
#include <cstdint>

#include "rules/Arithmetic.h"

namespace morvik::rules {

/// One entry for each signed 16-bit decision difference.
constexpr std::uint32_t correctionEntries = 65536;

/// Returns how many fraction bits of a difference a table of 2^log2Points points resolves, at most those of the format
/// (rule 9).
constexpr std::uint32_t resolvedFractionBits(std::uint32_t formatsFractionBits, std::uint32_t log2Points)
{
    return log2Points > 2 ? std::min(formatsFractionBits, log2Points - 3) : 0;
}

/// Returns the correction scale * ln(1 + e^-|d|) of a decision difference d, an aligned word, as an integer of the
/// format, rounded half away from zero; 0 where |d| as a real number is `range` or more. Clears the `ignored` low bits
/// of the magnitude. The hardware forms the magnitude of a negative difference by inversion, so -1 reads as 0 (rule 9).
inline std::int32_t correction(
    std::int32_t difference, std::uint32_t ignored, long double range, std::uint32_t alignment, std::uint32_t scale)
{
    const std::int32_t magnitude = difference >= 0 ? difference : ~difference;
    const std::int32_t kept = magnitude & ~(shiftLeftWrap(1, ignored) - 1);
    const long double r = static_cast<long double>(shiftRight(kept, alignment)) / scale;
    return r < range ? static_cast<std::int32_t>(std::trunc(scale * std::log(1.0L + std::exp(-r)) + 0.5L)) : 0;
}

}  // namespace morvik::rules

#endif
