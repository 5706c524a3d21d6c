// Changed components: whatever a test bench puts in a component's place, or changes in one, decides how blocks are
// decoded, whether or not the lanes would have decoded them.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <numeric>
#include <string>
#include <vector>

#include "DecoderState.h"
#include "TCalculationEngineMod.h"
#include "TCalculationEngineModHash.h"
#include "TDecoder3GPU.h"
#include "TInterleaver3GPPLTE.h"
#include "support/Batches.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/ExpectText.h"

namespace {

using State = veltra_ip_morvik_v1_0_state;
using Change = std::function<void(State&)>;

constexpr unsigned K = 128;

/// What a call leaves to be seen.
struct Seen {
    std::int32_t status = 0;
    std::vector<std::uint8_t> bits;
    std::vector<std::int16_t> ratios;
    std::string out;
    std::string err;

    bool operator==(const Seen& other) const
    {
        return status == other.status && bits == other.bits && ratios == other.ratios;
    }
};

Seen seen(State* state, unsigned blockSize)
{
    morvik::blocks::Random random(blockSize);
    std::vector<morvik::blocks::Block> some;
    for (unsigned b = 0; b < 3; ++b) {
        some.push_back(morvik::blocks::encode(morvik::blocks::randomBits(random, blockSize), 12));
        morvik::blocks::addNoise(random, 14.0, some.back());
    }
    const morvik::blocks::Batch<std::int16_t> batch(some);
    Seen result;
    result.bits.resize(3 * blockSize);
    result.ratios.resize(3 * blockSize);
    morvik::blocks::BatchOutputs outputs{};
    outputs.dout = result.bits.data();
    outputs.dout_alloc = result.bits.size();
    outputs.ratios = result.ratios.data();
    outputs.ratios_alloc = result.ratios.size();
    const CapturedStreams streams;
    result.status = batch.simulate(state, 3, nullptr, &outputs);
    result.out = streams.out();
    result.err = streams.err();
    return result;
}

void expectEqual(const Seen& expected, const Seen& got)
{
    EXPECT_TRUE(expected == got);
    expectText("output", expected.out, got.out);
    expectText("errors", expected.err, got.err);
}

TCalculationEngineModHash& table(State& state)
{
    return static_cast<TCalculationEngineModHash&>(*state.engine);
}

class Reversed : public TInterleaver {
public:
    bool calcInterleaver(std::vector<unsigned>& out, unsigned size) const override
    {
        out.resize(size);
        std::iota(out.rbegin(), out.rend(), 0U);
        return true;
    }

    std::string getProperties() const override
    {
        return "reversed";
    }
};

/// What a test bench may have made before.
const std::unique_ptr<TNumberFormat> narrow(TNumberFormat::create("Fix_7_3"));
const std::unique_ptr<TCalculationEngine> plainEngine(TCalculationEngine::create("MOD"));
const std::vector<unsigned char> coarse(65536, 16);
Reversed reversed;

void usePlainEngine(State& state)
{
    plainEngine->itsInputFormat = state.input_format;
    plainEngine->itsStateFormat = state.state_format;
    plainEngine->itsBranchFormat = state.branch_format;
    plainEngine->initialise();
    state.decoder->itsEngine = plainEngine.get();
}

void useAnotherDecoder(State& state)
{
    delete state.decoder;
    state.decoder = TDecoder::create("3GPPPU:1,1");
    state.decoder->itsEngine = state.engine;
    state.decoder->itsInterleaver = state.interleaver;
}

void presetPermutation(State& state)
{
    reversed.calcInterleaver(state.interleaver->itsPi, K);
    state.interleaver->itsPiInv = state.interleaver->itsPi;
}

void presetSegments(State& state)
{
    auto& decoder = static_cast<TDecoder3GPU&>(*state.decoder);
    decoder.itsNT = 2;
    decoder.itsAlphaSegment = {{0, 64}, {64, 128}};
    decoder.itsBetaSegment = {{15, 0}, {79, 63}, {63, 15}, {127, 79}};
}

const struct {
    const char* name;
    Change change;
} changes[] = {
    {"extrinsic scale",
     [](State& s) {
         s.decoder->itsExtrinsicScale = 0.25;
     }},
    {"SSE2",
     [](State& s) {
         s.engine->itsUseSSE2 = true;
     }},
    {"alpha's type",
     [](State& s) {
         table(s).itsAlphaAlgorithmType = TCalculationEngineModBase::MOD;
     }},
    {"beta's type",
     [](State& s) {
         table(s).itsBetaAlgorithmType = TCalculationEngineModBase::MOD_STAR;
     }},
    {"ratios' type",
     [](State& s) {
         table(s).itsLLRAlgorithmType = TCalculationEngineModBase::MOD_STAR;
     }},
    {"no type",
     [](State& s) {
         table(s).itsLLRAlgorithmType = TCalculationEngineModBase::UNKNOWN;
     }},
    {"alpha's table",
     [](State& s) {
         table(s).itsAlphaLUT = coarse.data() + 32768;
     }},
    {"beta's table",
     [](State& s) {
         table(s).itsBetaLUT = coarse.data() + 32768;
     }},
    {"ratios' table",
     [](State& s) {
         table(s).itsLLRLUT = coarse.data() + 32768;
     }},
    {"an entry of the table",
     [](State& s) {
         table(s).itsLUT[32768 + 160] = 112;
     }},
    {"input format",
     [](State& s) {
         s.input_format->itsMaxQ = 15;
     }},
    {"state format",
     [](State& s) {
         s.state_format->itsMask = -64;
     }},
    {"branch format",
     [](State& s) {
         s.branch_format->itsMax = 4096;
     }},
    {"engine's branch format",
     [](State& s) {
         s.engine->itsBranchFormat = narrow.get();
     }},
    {"engine of the decoder", usePlainEngine},
    {"interleaver of the decoder",
     [](State& s) {
         s.decoder->itsInterleaver = &reversed;
     }},
    {"decoder", useAnotherDecoder},
    {"permutation", presetPermutation},
    {"segments", presetSegments},
};

}  // namespace

