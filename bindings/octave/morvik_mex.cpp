// morvik_mex: what morvik_decode.m and morvik_encode.m call. Octave and MATLAB build it alike.
//
//     [status, messages, bits, ratios, tags] = morvik_mex('decode', sys, par1, par2, configuration, tags)
//     [status, messages, sys, par1, par2] = morvik_mex('encode', bits)
//
// The callers have checked classes and sizes: sys, par1 and par2 are of one size, and all int8, int16 or int32; the
// configuration is four doubles with whole values within 32 bits, num_pu, algorithm, tag_width and iterations; tags are
// uint32, one for each column, or empty; bits are logical. They also raise errors and warnings, from the status of the
// C interface and the lines of the library: an interpreter's functions for it would leave without destroying anything.
#include <mex.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <exception>
#include <memory>
#include <stdexcept>
#include <string>

#include "bindings/Listener.h"
#include "link/coding/TurboEncoder.h"
#include "morvik_v1_0_batch.h"
#include "rules/Tail.h"

namespace {

using morvik::rules::tailPositions;

enum Status : std::int32_t { success = 0, argumentRefused = 1, blockRefused = 2, outOfMemory = 99 };

template <class Value>
Value* data(const mxArray* array)
{
    return static_cast<Value*>(mxGetData(array));
}

mxArray* logicalMatrix(std::size_t rows, std::size_t columns)
{
    return mxCreateLogicalMatrix(static_cast<mwSize>(rows), static_cast<mwSize>(columns));
}

mxArray* numericMatrix(std::size_t rows, std::size_t columns, mxClassID type)
{
    return mxCreateNumericMatrix(static_cast<mwSize>(rows), static_cast<mwSize>(columns), type, mxREAL);
}

struct Destroy {
    void operator()(veltra_ip_morvik_v1_0_state* state) const
    {
        veltra_ip_morvik_v1_0_destroy_state(state);
    }
};
using State = std::unique_ptr<veltra_ip_morvik_v1_0_state, Destroy>;

State createState(const double* configuration)
{
    auto generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = static_cast<std::int32_t>(configuration[0]);
    generics.C_ALGORITHM_TYPE = static_cast<std::int32_t>(configuration[1]);
    generics.C_TAG_WIDTH = static_cast<std::int32_t>(configuration[2]);
    return State(veltra_ip_morvik_v1_0_create_state(generics));
}

/// Calls the batch function for the class of the soft values.
std::int32_t simulate(veltra_ip_morvik_v1_0_state* state,
                      const mxArray* const* streams,
                      std::uint32_t iterations,
                      const std::uint32_t* tags,
                      veltra_ip_morvik_v1_0_batch_outputs& outputs)
{
    const auto call = [&](auto function, auto zero) {
        using Value = const decltype(zero);
        return function(state,
                        data<Value>(streams[0]),
                        data<Value>(streams[1]),
                        data<Value>(streams[2]),
                        static_cast<std::int32_t>(mxGetM(streams[0])),
                        static_cast<std::uint32_t>(mxGetN(streams[0])),
                        iterations,
                        tags,
                        &outputs);
    };
    switch (mxGetClassID(streams[0])) {
    case mxINT8_CLASS:
        return call(veltra_ip_morvik_v1_0_batch_simulate_i8, std::int8_t{});
    case mxINT16_CLASS:
        return call(veltra_ip_morvik_v1_0_batch_simulate_i16, std::int16_t{});
    default:
        return call(veltra_ip_morvik_v1_0_batch_simulate_i32, std::int32_t{});
    }
}

std::int32_t decode(mxArray* results[], const mxArray* const* arguments, std::string& messages)
{
    const std::size_t positions = mxGetM(arguments[0]);
    const std::size_t blocks = mxGetN(arguments[0]);
    const std::size_t K = positions > tailPositions ? positions - tailPositions : 0;
    results[0] = logicalMatrix(K, blocks);
    results[1] = numericMatrix(K, blocks, mxINT16_CLASS);
    results[2] = numericMatrix(1, blocks, mxUINT32_CLASS);
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    outputs.dout = data<std::uint8_t>(results[0]);
    outputs.dout_alloc = outputs.ratios_alloc = K * blocks;
    outputs.ratios = data<std::int16_t>(results[1]);
    outputs.tags = data<std::uint32_t>(results[2]);
    outputs.tags_alloc = blocks;
    const auto* const configuration = data<const double>(arguments[3]);
    const auto* const tags = mxIsEmpty(arguments[4]) ? nullptr : data<const std::uint32_t>(arguments[4]);

    const morvik::Listener listener;
    const State state = createState(configuration);
    const std::int32_t status = state == nullptr
                                    ? argumentRefused
                                    : simulate(state.get(),
                                               arguments,
                                               static_cast<std::uint32_t>(static_cast<std::int32_t>(configuration[3])),
                                               tags,
                                               outputs);
    messages = listener.text();
    return status;
}

/// Encodes `count` columns of bits, up to 64, from column `first`.
void encodeColumns(
    mxArray* results[], const mxArray* bits, std::size_t first, unsigned count, morvik::link::TurboEncoder& encoder)
{
    const std::size_t K = mxGetM(bits);
    morvik::link::PackedBlocks information{encoder.words(), {}};
    information.bits.resize(count * information.words);
    for (unsigned b = 0; b < count; ++b) {
        const mxLogical* const column = mxGetLogicals(bits) + (first + b) * K;
        for (std::size_t i = 0; i < K; ++i) {
            information.block(b)[i / 64] |= std::uint64_t{column[i]} << i % 64;
        }
    }
    morvik::link::TurboEncoder::Streams streams;
    encoder.encode(information, count, streams);
    for (std::size_t s = 0; s < streams.size(); ++s) {
        for (unsigned b = 0; b < count; ++b) {
            mxLogical* const column = mxGetLogicals(results[s]) + (first + b) * (K + tailPositions);
            for (std::size_t i = 0; i < K + tailPositions; ++i) {
                column[i] = static_cast<mxLogical>(streams[s].block(b)[i / 64] >> i % 64 & 1);
            }
        }
    }
}

std::int32_t encode(mxArray* results[], const mxArray* bits, std::string& messages)
{
    using morvik::link::TurboEncoder;
    const std::size_t blocks = mxGetN(bits);
    for (int s = 0; s < 3; ++s) {
        results[s] = logicalMatrix(mxGetM(bits) + tailPositions, blocks);
    }
    try {
        TurboEncoder encoder(static_cast<unsigned>(mxGetM(bits)));
        for (std::size_t first = 0; first < blocks; first += TurboEncoder::blocksAtOnce) {
            const std::size_t count = std::min<std::size_t>(blocks - first, TurboEncoder::blocksAtOnce);
            encodeColumns(results, bits, first, static_cast<unsigned>(count), encoder);
        }
    } catch (const std::invalid_argument& error) {
        messages = std::string("ERROR:binding:") + error.what();
        return blockRefused;
    }
    return success;
}

}  // namespace

void mexFunction(int, mxArray* plhs[], int, const mxArray* prhs[])
{
    std::int32_t status = outOfMemory;
    std::string messages;
    try {
        const bool decodes = *mxGetChars(prhs[0]) == 'd';
        status = decodes ? decode(plhs + 2, prhs + 1, messages) : encode(plhs + 2, prhs[1], messages);
    } catch (const std::exception&) {
        messages = "ERROR:binding:Memory is exhausted";
    }
    plhs[0] = mxCreateDoubleScalar(status);
    plhs[1] = mxCreateString(messages.c_str());
}
