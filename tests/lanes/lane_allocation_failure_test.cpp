// Allocation failure in batches and on the lanes' way: every single allocation of a batch, of tracing after the lanes,
// and of changing the instruction set fails in turn. The status says so, the state still works, and no trace that was
// asked for is lost.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <iostream>
#include <new>
#include <sstream>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "morvik_v1_0_batch.h"
#include "morvik_v1_0_bitacc_cmodel.h"
#include "support/FailingAllocation.h"
#include "support/FailureBlock.h"

namespace {

/// Some blocks of one size for the batch interface, and room for what they give.
struct BatchOfBlocks {
    static constexpr unsigned count = 5;

    std::vector<std::int16_t> stream;
    std::vector<std::uint8_t> bits;
    std::vector<std::int16_t> ratios;
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    std::uint32_t errors[2 * count] = {};
    unsigned K;

    /// `beyond`: some values have to be clipped.
    BatchOfBlocks(unsigned blockSize, bool beyond)
        : stream(std::size_t{count} * (blockSize + 4)),
          bits(std::size_t{count} * blockSize),
          ratios(bits.size()),
          K(blockSize)
    {
        unsigned seed = K;
        for (std::int16_t& value : stream) {
            seed = seed * 1664525U + 1013904223U;
            value = static_cast<std::int16_t>(static_cast<std::int32_t>(seed) >> (beyond ? 23 : 24));
        }
    }

    std::int32_t decode(veltra_ip_morvik_v1_0_state* state)
    {
        outputs.dout = bits.data();
        outputs.dout_alloc = bits.size();
        outputs.ratios = ratios.data();
        outputs.ratios_alloc = ratios.size();
        outputs.dout_size = 777;
        return veltra_ip_morvik_v1_0_batch_simulate_i16(state,
                                                        stream.data(),
                                                        stream.data(),
                                                        stream.data(),
                                                        static_cast<std::int32_t>(K + 4),
                                                        count,
                                                        2,
                                                        nullptr,
                                                        &outputs);
    }

    /// Takes its decisions for what was sent.
    std::int32_t countErrors(veltra_ip_morvik_v1_0_state* state)
    {
        return veltra_ip_morvik_v1_0_batch_count_errors_i16(state,
                                                            stream.data(),
                                                            stream.data(),
                                                            stream.data(),
                                                            static_cast<std::int32_t>(K + 4),
                                                            count,
                                                            2,
                                                            bits.data(),
                                                            errors,
                                                            2 * count);
    }
};

constexpr std::string_view exceptionLine = "ERROR:decoder:Unhandled exception has occurred\n";

veltra_ip_morvik_v1_0_state* stateThatUses(const char* set)
{
    veltra_ip_morvik_v1_0_state* const state = veltra_ip_morvik_v1_0_create_state(genericsOf(2));
    EXPECT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(state, set), 0);
    return state;
}

/// The warnings of values that are clipped are not of interest.
std::int32_t decodedSilently(veltra_ip_morvik_v1_0_state* state, BatchOfBlocks& batch)
{
    const FailingAllocation none(0);
    return batch.decode(state);
}

/// Decodes a batch, after a block of another size, with a failing allocation and then without. Whether there are
/// further allocations to fail.
bool batchWithFailure(unsigned which, const char* set, unsigned previous, BatchOfBlocks& batch)
{
    const std::vector<std::uint8_t> expected = batch.bits;
    const std::vector<std::int16_t> expectedRatios = batch.ratios;
    veltra_ip_morvik_v1_0_state* const state = stateThatUses(set);
    EXPECT_EQ(Block(previous).decode(state), 0);
    bool happened = false;
    {
        const FailingAllocation failing(which);
        const std::int32_t status = batch.decode(state);
        happened = FailingAllocation::happened();
        EXPECT_EQ(status, happened ? 99 : 0) << which;
        EXPECT_EQ(failing.errors(), happened ? exceptionLine : "");
        EXPECT_EQ(batch.outputs.dout_size, happened ? 777U : batch.K);
    }
    EXPECT_EQ(decodedSilently(state, batch), 0);
    EXPECT_TRUE(batch.bits == expected);
    EXPECT_TRUE(batch.ratios == expectedRatios);
    veltra_ip_morvik_v1_0_destroy_state(state);
    return happened;
}

TEST(LaneAllocationFailure, OfABatchLeavesAWorkingState)
{
    for (const char* set : {"component", "generic"}) {
        for (const auto& [previous, K] :
             std::vector<std::pair<unsigned, unsigned>>{{40, 128}, {128, 40}, {128, 128}, {512, 256}}) {
            for (const bool beyond : {false, true}) {
                SCOPED_TRACE(std::string(set) + " " + std::to_string(previous) + " " + std::to_string(K));
                BatchOfBlocks batch(K, beyond);
                veltra_ip_morvik_v1_0_state* const state = stateThatUses(set);
                EXPECT_EQ(decodedSilently(state, batch), 0);
                veltra_ip_morvik_v1_0_destroy_state(state);
                const long live = blocksInUse();
                unsigned which = 1;
                while (which < manyAllocations && batchWithFailure(which, set, previous, batch)) {
                    ++which;
                }
                EXPECT_GE(which, 3U);  // the lists of blocks and results
                EXPECT_LT(which, manyAllocations);
                EXPECT_EQ(blocksInUse(), live);
            }
        }
    }
}

