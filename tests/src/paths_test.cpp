// The two paths of a block: which one is chosen, that both give the same by the same verbs, and what blocks that the
// lanes decoded leave for a trace.
//
// The program is linked from the model's objects, which do not export the paths.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "ComponentPath.h"
#include "LanePath.h"
#include "PathChoice.h"
#include "support/Blocks.h"

namespace {

using morvik::blocks::Block;
using morvik::simulation_call::Batch;
using State = veltra_ip_morvik_v1_0_state;

/// Some random blocks, one after the other, as a call hands them over.
class Blocks {
public:
    Blocks(unsigned count, unsigned K) : itsCount(count), itsSize(static_cast<std::int32_t>(K + 4))
    {
        morvik::blocks::Random random(K + count);
        for (unsigned b = 0; b < count; ++b) {
            const Block block = morvik::blocks::randomBlock(random, K, morvik::blocks::Values::uniform);
            itsSys.insert(itsSys.end(), block.sys.begin(), block.sys.end());
            itsPar1.insert(itsPar1.end(), block.par1.begin(), block.par1.end());
            itsPar2.insert(itsPar2.end(), block.par2.begin(), block.par2.end());
        }
    }

    Batch batch(unsigned iterations) const
    {
        const morvik::lanes::Streams<std::int32_t> streams = {itsSys.data(), itsPar1.data(), itsPar2.data()};
        return {streams, itsSize, itsCount, iterations, nullptr};
    }

private:
    std::uint32_t itsCount;
    std::int32_t itsSize;
    std::vector<std::int32_t> itsSys;
    std::vector<std::int32_t> itsPar1;
    std::vector<std::int32_t> itsPar2;
};

LanePath& lanesOf(State& state, unsigned K)
{
    LanePath* const path = state.path_choice->lanesFor(K);
    if (path == nullptr) {
        throw std::runtime_error("the lanes do not take the block");
    }
    return *path;
}

/// What a path gives for a batch.
struct Given {
    std::vector<std::uint8_t> bits;
    std::vector<std::int16_t> ratios;
    std::vector<std::uint32_t> errors;
    unsigned lots = 0;

    Given(BlockPath& path, const Batch& batch, const std::vector<std::uint8_t>& sent)
        : bits(batch.blocks * std::size_t{batch.blockSize()}),
          ratios(bits.size()),
          errors(std::size_t{batch.blocks} * batch.iterations)
    {
        for (std::size_t b = 0; b < batch.blocks; ++lots) {
            const auto most = static_cast<unsigned>(batch.blocks - b);
            const std::size_t first = b * batch.blockSize();
            path.take(batch, b, most);
            EXPECT_EQ(path.countErrors(batch.iterations, &sent[first], &errors[b * batch.iterations]), 0);
            const unsigned taken = path.take(batch, b, most);
            EXPECT_EQ(path.decode(batch.iterations), 0);
            EXPECT_EQ(path.blockSize(), batch.blockSize());
            path.decisions(&bits[first]);
            path.ratios(&ratios[first]);
            b += taken;
        }
    }
};

/// Decodes with the state as it is: by the path that is chosen.
void decode(State& state, unsigned K)
{
    const Blocks blocks(1, K);
    ComponentPath components(state);
    LanePath* const byLanes = state.path_choice->lanesFor(K);
    BlockPath& path = byLanes != nullptr ? static_cast<BlockPath&>(*byLanes) : components;
    path.take(blocks.batch(2), 0, 1);
    EXPECT_EQ(path.decode(2), 0);
}

void expectEqualColumns(const State& expected, const State& got, unsigned columns)
{
    ASSERT_NE(got.decoder->itsAlpha, nullptr);
    for (unsigned n = 0; n < columns; ++n) {
        for (unsigned i = 0; i < 8; ++i) {
            EXPECT_EQ(expected.decoder->itsAlpha[n][i], got.decoder->itsAlpha[n][i]) << n;
            EXPECT_EQ(expected.decoder->itsBeta[n][i], got.decoder->itsBeta[n][i]) << n;
            EXPECT_EQ(expected.decoder->itsGamma[n][i], got.decoder->itsGamma[n][i]) << n;
        }
    }
}

/// Changes each number of the decoder's tables in turn.
void forEachTableEntry(TDecoder3GPU& decoder, const std::function<void(std::uint32_t&)>& use)
{
    use(decoder.itsNT);
    for (auto* segments : {&decoder.itsAlphaSegment, &decoder.itsBetaSegment}) {
        for (TDecoder3GPU::ABSegment& segment : *segments) {
            use(segment.from);
            // A last segment with another end is one of another block size, whose tables are made anew.
            if (&segment != &decoder.itsAlphaSegment.back()) {
                use(segment.to);
            }
        }
    }
    for (std::vector<unsigned>* table : {&decoder.itsInterleaver->itsPi, &decoder.itsInterleaver->itsPiInv}) {
        use(table->front());
        use(table->back());
    }
}

}  // namespace

