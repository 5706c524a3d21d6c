// simulate_fuzz: any sequence of calls on one state: blocks that shrink and grow, batches of them, refusals in
// between, traces armed and the instruction set changed at any time. A block decodes alike before and after all
// of it, and a batch like its blocks.
#include <algorithm>
#include <iterator>
#include <limits>
#include <string>
#include <vector>

#include "FuzzInput.h"
#include "morvik_v1_0_batch.h"
#include "morvik_v1_0_bitacc_cmodel.h"
#include "src/InstructionSetNames.h"

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

/// Two blocks, in turn, as soft values of one type.
template <class Value>
std::vector<Value> joined(const std::vector<std::int32_t>& first,
                          const std::vector<std::int32_t>& second,
                          unsigned count)
{
    std::vector<Value> values;
    for (unsigned b = 0; b < count; ++b) {
        const std::vector<std::int32_t>& block = b % 2 == 0 ? first : second;
        std::transform(block.begin(), block.end(), std::back_inserter(values), [](std::int32_t value) {
            return static_cast<Value>(value);
        });
    }
    return values;
}

template <class Value>
using Simulate = std::int32_t(State*,
                              const Value*,
                              const Value*,
                              const Value*,
                              std::int32_t,
                              std::uint32_t,
                              std::uint32_t,
                              const std::uint32_t*,
                              veltra_ip_morvik_v1_0_batch_outputs*);

/// A batch of two blocks in turn, with room or without: each gives the same wherever it is, and the first what the
/// single call makes of it.
template <class Value>
void decodeBatch(FuzzInput& input, State* state, const Block& one, Simulate<Value> simulate)
{
    Block other = one;
    for (auto& stream : other.streams) {
        std::reverse(stream.begin(), stream.end());
    }
    const unsigned count = input.below(40);
    const bool ratiosToo = input.below(2) == 0;
    const std::size_t size = one.streams[0].size();
    const std::size_t K = size < 4 ? 0 : size - 4;
    std::vector<Value> streams[3];
    for (unsigned s = 0; s < 3; ++s) {
        streams[s] = joined<Value>(one.streams[s], other.streams[s], count);
        streams[s].resize(std::max<std::size_t>(streams[s].size(), 1));
    }
    Bits bits(count * K + 16, 0xEE);
    std::vector<std::int16_t> ratios(count * K + 16, 12345);
    std::vector<std::uint32_t> tags(count + 1, input.word());
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    outputs.dout = bits.data();
    outputs.dout_alloc = input.below(4) == 0 ? input.word() % (count * K + 1) : count * K;
    outputs.ratios = ratiosToo ? ratios.data() : nullptr;
    outputs.ratios_alloc = input.below(4) == 0 ? input.word() % (count * K + 1) : count * K;
    outputs.tags = tags.data();
    outputs.tags_alloc = input.below(4) == 0 ? input.word() % (count + 1) : count;
    outputs.dout_size = 12345;
    const std::int32_t status = simulate(state,
                                         streams[0].data(),
                                         streams[1].data(),
                                         streams[2].data(),
                                         static_cast<std::int32_t>(size),
                                         count,
                                         one.iterations,
                                         tags.data(),
                                         &outputs);
    require(std::count(bits.begin(), bits.end(), 0xEE) == static_cast<std::ptrdiff_t>(status == 0 ? 16 : bits.size()),
            "all decisions of a batch are written, or none");
    if (status != 0) {
        require(status == 1 || status == 2, "a refusal has status 1 or 2");
        require(outputs.dout_size == 12345, "a refusal leaves the record alone");
        require(std::count(ratios.begin(), ratios.end(), 12345) == static_cast<std::ptrdiff_t>(ratios.size()),
                "a refusal leaves the ratios alone");
        return;
    }
    require(outputs.dout_size == (count == 0 ? 12345 : K), "a batch gives K decisions for each block");
    for (std::size_t i = 0; i < count * K; ++i) {
        require(bits[i] == bits[i % (2 * K)], "a block is decoded alike wherever it is");
        require(!ratiosToo || bits[i] == (ratios[i] >= 0 ? 1 : 0), "ratios have the decisions' signs");
    }
    if (count > 0 && sizeof(Value) == 4) {
        veltra_ip_morvik_v1_0_bitacc_dump_config(state, 0);
        bits.resize(K);
        require(decode(state, one, 8192, 0) == bits, "a batch decides like the single call");
    }
}

void decodeBatch(FuzzInput& input, State* state, const Block& block)
{
    switch (input.below(3)) {
    case 0:
        return decodeBatch<std::int32_t>(input, state, block, veltra_ip_morvik_v1_0_batch_simulate_i32);
    case 1:
        return decodeBatch<std::int16_t>(input, state, block, veltra_ip_morvik_v1_0_batch_simulate_i16);
    default:
        return decodeBatch<std::int8_t>(input, state, block, veltra_ip_morvik_v1_0_batch_simulate_i8);
    }
}

/// Any of the names; those that the machine lacks change nothing.
void changeInstructionSet(FuzzInput& input, State* state)
{
    using morvik::instructionSetNames;
    constexpr auto known = static_cast<unsigned>(std::size(instructionSetNames));
    const unsigned choice = input.below(known + 1);
    const char* const name = choice < known ? instructionSetNames[choice] : "none";
    const std::string before = veltra_ip_morvik_v1_0_get_instruction_set(state);
    const std::int32_t status = veltra_ip_morvik_v1_0_set_instruction_set(state, name);
    require(status == 0 || status == 1, "the choice of an instruction set has status 0 or 1");
    require(veltra_ip_morvik_v1_0_get_instruction_set(state) == (status == 0 ? name : before),
            "the instruction set is the one that was chosen last");
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
        switch (input.below(8)) {
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
        case 6:
            decodeBatch(input, state, block);
            break;
        case 7:
            changeInstructionSet(input, state);
            break;
        default:
            decode(state, block, 8192, input.word());
        }
    }
    require(decode(state, first, 8192, 0) == decided, "what came between changes no decision");
    veltra_ip_morvik_v1_0_destroy_state(state);
    return 0;
}
