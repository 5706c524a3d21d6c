// SamplerForm: the ways to draw quantised values for 64 bits at a time, one for each instruction set that has its own.
#include "SamplerForm.h"

#include <algorithm>

namespace morvik::link {

namespace {

unsigned byteOf(const RandomBlock& block, unsigned i)
{
    return block[i / 4] >> 8 * (i % 4) & 0xFF;
}

void drawGeneric(const Draws& draws)
{
    const AliasTable& table = *draws.table;
    for (unsigned first = 0; first < draws.count; first += 64) {
        std::uint64_t undecided = 0;
        std::uint64_t ends = 0;
        const unsigned last = std::min(first + 64, draws.count);
        for (unsigned i = first; i < last; i += 8) {
            const RandomBlock random = randomBlock(*draws.frame, draws.index + i / 8);
            for (unsigned j = 0; j < 8 && i + j < last; ++j) {
                const unsigned entry = byteOf(random, j);
                const unsigned fraction = byteOf(random, 8 + j);
                const unsigned value = fraction <= table.highThreshold[entry] ? entry : table.alias[entry];
                const std::uint64_t place = std::uint64_t{1} << (i + j - first);
                undecided |= fraction == table.highThreshold[entry] ? place : 0;
                ends |= value == 127 || value == 128 ? place : 0;
                const bool bit = (draws.bits[first / 64] & place) != 0;
                draws.values[i + j] = static_cast<std::int8_t>(bit ? value : 0 - value);
            }
        }
        draws.undecided[first / 64] = undecided;
        draws.ends[first / 64] = ends;
    }
}

}  // namespace

std::vector<SamplerForm> samplerForms()
{
    return {{"generic", drawGeneric}};
}

}  // namespace morvik::link
