// The batch interface: a batch gives what the same blocks give one by one, and refuses as a whole.
#include "morvik_v1_0_batch.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <limits>
#include <string>
#include <utility>
#include <vector>

#include "DecoderState.h"
#include "support/Batches.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/ExpectText.h"

namespace {

using morvik::blocks::Batch;
using morvik::blocks::BatchOutputs;
using morvik::blocks::Block;
using morvik::blocks::State;

constexpr std::size_t guards = 5;  // elements after each array that must stay as they are
constexpr std::uint8_t untouchedBit = 0xEE;
constexpr std::int16_t untouchedRatio = 12345;
constexpr std::uint32_t untouchedWord = 0xDEADBEEF;

/// Arrays for a batch, their guards behind them, and the record that names them.
struct Room {
    std::vector<std::uint8_t> bits;
    std::vector<std::int16_t> ratios;
    std::vector<std::uint32_t> tags;
    BatchOutputs outputs{};

    Room(std::size_t count, std::size_t K)
        : bits(count * K + guards, untouchedBit),
          ratios(count * K + guards, untouchedRatio),
          tags(count + guards, untouchedWord)
    {
        outputs.dout = bits.data();
        outputs.dout_alloc = count * K;
        outputs.ratios = ratios.data();
        outputs.ratios_alloc = count * K;
        outputs.tags = tags.data();
        outputs.tags_alloc = count;
        outputs.dout_size = untouchedWord;
    }

    bool untouched() const
    {
        return std::count(bits.begin(), bits.end(), untouchedBit) == std::ptrdiff_t(bits.size()) &&
               std::count(ratios.begin(), ratios.end(), untouchedRatio) == std::ptrdiff_t(ratios.size()) &&
               std::count(tags.begin(), tags.end(), untouchedWord) == std::ptrdiff_t(tags.size()) &&
               outputs.dout_size == untouchedWord;
    }
};

/// The values with their guards.
template <class Value>
std::vector<Value> guarded(std::vector<Value> values, Value guard)
{
    values.insert(values.end(), guards, guard);
    return values;
}

std::vector<Block> someBlocks(unsigned count, unsigned K, unsigned seed)
{
    morvik::blocks::Random random(seed);
    std::vector<Block> some;
    for (unsigned b = 0; b < count; ++b) {
        some.push_back(morvik::blocks::randomBlock(random, K, static_cast<morvik::blocks::Values>(b % 3)));
    }
    return some;
}

std::vector<std::uint32_t> someTags(unsigned count)
{
    std::vector<std::uint32_t> tags;
    for (unsigned b = 0; b < count; ++b) {
        tags.push_back(7 * b + 1);
    }
    return tags;
}

/// What some blocks give, handed over one by one, and all that is written meanwhile.
struct OneByOne {
    std::vector<std::uint8_t> bits;
    std::vector<std::uint32_t> tags;
    std::string out;
    std::string err;

    OneByOne(morvik::blocks::Decoder& decoder,
             const std::vector<Block>& some,
             unsigned iterations,
             const std::vector<std::uint32_t>& withTags)
    {
        const CapturedStreams streams;
        for (std::size_t b = 0; b < some.size(); ++b) {
            const auto result = decoder.decode(some[b], iterations, withTags[b]);
            EXPECT_EQ(result.status, 0);
            bits.insert(bits.end(), result.bits.begin(), result.bits.end());
            tags.push_back(result.tag);
        }
        out = streams.out();
        err = streams.err();
    }
};

/// The warnings and then the error line of a call that returns the status that is expected.
std::string texts(std::int32_t expected, const std::function<std::int32_t()>& call)
{
    const CapturedStreams streams;
    EXPECT_EQ(call(), expected);
    return streams.out() + streams.err();
}

/// The trace of a block's first pass; its header has the counters.
std::string traceOf(morvik::blocks::Decoder& decoder, const Block& block)
{
    const CapturedStreams streams;
    veltra_ip_morvik_v1_0_bitacc_dump_config(decoder.state(), 1);
    EXPECT_EQ(decoder.decode(block, 1).status, 0);
    veltra_ip_morvik_v1_0_bitacc_dump_config(decoder.state(), 0);
    return streams.out();
}

template <class Input>
class BatchOf : public testing::Test {
};

using InputTypes = testing::Types<std::int32_t, std::int16_t, std::int8_t>;

}  // namespace

