// Demapper: from received symbols to log-likelihood ratios of their bits.
#include "Demapper.h"

#include "link/kernels/RowKernels.h"

namespace morvik::link {

namespace {

constexpr std::array<std::string_view, demappers.size()> names = {"max-log", "exact"};

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
    // With BPSK, a 1 is the positive level.
    const float sign = modulation == Modulation::bpsk ? -1.0F : 1.0F;
    const DimensionRow row = {symbols,
                              gains,
                              count,
                              dimensions(modulation),
                              bitsPerDimension(modulation),
                              2 * sign * unit / noiseVariance,
                              unit * unit / noiseVariance};
    const RowKernels& kernels = rowKernels();
    (demapper == Demapper::exact ? kernels.exactRatios : kernels.maxLogRatios)(row, ratios);
}

}  // namespace morvik::link
