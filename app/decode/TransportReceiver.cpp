// TransportReceiver: the receiver of one transport block after the other: soft buffer, decoder and CRCs.
#include "TransportReceiver.h"

#include <algorithm>
#include <array>
#include <utility>

#include "link/coding/Crc.h"
#include "link/coding/SoftValues.h"

namespace morvik {

TransportReceiver::TransportReceiver(link::TransportBlockCode code,
                                     const DecoderOptions& decoder,
                                     const Input& input,
                                     std::ostream& messages)
    : itsCode(std::move(code)),
      itsInput(input),
      itsIterations(decoder.iterations),
      itsDecoder(decoder.generics, messages),
      itsRow(link::wordsOf(itsCode.blocks().bits + link::crcBits))
{
    clear();
}

void TransportReceiver::clear()
{
    if (itsInput.softBufferBits == 0) {
        itsRatios.assign(itsCode.softSize(), 0);
    } else {
        itsSums.assign(itsCode.softSize(), 0);
    }
    itsFits = false;
}

void TransportReceiver::receive(const std::vector<float>& values, unsigned version)
{
    recover(values, version);
    itsCodeBlocks.clear();
    for (unsigned r = 0; r < itsCode.blocks().count; ++r) {
        itsDecoder.decode(softBlock(r), itsIterations, 0, itsDecisions);
        itsCodeBlocks += itsCode.join(itsDecisions.data(), r, itsRow.data()) ? '1' : '0';
    }
    itsFits = itsCode.fits(itsRow.data());
}

std::vector<std::uint8_t> TransportReceiver::bits() const
{
    std::vector<std::uint8_t> bits(itsCode.blocks().bits);
    link::unpackBits(itsRow.data(), bits.size(), bits.data());
    return bits;
}

void TransportReceiver::recover(const std::vector<float>& values, unsigned version)
{
    if (itsInput.softBufferBits == 0) {
        itsCode.recover(values.data(), version, itsRatios.data());
        return;
    }
    itsReceived.resize(values.size());
    link::softValues(values.data(), values.size(), itsInput.scale, itsInput.softBufferBits, itsReceived.data());
    itsCode.recover(itsReceived.data(), version, itsInput.softBufferBits, itsSums.data());
}

/// Code block r as the core takes it.
const SoftBlock& TransportReceiver::softBlock(unsigned r)
{
    const std::size_t at = itsCode.softOffset(r);
    itsValues.resize(itsCode.matching(r).size());
    if (itsInput.softBufferBits == 0) {
        link::softValues(&itsRatios[at], itsValues.size(), itsInput.scale, itsValues.data());
    } else {
        link::softValues(&itsSums[at], itsValues.size(), itsValues.data());
    }
    const std::size_t length = itsCode.blocks().size(r) + rules::tailPositions;
    std::array<std::vector<std::int8_t>, 3> streams;
    streams.fill(std::vector<std::int8_t>(length));
    itsCode.matching(r).deinterleave(
        itsValues.data(), link::fillerValue, {streams[0].data(), streams[1].data(), streams[2].data()});
    itsBlock.rsc1Sys.assign(streams[0].begin(), streams[0].end());
    itsBlock.rsc1Par.assign(streams[1].begin(), streams[1].end());
    itsBlock.rsc2Par.assign(streams[2].begin(), streams[2].end());
    return itsBlock;
}

}  // namespace morvik
