// simulate_fuzz: any sequence of calls on one state: blocks that shrink and grow, refusals in
// between, traces armed at any time. A block decodes alike before and after all of it.
#include <algorithm>
#include <limits>
#include <vector>

#include "FuzzInput.h"
#include "morvik_v1_0_bitacc_cmodel.h"

namespace {

using State = veltra_ip_morvik_v1_0_state;
using Bits = std::vector<std::uint8_t>;

struct Block {
    std::vector<std::int32_t> streams[3];
    std::uint32_t iterations = 1;
};

/// Numbers of positions, K + 4, of every kind: none at all, fewer than the tail's, K = 0, block sizes up to
/// the largest, K that the interleaver does not know, K that cannot be cut into equal segments, and too many.
constexpr std::int32_t positions[] = {4,   1,   3,   5,   44,  48,   52,   132,  135,  136,  260,  264,  300,
                                      516, 517, 532, 644, 772, 1028, 1060, 2052, 3000, 6148, 6149, 7000, 0};
constexpr unsigned listed = sizeof positions / sizeof *positions;

/// One of the numbers of positions above, or any other.
std::size_t takeSize(FuzzInput& input)
{
    const unsigned choice = input.below(listed + 1);
    return choice < listed ? static_cast<std::size_t>(positions[choice]) : input.word() % 6200;
}

Block takeBlock(FuzzInput& input)
{
    const std::size_t size = takeSize(input);
    Block block;
    block.iterations = 1 + input.below(3);
    std::uint32_t seed = input.word() | 1U;
    const unsigned shift = input.below(32);
    for (auto& stream : block.streams) {
        stream.resize(size);
        for (std::int32_t& value : stream) {
            seed = seed * 1664525U + 1013904223U;
            value = static_cast<std::int32_t>(seed) >> shift;
        }
        if (size > 0) {
            stream[input.word() % size] = input.integer();
        }
    }
    return block;
}

/// Decodes; empty when the block was refused. Nothing may be written but what is promised.
Bits decode(State* state, const Block& block, std::uint32_t room, std::uint32_t tag)
{
    const auto size = block.streams[0].size();
    Bits bits(size + 16, 0xEE);
    veltra_ip_morvik_v1_0_outputs outputs{bits.data(), room, 12345, 54321};
    const std::int32_t status = veltra_ip_morvik_v1_0_bitacc_simulate(state,
                                                                      block.streams[0].data(),
                                                                      block.streams[1].data(),
                                                                      block.streams[2].data(),
                                                                      static_cast<std::int32_t>(size),
                                                                      block.iterations,
                                                                      tag,
                                                                      &outputs);
    if (status != 0) {
        require(status == 1 || status == 2, "a refusal has status 1 or 2");
        require(outputs.dout_size == 12345 && outputs.tag == 54321, "a refusal leaves the record alone");
        require(std::count(bits.begin(), bits.end(), 0xEE) == static_cast<std::ptrdiff_t>(bits.size()),
                "a refusal leaves the array alone");
        return {};
    }
    require(outputs.dout_size == size - 4, "a block gives K decisions");
    const auto end = bits.begin() + static_cast<std::ptrdiff_t>(outputs.dout_size);
    require(std::all_of(bits.begin(), end, [](std::uint8_t bit) { return bit <= 1; }), "decisions are 0 or 1");
    require(std::all_of(end, bits.end(), [](std::uint8_t byte) { return byte == 0xEE; }), "no byte beyond is written");
    bits.erase(end, bits.end());
    return bits;
}

/// 0 or less, down to the smallest integer.
std::int32_t noSize(FuzzInput& input)
{
    const unsigned choice = input.below(4);
    return choice < 2    ? -static_cast<std::int32_t>(choice)
           : choice == 2 ? std::numeric_limits<std::int32_t>::min()
                         : std::min(input.integer(), 0);
}

/// One bad argument, anything else as it should be.
void callWithBadArgument(FuzzInput& input, State* state, const Block& block)
{
    const std::int32_t* streams[3] = {block.streams[0].data(), block.streams[1].data(), block.streams[2].data()};
    std::uint8_t bit = 0;
    veltra_ip_morvik_v1_0_outputs outputs{&bit, 0, 0, 0};
    const unsigned bad = input.below(7);
    if (bad < 3) {
        streams[bad] = nullptr;
    }
    outputs.dout = bad == 3 ? nullptr : &bit;
    const std::int32_t size = bad == 4 ? noSize(input) : 44;
    const std::int32_t status = veltra_ip_morvik_v1_0_bitacc_simulate(
        bad == 5 ? nullptr : state, streams[0], streams[1], streams[2], size, 1, 0, bad == 6 ? nullptr : &outputs);
    require(status == 1, "a bad argument has status 1");
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const SilencedStreams silenced;
    FuzzInput input(data, size);
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = 2 << input.below(3);
    generics.C_ALGORITHM_TYPE = static_cast<std::int32_t>(input.below(3));
    generics.C_TAG_WIDTH = static_cast<std::int32_t>(input.below(33));
    State* const state = veltra_ip_morvik_v1_0_create_state(generics);
    const Block first = takeBlock(input);
    const Bits decided = decode(state, first, 8192, input.word());
    for (unsigned calls = 0; calls < 8 && !input.empty(); ++calls) {
        veltra_ip_morvik_v1_0_bitacc_dump_config(state, input.below(8) == 0 ? input.below(4) : 0);
        Block block = takeBlock(input);
        switch (input.below(6)) {
        case 0:
            callWithBadArgument(input, state, block);
            break;
        case 1:
            decode(state, block, input.word() % 8192, input.word());
            break;
        case 2:
            block.iterations = input.below(2) == 0 ? 0 : 16 + input.word() % 0xFFFF0000U;
            require(decode(state, block, 8192, 0).empty(), "0 and more than 15 iterations are refused");
            break;
        default:
            decode(state, block, 8192, input.word());
        }
    }
    require(decode(state, first, 8192, 0) == decided, "what came between changes no decision");
    veltra_ip_morvik_v1_0_destroy_state(state);
    return 0;
}
