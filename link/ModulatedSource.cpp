// ModulatedSource: plain code blocks as a decoder receives them over any modulation and channel.
#include "ModulatedSource.h"

#include <algorithm>

#include "RandomBits.h"
#include "link/coding/SoftValues.h"
#include "rules/Tail.h"

namespace morvik::link {

namespace {

RandomKey pointKey(unsigned K, const SymbolFormat& format, std::uint64_t seed)
{
    // Transport blocks have coded bits, which take the place above K.
    return derivedKey(randomKey(seed), K, keyWordOf(format));
}

}  // namespace

ModulatedSource::ModulatedSource(
    unsigned K, const SymbolFormat& format, double scale, std::uint64_t seed, const SamplerForm& form)
    : itsK(K),
      itsScale(static_cast<float>(checkedScale(scale))),
      itsKey(pointKey(K, format, seed)),
      itsRandomBits(itsKey, form),
      itsEncoder(K),
      itsLink(format, itsKey, form)
{
    const std::size_t coded = std::size_t{3} * (K + rules::tailPositions);
    const unsigned perSymbol = bitsPerSymbol(format.modulation);
    itsSentBits = (coded + perSymbol - 1) / perSymbol * perSymbol;
    itsCoded.resize(wordsOf(itsSentBits));
    itsRatios.resize(itsSentBits);
    itsInformation.words = itsEncoder.words();
}

void ModulatedSource::make(std::uint64_t first, unsigned count, Frames& frames)
{
    frames.resize(count, itsK);
    for (unsigned done = 0; done < count; done += TurboEncoder::blocksAtOnce) {
        const unsigned now = std::min(count - done, TurboEncoder::blocksAtOnce);
        encode(first + done, now);
        for (unsigned i = 0; i < now; ++i) {
            receive(first + done + i, i, done + i, frames);
        }
    }
}

void ModulatedSource::encode(std::uint64_t first, unsigned count)
{
    itsInformation.bits.assign(count * itsInformation.words, 0);
    for (unsigned i = 0; i < count; ++i) {
        drawBits(itsRandomBits, FrameRandom(itsKey, 0, first + i), itsK, itsInformation.block(i));
    }
    itsEncoder.encode(itsInformation, count, itsStreams);
}

/// Makes frame `place` of the result from encoded block i.
void ModulatedSource::receive(std::uint64_t frame, unsigned i, std::size_t place, Frames& frames)
{
    const std::size_t positions = itsK + rules::tailPositions;
    unpackBits(itsInformation.block(i), itsK, &frames.sent[place * itsK]);
    std::fill(itsCoded.begin(), itsCoded.end(), 0);
    for (unsigned s = 0; s < 3; ++s) {
        copyBits(itsStreams[s].block(i), 0, positions, itsCoded.data(), s * positions);
    }
    itsLink.receive(frame, 0, itsCoded.data(), itsSentBits, itsRatios.data());
    frames.clipped[place] = 0;
    for (unsigned s = 0; s < 3; ++s) {
        const float* const ratios = &itsRatios[s * positions];
        std::int8_t* const values = &frames.streams[s][place * positions];
        frames.clipped[place] += softValues(ratios, positions, itsScale, values);
    }
}

}  // namespace morvik::link
