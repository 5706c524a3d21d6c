// Batches: calls of the batch interface for tests, for every type of soft values.
#include "Batches.h"

#include <stdexcept>

#include "CapturedStreams.h"
#include "DecoderState.h"
#include "InstructionSetNames.h"

namespace morvik::blocks {

std::vector<std::string> instructionSets()
{
    const CapturedStreams silenced;
    const Decoder decoder(2, 0);
    std::vector<std::string> names;
    for (const char* name : instructionSetNames) {
        if (veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), name) == 0) {
            names.emplace_back(name);
        }
    }
    return names;
}

std::int32_t simulateBatch(State* state,
                           const std::int32_t* const* streams,
                           std::int32_t dinSize,
                           std::uint32_t count,
                           unsigned iterations,
                           const std::uint32_t* tags,
                           BatchOutputs* outputs)
{
    return veltra_ip_morvik_v1_0_batch_simulate_i32(
        state, streams[0], streams[1], streams[2], dinSize, count, iterations, tags, outputs);
}

std::int32_t simulateBatch(State* state,
                           const std::int16_t* const* streams,
                           std::int32_t dinSize,
                           std::uint32_t count,
                           unsigned iterations,
                           const std::uint32_t* tags,
                           BatchOutputs* outputs)
{
    return veltra_ip_morvik_v1_0_batch_simulate_i16(
        state, streams[0], streams[1], streams[2], dinSize, count, iterations, tags, outputs);
}

std::int32_t simulateBatch(State* state,
                           const std::int8_t* const* streams,
                           std::int32_t dinSize,
                           std::uint32_t count,
                           unsigned iterations,
                           const std::uint32_t* tags,
                           BatchOutputs* outputs)
{
    return veltra_ip_morvik_v1_0_batch_simulate_i8(
        state, streams[0], streams[1], streams[2], dinSize, count, iterations, tags, outputs);
}

template <class Input>
Batch<Input>::Batch(const std::vector<Block>& blocks)
    : dinSize(blocks.empty() ? 0 : static_cast<std::int32_t>(blocks[0].sys.size())),
      count(static_cast<std::uint32_t>(blocks.size()))
{
    const auto append = [](std::vector<Input>& to, const Stream& values) {
        for (const std::int32_t value : values) {
            to.push_back(static_cast<Input>(value));
        }
    };
    for (const Block& block : blocks) {
        append(sys, block.sys);
        append(par1, block.par1);
        append(par2, block.par2);
    }
}

template <class Input>
std::int32_t Batch<Input>::countErrors(
    State* state, unsigned iterations, const std::uint8_t* sent, std::uint32_t* errors, std::size_t room) const
{
    const auto call = [&](auto function) {
        return function(state, sys.data(), par1.data(), par2.data(), dinSize, count, iterations, sent, errors, room);
    };
    if constexpr (sizeof(Input) == 4) {
        return call(veltra_ip_morvik_v1_0_batch_count_errors_i32);
    } else if constexpr (sizeof(Input) == 2) {
        return call(veltra_ip_morvik_v1_0_batch_count_errors_i16);
    } else {
        return call(veltra_ip_morvik_v1_0_batch_count_errors_i8);
    }
}

template <class Input>
Block Batch<Input>::block(std::size_t b) const
{
    const auto size = static_cast<std::size_t>(dinSize);
    const auto part = [&](const std::vector<Input>& of) {
        Stream stream;
        for (std::size_t i = b * size; i < (b + 1) * size; ++i) {
            stream.push_back(of[i]);
        }
        return stream;
    };
    return {part(sys), part(par1), part(par2)};
}

template <class Input>
std::int32_t Batch<Input>::simulate(State* state,
                                    unsigned iterations,
                                    const std::uint32_t* tags,
                                    BatchOutputs* outputs) const
{
    const Input* const streams[3] = {sys.data(), par1.data(), par2.data()};
    return simulateBatch(state, streams, dinSize, count, iterations, tags, outputs);
}

template <class Input>
Decoded decodedOneByOne(State* components, const Batch<Input>& batch, unsigned iterations, const std::uint32_t* tags)
{
    Decoded decoded;
    const auto K = static_cast<std::size_t>(batch.dinSize - 4);
    for (std::size_t b = 0; b < batch.count; ++b) {
        const Block block = batch.block(b);
        std::vector<std::uint8_t> bits(K);
        veltra_ip_morvik_v1_0_outputs outputs{bits.data(), static_cast<std::uint32_t>(K), 0, 0};
        if (veltra_ip_morvik_v1_0_bitacc_simulate(components,
                                                  block.sys.data(),
                                                  block.par1.data(),
                                                  block.par2.data(),
                                                  batch.dinSize,
                                                  iterations,
                                                  tags == nullptr ? 0 : tags[b],
                                                  &outputs) != 0 ||
            outputs.dout_size != K) {
            throw std::runtime_error("a block was refused");
        }
        const std::vector<short>& ratios = components->decoder->itsLLR;
        decoded.bits.insert(decoded.bits.end(), bits.begin(), bits.end());
        decoded.ratios.insert(decoded.ratios.end(), ratios.begin(), ratios.begin() + batch.dinSize - 4);
        decoded.tags.push_back(outputs.tag);
    }
    return decoded;
}

template struct Batch<std::int32_t>;
template struct Batch<std::int16_t>;
template struct Batch<std::int8_t>;
template Decoded decodedOneByOne(State*, const Batch<std::int32_t>&, unsigned, const std::uint32_t*);
template Decoded decodedOneByOne(State*, const Batch<std::int16_t>&, unsigned, const std::uint32_t*);
template Decoded decodedOneByOne(State*, const Batch<std::int8_t>&, unsigned, const std::uint32_t*);

}  // namespace morvik::blocks
