// The counting of errors: after each iteration the decisions differ from the sent bits in as many places as those of
// a decode with so many iterations do.
#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "DecoderState.h"
#include "morvik_v1_0_batch.h"
#include "support/Batches.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/ExpectText.h"

namespace {

using morvik::blocks::Batch;
using morvik::blocks::Block;

constexpr std::uint32_t untouched = 0xDEADBEEF;

/// Noisy code blocks, and the bits that they carry, in which 0 stands for 0 and all else for 1.
struct Sent {
    std::vector<Block> received;
    std::vector<std::uint8_t> bits;

    Sent(unsigned count, unsigned K, unsigned seed)
    {
        morvik::blocks::Random random(seed);
        for (unsigned b = 0; b < count; ++b) {
            const std::vector<int> block = morvik::blocks::randomBits(random, K);
            received.push_back(morvik::blocks::encode(block, 10));
            morvik::blocks::addNoise(random, 14.0, received.back());
            for (const int bit : block) {
                bits.push_back(bit == 0 ? std::uint8_t{0} : static_cast<std::uint8_t>(1 + b % 3));
            }
        }
    }
};

/// The errors of decodes with 1, 2, ... iterations, block after block.
std::vector<std::uint32_t> errorsOfDecodes(const Sent& sent, morvik::blocks::Decoder& decoder, unsigned iterations)
{
    std::vector<std::uint32_t> errors;
    std::size_t position = 0;
    for (const Block& block : sent.received) {
        const std::size_t first = position;
        for (unsigned t = 1; t <= iterations; ++t) {
            position = first;
            std::uint32_t wrong = 0;
            for (const std::uint8_t decision : decoder.decode(block, t).bits) {
                wrong += (decision != 0) != (sent.bits[position++] != 0) ? 1U : 0U;
            }
            errors.push_back(wrong);
        }
    }
    return errors;
}

template <class Input>
class ErrorsOf : public testing::Test {
};

using InputTypes = testing::Types<std::int32_t, std::int16_t, std::int8_t>;

}  // namespace

TYPED_TEST_SUITE(ErrorsOf, InputTypes, );

TYPED_TEST(ErrorsOf, BlocksAreThoseOfTheirDecodes)
{
    for (const int algorithm : {0, 1, 2}) {
        for (const auto& [K, count] : std::vector<std::pair<unsigned, unsigned>>{{40, 70}, {512, 5}, {1088, 3}}) {
            const Sent sent(count, K, K);
            morvik::blocks::Decoder single(2, algorithm);
            const std::vector<std::uint32_t> expected = errorsOfDecodes(sent, single, 4);
            EXPECT_GT(expected[0], 0U);
            for (const std::string& set : morvik::blocks::instructionSets()) {
                SCOPED_TRACE("type " + std::to_string(algorithm) + ", K " + std::to_string(K) + ", " + set);
                morvik::blocks::Decoder decoder(2, algorithm);
                ASSERT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), set.c_str()), 0);
                std::vector<std::uint32_t> errors(std::size_t{4} * count + 1, untouched);
                ASSERT_EQ(Batch<TypeParam>(sent.received)
                              .countErrors(decoder.state(), 4, sent.bits.data(), errors.data(), errors.size() - 1),
                          0);
                EXPECT_EQ(errors.back(), untouched);
                errors.pop_back();
                EXPECT_EQ(errors, expected);
                EXPECT_EQ(decoder.state()->decoder->itsDecodeCount, count);
                EXPECT_EQ(decoder.state()->decoder->itsHalfIterationCount, 8 * count);
            }
        }
    }
}

TEST(BatchErrors, AreTracedLikeDecodes)
{
    const Sent sent(2, 128, 1);
    const Batch<std::int32_t> batch(sent.received);
    morvik::blocks::Decoder counting(2, 1);
    morvik::blocks::Decoder decoding(2, 1);
    veltra_ip_morvik_v1_0_bitacc_dump_config(counting.state(), 8);
    veltra_ip_morvik_v1_0_bitacc_dump_config(decoding.state(), 8);
    std::uint32_t errors[4] = {};
    std::string expected;
    {
        const CapturedStreams streams;
        for (const Block& block : sent.received) {
            EXPECT_EQ(decoding.decode(block, 2).status, 0);
        }
        expected = streams.out();
    }
    const CapturedStreams streams;
    EXPECT_EQ(batch.countErrors(counting.state(), 2, sent.bits.data(), errors, 4), 0);
    expectText("trace", expected, streams.out());
    EXPECT_FALSE(expected.empty());
}

TEST(BatchErrors, OfRefusedBatchesLeaveTheArrayAlone)
{
    const Sent sent(2, 40, 1);
    const Batch<std::int8_t> batch(sent.received);
    morvik::blocks::Decoder decoder(2, 1);
    std::vector<std::uint32_t> errors(6, untouched);
    const auto refusal = [&](unsigned iterations, const std::uint8_t* bits, std::uint32_t* to, std::size_t room) {
        const CapturedStreams streams;
        EXPECT_EQ(batch.countErrors(decoder.state(), iterations, bits, to, room), 1);
        return streams.out() + streams.err();
    };
    EXPECT_EQ(refusal(3, nullptr, errors.data(), 6), "ERROR:decoder:Simulate called with null pointer for sent\n");
    EXPECT_EQ(refusal(3, sent.bits.data(), nullptr, 6), "ERROR:decoder:Simulate called with null pointer for errors\n");
    EXPECT_EQ(refusal(3, sent.bits.data(), errors.data(), 5),
              "ERROR:decoder:Insufficient allocated space for errors array\n");
    EXPECT_EQ(refusal(0, sent.bits.data(), errors.data(), 6),
              "ERROR:decoder:Number of iterations must be in the range 1 to 15\n");
    Batch<std::int8_t> unknown = batch;
    unknown.dinSize = 45;
    unknown.count = 1;
    {
        const CapturedStreams streams;
        EXPECT_EQ(unknown.countErrors(decoder.state(), 3, sent.bits.data(), errors.data(), 6), 2);
    }
    EXPECT_EQ(errors, std::vector<std::uint32_t>(6, untouched));
    unknown.count = 0;
    EXPECT_EQ(unknown.countErrors(decoder.state(), 3, sent.bits.data(), errors.data(), 0), 0);
    EXPECT_EQ(batch.countErrors(decoder.state(), 3, sent.bits.data(), errors.data(), 6), 0);
    EXPECT_EQ(batch.countErrors(decoder.state(), 1, sent.bits.data(), errors.data(), 2), 0);
}
