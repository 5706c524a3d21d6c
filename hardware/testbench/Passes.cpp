// Passes: every value that the core computes on a block, one half-iteration at a time.
#include "Passes.h"

#include <vector>

#include "src/TDecoder3GPU.h"

namespace morvik {

namespace {

short alignedValue(const TDecoder& decoder, unsigned signal, std::uint32_t step)
{
    const Stage stage = stageOf(signal);
    const unsigned number = signal - signalsOf(stage).first;
    switch (stage) {
    case Stage::intrinsic:
        return decoder.itsIntrinsic[step];
    case Stage::branch:
        return decoder.itsGamma[step][number];
    case Stage::forward:
        return decoder.itsAlpha[step][number];
    case Stage::backward:
        return decoder.itsBeta[step][number];
    case Stage::ratio:
        return decoder.itsLLR[step];
    case Stage::extrinsic:
        break;
    }
    return decoder.itsExtrinsic[step];
}

}  // namespace

Passes::Passes(const SoftBlock& block, const veltra_ip_morvik_v1_0_generics& generics, std::ostream& warnings)
    : itsDecoder(generics, warnings), itsComponent(dynamic_cast<TDecoder3GPU&>(itsDecoder.component()))
{
    // One iteration leaves the streams in the component, as the core takes them; half-iteration 0 starts afresh.
    std::vector<std::uint8_t> bits;
    itsDecoder.decode(block, 1, 0, bits);
    if (bits.empty()) {
        throw Refusal("has no bits besides the tail");
    }
    itsCut =
        rules::Cut(itsComponent.itsBlockSize - rules::tailSteps, itsComponent.itsNumPU, itsComponent.itsThreadsPerPU);
}

const rules::Cut& Passes::cut() const
{
    return itsCut;
}

const TDecoder3GPU& Passes::component() const
{
    return itsComponent;
}

void Passes::next()
{
    itsComponent.calcSISO(itsNext);
    ++itsNext;
}

std::int16_t Passes::value(unsigned signal, std::uint32_t step) const
{
    return static_cast<std::int16_t>(rules::integerOf(alignedValue(itsComponent, signal, step), rules::stateAlignment));
}

bool Passes::isComputed(unsigned signal, std::uint32_t step) const
{
    return step < itsCut.K() + stepsAfterBits(stageOf(signal));
}

}  // namespace morvik
