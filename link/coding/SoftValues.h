// SoftValues: turns log-likelihood ratios into the core's input: scaled, rounded, clipped.
#ifndef MORVIK_LINK_CODING_SOFTVALUES_H
#define MORVIK_LINK_CODING_SOFTVALUES_H

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <stdexcept>
#include <string>

namespace morvik::link {

/// The soft value of a filler bit: the strongest 0.
constexpr std::int8_t fillerValue = -128;

/// Returns a scale of values or ratios. Throws std::invalid_argument unless it is finite and above 0.
inline double checkedScale(double scale)
{
    if (!(scale > 0) || !std::isfinite(scale)) {
        throw std::invalid_argument("a scale of " + std::to_string(scale));
    }
    return scale;
}

/// Ratios times scale, rounded with halves away from 0, clipped to -128 ... 127. NaN becomes -128. Returns how many
/// were clipped.
std::uint32_t softValues(const float* ratios, std::size_t count, float scale, std::int8_t* values);

/// The same, clipped to `width` bits, 2 to 16.
std::uint32_t softValues(const float* ratios, std::size_t count, float scale, unsigned width, std::int16_t* values);

/// Clips to -128 ... 127.
void softValues(const std::int16_t* sums, std::size_t count, std::int8_t* values);

}  // namespace morvik::link

#endif