TYPED_TEST_SUITE(BatchOf, InputTypes, );

TYPED_TEST(BatchOf, BlocksGivesWhatSingleCallsGive)
{
    for (const int algorithm : {0, 1, 2}) {
        morvik::blocks::Decoder batched(4, algorithm);
        morvik::blocks::Decoder single(4, algorithm);
        morvik::blocks::Decoder components(4, algorithm);
        components.decodeByComponents();
        for (const auto& [K, count] :
             std::vector<std::pair<unsigned, unsigned>>{{40, 1}, {40, 33}, {512, 5}, {128, 16}, {2048, 3}, {48, 2}}) {
            SCOPED_TRACE("type " + std::to_string(algorithm) + ", K " + std::to_string(K));
            const std::vector<Block> some = someBlocks(count, K, K);
            const std::vector<std::uint32_t> tags = someTags(count);
            const Batch<TypeParam> batch(some);
            Room room(count, K);
            ASSERT_EQ(batch.simulate(batched.state(), 3, tags.data(), &room.outputs), 0);
            const OneByOne expected(single, some, 3, tags);
            EXPECT_EQ(room.outputs.dout_size, K);
            EXPECT_EQ(room.bits, guarded(expected.bits, untouchedBit));
            EXPECT_EQ(room.tags, guarded(expected.tags, untouchedWord));
            EXPECT_EQ(room.ratios,
                      guarded(decodedOneByOne(components.state(), batch, 3, tags.data()).ratios, untouchedRatio));
        }
        EXPECT_EQ(batched.state()->decoder->itsDecodeCount, 60U);
        EXPECT_EQ(batched.state()->decoder->itsHalfIterationCount, 6 * 60U);
        const Block last = someBlocks(1, 256, 1)[0];
        const std::string trace = traceOf(single, last);
        EXPECT_NE(trace.find("decode=60 "), std::string::npos);
        expectText("trace", trace, traceOf(batched, last));
    }
}

TYPED_TEST(BatchOf, BlocksDeliversOnlyWhatIsWanted)
{
    const std::vector<Block> some = someBlocks(3, 64, 5);
    const Batch<TypeParam> batch(some);
    for (const char* set : {"component", ""}) {
        for (const bool ratios : {false, true}) {
            morvik::blocks::Decoder decoder(2, 1);
            morvik::blocks::Decoder single(2, 1);
            if (*set != '\0') {
                decoder.decodeByComponents();
            }
            Room room(3, 64);
            room.outputs.ratios = ratios ? room.ratios.data() : nullptr;
            room.outputs.tags = ratios ? nullptr : room.tags.data();
            room.outputs.ratios_alloc = ratios ? room.outputs.ratios_alloc : 0;
            room.outputs.tags_alloc = ratios ? 0 : room.outputs.tags_alloc;
            ASSERT_EQ(batch.simulate(decoder.state(), 2, nullptr, &room.outputs), 0);
            EXPECT_EQ(room.bits, guarded(OneByOne(single, some, 2, {0, 0, 0}).bits, untouchedBit));
            EXPECT_EQ(room.ratios[0] == untouchedRatio, !ratios);
            EXPECT_EQ(room.tags, guarded(std::vector<std::uint32_t>(3, ratios ? untouchedWord : 0), untouchedWord));
        }
    }
}

TYPED_TEST(BatchOf, BlocksIsTracedLikeSingleCalls)
{
    const std::vector<Block> some = someBlocks(3, 128, 9);
    for (const unsigned passes : {1U, 4U, 6U, 100U}) {
        morvik::blocks::Decoder batched(2, 2);
        morvik::blocks::Decoder single(2, 2);
        Room room(3, 128);
        veltra_ip_morvik_v1_0_bitacc_dump_config(batched.state(), passes);
        veltra_ip_morvik_v1_0_bitacc_dump_config(single.state(), passes);
        const std::vector<std::uint32_t> tags = {1, 0x100, 0x200};
        const OneByOne expected(single, some, 2, tags);
        const CapturedStreams streams;
        EXPECT_EQ(Batch<TypeParam>(some).simulate(batched.state(), 2, tags.data(), &room.outputs), 0);
        expectText("trace", expected.out, streams.out());
        EXPECT_EQ(streams.err(), expected.err);
        EXPECT_EQ(room.bits, guarded(expected.bits, untouchedBit));
        EXPECT_EQ(room.tags, guarded(expected.tags, untouchedWord));
        EXPECT_FALSE(expected.out.empty());
    }
}

