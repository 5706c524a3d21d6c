// Channel: BPSK over additive white Gaussian noise, and the quantiser behind it.
//
// Probabilities are computed more precisely than they are kept, the same on every machine, and then rounded to
// integers.
#include "Channel.h"

#include <algorithm>
#include <cmath>

#include "rules/Tail.h"

namespace morvik::link {

namespace {

/// Beyond so many standard deviations, no double is as small as the probability.
constexpr double farthest = 37;

/// The probability that a standard Gaussian variable is greater than x.
Precise tailAbove(const Precise& x)
{
    const auto rough = static_cast<double>(x);
    if (rough < 0) {
        return Precise(1) - tailAbove(-x);
    }
    return rough < farthest ? upperTail(x) : 0;
}

/// The probability of a value below x, times 2^48. The smaller tail is the one that is rounded.
std::uint64_t weightBelow(const Precise& x)
{
    constexpr std::uint64_t one = std::uint64_t{1} << AliasTable::weightBits;
    constexpr double last = 9;  // beyond, less than half a weight is left
    const auto rough = static_cast<double>(x);
    const bool isLow = rough < 0;
    if (std::fabs(rough) > last) {
        return isLow ? 0 : one;
    }
    const std::uint64_t tail = (tailAbove(isLow ? -x : x) * static_cast<double>(one)).rounded();
    return isLow ? tail : one - tail;
}

/// `part` / `whole`, times 2^32; 2^32 if `whole` is 0.
std::uint64_t share(const Precise& part, const Precise& whole)
{
    constexpr std::uint64_t all = std::uint64_t{1} << 32;
    return static_cast<double>(whole) > 0 ? (part / whole * static_cast<double>(all)).rounded() : all;
}

/// Where the rounded value changes from r - 1 to r, in standard deviations from the mean.
Precise borderOf(int r, const Precise& deviation, double scale)
{
    const double rough = ((r - 0.5) / scale - 1) / static_cast<double>(deviation);
    if (!(std::fabs(rough) < farthest)) {
        return rough < 0 ? -farthest : farthest;
    }
    return (Precise(r - 0.5) / std::min(scale, 0x1p200) - 1) / deviation;
}

}  // namespace

Precise noiseDeviation(unsigned K, int milliDecibels)
{
    constexpr Precise ln10 = {2.302585092994046, -2.1707562233822494e-16};
    const Precise rate = Precise(K) / (3.0 * K + rules::tailValues);
    const Precise ratio = exponential(ln10 * milliDecibels / 10000);
    return Precise(1) / squareRoot(rate * 2 * ratio);  // for energy 1 per transmitted value
}

RoundedDistribution roundedDistribution(const Precise& deviation, double scale)
{
    const auto border = [&](int r) {
        return borderOf(r, deviation, scale);
    };
    RoundedDistribution distribution{};
    std::uint64_t below = 0;
    for (int r = -128; r <= 127; ++r) {
        const std::uint64_t next = r < 127 ? weightBelow(border(r + 1)) : std::uint64_t{1} << AliasTable::weightBits;
        distribution.weights[static_cast<std::uint8_t>(r)] = next - below;
        below = next;
    }
    const Precise top = tailAbove(border(127));
    distribution.top[0] = share(top - tailAbove(border(128)), top);
    distribution.top[1] = share(top - tailAbove(border(129)), top);
    const Precise bottom = tailAbove(-border(-127));
    distribution.bottom = share(bottom - tailAbove(-border(-128)), bottom);
    return distribution;
}

}  // namespace morvik::link
