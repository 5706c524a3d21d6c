// TurboEncoder: tests against a plain encoder, another one's blocks, the decoder, and the code's algebra.
#include "link/coding/TurboEncoder.h"

#include <gtest/gtest.h>

#include <array>
#include <cstdlib>
#include <random>
#include <stdexcept>

#include "support/Blocks.h"
#include "support/PlainDecoder.h"
#include "support/SentBlocks.h"

namespace {

using morvik::link::PackedBlocks;
using morvik::link::TurboEncoder;

bool bitAt(const PackedBlocks& blocks, unsigned block, unsigned position)
{
    return (blocks.block(block)[position / 64] >> position % 64 & 1) != 0;
}

PackedBlocks pack(const TurboEncoder& encoder, const std::vector<std::vector<int>>& blocks)
{
    PackedBlocks packed;
    packed.words = encoder.words();
    packed.bits.resize(blocks.size() * packed.words);
    for (unsigned b = 0; b < blocks.size(); ++b) {
        for (unsigned k = 0; k < blocks[b].size(); ++k) {
            packed.block(b)[k / 64] |= static_cast<std::uint64_t>(blocks[b][k]) << k % 64;
        }
    }
    return packed;
}

TurboEncoder::Streams encode(TurboEncoder& encoder, const std::vector<std::vector<int>>& blocks)
{
    TurboEncoder::Streams streams;
    encoder.encode(pack(encoder, blocks), static_cast<unsigned>(blocks.size()), streams);
    return streams;
}

std::vector<std::vector<int>> randomBlocks(morvik::blocks::Random& random, unsigned K, unsigned count)
{
    std::vector<std::vector<int>> made;
    for (unsigned b = 0; b < count; ++b) {
        made.push_back(morvik::blocks::randomBits(random, K));
    }
    return made;
}

/// The state of a constituent encoder, by the generators alone: what it sends for a bit, and where it goes.
struct PlainEncoder {
    std::array<bool, 3> delays{};

    bool step(bool bit)
    {
        const bool fed = bit != (delays[1] != delays[2]);
        const bool parity = fed != (delays[0] != delays[2]);
        delays = {fed, delays[0], delays[1]};
        return parity;
    }
};

/// The twelve tail bits of a block in the order they are sent.
std::array<bool, 12> tailOf(const TurboEncoder::Streams& streams, unsigned block, unsigned K)
{
    std::array<bool, 12> tail{};
    for (unsigned i = 0; i < tail.size(); ++i) {
        tail[i] = bitAt(streams[i % 3], block, K + i / 3);
    }
    return tail;
}

}  // namespace

TEST(TurboEncoder, RefusesWhatIsNoBlockSize)
{
    for (const unsigned K : {0U, 32U, 41U, 520U, 6145U, 6208U}) {
        EXPECT_THROW(TurboEncoder{K}, std::invalid_argument) << K;
    }
}

TEST(TurboEncoder, EncodesAsAPlainEncoderDoesForAllSizes)
{
    morvik::blocks::Random random(1);
    for (const unsigned K : morvik::blocks::blockSizes()) {
        TurboEncoder encoder(K);
        EXPECT_EQ(encoder.words(), (K + 4 + 63) / 64) << K;
        for (const unsigned count : {1U, K % 61 + 2, 64U}) {
            const auto information = randomBlocks(random, K, count);
            const TurboEncoder::Streams streams = encode(encoder, information);
            for (unsigned b = 0; b < count; b += b + 3 < count ? 3 : 1) {
                const morvik::blocks::Block plain = morvik::blocks::encode(information[b], 1);
                for (unsigned k = 0; k < 64 * encoder.words(); ++k) {
                    const auto expected = [k, K](const morvik::blocks::Stream& stream) {
                        return k < K + 4 && stream[k] > 0;
                    };
                    ASSERT_EQ(bitAt(streams[0], b, k), expected(plain.sys)) << K << ' ' << b << ' ' << k;
                    ASSERT_EQ(bitAt(streams[1], b, k), expected(plain.par1)) << K << ' ' << b << ' ' << k;
                    ASSERT_EQ(bitAt(streams[2], b, k), expected(plain.par2)) << K << ' ' << b << ' ' << k;
                }
            }
        }
    }
}

TEST(TurboEncoder, EndsBothTrellisesInStateZero)
{
    morvik::blocks::Random random(2);
    for (const unsigned K : morvik::blocks::blockSizes()) {
        TurboEncoder encoder(K);
        const auto information = randomBlocks(random, K, 2);
        const TurboEncoder::Streams streams = encode(encoder, information);
        const std::vector<unsigned> permutation = morvik::plain::permutation(K);
        for (unsigned b = 0; b < 2; ++b) {
            const std::array<bool, 12> tail = tailOf(streams, b, K);
            for (unsigned constituent = 0; constituent < 2; ++constituent) {
                PlainEncoder walk;
                for (unsigned k = 0; k < K; ++k) {
                    const bool sent = bitAt(streams[0], b, constituent == 0 ? k : permutation[k]);
                    ASSERT_EQ(walk.step(sent), bitAt(streams[1 + constituent], b, k)) << K << ' ' << k;
                }
                for (unsigned step = 0; step < 3; ++step) {
                    const unsigned at = 6 * constituent + 2 * step;
                    ASSERT_EQ(walk.step(tail[at]), tail[at + 1]) << K << ' ' << step;
                }
                EXPECT_EQ(walk.delays, (std::array<bool, 3>{})) << K;
            }
        }
    }
}