namespace {

constexpr const char* truncation =
    "WARNING:decoder:Input block tag has been truncated to 8 bits, further truncation will not be reported\n";

/// Blocks of small values, one of which has `value` in the given stream and position.
std::vector<Block> blocksWith(unsigned count, unsigned block, unsigned stream, std::size_t position, std::int32_t value)
{
    std::vector<Block> some(
        count, {morvik::blocks::Stream(52, 3), morvik::blocks::Stream(52, -2), morvik::blocks::Stream(52, 1)});
    morvik::blocks::Stream* const streams[] = {&some[block].sys, &some[block].par1, &some[block].par2};
    (*streams[stream])[position] = value;
    return some;
}

}  // namespace

/// Of a saturating value in block i and a tag that is too long in block j.
TEST(BatchWarnings, ComeInTheOrderOfSingleCalls)
{
    constexpr unsigned count = 19;
    for (const unsigned i : {0U, 1U, 9U, 18U}) {
        for (const unsigned j : {0U, 1U, 8U, 9U, 10U, 18U}) {
            for (const std::size_t position : {std::size_t{0}, std::size_t{7}, std::size_t{47}, std::size_t{51}}) {
                const unsigned stream = (i + j) % 3;
                const std::vector<Block> some = blocksWith(count, i, stream, position, j % 2 == 0 ? 128 : -300);
                std::vector<std::uint32_t> tags = someTags(count);
                tags[j] = 0xABCD;
                morvik::blocks::Decoder batched(2, 1);
                morvik::blocks::Decoder single(2, 1);
                const OneByOne expected(single, some, 1, tags);
                const char* const names[] = {"RSC1 systematic", "RSC1 parity", "RSC2 parity"};
                const std::string saturation = std::string("WARNING:decoder:") + names[stream] + " value in position " +
                                               std::to_string(position) + " saturated " +
                                               (j % 2 == 0 ? "positively" : "negatively") +
                                               ", further saturation will not be reported\n";
                ASSERT_EQ(expected.out, j < i ? truncation + saturation : saturation + truncation);
                for (const char* again : {"once", ""}) {
                    Room room(count, 48);
                    const std::string warnings = texts(0, [&] {
                        return Batch<std::int16_t>(some).simulate(batched.state(), 1, tags.data(), &room.outputs);
                    });
                    EXPECT_EQ(warnings, *again != '\0' ? expected.out : "");
                    EXPECT_EQ(room.bits, guarded(expected.bits, untouchedBit));
                    EXPECT_EQ(room.tags, guarded(expected.tags, untouchedWord));
                }
            }
        }
    }
}

TEST(BatchWarnings, TellTheFirstOfManySaturatingValues)
{
    std::vector<Block> some = blocksWith(40, 3, 2, 5, 200);
    some[3].sys[6] = 200;
    some[2].par1[51] = -129;
    some[30].sys[0] = 999;
    for (const bool components : {false, true}) {
        morvik::blocks::Decoder decoder(8, 0);
        if (components) {
            decoder.decodeByComponents();
        }
        Room room(40, 48);
        EXPECT_EQ(
            texts(0, [&] { return Batch<std::int32_t>(some).simulate(decoder.state(), 1, nullptr, &room.outputs); }),
            "WARNING:decoder:RSC1 parity value in position 51 saturated negatively, further saturation will not "
            "be reported\n");
    }
}

