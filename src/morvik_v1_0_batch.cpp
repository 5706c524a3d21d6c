// morvik_v1_0_batch: the batch interface, and the choice of how a state computes.
#include "morvik_v1_0_batch.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <string_view>
#include <vector>

#include "LanePath.h"
#include "Messages.h"
#include "SimulationCall.h"
#include "TDecoder.h"
#include "lanes/Unaligned.h"

namespace {

using namespace simulation_call;
using Outputs = veltra_ip_morvik_v1_0_batch_outputs;

constexpr const char* byComponents = "component";

/// The arguments of a batch that has passed their check.
template <class Input>
struct Batch {
    lanes::Streams<Input> first;
    std::int32_t dinSize;
    std::uint32_t blocks;
    std::uint32_t iterations;
    const std::uint32_t* tags;

    lanes::Streams<Input> block(std::size_t b) const
    {
        const std::size_t offset = b * static_cast<std::size_t>(dinSize);
        return {first.systematic + offset, first.parity1 + offset, first.parity2 + offset};
    }

    std::uint32_t tag(std::size_t b) const
    {
        return tags == nullptr ? 0 : lanes::valueAt(tags, b);
    }
};

/// Which array of the record has no room for all that a batch of blocks of K bits delivers, or null.
const char* shortArray(const Outputs& outputs, std::size_t blocks, std::size_t K)
{
    const auto lacks = [blocks](std::size_t room, std::size_t each) {
        return each != 0 && room / each < blocks;
    };
    if (lacks(outputs.dout_alloc, K)) {
        return "Insufficient allocated space for output array";
    }
    if (outputs.ratios != nullptr && lacks(outputs.ratios_alloc, K)) {
        return "Insufficient allocated space for ratios array";
    }
    return outputs.tags != nullptr && lacks(outputs.tags_alloc, 1) ? "Insufficient allocated space for tags array"
                                                                   : nullptr;
}

void deliverTag(State& state, Outputs& outputs, std::size_t b, std::uint32_t tag)
{
    const std::uint32_t kept = truncateTag(state, tag);
    if (outputs.tags != nullptr) {
        lanes::setValueAt(outputs.tags, b, kept);
    }
}

/// Decodes block after block. The first one tells whether all are refused, before anything is delivered.
template <class Input>
Status runByComponents(State& state, const Batch<Input>& batch, Outputs& outputs)
{
    std::vector<unsigned char> hard;
    for (std::size_t b = 0; b < batch.blocks; ++b) {
        const Status status = decodeByComponents(state, batch.block(b), batch.dinSize, batch.iterations, hard);
        if (status != success) {
            return status;
        }
        if (const char* reason = b == 0 ? shortArray(outputs, batch.blocks, hard.size()) : nullptr) {
            return refuse(reason);
        }
        std::copy(hard.begin(), hard.end(), outputs.dout + b * hard.size());
        if (outputs.ratios != nullptr) {
            std::memcpy(
                outputs.ratios + b * hard.size(), state.decoder->itsLLR.data(), hard.size() * sizeof *outputs.ratios);
        }
        deliverTag(state, outputs, b, batch.tag(b));
    }
    outputs.dout_size = static_cast<std::uint32_t>(hard.size());
    return success;
}

template <class Input>
Status runByLanes(State& state, const Batch<Input>& batch, Outputs& outputs)
{
    const std::size_t K = blockSizeOf(batch.dinSize);
    LanePath& path = *state.lane_path;
    if (const char* reason = shortArray(outputs, batch.blocks, K)) {
        // As in the single call, room is what is looked at last: the first block is decoded and counts.
        const lanes::Streams<Input> first = batch.block(0);
        loadLanes(state, &first, 1, batch.dinSize, nullptr);
        path.decode(batch.iterations);
        return refuse(reason);
    }
    std::vector<lanes::Streams<Input>> blocks;
    std::vector<std::uint8_t*> decisions;
    std::vector<std::int16_t*> ratios;
    for (std::size_t b = 0; b < batch.blocks; ++b) {
        blocks.push_back(batch.block(b));
        decisions.push_back(outputs.dout + b * K);
        ratios.push_back(outputs.ratios == nullptr ? nullptr : outputs.ratios + b * K);
    }
    for (std::uint32_t b = 0; b < batch.blocks;) {
        const std::uint32_t* tags = batch.tags == nullptr ? nullptr : batch.tags + b;
        const unsigned taken = loadLanes(state, &blocks[b], batch.blocks - b, batch.dinSize, tags);
        path.decode(batch.iterations);
        path.decisions(&decisions[b]);
        if (outputs.ratios != nullptr) {
            path.ratios(&ratios[b]);
        }
        for (const std::uint32_t end = b + taken; b < end; ++b) {
            deliverTag(state, outputs, b, batch.tag(b));
        }
    }
    outputs.dout_size = static_cast<std::uint32_t>(K);
    return success;
}

template <class Input>
std::int32_t simulate(State* state, const Batch<Input>& batch, Outputs* outputs)
{
    if (const char* reason =
            checkArguments(state, outputFault(outputs), batch.first, batch.dinSize, batch.iterations)) {
        return refuse(reason);
    }
    if (batch.blocks == 0) {
        return success;
    }
    return guarded([&] {
        return lanesTake(*state, batch.dinSize) ? runByLanes(*state, batch, *outputs)
                                                : runByComponents(*state, batch, *outputs);
    });
}

/// What was sent, and where the counts of wrong decisions go.
struct ErrorCount {
    const std::uint8_t* sent;
    std::uint32_t* errors;
    std::size_t room;

