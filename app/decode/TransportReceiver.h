// TransportReceiver: the receiver of one transport block after the other: soft buffer, decoder and CRCs.
#ifndef MORVIK_APP_DECODE_TRANSPORTRECEIVER_H
#define MORVIK_APP_DECODE_TRANSPORTRECEIVER_H

#include <cstdint>
#include <string>
#include <vector>

#include "hardware/testbench/Decoder.h"
#include "hardware/testbench/DecoderOptions.h"
#include "link/coding/TransportBlock.h"

namespace morvik {

class TransportReceiver {
public:
    /// How received values become those of the core.
    struct Input {
        float scale;              ///< soft value for an input of 1
        unsigned softBufferBits;  ///< width of the soft buffer, 2 to 16; 0: sums are floats, scaled at the end
    };

    /// `messages` gets the decoder's warnings and must outlive the receiver.
    TransportReceiver(link::TransportBlockCode code,
                      const DecoderOptions& decoder,
                      const Input& input,
                      std::ostream& messages);

    /// Empties the soft buffer for the next transport block.
    void clear();

    /// Adds a transmission to the soft buffer, and decodes.
    void receive(const std::vector<float>& values, unsigned version);

    /// Whether the transport block's CRC fits.
    bool fits() const
    {
        return itsFits;
    }

    /// A 1 for each code block whose CRC fits, or a 0.
    const std::string& codeBlocks() const
    {
        return itsCodeBlocks;
    }

    /// The transport block's bits.
    std::vector<std::uint8_t> bits() const;

    const link::TransportBlockCode& code() const
    {
        return itsCode;
    }

private:
    void recover(const std::vector<float>& values, unsigned version);
    const SoftBlock& softBlock(unsigned r);

    link::TransportBlockCode itsCode;
    Input itsInput;
    std::uint32_t itsIterations;
    Decoder itsDecoder;
    std::vector<float> itsRatios;       // the soft buffer in full width,
    std::vector<std::int16_t> itsSums;  // or of softBufferBits
    std::vector<std::int16_t> itsReceived;
    std::vector<std::int8_t> itsValues;
    SoftBlock itsBlock;
    std::vector<std::uint8_t> itsDecisions;
    std::vector<std::uint64_t> itsRow;
    std::string itsCodeBlocks;
    bool itsFits = false;
};

}  // namespace morvik

#endif
