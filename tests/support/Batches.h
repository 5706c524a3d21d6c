// Batches: calls of the batch interface for tests, for every type of soft values.
#ifndef MORVIK_TESTS_SUPPORT_BATCHES_H
#define MORVIK_TESTS_SUPPORT_BATCHES_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "Blocks.h"
#include "morvik_v1_0_batch.h"

namespace morvik::blocks {

using State = veltra_ip_morvik_v1_0_state;
using BatchOutputs = veltra_ip_morvik_v1_0_batch_outputs;

/// The names of the instruction sets of this machine, best first; the last is `component`.
std::vector<std::string> instructionSets();

/// Blocks of one size in the layout of the batch interface.
template <class Input>
struct Batch {
    std::vector<Input> sys;
    std::vector<Input> par1;
    std::vector<Input> par2;
    std::int32_t dinSize = 0;
    std::uint32_t count = 0;

    Batch() = default;

    /// Values too large for the type lose their upper bits.
    explicit Batch(const std::vector<Block>& blocks);

    /// One of its blocks, for a single call.
    Block block(std::size_t b) const;

    std::int32_t simulate(State* state, unsigned iterations, const std::uint32_t* tags, BatchOutputs* outputs) const;

    /// `room`: the claimed size of `errors`.
    std::int32_t countErrors(
        State* state, unsigned iterations, const std::uint8_t* sent, std::uint32_t* errors, std::size_t room) const;
};

/// Calls the batch function for the type of soft values.
std::int32_t simulateBatch(State* state,
                           const std::int32_t* const* streams,
                           std::int32_t dinSize,
                           std::uint32_t count,
                           unsigned iterations,
                           const std::uint32_t* tags,
                           BatchOutputs* outputs);
std::int32_t simulateBatch(State* state,
                           const std::int16_t* const* streams,
                           std::int32_t dinSize,
                           std::uint32_t count,
                           unsigned iterations,
                           const std::uint32_t* tags,
                           BatchOutputs* outputs);
std::int32_t simulateBatch(State* state,
                           const std::int8_t* const* streams,
                           std::int32_t dinSize,
                           std::uint32_t count,
                           unsigned iterations,
                           const std::uint32_t* tags,
                           BatchOutputs* outputs);

/// The results of several blocks: one array of all blocks' values each.
struct Decoded {
    std::vector<std::uint8_t> bits;
    std::vector<std::int16_t> ratios;
    std::vector<std::uint32_t> tags;
};

/// Decodes the same blocks one by one, with a state's components.
template <class Input>
Decoded decodedOneByOne(State* components, const Batch<Input>& batch, unsigned iterations, const std::uint32_t* tags);

}  // namespace morvik::blocks

#endif
