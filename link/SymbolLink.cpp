// SymbolLink: sends coded bits through mapper, channel and demapper; returns log-likelihood ratios.
#include "SymbolLink.h"

#include <algorithm>

#include "link/coding/PackedBits.h"
#include "link/modulation/Mapper.h"

namespace morvik::link {

namespace {

/// Symbols of one pass: their numbers stay in the first-level cache. Whole words of bits for every modulation.
constexpr std::size_t symbolsAtOnce = 1024;

}  // namespace

std::uint64_t keyWordOf(const SymbolFormat& format)
{
    const auto kind = static_cast<std::uint64_t>(format.modulation) << 8 | static_cast<std::uint64_t>(format.fading);
    return kind << 32 | static_cast<std::uint32_t>(format.milliDecibels);
}

SymbolLink::SymbolLink(const SymbolFormat& format, const RandomKey& key, const SamplerForm& form)
    : itsFormat(format),
      itsChannel(format.fading, dimensions(format.modulation), format.milliDecibels, key, form),
      itsSymbols(symbolsAtOnce * dimensions(format.modulation)),
      itsGains(symbolsAtOnce)
{
}

void SymbolLink::receive(
    std::uint64_t frame, unsigned transmission, const std::uint64_t* bits, std::size_t count, float* ratios)
{
    const unsigned perSymbol = bitsPerSymbol(itsFormat.modulation);
    const std::size_t symbols = count / perSymbol;
    for (std::size_t first = 0; first < symbols; first += symbolsAtOnce) {
        const std::size_t now = std::min(symbolsAtOnce, symbols - first);
        mapSymbols(itsFormat.modulation, bits + first * perSymbol / 64, now, itsSymbols.data());
        itsChannel.pass(frame,
                        transmission,
                        static_cast<std::uint32_t>(first),
                        static_cast<std::uint32_t>(now),
                        itsSymbols.data(),
                        itsGains.data());
        demapSymbols(itsFormat.modulation,
                     itsFormat.demapper,
                     itsSymbols.data(),
                     itsChannel.hasGains() ? itsGains.data() : nullptr,
                     itsChannel.noiseVariance(),
                     now,
                     ratios + first * perSymbol);
    }
}

void transmitRows(const SymbolFormat& format,
                  std::uint64_t seed,
                  const std::uint8_t* bits,
                  std::size_t rows,
                  std::size_t count,
                  float* ratios)
{
    SymbolLink link(format, randomKey(seed), samplerForms().front());
    std::vector<std::uint64_t> packed(wordsOf(count));
    for (std::size_t row = 0; row < rows; ++row) {
        packBits(bits + row * count, count, packed.data());
        link.receive(row, 0, packed.data(), count, ratios + row * count);
    }
}

}  // namespace morvik::link
