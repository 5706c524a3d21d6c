// ReceivedBlocks: transport blocks of one code block behind the LTE chain and white Gaussian noise, from seed 1.
#ifndef MORVIK_VALIDATION_RECEIVEDBLOCKS_H
#define MORVIK_VALIDATION_RECEIVEDBLOCKS_H

#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "link/coding/TransportBlock.h"
#include "link/modulation/Demapper.h"
#include "link/modulation/Modulation.h"

namespace morvik::validation {

/// What is sent, once, with redundancy version 0.
struct ChainFormat {
    unsigned bits = 0;       ///< of the transport block (A)
    unsigned codedBits = 0;  ///< (G)
    link::Modulation modulation{};
    link::Demapper demapper{};
};

/// What a name stands for; throws std::invalid_argument if nothing.
template <class Value>
Value named(std::optional<Value> value, const std::string& name)
{
    return value ? *value : throw std::invalid_argument("there is no " + name);
}

class ReceivedBlocks {
public:
    static constexpr unsigned atOnce = link::TurboEncoder::blocksAtOnce;

    /// Es/N0 in thousandths of a decibel. Throws std::invalid_argument for a format that cannot be sent in one block.
    ReceivedBlocks(const ChainFormat& format, int milliDecibels);

    const link::TransportBlockCode& code() const
    {
        return itsCode;
    }

    /// Makes blocks `first` to first + atOnce - 1.
    void make(std::uint64_t first);

    /// The bits of code block b: fillers, transport block, CRC.
    const std::vector<unsigned char>& sent(unsigned b) const
    {
        return itsSent[b];
    }

    /// The sums of ratios in its circular buffer.
    const std::vector<float>& buffer(unsigned b) const
    {
        return itsBuffers[b];
    }

private:
    void draw(std::uint64_t first);
    void receive(std::uint64_t number, unsigned b);

    ChainFormat itsFormat;
    int itsMilliDecibels;
    float itsNoiseVariance;
    link::TransportBlockCode itsCode;
    link::PackedBlocks itsInformation;
    link::PackedBlocks itsCoded;
    std::vector<std::vector<unsigned char>> itsSent;
    std::vector<std::vector<float>> itsBuffers;
};

}  // namespace morvik::validation

#endif
