// Mapper: from coded bits to symbols.
#include "Mapper.h"

namespace morvik::link {

namespace {

/// The odd number that m bits of a dimension stand for: (1 - 2 b0) (8 - (1 - 2 b2) (4 - ...)), b0 in bit 0.
int level(unsigned bits, unsigned m)
{
    const auto sign = [=](unsigned i) {
        return (bits >> i & 1) != 0 ? -1 : 1;
    };
    int magnitude = 1;
    for (unsigned i = 1; i < m; ++i) {
        magnitude = (1 << i) - sign(m - i) * magnitude;
    }
    return sign(0) * magnitude;
}

}  // namespace

void mapSymbols(Modulation modulation, const std::uint64_t* bits, std::size_t count, float* symbols)
{
    const unsigned m = bitsPerDimension(modulation);
    const std::size_t across = dimensions(modulation);
    const float unit = modulation == Modulation::bpsk ? -unitAmplitude(modulation) : unitAmplitude(modulation);
    for (std::size_t n = 0; n < count * across; ++n) {
        const std::size_t first = n / across * bitsPerSymbol(modulation) + n % across;
        unsigned own = 0;
        for (unsigned i = 0; i < m; ++i) {
            const std::size_t bit = first + i * across;
            own |= static_cast<unsigned>(bits[bit / 64] >> bit % 64 & 1) << i;
        }
        symbols[n] = static_cast<float>(level(own, m)) * unit;
    }
}

}  // namespace morvik::link
