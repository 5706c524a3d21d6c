// morvik_v1_0_bitacc_cmodel: generics, state, trace switch and block simulation.
#include "morvik_v1_0_bitacc_cmodel.h"
#include "morvik_v1_0_batch.h"

#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "DecoderState.h"
#include "TDecoder3GPU.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"

namespace {

using Generics = veltra_ip_morvik_v1_0_generics;
using State = veltra_ip_morvik_v1_0_state;
using Outputs = veltra_ip_morvik_v1_0_outputs;
using Change = std::function<void(Generics&)>;

constexpr std::uint32_t untouched = 0xDEADBEEF;

std::string refusalOf(const Change& change)
{
    Generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    change(generics);
    CapturedStreams streams;
    State* const state = veltra_ip_morvik_v1_0_create_state(generics);
    EXPECT_EQ(state, nullptr);
    veltra_ip_morvik_v1_0_destroy_state(state);
    EXPECT_EQ(streams.out(), "");
    return streams.err();
}

std::unique_ptr<State, void (*)(State*)> create(const Change& change)
{
    Generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    change(generics);
    CapturedStreams streams;
    State* const state = veltra_ip_morvik_v1_0_create_state(generics);
    EXPECT_NE(state, nullptr);
    EXPECT_EQ(streams.out() + streams.err(), "");
    return {state, veltra_ip_morvik_v1_0_destroy_state};
}

/// One call with every argument in reach of the test; what it says is kept.
struct Call {
    morvik::blocks::Block block;
    State* state = nullptr;
    const std::int32_t* sys = nullptr;
    const std::int32_t* par1 = nullptr;
    const std::int32_t* par2 = nullptr;
    std::int32_t dinSize = 0;
    std::uint32_t iterations = 1;
    std::uint32_t tag = 0;
    std::vector<std::uint8_t> bits;
    Outputs outputs{};
    Outputs* outputsPointer = nullptr;
    std::string out;
    std::string err;

    Call(State* decoder, morvik::blocks::Block values)
        : block(std::move(values)), state(decoder), bits(block.sys.size(), 0xEE)
    {
        sys = block.sys.data();
        par1 = block.par1.data();
        par2 = block.par2.data();
        dinSize = static_cast<std::int32_t>(block.sys.size());
        outputs = {bits.data(), static_cast<std::uint32_t>(bits.size()) - 4, untouched, untouched};
        outputsPointer = &outputs;
    }

    std::int32_t run()
    {
        CapturedStreams streams;
        const std::int32_t status =
            veltra_ip_morvik_v1_0_bitacc_simulate(state, sys, par1, par2, dinSize, iterations, tag, outputsPointer);
        out = streams.out();
        err = streams.err();
        return status;
    }

    bool outputsUntouched() const
    {
        return outputs.dout_size == untouched && outputs.tag == untouched &&
               bits == std::vector<std::uint8_t>(bits.size(), 0xEE);
    }
};

morvik::blocks::Block quietBlock(unsigned K)
{
    const morvik::blocks::Stream values(K + 4, 5);
    return {values, values, values};
}

void accept(Generics&) {}

unsigned count(const std::string& text, const std::string& part)
{
    unsigned found = 0;
    for (std::size_t at = text.find(part); at != std::string::npos; at = text.find(part, at + 1)) {
        ++found;
    }
    return found;
}

}  // namespace

TEST(Generics, HaveTheDocumentedDefaults)
{
    const Generics g = veltra_ip_morvik_v1_0_get_default_generics();
    EXPECT_STREQ(g.C_DIRECTORY, "./");
    EXPECT_STREQ(g.C_FAMILY, "halden5");
    EXPECT_STREQ(g.C_COMPONENT_NAME, "morvik_v1_0");
    EXPECT_EQ(g.C_RESERVED_1, 512);
    EXPECT_EQ(g.C_STATE_INT_WIDTH, 9);
    EXPECT_EQ(g.C_STATE_FRAC_WIDTH, 3);
    EXPECT_EQ(g.C_INPUT_INT_WIDTH, 5);
    EXPECT_EQ(g.C_INPUT_FRAC_WIDTH, 3);
    EXPECT_EQ(g.C_RESERVED_2, 0);
    EXPECT_EQ(g.C_RESERVED_3, 0);
    EXPECT_EQ(g.C_RESERVED_4, 0);
    EXPECT_EQ(g.C_NUM_PU, 2);
    EXPECT_EQ(g.C_TAG_WIDTH, 8);
    EXPECT_EQ(g.C_ALGORITHM_TYPE, 1);
}