/// Counts errors, after a block of another size, with a failing allocation and then without. Whether there are
/// further allocations to fail.
bool countWithFailure(unsigned which, const char* set, unsigned previous, BatchOfBlocks& batch)
{
    const std::vector<std::uint32_t> expected(batch.errors, batch.errors + 2 * BatchOfBlocks::count);
    veltra_ip_morvik_v1_0_state* const state = stateThatUses(set);
    EXPECT_EQ(Block(previous).decode(state), 0);
    bool happened = false;
    {
        const FailingAllocation failing(which);
        const std::int32_t status = batch.countErrors(state);
        happened = FailingAllocation::happened();
        EXPECT_EQ(status, happened ? 99 : 0) << which;
        EXPECT_EQ(failing.errors(), happened ? exceptionLine : "");
    }
    EXPECT_EQ(batch.countErrors(state), 0);
    EXPECT_TRUE(std::equal(expected.begin(), expected.end(), batch.errors)) << which;
    veltra_ip_morvik_v1_0_destroy_state(state);
    return happened;
}

TEST(LaneAllocationFailure, OfACountLeavesAWorkingState)
{
    for (const char* set : {"component", "generic"}) {
        SCOPED_TRACE(set);
        BatchOfBlocks batch(128, false);
        veltra_ip_morvik_v1_0_state* const state = stateThatUses(set);
        EXPECT_EQ(batch.decode(state), 0);
        EXPECT_EQ(batch.countErrors(state), 0);
        EXPECT_GT(batch.errors[0], 0U);
        veltra_ip_morvik_v1_0_destroy_state(state);
        const long live = blocksInUse();
        unsigned which = 1;
        while (which < manyAllocations && countWithFailure(which, set, 40, batch)) {
            ++which;
        }
        EXPECT_GE(which, 3U);
        EXPECT_LT(which, manyAllocations);
        EXPECT_EQ(blocksInUse(), live);
    }
}

/// Collects the trace of a block's first pass, whose header has the counters, and all that longer blocks left.
std::string tracedBlock(veltra_ip_morvik_v1_0_state* state, Block& block)
{
    std::ostringstream text;
    std::streambuf* const cout = std::cout.rdbuf(text.rdbuf());
    EXPECT_EQ(block.decode(state), 0);
    std::cout.rdbuf(cout);
    return text.str();
}

/// Blocks that shrink are decoded; then one is to be traced, with a failing allocation at first: the trace that
/// was asked for comes when there is memory. Whether there are further allocations to fail.
bool traceWithFailure(unsigned which, const char* set, const std::string& expected)
{
    veltra_ip_morvik_v1_0_state* const state = stateThatUses(set);
    for (const unsigned K : {512U, 256U, 128U}) {
        EXPECT_EQ(Block(K).decode(state), 0);
    }
    Block block(40);
    veltra_ip_morvik_v1_0_bitacc_dump_config(state, 1);
    bool happened = false;
    bool traced = false;
    {
        const FailingAllocation failing(which);
        std::int32_t status = 99;
        try {
            status = block.decode(state);
        } catch (const std::bad_alloc&) {
            EXPECT_EQ(which, 1U);  // the soft values' buffer
        }
        happened = FailingAllocation::happened();
        EXPECT_EQ(status, happened ? 99 : 0) << which;
        traced = failing.traced();
    }
    if (!traced) {
        EXPECT_EQ(tracedBlock(state, block), expected) << which;
    }
    veltra_ip_morvik_v1_0_bitacc_dump_config(state, 0);
    EXPECT_EQ(block.decode(state), 0);
    veltra_ip_morvik_v1_0_destroy_state(state);
    return happened;
}

TEST(LaneAllocationFailure, LosesNoTrace)
{
    for (const char* set : {"component", "generic"}) {
        veltra_ip_morvik_v1_0_state* const state = stateThatUses("component");
        for (const unsigned K : {512U, 256U, 128U}) {
            EXPECT_EQ(Block(K).decode(state), 0);
        }
        veltra_ip_morvik_v1_0_bitacc_dump_config(state, 1);
        Block block(40);
        const std::string expected = tracedBlock(state, block);
        veltra_ip_morvik_v1_0_destroy_state(state);
        EXPECT_NE(expected.find("decode=3 siso=0"), std::string::npos);
        unsigned which = 1;
        while (which < manyAllocations && traceWithFailure(which, set, expected)) {
            ++which;
        }
        EXPECT_GE(which, 3U);
        EXPECT_LT(which, manyAllocations);
    }
}

/// Changes of the way to decode keep what the lanes have loaded, for a trace.
TEST(LaneAllocationFailure, OfAnotherInstructionSetKeepsTheOldOne)
{
    unsigned which = 1;
    for (bool happened = true; happened && which < 100; ++which) {
        veltra_ip_morvik_v1_0_state* const state = stateThatUses("component");
        Block block(128);
        EXPECT_EQ(block.decode(state), 0);
        const std::vector<std::uint8_t> expected = block.bits;
        {
            const FailingAllocation failing(which);
            const std::int32_t status = veltra_ip_morvik_v1_0_set_instruction_set(state, "generic");
            happened = FailingAllocation::happened();
            EXPECT_EQ(status, happened ? 99 : 0) << which;
            EXPECT_EQ(failing.errors(), happened ? exceptionLine : "");
        }
        EXPECT_STREQ(veltra_ip_morvik_v1_0_get_instruction_set(state), happened ? "component" : "generic");
        EXPECT_EQ(block.decode(state), 0);
        EXPECT_EQ(block.bits, expected);
        veltra_ip_morvik_v1_0_destroy_state(state);
    }
    EXPECT_GE(which, 3U);
    EXPECT_LT(which, 100U);
}

}  // namespace
