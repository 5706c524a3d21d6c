// SimulationCall: checks a call, decodes its blocks on one of the two paths and delivers the results.
#include "SimulationCall.h"

#include <algorithm>
#include <optional>
#include <variant>

#include "ComponentPath.h"
#include "CoreInputs.h"
#include "LanePath.h"
#include "PathChoice.h"

namespace morvik::simulation_call {

namespace {

using State = veltra_ip_morvik_v1_0_state;
using Outputs = veltra_ip_morvik_v1_0_batch_outputs;

/// Returns what is wrong with an output record, or null.
const char* outputFault(const Outputs* outputs)
{
    if (outputs == nullptr) {
        return "Simulate called with null output structure";
    }
    return outputs->dout == nullptr ? "Simulate called with null pointer for dout" : nullptr;
}

/// Returns what is wrong with the arrays for the counts, or null.
const char* outputFault(const ErrorCounts& counts, const Batch& batch)
{
    if (counts.sent == nullptr) {
        return "Simulate called with null pointer for sent";
    }
    if (counts.errors == nullptr) {
        return "Simulate called with null pointer for errors";
    }
    return counts.room / std::max(batch.iterations, 1U) < batch.blocks ? "Insufficient allocated space for errors array"
                                                                       : nullptr;
}

const char* nullStream(const Batch& batch)
{
    const auto nullOne = [](const auto& streams) -> const char* {
        if (streams.systematic == nullptr) {
            return "rsc1_sys must not be a null pointer";
        }
        if (streams.parity1 == nullptr) {
            return "rsc1_par must not be a null pointer";
        }
        return streams.parity2 == nullptr ? "rsc2_par must not be a null pointer" : nullptr;
    };
    return std::visit(nullOne, batch.streams);
}

/// Returns the first fault of a call's arguments, or null.
const char* checkArguments(const State* state, const char* outputFault, const Batch& batch)
{
    if (state == nullptr) {
        return "Simulate called with null state structure";
    }
    if (outputFault != nullptr) {
        return outputFault;
    }
    if (batch.dinSize < 1) {
        return "din_size must be a positive integer";
    }
    if (const char* reason = nullStream(batch)) {
        return reason;
    }
    return batch.iterations < 1 || batch.iterations > 15 ? "Number of iterations must be in the range 1 to 15"
                                                         : nullptr;
}

/// Returns which array of the record is too short for a batch of blocks of K bits, or null.
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

/// Feeds the blocks of a batch to a path, some at a time, and calls decode(path, first, taken) each time.
/// `firstAlone`: takes only one block the first time.
template <class Decode>
Status sendBy(BlockPath& path, const Batch& batch, bool firstAlone, Decode decode)
{
    for (std::uint32_t b = 0; b < batch.blocks;) {
        const unsigned taken = path.take(batch, b, b == 0 && firstAlone ? 1 : batch.blocks - b);
        if (const Status status = decode(path, b, taken); status != success) {
            return status;
        }
        b += taken;
    }
    return success;
}

/// Sends a batch through the lanes if they can decode it, else through the components, which guard only the decoder
/// call.
template <class Decode>
Status send(State& state, const Batch& batch, bool firstAlone, Decode decode)
{
    if (batch.blocks == 0) {
        return success;
    }
    const auto byLanes = guarded([&]() -> std::optional<Status> {
        LanePath* const lanes = state.path_choice == nullptr ? nullptr : state.path_choice->lanesFor(batch.blockSize());
        return lanes == nullptr ? std::nullopt : std::optional<Status>(sendBy(*lanes, batch, firstAlone, decode));
    });
    if (byLanes) {
        return *byLanes;
    }
    ComponentPath components(state);
    return sendBy(components, batch, firstAlone, decode);
}

/// Delivers a path's results for the blocks from `first` on.
void deliver(State& state, const Batch& batch, BlockPath& path, std::size_t first, unsigned taken, Outputs& outputs)
{
    const std::size_t K = path.blockSize();
    path.decisions(outputs.dout + first * K);
    if (outputs.ratios != nullptr) {
        path.ratios(outputs.ratios + first * K);
    }
    for (std::size_t b = first; b < first + taken; ++b) {
        const std::uint32_t kept = core_inputs::truncateTag(state, batch.tag(b));
        if (outputs.tags != nullptr) {
            morvik::lanes::setValueAt(outputs.tags, b, kept);
        }
    }
    if (first + taken == batch.blocks) {
        outputs.dout_size = static_cast<std::uint32_t>(K);
    }
}

}  // namespace

/// Checks array sizes last: if one is too short, the first block is decoded, and counted, before the call is refused.
Status simulate(State* state, const Batch& batch, Outputs* outputs)
{
    if (const char* reason = checkArguments(state, outputFault(outputs), batch)) {
        return refuse(reason);
    }
    const bool firstAlone = shortArray(*outputs, batch.blocks, batch.blockSize()) != nullptr;
    return send(*state, batch, firstAlone, [&](BlockPath& path, std::size_t first, unsigned taken) {
        if (const Status status = path.decode(batch.iterations); status != success) {
            return status;
        }
        if (const char* reason = first == 0 ? shortArray(*outputs, batch.blocks, path.blockSize()) : nullptr) {
            return refuse(reason);
        }
        deliver(*state, batch, path, first, taken, *outputs);
        return success;
    });
}

Status countErrors(State* state, const Batch& batch, const ErrorCounts& counts)
{
    if (const char* reason = checkArguments(state, outputFault(counts, batch), batch)) {
        return refuse(reason);
    }
    return send(*state, batch, false, [&](BlockPath& path, std::size_t first, unsigned) {
        return path.countErrors(
            batch.iterations, counts.sent + first * batch.blockSize(), counts.errors + first * batch.iterations);
    });
}

}  // namespace morvik::simulation_call
