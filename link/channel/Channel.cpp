// Channel: BPSK over additive white Gaussian noise, and the quantiser behind it.
//
// Probabilities are computed in floating point of 64 bits or more (WideMath.h), and then rounded to integers.
#include "Channel.h"

#include <cmath>

#include "WideMath.h"
#include "rules/Tail.h"

namespace morvik::link {

namespace {

/// The probability that a standard Gaussian variable is greater than x.
long double upperTail(long double x)
{
    return wideErfc(x / std::sqrt(2.0L)) / 2;
}

/// The probability of a value below x, times 2^48. The smaller tail is the one that is rounded.
std::uint64_t weightBelow(long double x)
{
    constexpr std::uint64_t one = std::uint64_t{1} << AliasTable::weightBits;
    const auto weight = [](long double probability) {
        return static_cast<std::uint64_t>(std::round(std::ldexp(probability, AliasTable::weightBits)));
    };
    return x < 0 ? weight(upperTail(-x)) : one - weight(upperTail(x));
}

/// `part` / `whole`, times 2^32; 2^32 if `whole` is 0.
std::uint64_t share(long double part, long double whole)
{
    constexpr std::uint64_t all = std::uint64_t{1} << 32;
    return whole > 0 ? static_cast<std::uint64_t>(std::round(std::ldexp(part / whole, 32))) : all;
}

}  // namespace

long double noiseDeviation(unsigned K, int milliDecibels)
{
    const long double rate = static_cast<long double>(K) / (3.0L * K + rules::tailValues);
    const long double ratio = widePowerOfTen(milliDecibels / 10000.0L);
    return 1 / std::sqrt(2 * rate * ratio);  // for energy 1 per transmitted value
}

RoundedDistribution roundedDistribution(long double deviation, long double scale)
{
    // Where the rounded value changes from r - 1 to r, in standard deviations from the mean.
    const auto border = [=](int r) {
        return ((r - 0.5L) / scale - 1) / deviation;
    };
    RoundedDistribution distribution{};
    std::uint64_t below = 0;
    for (int r = -128; r <= 127; ++r) {
        const std::uint64_t next = r < 127 ? weightBelow(border(r + 1)) : std::uint64_t{1} << AliasTable::weightBits;
        distribution.weights[static_cast<std::uint8_t>(r)] = next - below;
        below = next;
    }
    const long double top = upperTail(border(127));
    distribution.top[0] = share(top - upperTail(border(128)), top);
    distribution.top[1] = share(top - upperTail(border(129)), top);
    const long double bottom = upperTail(-border(-127));
    distribution.bottom = share(bottom - upperTail(-border(-128)), bottom);
    return distribution;
}

}  // namespace morvik::link
