// Components: creates the six components of a state from its generics.
#include "Components.h"

#include <string>

#include "rules/Algorithms.h"

namespace morvik::components {

namespace {

TNumberFormat* createFormat(int integerBits, int fractionBits)
{
    return TNumberFormat::create("Fix_" + std::to_string(integerBits + fractionBits) + "_" +
                                 std::to_string(fractionBits));
}

template <class Component>
void releaseOne(Component*& component)
{
    delete component;
    component = nullptr;
}

}  // namespace

const char* create(State& state)
{
    const veltra_ip_morvik_v1_0_generics& generics = state.generics;
    state.state_format = createFormat(generics.C_STATE_INT_WIDTH, generics.C_STATE_FRAC_WIDTH);
    if (state.state_format == nullptr) {
        return "Could not set state number format";
    }
    state.branch_format = TNumberFormat::create("Fix_8_3");
    if (state.branch_format == nullptr) {
        return "Could not set branch number format";
    }
    state.input_format = createFormat(generics.C_INPUT_INT_WIDTH, generics.C_INPUT_FRAC_WIDTH);
    if (state.input_format == nullptr) {
        return "Could not set input number format";
    }
    state.interleaver = TInterleaver::create("3GPPLTE");
    if (state.interleaver == nullptr) {
        return "Could not create interleaver";
    }
    state.engine = TCalculationEngine::create(generics.C_ALGORITHM_TYPE == 2 ? "MOD#:16" : "MOD");
    if (state.engine == nullptr) {
        return "Could not create calculation engine";
    }
    state.engine->itsInputFormat = state.input_format;
    state.engine->itsStateFormat = state.state_format;
    state.engine->itsBranchFormat = state.branch_format;
    if (!state.engine->initialise()) {
        return "Could not initialise calculation engine";
    }
    state.decoder = TDecoder::create("3GPPPU:" + std::to_string(generics.C_NUM_PU));
    if (state.decoder == nullptr) {
        return "Could not create decoder";
    }
    state.decoder->itsInterleaver = state.interleaver;
    state.decoder->itsEngine = state.engine;
    state.decoder->itsExtrinsicScale = rules::extrinsicScale(generics.C_ALGORITHM_TYPE);
    return nullptr;
}

void release(State& state)
{
    releaseOne(state.state_format);
    releaseOne(state.branch_format);
    releaseOne(state.input_format);
    releaseOne(state.engine);
    releaseOne(state.interleaver);
    releaseOne(state.decoder);
}

}  // namespace morvik::components