TEST(Generics, AreFourteenWords)
{
    EXPECT_EQ(sizeof(Generics), 3 * sizeof(void*) + 11 * sizeof(std::int32_t) + (sizeof(void*) == 8 ? 4 : 0));
    EXPECT_EQ(offsetof(Generics, C_RESERVED_1), 3 * sizeof(void*));
    EXPECT_EQ(offsetof(Generics, C_ALGORITHM_TYPE), 3 * sizeof(void*) + 40);
}

TEST(CreateState, RefusesEachBadGenericWithItsOwnLine)
{
    const std::vector<std::pair<Change, std::string>> cases = {
        {[](Generics& g) { g.C_NUM_PU = 3; }, "C_NUM_PU must be either 2, 4 or 8"},
        {[](Generics& g) { g.C_NUM_PU = 0; }, "C_NUM_PU must be either 2, 4 or 8"},
        {[](Generics& g) { g.C_NUM_PU = -2; }, "C_NUM_PU must be either 2, 4 or 8"},
        {[](Generics& g) { g.C_NUM_PU = 16; }, "C_NUM_PU must be either 2, 4 or 8"},
        {[](Generics& g) { g.C_TAG_WIDTH = 33; }, "C_TAG_WIDTH must be in range 0 to 32"},
        {[](Generics& g) { g.C_TAG_WIDTH = -1; }, "C_TAG_WIDTH must be in range 0 to 32"},
        {[](Generics& g) { g.C_ALGORITHM_TYPE = 3; }, "C_ALGORITHM_TYPE must be in range 0 to 2"},
        {[](Generics& g) { g.C_ALGORITHM_TYPE = -1; }, "C_ALGORITHM_TYPE must be in range 0 to 2"},
        {[](Generics& g) { g.C_STATE_INT_WIDTH = 10; }, "C_STATE_INT_WIDTH must be 9"},
        {[](Generics& g) { g.C_STATE_FRAC_WIDTH = 2; }, "C_STATE_FRAC_WIDTH must be 3"},
        {[](Generics& g) { g.C_INPUT_INT_WIDTH = 4; }, "C_INPUT_INT_WIDTH must be 5"},
        {[](Generics& g) { g.C_INPUT_FRAC_WIDTH = 0; }, "C_INPUT_FRAC_WIDTH must be 3"},
    };
    for (const auto& [change, reason] : cases) {
        EXPECT_EQ(refusalOf(change), "ERROR:decoder:" + reason + "\n");
    }
}

TEST(CreateState, ReportsTheFirstOfSeveralBadGenerics)
{
    const std::vector<Change> inOrder = {
        [](Generics& g) { g.C_NUM_PU = 3; },
        [](Generics& g) { g.C_TAG_WIDTH = 33; },
        [](Generics& g) { g.C_ALGORITHM_TYPE = 3; },
        [](Generics& g) { g.C_STATE_INT_WIDTH = 10; },
        [](Generics& g) { g.C_STATE_FRAC_WIDTH = 10; },
        [](Generics& g) { g.C_INPUT_INT_WIDTH = 10; },
        [](Generics& g) { g.C_INPUT_FRAC_WIDTH = 10; },
    };
    for (std::size_t first = 0; first < inOrder.size(); ++first) {
        const auto allFrom = [&](Generics& g) {
            for (std::size_t i = first; i < inOrder.size(); ++i) {
                inOrder[i](g);
            }
        };
        EXPECT_EQ(refusalOf(allFrom), refusalOf(inOrder[first]));
    }
}