    /// What is wrong with it for so many blocks and iterations, or null.
    const char* fault(std::uint32_t blocks, std::uint32_t iterations) const
    {
        if (sent == nullptr) {
            return "Simulate called with null pointer for sent";
        }
        if (errors == nullptr) {
            return "Simulate called with null pointer for errors";
        }
        return room / std::max(iterations, 1U) < blocks ? "Insufficient allocated space for errors array" : nullptr;
    }
};

template <class Input>
Status countAllByComponents(State& state, const Batch<Input>& batch, const ErrorCount& count)
{
    const std::size_t K = batch.dinSize < std::int32_t{lanes::tailPositions} ? 0 : blockSizeOf(batch.dinSize);
    for (std::size_t b = 0; b < batch.blocks; ++b) {
        const std::vector<unsigned char> sent(count.sent + b * K, count.sent + (b + 1) * K);
        std::vector<unsigned long long> bitErrors(batch.iterations);
        const Status status = countByComponents(state, batch.block(b), batch.dinSize, sent, bitErrors);
        if (status != success) {
            return status;
        }
        for (std::size_t t = 0; t < bitErrors.size(); ++t) {
            lanes::setValueAt(count.errors, b * batch.iterations + t, static_cast<std::uint32_t>(bitErrors[t]));
        }
    }
    return success;
}

std::uint32_t differences(const std::uint8_t* decisions, const std::uint8_t* sent, std::size_t K)
{
    std::uint32_t differing = 0;
    for (std::size_t i = 0; i < K; ++i) {
        differing += (decisions[i] != 0) != (sent[i] != 0) ? 1U : 0U;
    }
    return differing;
}

template <class Input>
Status countAllByLanes(State& state, const Batch<Input>& batch, const ErrorCount& count)
{
    const std::size_t K = blockSizeOf(batch.dinSize);
    LanePath& path = *state.lane_path;
    std::vector<lanes::Streams<Input>> blocks;
    for (std::size_t b = 0; b < batch.blocks; ++b) {
        blocks.push_back(batch.block(b));
    }
    std::vector<std::uint8_t> bits;
    std::vector<std::uint8_t*> decisions;
    for (std::size_t b = 0; b < batch.blocks; b += decisions.size()) {
        const unsigned taken =
            loadLanes(state, &blocks[b], static_cast<unsigned>(batch.blocks - b), batch.dinSize, nullptr);
        bits.resize(taken * K);
        decisions.resize(taken);
        for (std::size_t i = 0; i < taken; ++i) {
            decisions[i] = &bits[i * K];
        }
        path.decode(batch.iterations, [&](unsigned t) {
            path.decisions(decisions.data());
            for (std::size_t i = 0; i < taken; ++i) {
                const std::uint32_t errors = differences(decisions[i], count.sent + (b + i) * K, K);
                lanes::setValueAt(count.errors, (b + i) * batch.iterations + t, errors);
            }
        });
    }
    return success;
}

template <class Input>
std::int32_t countErrors(State* state, const Batch<Input>& batch, const ErrorCount& count)
{
    const char* const fault = count.fault(batch.blocks, batch.iterations);
    if (const char* reason = checkArguments(state, fault, batch.first, batch.dinSize, batch.iterations)) {
        return refuse(reason);
    }
    if (batch.blocks == 0) {
        return success;
    }
    return guarded([&] {
        return lanesTake(*state, batch.dinSize) ? countAllByLanes(*state, batch, count)
                                                : countAllByComponents(*state, batch, count);
    });
}

Status setInstructionSet(State& state, std::string_view wanted)
{
    std::string known;
    for (const lanes::InstructionSet* set : lanes::availableInstructionSets()) {
        if (state.lane_path == nullptr) {
            break;
        }
        if (wanted == set->name) {
            state.lane_path->setInstructionSet(*set);
            state.by_components = false;
            return success;
        }
        known += std::string(set->name) + ", ";
    }
    if (wanted == byComponents) {
        state.by_components = true;
        return success;
    }
    messages::writeError("ERROR:decoder:Instruction set '", wanted, "' is not one of ", known, byComponents);
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
    return simulate<std::int32_t>(state, {{rsc1_sys, rsc1_par, rsc2_par}, din_size, blocks, iterations, tags}, outputs);
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
    return simulate<std::int16_t>(state, {{rsc1_sys, rsc1_par, rsc2_par}, din_size, blocks, iterations, tags}, outputs);
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
    return simulate<std::int8_t>(state, {{rsc1_sys, rsc1_par, rsc2_par}, din_size, blocks, iterations, tags}, outputs);
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
    return countErrors<std::int32_t>(
        state, {{rsc1_sys, rsc1_par, rsc2_par}, din_size, blocks, iterations, nullptr}, {sent, errors, errors_alloc});
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
    return countErrors<std::int16_t>(
        state, {{rsc1_sys, rsc1_par, rsc2_par}, din_size, blocks, iterations, nullptr}, {sent, errors, errors_alloc});
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
    return countErrors<std::int8_t>(
        state, {{rsc1_sys, rsc1_par, rsc2_par}, din_size, blocks, iterations, nullptr}, {sent, errors, errors_alloc});
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
    const bool byLanes = state->lane_path != nullptr && !state->by_components && state->lane_path->knows(*state);
    return byLanes ? state->lane_path->instructionSet().name : byComponents;
}
