// VariantDecoder: decoders made of the model's components, from fine, undivided arithmetic to the hardware's.
#include "VariantDecoder.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <stdexcept>
#include <string>

#include "rules/Algorithms.h"

namespace morvik::validation {

namespace {

/// Returns what a factory made; throws on failure.
template <class Component>
std::unique_ptr<Component> made(Component* component)
{
    if (component == nullptr) {
        throw std::runtime_error("a component cannot be made");
    }
    return std::unique_ptr<Component>(component);
}

}  // namespace

const Variant& variantOf(const char* name)
{
    return *std::find_if(
        variants.begin(), variants.end(), [=](const Variant& variant) { return std::string(variant.name) == name; });
}

VariantDecoder::VariantDecoder(const Variant& variant, int algorithm)
    : itsState(made(TNumberFormat::create(variant.stateFormat))),
      itsBranch(made(TNumberFormat::create(variant.branchFormat))),
      itsInterleaver(made(TInterleaver::create("3GPPLTE"))),
      itsEngine(made(TCalculationEngine::create(algorithm == 2 ? "MOD#:16" : "MOD"))),
      itsDecoder(made(*variant.decoder == '\0' ? TDecoder3G::create(false, "") : TDecoder::create(variant.decoder)))
{
    itsEngine->itsStateFormat = itsState.get();
    itsEngine->itsBranchFormat = itsEngine->itsInputFormat = itsBranch.get();
    if (!itsEngine->initialise()) {
        throw std::runtime_error("the engine cannot be initialised");
    }
    itsDecoder->itsInterleaver = itsInterleaver.get();
    itsDecoder->itsEngine = itsEngine.get();
    itsDecoder->itsExtrinsicScale = rules::extrinsicScale(algorithm);
}

const std::vector<unsigned char>& VariantDecoder::decode(const std::vector<double>& received,
                                                         double scale,
                                                         unsigned iterations)
{
    const double unit = scale * itsState->itsScale / 8;
    itsSoft.clear();
    for (const double value : received) {
        const double rounded = std::round(value * unit);
        const double lowest = itsBranch->itsMinQ;
        const double highest = itsBranch->itsMaxQ;
        itsSoft.push_back(itsState->place(static_cast<std::int32_t>(std::clamp(rounded, lowest, highest))));
    }
    if (!itsDecoder->decode(itsSoft, itsHard, iterations)) {
        throw std::runtime_error("a block was refused");
    }
    return itsHard;
}

}  // namespace morvik::validation