TEST(CreateState, BuildsWhatTheGenericsSay)
{
    struct Expected {
        int algorithm;
        const char* engine;
        double scale;
    };
    for (const int units : {2, 4, 8}) {
        for (const Expected& e : {Expected{0, "MOD", 1.0}, Expected{1, "MOD", 0.75}, Expected{2, "MOD#:16", 1.0}}) {
            const auto state = create([&](Generics& g) {
                g.C_NUM_PU = units;
                g.C_ALGORITHM_TYPE = e.algorithm;
            });
            EXPECT_EQ(state->decoder->getProperties(), "3GPPPU:" + std::to_string(units));
            EXPECT_EQ(state->engine->getProperties(), e.engine);
            EXPECT_EQ(state->decoder->itsExtrinsicScale, e.scale);
            EXPECT_EQ(state->interleaver->getProperties(), "3GPPLTE");
            EXPECT_EQ(state->state_format->getProperties(), "Fix_12_3");
            EXPECT_EQ(state->branch_format->getProperties(), "Fix_8_3");
            EXPECT_EQ(state->input_format->getProperties(), "Fix_8_3");
            EXPECT_EQ(state->engine->itsStateFormat, state->state_format);
            EXPECT_EQ(state->engine->itsBranchFormat, state->branch_format);
            EXPECT_EQ(state->engine->itsInputFormat, state->input_format);
            EXPECT_EQ(state->decoder->itsEngine, state->engine);
            EXPECT_EQ(state->decoder->itsInterleaver, state->interleaver);
            EXPECT_FALSE(state->saturation_reported);
            EXPECT_FALSE(state->tag_truncation_reported);
        }
    }
}

TEST(CreateState, MasksTheTagWithAFiveBitShiftCount)
{
    const std::vector<std::pair<int, std::uint32_t>> masks = {{0, 0U}, {1, 1U}, {8, 255U}, {31, 0x7FFFFFFFU}, {32, 0U}};
    for (const auto& [width, mask] : masks) {
        EXPECT_EQ(create([w = width](Generics& g) { g.C_TAG_WIDTH = w; })->tag_mask, mask) << width;
    }
}

TEST(CreateState, IgnoresTextsAndReservedWords)
{
    const auto state = create([](Generics& g) {
        g.C_DIRECTORY = nullptr;
        g.C_FAMILY = nullptr;
        g.C_COMPONENT_NAME = nullptr;
        g.C_RESERVED_1 = g.C_RESERVED_2 = g.C_RESERVED_3 = g.C_RESERVED_4 = -1;
    });
    morvik::blocks::Random random(1);
    const morvik::blocks::Block block = morvik::blocks::randomBlock(random, 512, morvik::blocks::Values::uniform);
    Call changed(state.get(), block);
    const auto plain = create(accept);
    Call unchanged(plain.get(), block);
    EXPECT_EQ(changed.run(), 0);
    EXPECT_EQ(unchanged.run(), 0);
    EXPECT_EQ(changed.bits, unchanged.bits);
}

TEST(DestroyState, IgnoresNull)
{
    CapturedStreams streams;
    veltra_ip_morvik_v1_0_destroy_state(nullptr);
    EXPECT_EQ(streams.out() + streams.err(), "");
}

TEST(CreateDefaultState, MakesAnEmptyRecordThatCanBeDestroyed)
{
    Generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = 99;  // not checked
    generics.C_TAG_WIDTH = 5;
    State* const state = create_default_state(generics);
    ASSERT_NE(state, nullptr);
    EXPECT_EQ(state->generics.C_NUM_PU, 99);
    EXPECT_EQ(state->decoder, nullptr);
    EXPECT_EQ(state->interleaver, nullptr);
    EXPECT_EQ(state->engine, nullptr);
    EXPECT_EQ(state->state_format, nullptr);
    EXPECT_EQ(state->input_format, nullptr);
    EXPECT_EQ(state->branch_format, nullptr);
    EXPECT_FALSE(state->saturation_reported);
    EXPECT_FALSE(state->tag_truncation_reported);
    EXPECT_EQ(state->tag_mask, 31U);
    veltra_ip_morvik_v1_0_destroy_state(state);
}

TEST(DumpConfig, ArmsThePassesAndClearsTheStopFlag)
{
    const auto state = create(accept);
    state->decoder->itsStopAfterDump = true;
    veltra_ip_morvik_v1_0_bitacc_dump_config(state.get(), 3);
    EXPECT_EQ(state->decoder->itsDumpCount, 3U);
    EXPECT_FALSE(state->decoder->itsStopAfterDump);

    Call call(state.get(), quietBlock(40));
    call.iterations = 2;
    EXPECT_EQ(call.run(), 0);
    EXPECT_EQ(count(call.out, "itsSys [0]=["), 1U);
    for (const char* traced : {"decode=0 siso=0\n", "decode=0 siso=1\n", "decode=0 siso=2\n"}) {
        EXPECT_EQ(count(call.out, traced), 1U) << traced;
    }
    EXPECT_EQ(count(call.out, "siso="), 3U);

    EXPECT_EQ(call.run(), 0);
    EXPECT_EQ(call.out, "");
}

