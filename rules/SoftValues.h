// SoftValues: the core's input conversion, and the values that one pass hands to the next.
//
// The numbered rules are those of docs/arithmetic.md. Values are aligned words of the state format.
#ifndef MORVIK_RULES_SOFTVALUES_H
#define MORVIK_RULES_SOFTVALUES_H

#include <algorithm>
#include <cstdint>

#include "rules/Arithmetic.h"

namespace morvik::rules {

/// A caller's value in the input format, and what clipping took off.
struct InputInteger {
    std::int32_t kept;
    std::int32_t excess;
};

/// Clips the low bits of a caller's value, those left by a shift by the format's alignment (24 in the hardware), to the
/// format's integers (rule 4).
constexpr InputInteger inputInteger(std::int32_t value, std::uint32_t alignment, std::int32_t lo, std::int32_t hi)
{
    const std::int32_t low = shiftRight(shiftLeftWrap(value, alignment), alignment);
    const std::int32_t kept = clip(low, lo, hi);
    return {kept, low - kept};
}

/// Twice the intrinsic value: the a-priori value halved, truncated toward zero and masked to the format's bits, plus
/// the systematic value (rule 13).
constexpr std::int32_t twiceIntrinsicValue(std::int32_t apriori, std::int32_t systematic, std::int32_t stateMask)
{
    return ((apriori / 2) & stateMask) + systematic;
}

/// The intrinsic value: halved again, truncated toward zero again (rule 13).
constexpr Value intrinsicValue(std::int32_t apriori, std::int32_t systematic, std::int32_t stateMask)
{
    return wrap16(twiceIntrinsicValue(apriori, systematic, stateMask) / 2);
}

/// The extrinsic part of a ratio, scaled, truncated toward zero and clipped (rule 14). The hardware's scales
/// (Algorithms.h) are exact, since the difference has 19 bits. The product is clipped before its conversion, which
/// therefore cannot overflow; NaN becomes the lower limit.
inline Value extrinsicValue(Value ratio, Value intrinsic, double scale, std::int32_t lo, std::int32_t hi)
{
    const double product = (ratio - 4 * intrinsic) * scale;
    return wrap16(product > lo ? static_cast<std::int32_t>(std::min<double>(product, hi)) : lo);
}

/// The bits that an extrinsic value keeps: those of the state format, or all if the scale is 1 (rule 14).
constexpr Value extrinsicMask(double scale, Value stateMask)
{
    return scale == 1.0 ? wrap16(-1) : stateMask;
}

/// The hard decision of a ratio: true for 1 (rule 16).
constexpr bool decision(Value ratio)
{
    return ratio >= 0;
}

/// The mask of the tag bits that the core carries; the width is taken modulo 32 (rule 21).
constexpr std::uint32_t tagMask(std::uint32_t width)
{
    return (std::uint32_t{1} << (width & 31U)) - 1;
}

}  // namespace morvik::rules

#endif
