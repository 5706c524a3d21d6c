// morvik_v1_0_bitacc_cmodel: the C interface: generics, decoder state and block simulation.
#include "morvik_v1_0_bitacc_cmodel.h"

#include <algorithm>
#include <cstddef>
#include <cstdlib>
#include <string>
#include <vector>

#include "DecoderState.h"
#include "LanePath.h"
#include "Messages.h"
#include "SimulationCall.h"

namespace {

using Generics = veltra_ip_morvik_v1_0_generics;
using namespace simulation_call;
using Outputs = veltra_ip_morvik_v1_0_outputs;

/// What is wrong with the generics, or null.
const char* checkGenerics(const Generics& generics)
{
    if (generics.C_NUM_PU != 2 && generics.C_NUM_PU != 4 && generics.C_NUM_PU != 8) {
        return "C_NUM_PU must be either 2, 4 or 8";
    }
    if (generics.C_TAG_WIDTH < 0 || generics.C_TAG_WIDTH > 32) {
        return "C_TAG_WIDTH must be in range 0 to 32";
    }
    if (generics.C_ALGORITHM_TYPE < 0 || generics.C_ALGORITHM_TYPE > 2) {
        return "C_ALGORITHM_TYPE must be in range 0 to 2";
    }
    if (generics.C_STATE_INT_WIDTH != 9) {
        return "C_STATE_INT_WIDTH must be 9";
    }
    if (generics.C_STATE_FRAC_WIDTH != 3) {
        return "C_STATE_FRAC_WIDTH must be 3";
    }
    if (generics.C_INPUT_INT_WIDTH != 5) {
        return "C_INPUT_INT_WIDTH must be 5";
    }
    if (generics.C_INPUT_FRAC_WIDTH != 3) {
        return "C_INPUT_FRAC_WIDTH must be 3";
    }
    return nullptr;
}

TNumberFormat* createFormat(int integerBits, int fractionBits)
{
    return TNumberFormat::create("Fix_" + std::to_string(integerBits + fractionBits) + "_" +
                                 std::to_string(fractionBits));
}

/// Builds the components of a state from its generics; null, or what failed.
const char* buildComponents(State& state)
{
    const Generics& generics = state.generics;
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
    state.decoder->itsExtrinsicScale = generics.C_ALGORITHM_TYPE == 1 ? 0.75 : 1.0;
    state.lane_path = new LanePath(static_cast<TDecoder3GPU&>(*state.decoder),
                                   static_cast<lanes::Algorithm>(generics.C_ALGORITHM_TYPE),
                                   lanes::bestInstructionSet());
    return nullptr;
}

/// Releases a component and forgets it.
template <class Component>
void release(Component*& component)
{
    delete component;
    component = nullptr;
}

}  // namespace

veltra_ip_morvik_v1_0_generics veltra_ip_morvik_v1_0_get_default_generics(void)
{
    Generics generics = {};
    generics.C_DIRECTORY = "./";
    generics.C_FAMILY = "halden5";
    generics.C_COMPONENT_NAME = "morvik_v1_0";
    generics.C_RESERVED_1 = 512;
    generics.C_STATE_INT_WIDTH = 9;
    generics.C_STATE_FRAC_WIDTH = 3;
    generics.C_INPUT_INT_WIDTH = 5;
    generics.C_INPUT_FRAC_WIDTH = 3;
    generics.C_NUM_PU = 2;
    generics.C_TAG_WIDTH = 8;
    generics.C_ALGORITHM_TYPE = 1;
    return generics;
}

veltra_ip_morvik_v1_0_state* create_default_state(veltra_ip_morvik_v1_0_generics generics)
{
    auto* state = static_cast<State*>(std::malloc(sizeof(State)));
    if (state == nullptr) {
        messages::writeError("ERROR:decoder:Could not allocate memory for decoder state");
        return nullptr;
    }
    *state = State{};
    state->generics = generics;
    // The shift count has five bits: a width of 32 keeps no bit, as a width of 0.
    state->tag_mask = (std::uint32_t{1} << (static_cast<std::uint32_t>(generics.C_TAG_WIDTH) & 31U)) - 1U;
    return state;
}

veltra_ip_morvik_v1_0_state* veltra_ip_morvik_v1_0_create_state(veltra_ip_morvik_v1_0_generics generics)
{
    if (const char* reason = checkGenerics(generics)) {
        refuse(reason);
        return nullptr;
    }
    State* state = create_default_state(generics);
    if (state == nullptr) {
        return nullptr;
    }
    const char* reason = nullptr;
    try {
        reason = buildComponents(*state);
    } catch (...) {
        reason = "Unhandled exception has occurred";
    }
    if (reason != nullptr) {
        refuse(reason);
        veltra_ip_morvik_v1_0_destroy_state(state);
        return nullptr;
    }
    return state;
}

void veltra_ip_morvik_v1_0_destroy_state(veltra_ip_morvik_v1_0_state* state)
{
    if (state == nullptr) {
        return;
    }
    release(state->lane_path);
    release(state->state_format);
    release(state->branch_format);
    release(state->input_format);
    release(state->engine);
    release(state->interleaver);
    release(state->decoder);
    std::free(state);
}

void veltra_ip_morvik_v1_0_bitacc_dump_config(veltra_ip_morvik_v1_0_state* state, uint32_t count)
{
    state->decoder->itsDumpCount = count;
    state->decoder->itsStopAfterDump = false;
}

int32_t veltra_ip_morvik_v1_0_bitacc_simulate(veltra_ip_morvik_v1_0_state* state,
                                              const int32_t* rsc1_sys,
                                              const int32_t* rsc1_par,
                                              const int32_t* rsc2_par,
                                              int32_t din_size,
                                              uint32_t iterations,
                                              uint32_t tag,
                                              veltra_ip_morvik_v1_0_outputs* outputs)
{
    const lanes::Streams<std::int32_t> streams = {rsc1_sys, rsc1_par, rsc2_par};
    if (const char* reason = checkArguments(state, outputFault(outputs), streams, din_size, iterations)) {
        return refuse(reason);
    }
    const bool byLanes = lanesTake(*state, din_size);
    std::vector<unsigned char> hard;
    std::size_t K = 0;
    if (byLanes) {
        K = blockSizeOf(din_size);
        loadLanes<std::int32_t>(*state, &streams, 1, din_size, nullptr);
        state->lane_path->decode(iterations);
    } else {
        const Status status = decodeByComponents(*state, streams, din_size, iterations, hard);
        if (status != success) {
            return status;
        }
        K = hard.size();
    }
    if (outputs->dout_alloc < K) {
        return refuse("Insufficient allocated space for output array");
    }
    if (byLanes) {
        state->lane_path->decisions(&outputs->dout);
    } else {
        std::copy(hard.begin(), hard.end(), outputs->dout);
    }
    outputs->dout_size = static_cast<std::uint32_t>(K);
    outputs->tag = truncateTag(*state, tag);
    return success;
}
