// Demapper: computes the log-likelihood ratios of the bits of received symbols.
#include "Demapper.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>

#include "link/kernels/RowKernels.h"

namespace morvik::link {

namespace {

constexpr std::array<std::string_view, demappers.size()> names = {"max-log", "exact"};

/// With BPSK, a 1 is the positive level.
constexpr float signOf(Modulation modulation)
{
    return modulation == Modulation::bpsk ? -1.0F : 1.0F;
}

/// The largest magnitude of finite numbers. As integers, magnitudes are in the same order, and compared in vectors.
float largestOf(const float* numbers, std::size_t count)
{
    std::int32_t most = 0;
    for (std::size_t i = 0; i < count; ++i) {
        std::int32_t bits = 0;
        std::memcpy(&bits, &numbers[i], sizeof bits);
        most = std::max(most, bits & std::numeric_limits<std::int32_t>::max());
    }
    float largest = 0;
    std::memcpy(&largest, &most, sizeof largest);
    return largest;
}

/// Whether all that the kernels compute of such numbers fits a float. Levels are up to 15 units, of at most 1: the
/// largest are differences of two energies of 225 units.
bool staysInRange(double symbol, double gain, double noiseVariance)
{
    constexpr double most = std::numeric_limits<float>::max();
    return 4096 * ((symbol * gain + gain * gain + gain + 1) / noiseVariance + gain * gain) < most;
}

/// The ratios of one symbol by its nearest points, in doubles, which hold all that comes of floats.
void demapWide(Modulation modulation, const float* symbol, double gain, double noiseVariance, float* ratios)
{
    constexpr double infinity = std::numeric_limits<double>::infinity();
    constexpr double most = std::numeric_limits<float>::max();
    const unsigned across = dimensions(modulation);
    const unsigned bits = bitsPerDimension(modulation);
    const double amplitude = gain * unitAmplitude(modulation);
    for (unsigned d = 0; d < across; ++d) {
        std::array<double, 4> zeros;
        std::array<double, 4> ones;
        zeros.fill(-infinity);
        ones.fill(-infinity);
        const double received = 2.0 * signOf(modulation) * symbol[d];
        const int levels = 1 << bits;
        for (int level = 1 - levels; level < levels; level += 2) {
            const double metric = level * amplitude * (received - level * amplitude) / noiseVariance;
            int rest = level;  // its sign is the next bit: 3GPP TS 36.211, 7.1
            for (unsigned bit = 0; bit < bits; ++bit) {
                double& best = (rest < 0 ? ones : zeros).at(bit);
                best = std::max(best, metric);
                rest = (levels >> (bit + 1)) - std::abs(rest);
            }
        }
        for (unsigned bit = 0; bit < bits; ++bit) {
            ratios[bit * across + d] = static_cast<float>(std::clamp(ones.at(bit) - zeros.at(bit), -most, most));
        }
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

void demapSymbols(Modulation modulation,
                  Demapper demapper,
                  const float* symbols,
                  const float* gains,
                  float noiseVariance,
                  std::size_t count,
                  float* ratios)
{
    const float unit = unitAmplitude(modulation);
    const DimensionRow row = {symbols,
                              gains,
                              count,
                              dimensions(modulation),
                              bitsPerDimension(modulation),
                              2 * signOf(modulation) * unit / noiseVariance,
                              unit * unit / noiseVariance};
    const RowKernels& kernels = rowKernels();
    (demapper == Demapper::exact ? kernels.exactRatios : kernels.maxLogRatios)(row, ratios);
}

void demapAnySymbols(Modulation modulation,
                     Demapper demapper,
                     const float* symbols,
                     const float* gains,
                     float noiseVariance,
                     std::size_t count,
                     float* ratios)
{
    const unsigned across = dimensions(modulation);
    const float largestGain = gains == nullptr ? 1 : largestOf(gains, count);
    if (staysInRange(largestOf(symbols, count * across), largestGain, noiseVariance)) {
        demapSymbols(modulation, demapper, symbols, gains, noiseVariance, count, ratios);
        return;
    }
    for (std::size_t i = 0; i < count; ++i) {
        const float* const symbol = symbols + i * across;
        const float* const gain = gains == nullptr ? nullptr : gains + i;
        const float gainHere = gain == nullptr ? 1 : *gain;
        float* const own = ratios + i * bitsPerSymbol(modulation);
        if (staysInRange(largestOf(symbol, across), gainHere, noiseVariance)) {
            demapSymbols(modulation, demapper, symbol, gain, noiseVariance, 1, own);
        } else {
            demapWide(modulation, symbol, gainHere, noiseVariance, own);
        }
    }
}

}  // namespace morvik::link
