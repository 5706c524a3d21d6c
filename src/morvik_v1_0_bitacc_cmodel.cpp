// morvik_v1_0_bitacc_cmodel: the C interface: generics, decoder state and block simulation.
#include "morvik_v1_0_bitacc_cmodel.h"

#include <algorithm>
#include <cstddef>
#include <cstdlib>
#include <string>
#include <vector>

#include "Arithmetic.h"
#include "DecoderState.h"
#include "Messages.h"

namespace {

using Generics = veltra_ip_morvik_v1_0_generics;
using State = veltra_ip_morvik_v1_0_state;
using Outputs = veltra_ip_morvik_v1_0_outputs;

enum Status : std::int32_t { success = 0, refused = 1, decodeFailed = 2, exceptionRaised = 99 };

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
    return nullptr;
}

/// Releases a component and forgets it.
template <class Component>
void release(Component*& component)
{
    delete component;
    component = nullptr;
}

/// What is wrong with the arguments of a simulation call, or null.
const char* checkArguments(const State* state,
                           const std::int32_t* const (&streams)[3],
                           std::int32_t dinSize,
                           std::uint32_t iterations,
                           const Outputs* outputs)
{
    if (state == nullptr) {
        return "Simulate called with null state structure";
    }
    if (outputs == nullptr) {
        return "Simulate called with null output structure";
    }
    if (outputs->dout == nullptr) {
        return "Simulate called with null pointer for dout";
    }
    if (dinSize < 1) {
        return "din_size must be a positive integer";
    }
    if (streams[0] == nullptr) {
        return "rsc1_sys must not be a null pointer";
    }
    if (streams[1] == nullptr) {
        return "rsc1_par must not be a null pointer";
    }
    if (streams[2] == nullptr) {
        return "rsc2_par must not be a null pointer";
    }
    if (iterations < 1 || iterations > 15) {
        return "Number of iterations must be in the range 1 to 15";
    }
    return nullptr;
}

/// A caller's value in the state format, clipped to the input format (rule 4). `excess` is set to what
/// was clipped: 0, or a number of the sign of the limit that was exceeded.
short convertInput(std::int32_t value, const TNumberFormat& input, const TNumberFormat& state, std::int32_t& excess)
{
    const std::int32_t aligned = arithmetic::shiftLeftWrap(value, input.itsShift);
    const std::int32_t clipped = arithmetic::clip<std::int32_t>(aligned, input.itsMin, input.itsMax);
    excess = aligned - clipped;
    return state.place(input.integer(arithmetic::wrap16(clipped)));
}

/// Joins the caller's three streams, position by position, into aligned soft values. The first
/// value of a state's life that has to be clipped is reported.
std::vector<short> convertInputs(State& state, const std::int32_t* const (&streams)[3], std::int32_t dinSize)
{
    static constexpr const char* streamNames[3] = {"RSC1 systematic", "RSC1 parity", "RSC2 parity"};
    std::vector<short> soft;
    soft.reserve(3 * static_cast<std::size_t>(dinSize));
    for (std::int32_t i = 0; i < dinSize; ++i) {
        for (unsigned s = 0; s < 3; ++s) {
            std::int32_t excess = 0;
            soft.push_back(convertInput(streams[s][i], *state.input_format, *state.state_format, excess));
            if (excess != 0 && !state.saturation_reported) {
                messages::writeWarning("WARNING:decoder:",
                                       streamNames[s],
                                       " value in position ",
                                       i,
                                       excess > 0 ? " saturated positively" : " saturated negatively",
                                       ", further saturation will not be reported");
                state.saturation_reported = true;
            }
        }
    }
    return soft;
}

/// The tag's bits that the core carries. The first tag of a state's life that loses bits is reported.
std::uint32_t truncateTag(State& state, std::uint32_t tag)
{
    const std::uint32_t kept = tag & state.tag_mask;
    if (kept != tag && !state.tag_truncation_reported) {
        messages::writeWarning("WARNING:decoder:Input block tag has been truncated to ",
                               state.generics.C_TAG_WIDTH,
                               " bits, further truncation will not be reported");
        state.tag_truncation_reported = true;
    }
    return kept;
}

Status refuse(const char* reason)
{
    messages::writeError("ERROR:decoder:", reason);
    return refused;
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
    const std::int32_t* const streams[3] = {rsc1_sys, rsc1_par, rsc2_par};
    if (const char* reason = checkArguments(state, streams, din_size, iterations, outputs)) {
        return refuse(reason);
    }
    const std::vector<short> soft = convertInputs(*state, streams, din_size);
    std::vector<unsigned char> hard;
    try {
        if (!state->decoder->decode(soft, hard, iterations)) {
            return decodeFailed;
        }
    } catch (...) {
        refuse("Unhandled exception has occurred");
        return exceptionRaised;
    }
    if (outputs->dout_alloc < hard.size()) {
        return refuse("Insufficient allocated space for output array");
    }
    std::copy(hard.begin(), hard.end(), outputs->dout);
    outputs->dout_size = static_cast<std::uint32_t>(hard.size());
    outputs->tag = truncateTag(*state, tag);
    return success;
}
