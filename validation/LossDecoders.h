// LossDecoders: the decoders from the floating-point reference to the hardware, each a step further.
#ifndef MORVIK_VALIDATION_LOSSDECODERS_H
#define MORVIK_VALIDATION_LOSSDECODERS_H

#include <array>
#include <memory>
#include <string>
#include <vector>

#include "FloatDecoder.h"
#include "ReceivedBlocks.h"
#include "VariantDecoder.h"
#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik::validation {

constexpr int scaledAlgorithm = 1;

class LossDecoders {
public:
    /// reference: floating point throughout
    /// input: the reference behind the core's input: scaled, rounded, clipped to 8 bits
    /// undivided: the hardware's number formats, neither segments nor windows
    /// hardware: the core with 2 units and scaled extrinsic values
    static constexpr std::array<const char*, 4> names = {"reference", "input", "undivided", "hardware"};

    /// `chosen` are some of the names; `scale` is the soft value for a ratio of 1.
    LossDecoders(const link::TransportBlockCode& code,
                 const std::vector<std::string>& chosen,
                 float scale,
                 unsigned iterations);

    /// Whether the chosen decoder i fails on each of the blocks.
    std::vector<bool> failures(std::size_t i, const ReceivedBlocks& blocks);

private:
    using Streams = std::array<std::vector<std::int8_t>, 3>;  ///< all blocks, one after the other
    using Decisions = std::vector<std::vector<unsigned char>>;

    struct Destroy {
        void operator()(veltra_ip_morvik_v1_0_state* state) const;
    };

    Streams softValuesOf(const ReceivedBlocks& blocks) const;
    FloatDecoder::Received exactRatios(const ReceivedBlocks& blocks, unsigned first) const;
    FloatDecoder::Received roundedRatios(const Streams& streams, unsigned first) const;
    Decisions decideReference(const ReceivedBlocks& blocks);
    Decisions decideInput(const Streams& streams);
    Decisions decideUndivided(const Streams& streams);
    Decisions decideHardware(const Streams& streams);
    void decideFloat(const FloatDecoder::Received& received, Decisions& decisions);

    const link::RateMatching& itsMatching;
    unsigned itsK;
    unsigned itsFillers;
    std::vector<std::string> itsNames;
    float itsScale;
    unsigned itsIterations;
    FloatDecoder itsFloat;
    VariantDecoder itsUndivided;
    std::unique_ptr<veltra_ip_morvik_v1_0_state, Destroy> itsHardware;
};

}  // namespace morvik::validation

#endif
