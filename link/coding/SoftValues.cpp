// SoftValues: turns log-likelihood ratios into the core's input: scaled, rounded, clipped.
#include "SoftValues.h"

#include <algorithm>

#include "link/kernels/RowKernels.h"

namespace morvik::link {

std::uint32_t softValues(const float* ratios, std::size_t count, float scale, std::int8_t* values)
{
    return rowKernels().roundToBytes(ratios, count, scale, 128, values);
}

std::uint32_t softValues(const float* ratios, std::size_t count, float scale, unsigned width, std::int16_t* values)
{
    return rowKernels().roundToWords(ratios, count, scale, static_cast<float>(1U << (width - 1)), values);
}

void softValues(const std::int16_t* sums, std::size_t count, std::int8_t* values)
{
    for (std::size_t i = 0; i < count; ++i) {
        values[i] = static_cast<std::int8_t>(std::clamp<int>(sums[i], -128, 127));
    }
}

}  // namespace morvik::link
