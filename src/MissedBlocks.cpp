// MissedBlocks: blocks decoded by the lanes, and the metric columns that they would have left.
#include "MissedBlocks.h"

#include <cstddef>
#include <utility>

namespace {

/// Lends a decoder another's metric columns and returns them on exit, exceptions included.
class LentColumns {
public:
    LentColumns(TDecoder& owner, TDecoder& user) : itsOwner(owner), itsUser(user)
    {
        exchange();
    }

    ~LentColumns()
    {
        exchange();
    }

    LentColumns(const LentColumns&) = delete;
    LentColumns& operator=(const LentColumns&) = delete;

private:
    void exchange()
    {
        std::swap(itsOwner.itsMetricBuffer, itsUser.itsMetricBuffer);
        std::swap(itsOwner.itsMetricBufferSize, itsUser.itsMetricBufferSize);
        std::swap(itsOwner.itsAlpha, itsUser.itsAlpha);
        std::swap(itsOwner.itsBeta, itsUser.itsBeta);
        std::swap(itsOwner.itsGamma, itsUser.itsGamma);
    }

    TDecoder& itsOwner;
    TDecoder& itsUser;
};

}  // namespace

void MissedBlocks::add(morvik::lanes::LoadedBlock input, unsigned K, unsigned iterations)
{
    itsBlocks.push_back({std::move(input), K, iterations});
}

void MissedBlocks::overwrite(unsigned K)
{
    while (!itsBlocks.empty() && itsBlocks.back().K <= K) {
        itsBlocks.pop_back();
    }
}

void MissedBlocks::forget()
{
    itsBlocks.clear();
}

void MissedBlocks::computeColumns()
{
    if (itsBlocks.empty()) {
        return;
    }
    TDecoder3GPU& decoder = itsOriginals.decoder();
    TDecoder3GPU& twin = itsOriginals.twin();
    const LentColumns columns(decoder, twin);
    for (const Block& block : itsBlocks) {
        decodeByTwin(block);
    }
    if (decoder.itsAlphaSegment.empty()) {
        decoder.itsNT = twin.itsNT;
        decoder.itsBetaSegment = twin.itsBetaSegment;
        decoder.itsAlphaSegment = twin.itsAlphaSegment;
    }
    itsBlocks.clear();
}

/// Uses components that no test bench can change, count in or trace.
void MissedBlocks::decodeByTwin(const Block& block)
{
    TDecoder3GPU& twin = itsOriginals.twin();
    const unsigned shift = twin.itsEngine->itsStateFormat->itsShift;
    std::vector<short> soft;
    std::vector<unsigned char> hard;
    for (std::size_t position = 0; position < block.input[0].size(); ++position) {
        for (const std::vector<std::int16_t>& stream : block.input) {
            soft.push_back(static_cast<short>(stream[position] * (1 << shift)));
        }
    }
    twin.decode(soft, hard, block.iterations);
}
