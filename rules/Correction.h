// Correction: an entry of the table ln(1 + e^-|d|) (rule 9 of docs/arithmetic.md).
#ifndef MORVIK_RULES_CORRECTION_H
#define MORVIK_RULES_CORRECTION_H

#include <algorithm>
#include <cmath>
#include <cstdint>

#include "rules/Arithmetic.h"

namespace morvik::rules {

/// One entry for each signed 16-bit decision difference.
constexpr std::uint32_t correctionEntries = 65536;

/// The fraction bits of a difference that a table of 2^log2Points points resolves: eight points to one at most, and no
/// more than the format has (rule 9).
constexpr std::uint32_t resolvedFractionBits(std::uint32_t formatsFractionBits, std::uint32_t log2Points)
{
    return log2Points > 2 ? std::min(formatsFractionBits, log2Points - 3) : 0;
}

/// The correction scale * ln(1 + e^-|d|) of a decision difference d, an aligned word, rounded half away from zero, as
/// an integer of the format; 0 from `range` on, as a real number. The `ignored` low bits of the magnitude do not count.
/// The hardware forms the magnitude of a negative difference by inversion, so -1 reads like 0 (rule 9).
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