TEST(Paths, GiveTheSameByTheSameVerbs)
{
    for (const int algorithm : {0, 1, 2}) {
        for (const unsigned K : {40U, 256U, 2048U}) {
            SCOPED_TRACE("type " + std::to_string(algorithm) + ", K " + std::to_string(K));
            const morvik::blocks::Decoder decoder(2, algorithm);
            const morvik::blocks::Decoder other(2, algorithm);
            const Blocks blocks(5, K);
            const std::vector<std::uint8_t> sent(std::size_t{5} * K, 1);
            ComponentPath components(*decoder.state());
            const Given expected(components, blocks.batch(3), sent);
            const Given got(lanesOf(*other.state(), K), blocks.batch(3), sent);
            EXPECT_EQ(expected.lots, 5U);
            EXPECT_LE(got.lots, 5U);
            EXPECT_EQ(expected.bits, got.bits);
            EXPECT_EQ(expected.ratios, got.ratios);
            EXPECT_EQ(expected.errors, got.errors);
            EXPECT_EQ(decoder.state()->decoder->itsDecodeCount, other.state()->decoder->itsDecodeCount);
            EXPECT_EQ(decoder.state()->decoder->itsHalfIterationCount, other.state()->decoder->itsHalfIterationCount);
        }
    }
}

TEST(PathChoice, IsForTheLanesWhereNobodyWatchesAndNothingIsChanged)
{
    const std::pair<const char*, std::function<void(State&)>> changes[] = {
        {"a trace",
         [](State& state) {
             state.decoder->itsDumpCount = 1;
         }},
        {"a trace of the units",
         [](State& state) {
             state.decoder->itsTraceLevel = 1;
         }},
        {"preset values",
         [](State& state) {
             state.decoder->itsExtrinsicIn.assign(43, 16);
         }},
        {"another scale",
         [](State& state) {
             state.decoder->itsExtrinsicScale = 0.5;
         }},
        {"a table",
         [](State& state) {
             state.interleaver->itsPi.assign(40, 0);
         }},
        {"a wish",
         [](State& state) {
             state.path_choice->useComponents();
         }},
    };
    for (const auto& [name, change] : changes) {
        SCOPED_TRACE(name);
        const morvik::blocks::Decoder decoder(4, 1);
        State& state = *decoder.state();
        EXPECT_NE(state.path_choice->lanesFor(40), nullptr);
        change(state);
        EXPECT_EQ(state.path_choice->lanesFor(40), nullptr);
    }
}

TEST(PathChoice, IsForTheLanesWhereTheTablesAreTheDecodersOwn)
{
    constexpr unsigned K = 128;
    const morvik::blocks::Decoder made(2, 1);
    State& state = *made.state();
    ComponentPath components(state);
    components.take(Blocks(1, K).batch(1), 0, 1);
    ASSERT_EQ(components.decode(1), 0);
    auto& decoder = dynamic_cast<TDecoder3GPU&>(*state.decoder);
    ASSERT_EQ(decoder.itsAlphaSegment.size(), 2U);
    unsigned entries = 0;
    forEachTableEntry(decoder, [&](std::uint32_t& entry) {
        EXPECT_NE(state.path_choice->lanesFor(K), nullptr) << entries;
        ++entry;
        EXPECT_EQ(state.path_choice->lanesFor(K), nullptr) << entries;
        --entry;
        ++entries;
    });
    EXPECT_NE(state.path_choice->lanesFor(K), nullptr);
    EXPECT_EQ(entries, 1U + 3 + 4 + 4);
}

TEST(PathChoice, IsForTheLanesWhereTheStandardHasTheSize)
{
    const morvik::blocks::Decoder decoder(4, 1);
    PathChoice& choice = *decoder.state()->path_choice;
    for (const unsigned K : {40U, 6144U, 512U}) {
        EXPECT_NE(choice.lanesFor(K), nullptr) << K;
    }
    for (const unsigned K : {0U, 39U, 41U, 6145U, 0xFFFFFFFFU}) {
        EXPECT_EQ(choice.lanesFor(K), nullptr) << K;
    }
}

/// Each block leaves, behind its own columns, those of longer ones before it.
TEST(MissedBlocks, LeaveTheColumnsThatTheComponentsWouldHaveLeft)
{
    const std::vector<unsigned> sequences[] = {
        {512}, {512, 256, 40}, {40, 512}, {512, 40, 256}, {256, 256}, {512, 128, 40, 128}};
    for (const std::vector<unsigned>& sequence : sequences) {
        SCOPED_TRACE(testing::PrintToString(sequence));
        const morvik::blocks::Decoder components(2, 2);
        const morvik::blocks::Decoder lanes(2, 2);
        components.state()->path_choice->useComponents();
        for (const unsigned K : sequence) {
            decode(*components.state(), K);
            decode(*lanes.state(), K);
        }
        EXPECT_EQ(lanes.state()->decoder->itsAlpha, nullptr);
        lanes.state()->path_choice->catchUp();
        expectEqualColumns(
            *components.state(), *lanes.state(), *std::max_element(sequence.begin(), sequence.end()) + 3);
    }
}

/// Whether or not the new one has decoded elsewhere.
TEST(MissedBlocks, OfADecoderThatWasReplacedAreForgotten)
{
    for (const std::uint64_t decoded : {0U, 1U}) {
        const morvik::blocks::Decoder decoder(2, 1);
        State& state = *decoder.state();
        decode(state, 512);
        const std::unique_ptr<TDecoder> old(state.decoder);
        state.decoder = TDecoder::create("3GPPPU:2");
        state.decoder->itsInterleaver = state.interleaver;
        state.decoder->itsEngine = state.engine;
        state.decoder->itsDecodeCount = decoded;
        state.path_choice->catchUp();
        EXPECT_EQ(old->itsAlpha, nullptr);
        EXPECT_EQ(state.decoder->itsAlpha, nullptr);
    }
}
