// Demapper: from received symbols to log-likelihood ratios of their bits.
#include "Demapper.h"

#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace morvik::link {

namespace {

constexpr std::array<std::string_view, demappers.size()> names = {"max-log", "exact"};

/// Bits of a dimension, at most.
constexpr unsigned mostBits = 4;

/// exp(-x) for x from 0 to 80.
float expOfMinus(float x)
{
    constexpr float log2e = 1.44269504F;
    constexpr float ln2High = 0.693145752F;  // few bits, so that its multiples are exact
    constexpr float ln2Low = 1.42860677e-6F;
    constexpr float magic = 12582912;  // 1.5 * 2^23: a float that is added to it loses its fraction
    const float n = (x * log2e + magic) - magic;
    const auto halvings = static_cast<std::uint32_t>(n);
    const float rest = (n * ln2High - x) + n * ln2Low;  // from -ln 2 / 2 to ln 2 / 2
    float power = 1.0F / 720;
    for (const float factor : {1.0F / 120, 1.0F / 24, 1.0F / 6, 0.5F, 1.0F, 1.0F}) {
        power = power * rest + factor;
    }
    const auto bits = (127 - halvings) << 23;  // 2^-halvings
    float scale;
    std::memcpy(&scale, &bits, sizeof scale);
    return power * scale;
}

/// ln(1 + x) for x from 0 to 1: 2 artanh(x / (2 + x)).
float logOnePlus(float x)
{
    const float ratio = x / (2 + x);
    const float square = ratio * ratio;
    float series = 1.0F / 13;
    for (const float factor : {1.0F / 11, 1.0F / 9, 1.0F / 7, 1.0F / 5, 1.0F / 3, 1.0F}) {
        series = series * square + factor;
    }
    return 2 * ratio * series;
}

/// ln(exp(a) + exp(b)).
float logOfSum(float a, float b)
{
    return a > b ? a + logOnePlusExp(a - b) : b + logOnePlusExp(b - a);
}

/// The ratio of the sign of a dimension of 2^(m + 1) levels, for received x of at least 0 and a distance of neighbours,
/// both times amplitude and a common factor: its nearest positive level against its nearest negative one.
float signRatio(float x, float distance, unsigned m)
{
    float ratio = x;
    for (unsigned k = 1; k < 1U << m; ++k) {
        const float beyond = x - static_cast<float>(k) * distance;
        ratio += beyond > 0 ? beyond : 0;
    }
    return ratio;
}

/// The ratios of a dimension's m bits: of the sign of x; then, where x is folded at the middle of the positive levels,
/// of the sign of what comes out, and so on.
void maxLogRatios(float x, float distance, unsigned m, float* ratios)
{
    for (unsigned i = 0; i < m; ++i) {
        const float magnitude = std::fabs(x);
        const float ratio = signRatio(magnitude, distance, m - 1 - i);
        ratios[i] = x > 0 ? -ratio : ratio;
        x = static_cast<float>(1U << (m - 1 - i)) / 2 * distance - magnitude;
    }
}

/// Bit i of the m bits of a level, an odd number below 2^m: the sign of what i foldings leave of it.
bool bitOf(int level, unsigned i, unsigned m)
{
    for (unsigned fold = 0; fold < i; ++fold) {
        level = (1 << (m - 1 - fold)) - std::abs(level);
    }
    return level < 0;
}

/// The same ratios from the sums over all levels. `slope` and `energy` are the logarithm of the probability of level
/// l, which is slope l - energy l^2 but for a constant.
void exactRatios(float slope, float energy, unsigned m, float* ratios)
{
    const int end = 1 << m;
    for (unsigned i = 0; i < m; ++i) {
        std::array<float, 2> sums{};
        std::array<bool, 2> begun{};
        for (int level = 1 - end; level < end; level += 2) {
            const auto l = static_cast<float>(level);
            const float metric = slope * l - energy * (l * l);
            const unsigned bit = bitOf(level, i, m) ? 1 : 0;
            sums[bit] = begun[bit] ? logOfSum(sums[bit], metric) : metric;
            begun[bit] = true;
        }
        ratios[i] = sums[1] - sums[0];
    }
}

}  // namespace

std::string_view nameOf(Demapper demapper)
{
    return names[static_cast<unsigned>(demapper)];
}

std::optional<Demapper> demapperOf(std::string_view name)
{
    for (const Demapper demapper : demappers) {
        if (nameOf(demapper) == name) {
            return demapper;
        }
    }
    return std::nullopt;
}

float logOnePlusExp(float x)
{
    return x < 80 ? logOnePlus(expOfMinus(x)) : 0;
}

void demapSymbols(Modulation modulation,
                  Demapper demapper,
                  const float* symbols,
                  const float* gains,
                  float noiseVariance,
                  std::size_t count,
                  float* ratios)
{
    const unsigned m = bitsPerDimension(modulation);
    const std::size_t across = dimensions(modulation);
    const float unit = unitAmplitude(modulation);
    // With BPSK, a 1 is the positive level.
    const float slope = (modulation == Modulation::bpsk ? -2.0F : 2.0F) * unit / noiseVariance;
    const float energy = unit * unit / noiseVariance;
    for (std::size_t n = 0; n < count * across; ++n) {
        const float gain = gains == nullptr ? 1 : gains[n / across];
        std::array<float, mostBits> own{};
        if (demapper == Demapper::maxLog) {
            maxLogRatios(symbols[n] * (2 * slope * gain), 8 * energy * (gain * gain), m, own.data());
        } else {
            exactRatios(symbols[n] * (slope * gain), energy * (gain * gain), m, own.data());
        }
        for (unsigned i = 0; i < m; ++i) {
            ratios[n / across * bitsPerSymbol(modulation) + n % across + i * across] = own[i];
        }
    }
}

}  // namespace morvik::link
