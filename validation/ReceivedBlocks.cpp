// ReceivedBlocks: transport blocks of one code block behind the LTE chain and white Gaussian noise, from seed 1.
#include "ReceivedBlocks.h"

#include <cmath>

#include "link/coding/Crc.h"
#include "link/modulation/Mapper.h"
#include "link/random/GaussianNumber.h"
#include "link/random/Random.h"

namespace morvik::validation {

using namespace link;

ReceivedBlocks::ReceivedBlocks(const ChainFormat& format, int milliDecibels)
    : itsFormat(format),
      itsMilliDecibels(milliDecibels),
      itsNoiseVariance(static_cast<float>(std::pow(10.0, -milliDecibels / 10000.0))),
      itsCode({format.bits, format.codedBits, bitsPerSymbol(format.modulation)}),
      itsInformation{wordsOf(format.bits), std::vector<std::uint64_t>(atOnce * wordsOf(format.bits))},
      itsSent(atOnce),
      itsBuffers(atOnce)
{
    if (itsCode.blocks().count > 1) {
        throw std::invalid_argument(std::to_string(format.bits) + " bits take more than one code block");
    }
}

void ReceivedBlocks::make(std::uint64_t first)
{
    draw(first);
    PackedBlocks buffers;
    itsCode.encode(itsInformation, atOnce, buffers);
    itsCode.select(buffers, atOnce, 0, itsCoded);
    for (unsigned b = 0; b < atOnce; ++b) {
        receive(first + b, b);
    }
}

void ReceivedBlocks::draw(std::uint64_t first)
{
    for (unsigned b = 0; b < atOnce; ++b) {
        const FrameRandom random(randomKey(1), itsFormat.bits, itsMilliDecibels, first + b);
        std::uint64_t* const row = itsInformation.block(b);
        for (unsigned i = 0; i < itsFormat.bits; i += 64) {
            const RandomBlock block = random.block(random_index::information + i / 128);
            const std::uint64_t word = std::uint64_t{block[i % 128 / 32 + 1]} << 32 | block[i % 128 / 32];
            row[i / 64] = word & lowBits(std::min(64U, itsFormat.bits - i));
        }
        const std::uint64_t parity = crc24a(row, 0, itsFormat.bits);
        const unsigned fillers = itsCode.blocks().fillers;
        itsSent[b].assign(fillers + itsFormat.bits + crcBits, 0);
        unpackBits(row, itsFormat.bits, &itsSent[b][fillers]);
        unpackBits(&parity, crcBits, &itsSent[b][fillers + itsFormat.bits]);
    }
}

void ReceivedBlocks::receive(std::uint64_t number, unsigned b)
{
    const std::size_t symbols = itsFormat.codedBits / bitsPerSymbol(itsFormat.modulation);
    std::vector<float> received(symbols * dimensions(itsFormat.modulation));
    mapSymbols(itsFormat.modulation, itsCoded.block(b), symbols, received.data());
    const FrameRandom random(randomKey(1), itsFormat.bits, itsMilliDecibels, number);
    const double deviation = std::sqrt(itsNoiseVariance / 2);  // N0/2 in each dimension
    for (std::size_t i = 0; i < received.size(); ++i) {
        const auto index = static_cast<std::uint32_t>(random_index::gaussian + i);
        received[i] += static_cast<float>(deviation * gaussianNumber(random.block(index)));
    }
    std::vector<float> ratios(itsFormat.codedBits);
    demapSymbols(
        itsFormat.modulation, itsFormat.demapper, received.data(), nullptr, itsNoiseVariance, symbols, ratios.data());
    itsBuffers[b].assign(itsCode.softSize(), 0);
    itsCode.recover(ratios.data(), 0, itsBuffers[b].data());
}

}  // namespace morvik::validation