TEST(DumpConfig, CountsPassesAcrossBlocksAndIsSwitchedOffByZero)
{
    const auto state = create(accept);
    veltra_ip_morvik_v1_0_bitacc_dump_config(state.get(), 5);
    Call call(state.get(), quietBlock(40));
    EXPECT_EQ(call.run(), 0);
    EXPECT_EQ(count(call.out, "siso="), 2U);
    EXPECT_EQ(call.run(), 0);
    EXPECT_EQ(count(call.out, "decode=1 siso="), 2U);
    EXPECT_EQ(count(call.out, "itsSys [0]=["), 1U);
    veltra_ip_morvik_v1_0_bitacc_dump_config(state.get(), 0);
    EXPECT_EQ(call.run(), 0);
    EXPECT_EQ(call.out, "");
}

TEST(Simulate, RefusesBadArgumentsInOrder)
{
    const auto state = create(accept);
    const std::vector<std::pair<std::function<void(Call&)>, std::string>> inOrder = {
        {[](Call& c) { c.state = nullptr; }, "Simulate called with null state structure"},
        {[](Call& c) { c.outputsPointer = nullptr; }, "Simulate called with null output structure"},
        {[](Call& c) { c.outputs.dout = nullptr; }, "Simulate called with null pointer for dout"},
        {[](Call& c) { c.dinSize = -5; }, "din_size must be a positive integer"},
        {[](Call& c) { c.sys = nullptr; }, "rsc1_sys must not be a null pointer"},
        {[](Call& c) { c.par1 = nullptr; }, "rsc1_par must not be a null pointer"},
        {[](Call& c) { c.par2 = nullptr; }, "rsc2_par must not be a null pointer"},
        {[](Call& c) { c.iterations = 16; }, "Number of iterations must be in the range 1 to 15"},
    };
    for (std::size_t first = 0; first < inOrder.size(); ++first) {
        for (std::size_t last = first; last < inOrder.size(); ++last) {
            Call call(state.get(), quietBlock(40));
            for (std::size_t i = first; i <= last; ++i) {
                inOrder[i].first(call);
            }
            EXPECT_EQ(call.run(), 1);
            EXPECT_EQ(call.err, "ERROR:decoder:" + inOrder[first].second + "\n");
            EXPECT_EQ(call.out, "");
            EXPECT_TRUE(call.outputsUntouched());
        }
    }
}

TEST(Simulate, AcceptsOneToFifteenIterations)
{
    const auto state = create(accept);
    for (const auto& [iterations, status] : std::vector<std::pair<std::uint32_t, int>>{
             {0, 1}, {1, 0}, {15, 0}, {16, 1}, {0xFFFFFFFF, 1}, {0x80000001, 1}}) {
        Call call(state.get(), quietBlock(40));
        call.iterations = iterations;
        EXPECT_EQ(call.run(), status) << iterations;
    }
    Call call(state.get(), quietBlock(40));
    call.dinSize = 0;
    EXPECT_EQ(call.run(), 1);
    EXPECT_EQ(call.err, "ERROR:decoder:din_size must be a positive integer\n");
}