/// Of 32 bits, the low 24 count.
TEST(Batch, TakesTheLowBitsOfLongWords)
{
    morvik::blocks::Random random(11);
    std::vector<Block> plain = someBlocks(5, 104, 3);
    std::vector<Block> wrapped = plain;
    for (Block& block : wrapped) {
        for (morvik::blocks::Stream* stream : {&block.sys, &block.par1, &block.par2}) {
            for (std::int32_t& value : *stream) {
                value += morvik::blocks::between(random, -127, 126) * (1 << 24);
            }
        }
    }
    morvik::blocks::Decoder decoder(2, 2);
    Room expected(5, 104);
    Room got(5, 104);
    ASSERT_EQ(Batch<std::int32_t>(plain).simulate(decoder.state(), 2, nullptr, &expected.outputs), 0);
    EXPECT_EQ(
        texts(0, [&] { return Batch<std::int32_t>(wrapped).simulate(decoder.state(), 2, nullptr, &got.outputs); }), "");
    EXPECT_EQ(got.bits, expected.bits);
    EXPECT_EQ(got.ratios, expected.ratios);

    wrapped[4].par2[107] = 0x7F800000;  // -2^23 in 24 bits
    EXPECT_EQ(
        texts(0, [&] { return Batch<std::int32_t>(wrapped).simulate(decoder.state(), 2, nullptr, &got.outputs); }),
        "WARNING:decoder:RSC2 parity value in position 107 saturated negatively, further saturation will not be "
        "reported\n");
}

/// What a short array leaves is what the refusal of its first block leaves, however the state computes.
TEST(Batch, NeedsRoomForEverything)
{
    const std::pair<std::function<void(BatchOutputs&)>, std::string> cases[] = {
        {[](BatchOutputs& outputs) { outputs.dout_alloc -= 1; }, "output"},
        {[](BatchOutputs& outputs) { outputs.dout_alloc = 0; }, "output"},
        {[](BatchOutputs& outputs) { outputs.ratios_alloc -= 1; }, "ratios"},
        {[](BatchOutputs& outputs) { outputs.tags_alloc -= 1; }, "tags"},
        {[](BatchOutputs& outputs) { outputs.ratios_alloc = outputs.tags_alloc = 0; }, "ratios"},
        {[](BatchOutputs& outputs) { outputs.dout_alloc = outputs.ratios_alloc = 0; }, "output"},
    };
    const std::vector<Block> some = blocksWith(9, 0, 0, 1, 128);
    const std::vector<std::uint32_t> tags(9, 0x1FF);
    const Batch<std::int32_t> batch(some);
    for (const auto& [change, array] : cases) {
        morvik::blocks::Decoder lanes(2, 1);
        morvik::blocks::Decoder components(2, 1);
        components.decodeByComponents();
        for (morvik::blocks::Decoder* decoder : {&lanes, &components}) {
            SCOPED_TRACE(array);
            Room room(9, 48);
            change(room.outputs);
            EXPECT_EQ(
                texts(1, [&] { return batch.simulate(decoder->state(), 2, tags.data(), &room.outputs); }),
                "WARNING:decoder:RSC1 systematic value in position 1 saturated positively, further saturation will not "
                "be reported\nERROR:decoder:Insufficient allocated space for " +
                    array + " array\n");
            EXPECT_TRUE(room.untouched());
        }
        expectText("trace", traceOf(components, some[1]), traceOf(lanes, some[1]));
        Room room(9, 48);
        EXPECT_EQ(texts(0, [&] { return batch.simulate(lanes.state(), 2, tags.data(), &room.outputs); }), truncation);
    }
}

TEST(Batch, OfNoBlocksDecodesNothing)
{
    morvik::blocks::Decoder decoder(2, 1);
    Room room(1, 40);
    room.outputs.dout_alloc = room.outputs.ratios_alloc = room.outputs.tags_alloc = 0;
    for (const std::int32_t dinSize : {44, 5, 1}) {
        Batch<std::int32_t> batch(blocksWith(1, 0, 0, 0, 999));
        batch.count = 0;
        batch.dinSize = dinSize;
        EXPECT_EQ(texts(0, [&] { return batch.simulate(decoder.state(), 1, nullptr, &room.outputs); }), "");
        EXPECT_TRUE(room.untouched());
    }
}