TEST(ChangedComponents, DecideHowBlocksAreDecoded)
{
    for (const auto& [name, change] : changes) {
        for (const bool decodedBefore : {false, true}) {
            SCOPED_TRACE(name + std::string(decodedBefore ? ", after a block" : ""));
            morvik::blocks::Decoder components(2, 2);
            components.decodeByComponents();
            morvik::blocks::Decoder lanes(2, 2);
            const Seen plain = seen(components.state(), K);
            if (decodedBefore) {
                EXPECT_TRUE(seen(lanes.state(), K) == plain);
            }
            change(*components.state());
            change(*lanes.state());
            const Seen changed = seen(components.state(), K);
            EXPECT_FALSE(changed == plain);
            expectEqual(changed, seen(lanes.state(), K));
        }
    }
}

TEST(ChangedComponents, AreNoLongerDecodedByLanes)
{
    morvik::blocks::Decoder decoder(2, 1);
    State* const state = decoder.state();
    const std::string best = morvik::blocks::instructionSets().front();
    EXPECT_EQ(veltra_ip_morvik_v1_0_get_instruction_set(state), best);
    state->decoder->itsExtrinsicScale = 0.5;
    EXPECT_STREQ(veltra_ip_morvik_v1_0_get_instruction_set(state), "component");
    state->decoder->itsExtrinsicScale = 0.75;
    EXPECT_EQ(veltra_ip_morvik_v1_0_get_instruction_set(state), best);
}

/// The components would replace the tables of another size, a test bench's own among them.
TEST(ChangedComponents, OfAnotherBlockSizeAreReplaced)
{
    for (const Change& change : {Change(presetPermutation), Change(presetSegments)}) {
        morvik::blocks::Decoder components(2, 1);
        components.decodeByComponents();
        morvik::blocks::Decoder lanes(2, 1);
        for (State* const state : {components.state(), lanes.state()}) {
            change(*state);
            EXPECT_EQ(seen(state, 40).status, 0);
        }
        expectEqual(seen(components.state(), K), seen(lanes.state(), K));
    }
}

/// What blocks decoded by the lanes left in the columns is what the components had left at the time, whatever has
/// been changed or preset since.
TEST(ChangedComponents, LeaveTheColumnsOfEarlierBlocksAlone)
{
    const Change later[] = {
        [](State& s) { s.decoder->itsExtrinsicScale = 0.25; },
        [](State& s) { s.decoder->itsExtrinsicIn.assign(K + 3, 160); },
        [](State& s) { s.decoder->itsTraceLevel = 9; },
        [](State& s) { s.engine->itsUseSSE2 = true; },
        presetPermutation,
        presetSegments,
        useAnotherDecoder,
    };
    for (const Change& change : later) {
        for (const unsigned previous : {K, 512U}) {
            SCOPED_TRACE(std::to_string(&change - later) + " after " + std::to_string(previous));
            morvik::blocks::Decoder components(2, 2);
            components.decodeByComponents();
            morvik::blocks::Decoder lanes(2, 2);
            for (State* const state : {components.state(), lanes.state()}) {
                EXPECT_EQ(seen(state, previous).status, 0);
                change(*state);
                veltra_ip_morvik_v1_0_bitacc_dump_config(state, 2);
            }
            expectEqual(seen(components.state(), K), seen(lanes.state(), K));
        }
    }
}