TEST(Simulate, WarnsOfTheFirstSaturationOnly)
{
    struct Saturation {
        morvik::blocks::Stream morvik::blocks::Block::*stream;
        const char* name;
        std::int32_t value;
        const char* direction;
    };
    for (const Saturation& s : {Saturation{&morvik::blocks::Block::sys, "RSC1 systematic", 128, "positively"},
                                Saturation{&morvik::blocks::Block::par1, "RSC1 parity", -129, "negatively"},
                                Saturation{&morvik::blocks::Block::par2, "RSC2 parity", 8388607, "positively"},
                                Saturation{&morvik::blocks::Block::par2, "RSC2 parity", 8388608, "negatively"}}) {
        const auto state = create(accept);
        morvik::blocks::Block block = quietBlock(40);
        block.sys[0] = 127;
        block.par1[1] = -128;
        block.par2[2] = 16777216;  // leaves the 32-bit word and reads as 0
        Call silent(state.get(), block);
        EXPECT_EQ(silent.run(), 0);
        EXPECT_EQ(silent.out, "");

        (block.*s.stream)[17] = s.value;
        block.sys[20] = 1000;
        block.par2[30] = -1000;
        Call warned(state.get(), block);
        EXPECT_EQ(warned.run(), 0);
        EXPECT_EQ(warned.out,
                  std::string("WARNING:decoder:") + s.name + " value in position 17 saturated " + s.direction +
                      ", further saturation will not be reported\n");
        EXPECT_EQ(warned.err, "");
        EXPECT_EQ(warned.run(), 0);
        EXPECT_EQ(warned.out, "");
    }
}

TEST(Simulate, ClipsAndAlignsInputs)
{
    const auto state = create(accept);
    morvik::blocks::Block block = quietBlock(40);
    const std::vector<std::pair<std::int32_t, short>> values = {{0, 0},
                                                                {1, 16},
                                                                {-1, -16},
                                                                {127, 2032},
                                                                {128, 2032},
                                                                {-128, -2048},
                                                                {-129, -2048},
                                                                {16777216, 0},
                                                                {16777217, 16},
                                                                {8388608, -2048},
                                                                {8388607, 2032},
                                                                {2147483647, -16},
                                                                {-2147483647 - 1, 0},
                                                                {-16777217, -16},
                                                                {-16777215, 16}};
    for (std::size_t i = 0; i < values.size(); ++i) {
        block.sys[i] = values[i].first;
    }
    EXPECT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(state.get(), "component"), 0);
    Call call(state.get(), block);
    EXPECT_EQ(call.run(), 0);
    const auto& decoder = dynamic_cast<const TDecoder3GPU&>(*state->decoder);
    for (std::size_t i = 0; i < values.size(); ++i) {
        EXPECT_EQ(decoder.itsSys[0][i], values[i].second) << values[i].first;
    }
}

TEST(Simulate, KeepsTheSaturationReportedWhenTheBlockIsRefused)
{
    const auto state = create(accept);
    morvik::blocks::Block block = quietBlock(44);
    block.sys[3] = 500;
    Call call(state.get(), block);
    EXPECT_EQ(call.run(), 2);
    EXPECT_EQ(call.err, "ERROR:TDecoder3G:Block size not supported\n");
    EXPECT_EQ(count(call.out, "WARNING:decoder:RSC1 systematic value in position 3 saturated positively"), 1U);
    EXPECT_TRUE(call.outputsUntouched());
    EXPECT_TRUE(state->saturation_reported);
    EXPECT_EQ(call.run(), 2);
    EXPECT_EQ(call.out, "");
}

TEST(Simulate, RefusesBlocksShorterThanTheTail)
{
    const auto state = create(accept);
    for (const std::int32_t positions : {1, 2, 3}) {
        Call call(state.get(), quietBlock(0));
        call.dinSize = positions;
        EXPECT_EQ(call.run(), 2);
        EXPECT_EQ(call.err, "ERROR:TDecoder3G:Number of soft inputs does not match rate and number of tail bits\n");
        EXPECT_TRUE(call.outputsUntouched());
    }
}

TEST(Simulate, RefusesAndRefusesAgainWhatDoesNotDivideIntoSegments)
{
    const auto state = create(accept);
    Call good(state.get(), quietBlock(128));
    EXPECT_EQ(good.run(), 0);
    for (unsigned time = 0; time < 2; ++time) {
        Call call(state.get(), quietBlock(131));
        EXPECT_EQ(call.run(), 2);
        EXPECT_EQ(call.err, "ERROR:TDecoder3GPU:Block size not supported\n");
    }
    const std::vector<std::uint8_t> first = good.bits;
    EXPECT_EQ(good.run(), 0);
    EXPECT_EQ(good.bits, first);
}