TEST(Batch, OfBlocksWithoutBitsGivesNone)
{
    for (const bool components : {false, true}) {
        morvik::blocks::Decoder decoder(2, 1);
        if (components) {
            decoder.decodeByComponents();
        }
        const Batch<std::int8_t> batch(someBlocks(3, 0, 1));
        Room room(3, 0);
        const std::vector<std::uint32_t> tags = someTags(3);
        EXPECT_EQ(texts(0, [&] { return batch.simulate(decoder.state(), 1, tags.data(), &room.outputs); }), "");
        EXPECT_EQ(room.outputs.dout_size, 0U);
        EXPECT_EQ(room.bits, guarded<std::uint8_t>({}, untouchedBit));
        EXPECT_EQ(room.tags, guarded(tags, untouchedWord));
    }
}

/// A refused batch says what its first block says, once.
TEST(Batch, OfABadSizeIsRefusedLikeASingleBlock)
{
    for (const unsigned size : {1U, 3U, 45U, 48U + 4U, 135U, 3000U, 6149U}) {
        morvik::blocks::Decoder batched(8, 1);
        morvik::blocks::Decoder single(8, 1);
        Block block{morvik::blocks::Stream(size, 4), morvik::blocks::Stream(size, -4), morvik::blocks::Stream(size, 2)};
        block.sys[0] = 300;
        const Batch<std::int32_t> batch({block, block, block});
        const std::int32_t status = size == 52 ? 0 : 2;
        const std::string expected = texts(status, [&] { return single.decode(block, 1).status; });
        EXPECT_EQ(expected.substr(0, 47), "WARNING:decoder:RSC1 systematic value in positi");
        Room room(3, size);
        EXPECT_EQ(texts(status, [&] { return batch.simulate(batched.state(), 1, nullptr, &room.outputs); }), expected);
        EXPECT_EQ(room.untouched(), status != 0);
    }
}

TEST(Batch, ReportsBadArgumentsInTheOrderOfTheSingleCall)
{
    morvik::blocks::Decoder decoder(2, 1);
    const std::int32_t value = 1;
    std::uint8_t bit = 0;
    const auto refusal = [](State* state,
                            const std::int32_t* const(&streams)[3],
                            std::int32_t size,
                            unsigned iterations,
                            BatchOutputs* outputs) {
        return texts(
            1, [&] { return morvik::blocks::simulateBatch(state, streams, size, 0, iterations, nullptr, outputs); });
    };
    BatchOutputs outputs{};
    const auto line = [](const std::string& text) {
        return "ERROR:decoder:" + text + "\n";
    };
    State* const state = decoder.state();
    EXPECT_EQ(refusal(nullptr, {nullptr, nullptr, nullptr}, 0, 0, nullptr),
              line("Simulate called with null state structure"));
    EXPECT_EQ(refusal(state, {nullptr, nullptr, nullptr}, 0, 0, nullptr),
              line("Simulate called with null output structure"));
    EXPECT_EQ(refusal(state, {nullptr, nullptr, nullptr}, 0, 0, &outputs),
              line("Simulate called with null pointer for dout"));
    outputs.dout = &bit;
    for (const std::int32_t size : {0, -1, std::numeric_limits<std::int32_t>::min()}) {
        EXPECT_EQ(refusal(state, {nullptr, nullptr, nullptr}, size, 0, &outputs),
                  line("din_size must be a positive integer"));
    }
    EXPECT_EQ(refusal(state, {nullptr, nullptr, nullptr}, 44, 0, &outputs),
              line("rsc1_sys must not be a null pointer"));
    EXPECT_EQ(refusal(state, {&value, nullptr, nullptr}, 44, 0, &outputs), line("rsc1_par must not be a null pointer"));
    EXPECT_EQ(refusal(state, {&value, &value, nullptr}, 44, 0, &outputs), line("rsc2_par must not be a null pointer"));
    for (const unsigned iterations : {0U, 16U, 0xFFFFFFFFU}) {
        EXPECT_EQ(refusal(state, {&value, &value, &value}, 44, iterations, &outputs),
                  line("Number of iterations must be in the range 1 to 15"));
    }
}

