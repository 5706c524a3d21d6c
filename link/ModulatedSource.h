// ModulatedSource: plain code blocks as a decoder receives them over any modulation and channel.
//
// The three streams are sent one after the other; zeros pad the last symbol.
#ifndef MORVIK_LINK_MODULATEDSOURCE_H
#define MORVIK_LINK_MODULATEDSOURCE_H

#include <vector>

#include "FrameSource.h"
#include "SymbolLink.h"

namespace morvik::link {

/// Makes the frames of one point. A frame follows from seed, K, modulation, channel, Es/N0 and its number.
class ModulatedSource {
public:
    /// K        one of the 188 block sizes
    /// scale    the soft value for a log-likelihood ratio of 1, above 0
    ///
    /// Throws std::invalid_argument for other values. `form` is for tests.
    ModulatedSource(unsigned K,
                    const SymbolFormat& format,
                    double scale,
                    std::uint64_t seed,
                    const SamplerForm& form = samplerForms().front());

    /// Makes frames first to first + count - 1, which do not depend on how a range is split.
    void make(std::uint64_t first, unsigned count, Frames& frames);

private:
    void encode(std::uint64_t first, unsigned count);
    void receive(std::uint64_t frame, unsigned i, std::size_t place, Frames& frames);

    unsigned itsK;
    float itsScale;
    RandomKey itsKey;
    RandomBatch itsRandomBits;
    TurboEncoder itsEncoder;
    SymbolLink itsLink;
    std::size_t itsSentBits;
    PackedBlocks itsInformation;
    TurboEncoder::Streams itsStreams;
    std::vector<std::uint64_t> itsCoded;
    std::vector<float> itsRatios;
};

}  // namespace morvik::link

#endif