TEST(TurboEncoder, TheCodeIsLinear)
{
    morvik::blocks::Random random(3);
    for (const unsigned K : {40U, 48U, 56U, 64U, 120U, 512U, 1504U, 6144U}) {
        TurboEncoder encoder(K);
        // Block 0 is zero, and every third one from 3 on is the sum of the two before.
        auto information = randomBlocks(random, K, 64);
        information[0].assign(K, 0);
        for (unsigned b = 3; b < 64; b += 3) {
            for (unsigned k = 0; k < K; ++k) {
                information[b][k] = information[b - 1][k] ^ information[b - 2][k];
            }
        }
        const TurboEncoder::Streams streams = encode(encoder, information);
        for (const PackedBlocks& stream : streams) {
            for (unsigned w = 0; w < encoder.words(); ++w) {
                EXPECT_EQ(stream.block(0)[w], 0U);
                for (unsigned b = 3; b < 64; b += 3) {
                    ASSERT_EQ(stream.block(b)[w], stream.block(b - 1)[w] ^ stream.block(b - 2)[w]) << K << ' ' << b;
                }
            }
        }
    }
}

TEST(TurboEncoder, ForgetsTheBlocksOfTheCallBefore)
{
    morvik::blocks::Random random(4);
    TurboEncoder encoder(104);
    const auto information = randomBlocks(random, 104, 5);
    const TurboEncoder::Streams first = encode(encoder, information);
    encode(encoder, randomBlocks(random, 104, 64));
    const TurboEncoder::Streams second = encode(encoder, information);
    for (unsigned s = 0; s < 3; ++s) {
        EXPECT_EQ(first[s].bits, second[s].bits);
        EXPECT_EQ(first[s].bits.size(), 5 * encoder.words());
    }
}

// The blocks came through noise: of every hundred values, five to twenty have the wrong sign, but an encoder that
// disagreed would have fifty.
TEST(TurboEncoder, AgreesWithTheBlocksOfAnotherEncoder)
{
    std::array<int, 12> tail{};  // by their place, how far the tail's values lie on the right side
    std::array<int, 12> magnitude{};
    for (const std::string& name : morvik::blocks::sentBlockNames()) {
        for (const morvik::blocks::SentBlock& sent : morvik::blocks::readSentBlocks(name)) {
            std::vector<int> bits;
            for (const char bit : sent.bits) {
                bits.push_back(bit - '0');
            }
            const auto K = static_cast<unsigned>(bits.size());
            TurboEncoder encoder(K);
            const TurboEncoder::Streams streams = encode(encoder, {bits});
            unsigned s = 0;
            for (const morvik::blocks::Stream* soft : {&sent.soft.sys, &sent.soft.par1, &sent.soft.par2}) {
                unsigned wrong = 0;
                for (unsigned k = 0; k < K + 4; ++k) {
                    const int signedValue = bitAt(streams[s], 0, k) ? (*soft)[k] : -(*soft)[k];
                    wrong += signedValue < 0 ? 1U : 0U;
                    if (k >= K) {
                        tail[3 * (k - K) + s] += signedValue;
                        magnitude[3 * (k - K) + s] += std::abs(signedValue);
                    }
                }
                EXPECT_LT(wrong, (K + 4) * 3 / 10) << name << " stream " << s;
                ++s;
            }
        }
    }
    for (unsigned i = 0; i < 12; ++i) {
        EXPECT_GT(tail[i], magnitude[i] / 2) << "tail bit " << i;
    }
}

TEST(TurboEncoder, IsUnderstoodByTheDecoder)
{
    morvik::blocks::Random random(5);
    morvik::blocks::Decoder decoder(4, 1);
    for (const unsigned K : {40U, 512U, 1504U, 6144U}) {
        TurboEncoder encoder(K);
        const auto information = randomBlocks(random, K, 3);
        const TurboEncoder::Streams streams = encode(encoder, information);
        for (unsigned b = 0; b < 3; ++b) {
            morvik::blocks::Block block;
            for (unsigned k = 0; k < K + 4; ++k) {
                block.sys.push_back(bitAt(streams[0], b, k) ? 16 : -16);
                block.par1.push_back(bitAt(streams[1], b, k) ? 16 : -16);
                block.par2.push_back(bitAt(streams[2], b, k) ? 16 : -16);
            }
            const std::vector<std::uint8_t> sent(information[b].begin(), information[b].end());
            EXPECT_EQ(decoder.decode(block, 2).bits, sent) << K;
        }
    }
}
