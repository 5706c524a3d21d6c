// morvik_v1_0_bitacc_cmodel: the C interface: generics, decoder state and block simulation.
#include "morvik_v1_0_bitacc_cmodel.h"

#include <cstdlib>

#include "Components.h"
#include "DecoderState.h"
#include "Messages.h"
#include "PathChoice.h"
#include "SimulationCall.h"
#include "rules/SoftValues.h"

namespace {

using Generics = veltra_ip_morvik_v1_0_generics;
using namespace morvik::simulation_call;
using State = veltra_ip_morvik_v1_0_state;

/// Returns what is wrong with the generics, or null.
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

/// Builds a state's components and path choice. Returns null, or what failed.
const char* build(State& state)
{
    if (const char* reason = morvik::components::create(state)) {
        return reason;
    }
    state.path_choice = new PathChoice(state, morvik::lanes::bestInstructionSet());
    return nullptr;
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
        morvik::messages::writeError("ERROR:decoder:Could not allocate memory for decoder state");
        return nullptr;
    }
    *state = State{};
    state->generics = generics;
    // The shift count has five bits: like a width of 0, a width of 32 keeps no bit.
    state->tag_mask = morvik::rules::tagMask(static_cast<std::uint32_t>(generics.C_TAG_WIDTH));
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
        reason = build(*state);
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
    delete state->path_choice;
    morvik::components::release(*state);
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
    const morvik::lanes::Streams<std::int32_t> streams = {rsc1_sys, rsc1_par, rsc2_par};
    const Batch block = {streams, din_size, 1, iterations, &tag};
    if (outputs == nullptr) {
        return simulate(state, block, nullptr);
    }
    veltra_ip_morvik_v1_0_batch_outputs delivered = {};
    delivered.dout = outputs->dout;
    delivered.dout_alloc = outputs->dout_alloc;
    delivered.tags = &outputs->tag;
    delivered.tags_alloc = 1;
    const Status status = simulate(state, block, &delivered);
    if (status == success) {
        outputs->dout_size = delivered.dout_size;
    }
    return status;
}
