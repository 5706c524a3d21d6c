// morvik_v1_0_batch: the batch interface, and the choice of a state's instruction set.
#include "morvik_v1_0_batch.h"

#include <string>
#include <string_view>

#include "InstructionSetNames.h"
#include "Messages.h"
#include "PathChoice.h"
#include "SimulationCall.h"

namespace {

using namespace morvik::simulation_call;
using morvik::byComponents;
using Outputs = veltra_ip_morvik_v1_0_batch_outputs;
using State = veltra_ip_morvik_v1_0_state;

template <class Input>
using Streams = morvik::lanes::Streams<Input>;

std::int32_t simulateGuarded(State* state, const Batch& batch, Outputs* outputs)
{
    return guarded([&] { return simulate(state, batch, outputs); });
}

std::int32_t countErrorsGuarded(State* state, const Batch& batch, const ErrorCounts& counts)
{
    return guarded([&] { return countErrors(state, batch, counts); });
}

Status setInstructionSet(State& state, std::string_view wanted)
{
    std::string known;
    for (const morvik::lanes::InstructionSet* set : morvik::lanes::availableInstructionSets()) {
        if (state.path_choice == nullptr) {
            break;
        }
        if (wanted == set->name) {
            state.path_choice->useLanes(*set);
            return success;
        }
        known += std::string(set->name) + ", ";
    }
    if (wanted == byComponents) {
        if (state.path_choice != nullptr) {
            state.path_choice->useComponents();
        }
        return success;
    }
    morvik::messages::writeError("ERROR:decoder:Instruction set '", wanted, "' is not one of ", known, byComponents);
    return refused;
}

}  // namespace

int32_t veltra_ip_morvik_v1_0_batch_simulate_i32(veltra_ip_morvik_v1_0_state* state,
                                                 const int32_t* rsc1_sys,
                                                 const int32_t* rsc1_par,
                                                 const int32_t* rsc2_par,
                                                 int32_t din_size,
                                                 uint32_t blocks,
                                                 uint32_t iterations,
                                                 const uint32_t* tags,
                                                 veltra_ip_morvik_v1_0_batch_outputs* outputs)
{
    const Streams<std::int32_t> streams = {rsc1_sys, rsc1_par, rsc2_par};
    return simulateGuarded(state, {streams, din_size, blocks, iterations, tags}, outputs);
}

int32_t veltra_ip_morvik_v1_0_batch_simulate_i16(veltra_ip_morvik_v1_0_state* state,
                                                 const int16_t* rsc1_sys,
                                                 const int16_t* rsc1_par,
                                                 const int16_t* rsc2_par,
                                                 int32_t din_size,
                                                 uint32_t blocks,
                                                 uint32_t iterations,
                                                 const uint32_t* tags,
                                                 veltra_ip_morvik_v1_0_batch_outputs* outputs)
{
    const Streams<std::int16_t> streams = {rsc1_sys, rsc1_par, rsc2_par};
    return simulateGuarded(state, {streams, din_size, blocks, iterations, tags}, outputs);
}

int32_t veltra_ip_morvik_v1_0_batch_simulate_i8(veltra_ip_morvik_v1_0_state* state,
                                                const int8_t* rsc1_sys,
                                                const int8_t* rsc1_par,
                                                const int8_t* rsc2_par,
                                                int32_t din_size,
                                                uint32_t blocks,
                                                uint32_t iterations,
                                                const uint32_t* tags,
                                                veltra_ip_morvik_v1_0_batch_outputs* outputs)
{
    const Streams<std::int8_t> streams = {rsc1_sys, rsc1_par, rsc2_par};
    return simulateGuarded(state, {streams, din_size, blocks, iterations, tags}, outputs);
}

int32_t veltra_ip_morvik_v1_0_batch_count_errors_i32(veltra_ip_morvik_v1_0_state* state,
                                                     const int32_t* rsc1_sys,
                                                     const int32_t* rsc1_par,
                                                     const int32_t* rsc2_par,
                                                     int32_t din_size,
                                                     uint32_t blocks,
                                                     uint32_t iterations,
                                                     const uint8_t* sent,
                                                     uint32_t* errors,
                                                     size_t errors_alloc)
{
    const Streams<std::int32_t> streams = {rsc1_sys, rsc1_par, rsc2_par};
    return countErrorsGuarded(state, {streams, din_size, blocks, iterations, nullptr}, {sent, errors, errors_alloc});
}

int32_t veltra_ip_morvik_v1_0_batch_count_errors_i16(veltra_ip_morvik_v1_0_state* state,
                                                     const int16_t* rsc1_sys,
                                                     const int16_t* rsc1_par,
                                                     const int16_t* rsc2_par,
                                                     int32_t din_size,
                                                     uint32_t blocks,
                                                     uint32_t iterations,
                                                     const uint8_t* sent,
                                                     uint32_t* errors,
                                                     size_t errors_alloc)
{
    const Streams<std::int16_t> streams = {rsc1_sys, rsc1_par, rsc2_par};
    return countErrorsGuarded(state, {streams, din_size, blocks, iterations, nullptr}, {sent, errors, errors_alloc});
}

int32_t veltra_ip_morvik_v1_0_batch_count_errors_i8(veltra_ip_morvik_v1_0_state* state,
                                                    const int8_t* rsc1_sys,
                                                    const int8_t* rsc1_par,
                                                    const int8_t* rsc2_par,
                                                    int32_t din_size,
                                                    uint32_t blocks,
                                                    uint32_t iterations,
                                                    const uint8_t* sent,
                                                    uint32_t* errors,
                                                    size_t errors_alloc)
{
    const Streams<std::int8_t> streams = {rsc1_sys, rsc1_par, rsc2_par};
    return countErrorsGuarded(state, {streams, din_size, blocks, iterations, nullptr}, {sent, errors, errors_alloc});
}

int32_t veltra_ip_morvik_v1_0_set_instruction_set(veltra_ip_morvik_v1_0_state* state, const char* name)
{
    if (state == nullptr) {
        return refuse("set_instruction_set called with null state structure");
    }
    return guarded([&] { return setInstructionSet(*state, name == nullptr ? "" : name); });
}

const char* veltra_ip_morvik_v1_0_get_instruction_set(const veltra_ip_morvik_v1_0_state* state)
{
    if (state == nullptr) {
        refuse("get_instruction_set called with null state structure");
        return nullptr;
    }
    const morvik::lanes::InstructionSet* set =
        state->path_choice == nullptr ? nullptr : state->path_choice->instructionSet();
    return set == nullptr ? byComponents : set->name;
}
