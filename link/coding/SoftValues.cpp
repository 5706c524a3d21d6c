// SoftValues: from log-likelihood ratios to the core's input: scaled, rounded, clipped.
#include "SoftValues.h"

#include <algorithm>

namespace morvik::link {

namespace {

/// Rounded, halves away from 0, and clipped to -end ... end - 1, for ends up to 2^15.
std::int32_t rounded(float value, float end)
{
    const float above = value > -end ? value : -end;
    const float kept = above < end - 1 ? above : end - 1;
    const auto whole = static_cast<std::int32_t>(kept);
    const float rest = kept - static_cast<float>(whole);  // exact
    return whole + (rest >= 0.5F ? 1 : 0) - (rest <= -0.5F ? 1 : 0);
}

}  // namespace

void softValues(const float* ratios, std::size_t count, float scale, std::int8_t* values)
{
    for (std::size_t i = 0; i < count; ++i) {
        values[i] = static_cast<std::int8_t>(rounded(ratios[i] * scale, 128));
    }
}

void softValues(const float* ratios, std::size_t count, float scale, unsigned width, std::int16_t* values)
{
    const auto end = static_cast<float>(1U << (width - 1));
    for (std::size_t i = 0; i < count; ++i) {
        values[i] = static_cast<std::int16_t>(rounded(ratios[i] * scale, end));
    }
}

void softValues(const std::int16_t* sums, std::size_t count, std::int8_t* values)
{
    for (std::size_t i = 0; i < count; ++i) {
        values[i] = static_cast<std::int8_t>(std::clamp<int>(sums[i], -128, 127));
    }
}

}  // namespace morvik::link