TEST(Batch, AlternatesWithSingleCallsOfAnySize)
{
    morvik::blocks::Random random(21);
    const std::vector<unsigned> sizes = morvik::blocks::blockSizes();
    morvik::blocks::Decoder mixed(8, 2);
    morvik::blocks::Decoder components(8, 2);
    components.decodeByComponents();
    for (unsigned call = 0; call < 60; ++call) {
        const unsigned K = sizes[random() % 70];
        const auto count = static_cast<unsigned>(morvik::blocks::between(random, 1, 12));
        const std::vector<Block> some = someBlocks(count, K, call);
        const std::vector<std::uint32_t> tags = someTags(count);
        const OneByOne expected(components, some, 2, tags);
        if (call % 3 == 0) {
            EXPECT_EQ(OneByOne(mixed, some, 2, tags).bits, expected.bits);
            continue;
        }
        Room room(count, K);
        ASSERT_EQ((call % 3 == 1 ? Batch<std::int8_t>(some).simulate(mixed.state(), 2, tags.data(), &room.outputs)
                                 : Batch<std::int32_t>(some).simulate(mixed.state(), 2, tags.data(), &room.outputs)),
                  0);
        EXPECT_EQ(room.bits, guarded(expected.bits, untouchedBit));
        EXPECT_EQ(room.tags, guarded(expected.tags, untouchedWord));
    }
}

TEST(InstructionSet, IsTheBestOneUntilAnotherIsChosen)
{
    const std::vector<std::string> sets = morvik::blocks::instructionSets();
    ASSERT_GE(sets.size(), 2U);
    morvik::blocks::Decoder decoder(2, 0);
    EXPECT_EQ(veltra_ip_morvik_v1_0_get_instruction_set(decoder.state()), sets[0]);
    for (const std::string& set : sets) {
        EXPECT_EQ(texts(0, [&] { return veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), set.c_str()); }),
                  "");
        EXPECT_EQ(veltra_ip_morvik_v1_0_get_instruction_set(decoder.state()), set);
    }
}

TEST(InstructionSet, OfAnotherNameIsRefusedAndChangesNothing)
{
    const std::vector<std::string> sets = morvik::blocks::instructionSets();
    std::string list;
    for (const std::string& set : sets) {
        list += (list.empty() ? "" : ", ") + set;
    }
    morvik::blocks::Decoder decoder(2, 0);
    for (const char* before : {sets[0].c_str(), "generic", "component"}) {
        ASSERT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), before), 0);
        for (const char* name : {"", "AVX2", "generic ", "mmx", "components"}) {
            EXPECT_EQ(texts(1, [&] { return veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), name); }),
                      std::string("ERROR:decoder:Instruction set '") + name + "' is not one of " + list + "\n");
        }
        EXPECT_EQ(texts(1, [&] { return veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), nullptr); }),
                  "ERROR:decoder:Instruction set '' is not one of " + list + "\n");
        EXPECT_STREQ(veltra_ip_morvik_v1_0_get_instruction_set(decoder.state()), before);
    }
}

TEST(InstructionSet, OfNoStateIsRefused)
{
    EXPECT_EQ(texts(1, [] { return veltra_ip_morvik_v1_0_set_instruction_set(nullptr, "generic"); }),
              "ERROR:decoder:set_instruction_set called with null state structure\n");
    EXPECT_EQ(texts(0, [] { return veltra_ip_morvik_v1_0_get_instruction_set(nullptr) == nullptr ? 0 : 1; }),
              "ERROR:decoder:get_instruction_set called with null state structure\n");
}

/// A record that a test bench fills with components of its own has no other way to decode.
TEST(InstructionSet, OfAnEmptyRecordIsThatOfTheComponents)
{
    State* const state = create_default_state(veltra_ip_morvik_v1_0_get_default_generics());
    EXPECT_STREQ(veltra_ip_morvik_v1_0_get_instruction_set(state), "component");
    EXPECT_EQ(texts(1, [&] { return veltra_ip_morvik_v1_0_set_instruction_set(state, "generic"); }),
              "ERROR:decoder:Instruction set 'generic' is not one of component\n");
    EXPECT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(state, "component"), 0);
    veltra_ip_morvik_v1_0_destroy_state(state);
}