TEST(Simulate, DecodesNoBitsToNothing)
{
    const auto state = create(accept);
    Call before(state.get(), quietBlock(512));
    EXPECT_EQ(before.run(), 0);
    Call call(state.get(), quietBlock(0));
    call.tag = 9;
    EXPECT_EQ(call.run(), 0);
    EXPECT_EQ(call.outputs.dout_size, 0U);
    EXPECT_EQ(call.outputs.tag, 9U);
    EXPECT_EQ(call.out + call.err, "");
}

TEST(Simulate, MasksTheTagAndWarnsOnce)
{
    const auto state = create(accept);
    const auto tagged = [&](std::uint32_t tag) {
        Call call(state.get(), quietBlock(40));
        call.tag = tag;
        EXPECT_EQ(call.run(), 0);
        return std::make_pair(call.outputs.tag, call.out);
    };
    using Tagged = std::pair<std::uint32_t, std::string>;
    EXPECT_EQ(tagged(255), Tagged(255, ""));
    EXPECT_EQ(tagged(256),
              Tagged(0,
                     "WARNING:decoder:Input block tag has been truncated to 8 bits, further truncation will not be "
                     "reported\n"));
    EXPECT_EQ(tagged(300), Tagged(44, ""));
}

TEST(Simulate, KeepsNoTagBitAtAWidthOf32)
{
    const auto state = create([](Generics& g) { g.C_TAG_WIDTH = 32; });
    Call call(state.get(), quietBlock(40));
    call.tag = 0x80000001;
    EXPECT_EQ(call.run(), 0);
    EXPECT_EQ(call.outputs.tag, 0U);
    EXPECT_EQ(call.out,
              "WARNING:decoder:Input block tag has been truncated to 32 bits, further truncation will not be "
              "reported\n");
}

TEST(Simulate, NeedsRoomForEveryDecision)
{
    const auto state = create(accept);
    veltra_ip_morvik_v1_0_bitacc_dump_config(state.get(), 3);
    Call call(state.get(), quietBlock(40));
    call.outputs.dout_alloc = 39;
    call.tag = 999;
    EXPECT_EQ(call.run(), 1);
    EXPECT_EQ(call.err, "ERROR:decoder:Insufficient allocated space for output array\n");
    EXPECT_TRUE(call.outputsUntouched());
    EXPECT_EQ(count(call.out, "decode=0 siso="), 2U);  // the refused call has been decoded and traced
    EXPECT_EQ(count(call.out, "WARNING"), 0U);
    EXPECT_EQ(state->decoder->itsDecodeCount, 1U);

    call.outputs.dout_alloc = 40;
    EXPECT_EQ(call.run(), 0);
    EXPECT_EQ(call.outputs.dout_size, 40U);
    EXPECT_EQ(count(call.out, "decode=1 siso=0"), 1U);
    EXPECT_EQ(call.bits[40], 0xEE);
}

TEST(Simulate, WarnsOfSaturationFirstThenTracesThenWarnsOfTheTag)
{
    const auto state = create(accept);
    veltra_ip_morvik_v1_0_bitacc_dump_config(state.get(), 1);
    morvik::blocks::Block block = quietBlock(40);
    block.par1[0] = 128;
    Call call(state.get(), block);
    call.tag = 256;
    EXPECT_EQ(call.run(), 0);
    const std::vector<std::size_t> places = {call.out.find("WARNING:decoder:RSC1 parity"),
                                             call.out.find("itsSys [0]=["),
                                             call.out.find("decode=0 siso=0"),
                                             call.out.find("WARNING:decoder:Input block tag")};
    EXPECT_TRUE(std::is_sorted(places.begin(), places.end()));
    EXPECT_NE(places.back(), std::string::npos);
}

TEST(Simulate, ReportsAnExceptionOfTheDecoderAs99)
{
    const auto state = create(accept);
    struct Throwing : TDecoder3G {
        Throwing() : TDecoder3G(false) {}
        bool extract(const std::vector<short>&) override
        {
            throw std::bad_alloc();
        }
    };
    EXPECT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(state.get(), "component"), 0);
    delete state->decoder;
    state->decoder = new Throwing;
    Call call(state.get(), quietBlock(40));
    EXPECT_EQ(call.run(), 99);
    EXPECT_EQ(call.err, "ERROR:decoder:Unhandled exception has occurred\n");
    EXPECT_TRUE(call.outputsUntouched());
}
