// TransportSource: transport blocks as a receiver's decoder gets them: random bits, encoded (3GPP TS 36.212), sent over
// a channel in one or more transmissions, demapped, rate-recovered, scaled and rounded.
#ifndef MORVIK_LINK_TRANSPORTSOURCE_H
#define MORVIK_LINK_TRANSPORTSOURCE_H

#include <array>
#include <cstdint>
#include <vector>

#include "SymbolLink.h"
#include "link/coding/TransportBlock.h"
#include "link/random/Random.h"
#include "link/random/RandomBatch.h"
#include "link/random/SamplerForm.h"

namespace morvik::link {

/// How transport blocks are sent and received.
struct TransportSetting {
    unsigned bits = 0;       ///< A
    unsigned codedBits = 0;  ///< of one transmission, G
    SymbolFormat symbols;
    std::vector<unsigned> versions;             ///< the redundancy version of each transmission
    unsigned softBufferSize = unlimitedBuffer;  ///< N_IR
    unsigned softBufferBits = 0;                ///< width of the values that are added up, 2 to 16; 0: floats
    std::vector<double> scales;                 ///< soft value for a ratio of 1, in each transmission
};

/// What is coded in a setting. Its modulation is sent on one layer.
TransportFormat formatOf(const TransportSetting& setting);

/// Code blocks of one size as the decoder takes them, one after the other.
struct CodeBlockBatch {
    struct Place {
        unsigned frame;  ///< counted from the first that was made
        unsigned block;  ///< code block of its transport block
    };

    unsigned K = 0;
    std::vector<Place> places;
    std::array<std::vector<std::int8_t>, 3> streams;  ///< K + 4 soft values of each code block
};

/// Makes the transport blocks of one point. A block follows from seed, bits, coded bits, modulation, channel, Es/N0 and
/// its number; its bits and the noise of a transmission depend on nothing else.
class TransportSource {
public:
    /// Throws std::invalid_argument for an impossible setting. `form` is for tests.
    TransportSource(const TransportSetting& setting,
                    std::uint64_t seed,
                    const SamplerForm& form = samplerForms().front());

    const TransportBlockCode& code() const
    {
        return itsCode;
    }

    /// Draws and encodes the bits of frames first to first + count - 1.
    void begin(std::uint64_t first, unsigned count);

    /// Sends transmission `transmission` of some of these frames, to which all earlier ones have been sent, and remakes
    /// their code blocks, the smaller size first. Adds each frame's clipped soft values to its entry in `clipped`.
    void transmit(const std::vector<unsigned>& frames,
                  unsigned transmission,
                  std::array<CodeBlockBatch, 2>& batches,
                  std::uint32_t* clipped);

    /// The packed bits of code block r of a frame before encoding, with filler bits and CRC.
    void sentBlock(unsigned frame, unsigned r, std::uint64_t* bits) const
    {
        itsCode.frame(itsInformation.block(frame), r, bits);
    }

private:
    template <class Value>
    Value* bufferOf(std::vector<Value>& buffers, unsigned frame, unsigned transmission) const;
    void receive(unsigned frame, unsigned transmission);
    std::uint32_t place(unsigned frame);
    std::uint32_t recover(unsigned frame, unsigned transmission);
    std::uint32_t recoverIntegers(unsigned frame, unsigned transmission);
    void layOut(const std::vector<unsigned>& frames, std::array<CodeBlockBatch, 2>& batches) const;

    TransportSetting itsSetting;
    TransportBlockCode itsCode;
    RandomKey itsKey;
    RandomBatch itsRandomBits;
    SymbolLink itsLink;
    bool itsAddsNothing;  ///< no bit is sent twice, and values are not rounded to another width

    std::uint64_t itsFirst = 0;
    PackedBlocks itsInformation;
    PackedBlocks itsBuffers;
    std::vector<std::uint64_t> itsCoded;
    std::vector<float> itsRatios;
    std::vector<std::int16_t> itsRounded;
    std::vector<float> itsSoftBuffers;            ///< if values are added up as floats,
    std::vector<std::int16_t> itsRoundedBuffers;  ///< or as integers
    std::vector<std::int8_t> itsReceived;         ///< if nothing is added up
    std::vector<std::int8_t> itsValues;
};

}  // namespace morvik::link

#endif
