// GaussianNumber: a standard Gaussian number (the method of Box and Muller).
#ifndef MORVIK_LINK_RANDOM_GAUSSIANNUMBER_H
#define MORVIK_LINK_RANDOM_GAUSSIANNUMBER_H

#include <cmath>

#include "Random.h"

namespace morvik::link {

inline double gaussianNumber(const RandomBlock& random)
{
    // 53 bits each: one in (0, 1] for the radius, one in [0, 1) for the angle.
    const auto uniform = [](std::uint32_t low, std::uint32_t high) {
        return std::ldexp(static_cast<double>((std::uint64_t{high} << 32 | low) >> 11), -53);
    };
    constexpr double circle = 6.283185307179586;
    const double radius = std::sqrt(-2 * std::log(1 - uniform(random[0], random[1])));
    return radius * std::cos(circle * uniform(random[2], random[3]));
}

}  // namespace morvik::link

#endif
