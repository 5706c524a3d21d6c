// Mapper: from coded bits to symbols.
#include "Mapper.h"

#include "link/kernels/RowKernels.h"

namespace morvik::link {

void mapSymbols(Modulation modulation, const std::uint64_t* bits, std::size_t count, float* symbols)
{
    const float unit = unitAmplitude(modulation);
    rowKernels().map(bits,
                     bitsPerDimension(modulation),
                     count * dimensions(modulation),
                     modulation == Modulation::bpsk ? -unit : unit,
                     symbols);
}

}  // namespace morvik::link
