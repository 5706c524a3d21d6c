// Traces after blocks that the lanes decoded: the same text, byte for byte, as that of a state whose components
// decoded everything. A trace shows what earlier blocks left behind the columns of a shorter one, so what came
// before is random: sizes up and down, the same again, batches, refusals.
//
// MORVIK_TEST_SEED and MORVIK_TEST_BLOCKS in the environment choose another run.
#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "support/Batches.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/Configurations.h"
#include "support/Environment.h"
#include "support/ExpectText.h"

namespace {

/// What a call does.
enum class Kind { block, batch, withoutRoom, batchWithoutRoom, tooManyIterations, kinds };

struct Call {
    Kind kind = Kind::block;
    std::vector<morvik::blocks::Block> blocks;
    unsigned iterations = 1;
};

/// What a call leaves to be seen.
struct Seen {
    std::int32_t status;
    std::vector<std::uint8_t> bits;
    std::string out;
    std::string err;
};

Seen made(const Call& call, morvik::blocks::Decoder& decoder)
{
    const CapturedStreams streams;
    const morvik::blocks::Batch<std::int32_t> batch(call.blocks);
    std::vector<std::uint8_t> bits(batch.sys.size());
    std::int32_t status = 0;
    if (call.kind == Kind::batch || call.kind == Kind::batchWithoutRoom) {
        morvik::blocks::BatchOutputs outputs{};
        outputs.dout = bits.data();
        outputs.dout_alloc = call.kind == Kind::batch ? bits.size() : 7;
        status = batch.simulate(decoder.state(), call.iterations, nullptr, &outputs);
    } else {
        const auto room = static_cast<std::uint32_t>(call.kind == Kind::withoutRoom ? 3 : bits.size());
        veltra_ip_morvik_v1_0_outputs outputs{bits.data(), room, 0, 0};
        const morvik::blocks::Block& block = call.blocks[0];
        status = veltra_ip_morvik_v1_0_bitacc_simulate(decoder.state(),
                                                       block.sys.data(),
                                                       block.par1.data(),
                                                       block.par2.data(),
                                                       batch.dinSize,
                                                       call.kind == Kind::tooManyIterations ? 16 : call.iterations,
                                                       0,
                                                       &outputs);
    }
    return {status, bits, streams.out(), streams.err()};
}

class LaneTraces : public testing::TestWithParam<Configuration> {
protected:
    const int units = std::get<0>(GetParam());
    const int algorithm = std::get<1>(GetParam());
    const unsigned seed = fromEnvironment("MORVIK_TEST_SEED", static_cast<unsigned>(300 + 10 * units + algorithm));
    morvik::blocks::Random random{seed};
    const std::vector<unsigned> sizes = morvik::blocks::blockSizes();
    const std::vector<std::string> sets = morvik::blocks::instructionSets();
    unsigned lastK = 40;

    unsigned below(unsigned count)
    {
        return static_cast<unsigned>(random() % count);
    }

    /// Small sizes for the most part, some that the interleaver or the segments do not know, none at all, and
    /// often the last one again.
    unsigned randomSize()
    {
        switch (below(12)) {
        case 0:
            return 41 + below(200);
        case 1:
            return 0;
        case 2:
        case 3:
            return lastK;
        case 4:
            return sizes[below(130)];
        default:
            return sizes[below(60)];
        }
    }

    Call randomCall()
    {
        Call call;
        call.kind = below(2) == 0 ? Kind::block : static_cast<Kind>(below(static_cast<unsigned>(Kind::kinds)));
        call.iterations = 1 + below(3);
        lastK = randomSize();
        const unsigned count = call.kind == Kind::batch ? 1 + below(5) : 1;
        for (unsigned b = 0; b < count; ++b) {
            call.blocks.push_back(
                morvik::blocks::randomBlock(random, lastK, static_cast<morvik::blocks::Values>(below(4))));
        }
        return call;
    }

    /// Makes the call on both; whether it wrote something.
    static bool expectAlike(const Call& call, morvik::blocks::Decoder& lanes, morvik::blocks::Decoder& components)
    {
        SCOPED_TRACE("K + 4 = " + std::to_string(call.blocks[0].sys.size()) + ", kind " +
                     std::to_string(static_cast<int>(call.kind)));
        const Seen expected = made(call, components);
        const Seen got = made(call, lanes);
        EXPECT_EQ(got.status, expected.status);
        EXPECT_TRUE(got.bits == expected.bits);
        EXPECT_EQ(got.err, expected.err);
        expectText("output", expected.out, got.out);
        EXPECT_TRUE(got.out == expected.out);
        return !expected.out.empty();
    }
};

}  // namespace

TEST_P(LaneTraces, AreThoseOfTheComponents)
{
    const unsigned count = fromEnvironment("MORVIK_TEST_BLOCKS", 40);
    morvik::blocks::Decoder lanes(units, algorithm);
    morvik::blocks::Decoder components(units, algorithm);
    components.decodeByComponents();
    unsigned traced = 0;
    for (unsigned i = 0; i < count; ++i) {
        SCOPED_TRACE("MORVIK_TEST_SEED=" + std::to_string(seed) + ", sequence " + std::to_string(i));
        for (unsigned untraced = below(6); untraced > 0; --untraced) {
            if (below(4) == 0) {
                const std::string& set = sets[below(static_cast<unsigned>(sets.size()))];
                ASSERT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(lanes.state(), set.c_str()), 0);
            }
            expectAlike(randomCall(), lanes, components);
        }
        const unsigned passes = 1 + below(5);
        for (morvik::blocks::Decoder* decoder : {&lanes, &components}) {
            veltra_ip_morvik_v1_0_bitacc_dump_config(decoder->state(), passes);
        }
        const Call call = randomCall();
        traced += expectAlike(call, lanes, components) ? 1U : 0U;
        ASSERT_FALSE(HasFailure());
        for (morvik::blocks::Decoder* decoder : {&lanes, &components}) {
            veltra_ip_morvik_v1_0_bitacc_dump_config(decoder->state(), 0);
        }
    }
    EXPECT_GT(traced, 0U);
}

/// The longest blocks, whose columns lie behind those of all others.
TEST_P(LaneTraces, ShowWhatEachLongerBlockLeft)
{
    morvik::blocks::Decoder lanes(units, algorithm);
    morvik::blocks::Decoder components(units, algorithm);
    components.decodeByComponents();
    for (const unsigned K : {6144U, 2048U, 2048U, 512U, 128U, 136U, 40U}) {
        Call call;
        call.iterations = 2;
        call.blocks = {morvik::blocks::randomBlock(random, K, morvik::blocks::Values::uniform)};
        expectAlike(call, lanes, components);
    }
    for (const unsigned K : {40U, 136U, 6144U}) {
        for (morvik::blocks::Decoder* decoder : {&lanes, &components}) {
            veltra_ip_morvik_v1_0_bitacc_dump_config(decoder->state(), 2);
        }
        Call call;
        call.blocks = {morvik::blocks::randomBlock(random, K, morvik::blocks::Values::extreme)};
        const Seen expected = made(call, components);
        EXPECT_FALSE(expected.out.empty());
        EXPECT_TRUE(made(call, lanes).out == expected.out) << K;
    }
}

INSTANTIATE_TEST_SUITE_P(Configurations, LaneTraces, everyConfiguration(), configurationName);
