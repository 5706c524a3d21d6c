// Passes: every value that the core computes on a block, one half-iteration at a time.
#include "Passes.h"

#include <vector>

#include "src/TDecoder3GPU.h"

namespace morvik {

namespace {

/// Calls visit with the function that gives the signal's aligned value of a step.
template <class Visit>
auto visitSignal(const TDecoder& decoder, unsigned signal, Visit visit)
{
    const Stage stage = stageOf(signal);
    const unsigned number = signal - signalsOf(stage).first;
    switch (stage) {
    case Stage::intrinsic:
        return visit([&](std::uint32_t step) { return decoder.itsIntrinsic[step]; });
    case Stage::branch:
        return visit([&](std::uint32_t step) { return decoder.itsGamma[step][number]; });
    case Stage::forward:
        return visit([&](std::uint32_t step) { return decoder.itsAlpha[step][number]; });
    case Stage::backward:
        return visit([&](std::uint32_t step) { return decoder.itsBeta[step][number]; });
    case Stage::ratio:
        return visit([&](std::uint32_t step) { return decoder.itsLLR[step]; });
    case Stage::extrinsic:
        break;
    }
    return visit([&](std::uint32_t step) { return decoder.itsExtrinsic[step]; });
}

std::int16_t integerOf(short aligned)
{
    return static_cast<std::int16_t>(rules::integerOf(aligned, rules::stateAlignment));
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
    return visitSignal(itsComponent, signal, [step](auto alignedAt) { return integerOf(alignedAt(step)); });
}

void Passes::copyValues(unsigned signal, std::int16_t* values) const
{
    visitSignal(itsComponent, signal, [=](auto alignedAt) {
        for (std::uint32_t step = 0; step < computedSteps(signal); ++step) {
            values[step] = integerOf(alignedAt(step));
        }
    });
}

bool Passes::isComputed(unsigned signal, std::uint32_t step) const
{
    return step < computedSteps(signal);
}

std::uint32_t Passes::computedSteps(unsigned signal) const
{
    return itsCut.K() + stepsAfterBits(stageOf(signal));
}

}  // namespace morvik
