// TransportBlock: tests against another encoder's coded bits, against the clauses word by word, and through the
// decoder.
#include "link/coding/TransportBlock.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <stdexcept>
#include <tuple>

#include "link/coding/SoftValues.h"
#include "morvik_v1_0_batch.h"
#include "support/Blocks.h"
#include "support/LinkVectors.h"
#include "support/PlainLink.h"

namespace {

using morvik::blocks::below;
using morvik::blocks::between;
using morvik::blocks::Random;
using morvik::link::PackedBlocks;
using morvik::link::TransportBlockCode;
using morvik::link::TransportFormat;
using morvik::link::wordsOf;
using Bytes = std::vector<std::uint8_t>;

Bytes randomBits(Random& random, std::size_t count)
{
    Bytes bits(count);
    for (std::uint8_t& bit : bits) {
        bit = below(random, 2) == 0 ? 0 : 1;
    }
    return bits;
}

PackedBlocks packed(const std::vector<Bytes>& blocks)
{
    PackedBlocks rows{wordsOf(blocks.front().size()), {}};
    rows.bits.resize(blocks.size() * rows.words);
    for (unsigned b = 0; b < blocks.size(); ++b) {
        morvik::link::packBits(blocks[b].data(), blocks[b].size(), rows.block(b));
    }
    return rows;
}

std::vector<Bytes> encode(TransportBlockCode& code, unsigned version, const std::vector<Bytes>& blocks)
{
    const auto count = static_cast<unsigned>(blocks.size());
    PackedBlocks buffers;
    PackedBlocks rows;
    code.encode(packed(blocks), count, buffers);
    code.select(buffers, count, version, rows);
    std::vector<Bytes> coded(count, Bytes(code.format().codedBits));
    for (unsigned b = 0; b < count; ++b) {
        morvik::link::unpackBits(rows.block(b), coded[b].size(), coded[b].data());
    }
    return coded;
}

TransportFormat randomFormat(Random& random, unsigned mostBits)
{
    constexpr std::array<unsigned, 5> bitsPerSymbol = {1, 2, 4, 6, 8};
    TransportFormat format{1 + below(random, mostBits), 0, bitsPerSymbol[below(random, 5)], 1 + below(random, 4)};
    const unsigned perSymbol = format.bitsPerSymbol * format.layers;
    const unsigned C = morvik::link::codeBlocksOf(format.bits).count;
    format.codedBits = perSymbol * (C + (format.bits + below(random, 3 * format.bits)) / perSymbol);
    if (below(random, 2) == 0) {
        format.softBufferSize = format.bits + 200 * C + below(random, 3 * format.bits);
    }
    return format;
}

morvik::plain::Format plainFormat(const TransportFormat& format)
{
    const unsigned limit = format.softBufferSize == morvik::link::unlimitedBuffer ? 0 : format.softBufferSize;
    return {format.bits, format.codedBits, format.bitsPerSymbol, format.layers, limit};
}

/// Decodes every code block of a soft buffer; returns whether all CRCs fit.
bool decode(const TransportBlockCode& code, const std::vector<float>& buffer, Bytes& bits)
{
    const morvik::blocks::Decoder decoder(2, 1);
    const std::size_t total = code.blocks().bits + morvik::link::crcBits;
    std::vector<std::uint64_t> row(wordsOf(total));
    bool all = true;
    for (unsigned r = 0; r < code.blocks().count; ++r) {
        const unsigned K = code.blocks().size(r);
        std::vector<std::int8_t> values(code.matching(r).size());
        morvik::link::softValues(&buffer[code.softOffset(r)], values.size(), 8, values.data());
        std::array<std::vector<std::int8_t>, 3> streams;
        for (auto& stream : streams) {
            stream.resize(K + 4);
        }
        code.matching(r).deinterleave(
            values.data(), morvik::link::fillerValue, {streams[0].data(), streams[1].data(), streams[2].data()});
        Bytes decided(K);
        veltra_ip_morvik_v1_0_batch_outputs outputs{};
        outputs.dout = decided.data();
        outputs.dout_alloc = decided.size();
        EXPECT_EQ(veltra_ip_morvik_v1_0_batch_simulate_i8(decoder.state(),
                                                          streams[0].data(),
                                                          streams[1].data(),
                                                          streams[2].data(),
                                                          static_cast<std::int32_t>(K + 4),
                                                          1,
                                                          8,
                                                          nullptr,
                                                          &outputs),
                  0);
        all = code.join(decided.data(), r, row.data()) && all;
    }
    bits.resize(code.blocks().bits);
    morvik::link::unpackBits(row.data(), bits.size(), bits.data());
    return code.fits(row.data()) && all;
}

}  // namespace

TEST(TransportBlockTest, AgreesWithAnotherEncoder)
{
    const std::vector<morvik::blocks::LinkVector> vectors = morvik::blocks::linkVectors();
    EXPECT_GE(vectors.size(), 19U);
    for (const morvik::blocks::LinkVector& vector : vectors) {
        TransportBlockCode code({vector.A, vector.G, vector.Qm});
        const morvik::link::CodeBlocks& blocks = code.blocks();
        EXPECT_EQ(
            (std::array{
                blocks.count, blocks.countPlus, blocks.sizePlus, blocks.countMinus, blocks.sizeMinus, blocks.fillers}),
            vector.segmentation)
            << vector.A;
        EXPECT_EQ(encode(code, vector.rv, {vector.bits}).front(), vector.coded) << vector.A << ' ' << vector.G;
    }
}

TEST(TransportBlockTest, AgreesWithTheClauses)
{
    Random random(1);
    for (unsigned i = 0; i < 60; ++i) {
        TransportBlockCode code(randomFormat(random, i < 50 ? 3000 : 30000));
        std::vector<Bytes> blocks;
        for (unsigned b = 0; b < 1 + i % 3; ++b) {
            blocks.push_back(randomBits(random, code.format().bits));
        }
        for (unsigned version = 0; version < 4; ++version) {
            const std::vector<Bytes> coded = encode(code, version, blocks);
            const std::size_t b = below(random, static_cast<unsigned>(blocks.size()));
            const morvik::plain::Bits plain =
                morvik::plain::encode(plainFormat(code.format()), version, {blocks[b].begin(), blocks[b].end()});
            ASSERT_TRUE(std::equal(coded[b].begin(), coded[b].end(), plain.begin(), plain.end()))
                << code.format().bits << ' ' << code.format().codedBits << ' ' << version;
        }
    }
}

TEST(TransportBlockTest, AddsReceivedValuesWhereTheirBitsCameFrom)
{
    Random random(2);
    for (unsigned i = 0; i < 20; ++i) {
        const TransportBlockCode code(randomFormat(random, 14000));
        std::vector<float> buffer(code.softSize());
        std::vector<std::array<std::vector<float>, 3>> expected(code.blocks().count);
        for (unsigned r = 0; r < expected.size(); ++r) {
            expected[r].fill(std::vector<float>(code.blocks().size(r) + 4));
        }
        for (const unsigned version : {0U, 2U, 3U, 1U}) {
            std::vector<float> received(code.format().codedBits);
            for (float& value : received) {
                value = static_cast<float>(between(random, -1000, 1000));
            }
            code.recover(received.data(), version, buffer.data());
            std::size_t next = 0;
            for (const auto& place : morvik::plain::codedPlaces(plainFormat(code.format()), version)) {
                expected[place.r][place.stream][place.k] += received[next++];
            }
            ASSERT_EQ(next, received.size());
        }
        for (unsigned r = 0; r < expected.size(); ++r) {
            std::array<std::vector<float>, 3> streams;
            streams.fill(std::vector<float>(code.blocks().size(r) + 4));
            code.matching(r).deinterleave(
                &buffer[code.softOffset(r)], 0, {streams[0].data(), streams[1].data(), streams[2].data()});
            ASSERT_EQ(streams, expected[r]) << code.format().bits << ' ' << r;
        }
    }
}

TEST(TransportBlockTest, PlacesValuesOfBitsThatAreSentOnce)
{
    Random random(5);
    std::array<unsigned, 2> seen{};
    for (unsigned i = 0; i < 24; ++i) {
        TransportFormat format = randomFormat(random, 14000);
        format.softBufferSize = morvik::link::unlimitedBuffer;
        if (i % 3 == 0) {  // every bit once, if there is one code block
            format.codedBits = static_cast<unsigned>(TransportBlockCode(format).softSize());
            format.bitsPerSymbol = 1;
            format.layers = 1;
        }
        const TransportBlockCode code(format);
        auto places = morvik::plain::codedPlaces(plainFormat(format), 2);
        const auto key = [](const auto& place) {
            return std::tuple(place.r, place.stream, place.k);
        };
        std::sort(places.begin(), places.end(), [&](const auto& a, const auto& b) { return key(a) < key(b); });
        const bool once = std::adjacent_find(places.begin(), places.end(), [&](const auto& a, const auto& b) {
                              return key(a) == key(b);
                          }) == places.end();
        ASSERT_EQ(code.sendsOnce(), once) << format.bits << ' ' << format.codedBits;
        ++seen[once];
        if (!once) {
            continue;
        }
        std::vector<std::int8_t> received(format.codedBits);
        for (std::int8_t& value : received) {
            value = static_cast<std::int8_t>(between(random, -128, 127));
        }
        const std::vector<float> numbers(received.begin(), received.end());
        std::vector<float> sums(code.softSize());
        code.recover(numbers.data(), 2, sums.data());
        std::vector<std::int8_t> placed(code.softSize(), 77);
        code.place(received.data(), 2, placed.data());
        ASSERT_EQ(std::vector<float>(placed.begin(), placed.end()), sums) << format.bits << ' ' << format.codedBits;
    }
    EXPECT_GT(seen[0], 4U);
    EXPECT_GT(seen[1], 4U);
    // Of two code blocks of one size, the second one alone repeats a bit.
    const auto size = static_cast<unsigned>(TransportBlockCode({6200, 12400, 1}).softSize());
    EXPECT_TRUE(TransportBlockCode({6200, size, 1}).sendsOnce());
    EXPECT_FALSE(TransportBlockCode({6200, size + 1, 1}).sendsOnce());
}

TEST(TransportBlockTest, IsUnderstoodByTheDecoder)
{
    Random random(3);
    for (const TransportFormat& format : {TransportFormat{16, 144, 2},
                                          TransportFormat{41, 150, 2},
                                          TransportFormat{441, 636, 4},
                                          TransportFormat{3755, 4400, 8, 2},
                                          TransportFormat{6121, 13824, 6, 1, 20000},
                                          TransportFormat{12216, 16000, 4}}) {
        TransportBlockCode code(format);
        const Bytes sent = randomBits(random, format.bits);
        std::vector<float> buffer(code.softSize());
        const Bytes coded = encode(code, 0, {sent}).front();
        std::vector<float> received(coded.size());
        std::transform(
            coded.begin(), coded.end(), received.begin(), [](std::uint8_t bit) { return bit != 0 ? 2.0F : -2.0F; });
        code.recover(received.data(), 0, buffer.data());
        Bytes bits;
        EXPECT_TRUE(decode(code, buffer, bits)) << format.bits;
        EXPECT_EQ(bits, sent) << format.bits;
    }
}

TEST(TransportBlockTest, TransmissionsTogetherGiveWhatOneCannot)
{
    Random random(4);
    TransportBlockCode code({2000, 1500, 2});  // more bits than are sent at once
    const Bytes sent = randomBits(random, 2000);
    std::vector<float> buffer(code.softSize());
    Bytes bits;
    for (const unsigned version : {0U, 2U}) {
        const Bytes coded = encode(code, version, {sent}).front();
        std::vector<float> received(coded.size());
        std::transform(
            coded.begin(), coded.end(), received.begin(), [](std::uint8_t bit) { return bit != 0 ? 2.0F : -2.0F; });
        code.recover(received.data(), version, buffer.data());
        EXPECT_EQ(decode(code, buffer, bits), version == 2);
    }
    EXPECT_EQ(bits, sent);
}

TEST(TransportBlockTest, AWrongDecisionFailsTheCrcs)
{
    Random random(5);
    for (const unsigned A : {100U, 10000U}) {
        const TransportBlockCode code({A, 3 * A, 1});
        const std::vector<int> bits = morvik::blocks::randomBits(random, A);
        const std::vector<morvik::plain::Bits> blocks = morvik::plain::codeBlocks(bits);
        std::vector<std::uint64_t> row(wordsOf(A + 24));
        for (unsigned r = 0; r < blocks.size(); ++r) {
            Bytes decisions(blocks[r].begin(), blocks[r].end());
            EXPECT_TRUE(code.join(decisions.data(), r, row.data()));
        }
        EXPECT_TRUE(code.fits(row.data()));
        Bytes decisions(blocks[0].begin(), blocks[0].end());
        decisions[0] ^= 1;
        // A decision on a filler bit counts for nothing, since it is known.
        EXPECT_EQ(code.join(decisions.data(), 0, row.data()), code.blocks().fillers > 0);
        decisions[70] ^= 1;
        EXPECT_FALSE(code.join(decisions.data(), 0, row.data()));
        EXPECT_FALSE(code.fits(row.data()));
    }
}

TEST(TransportBlockTest, RefusesFormatsThatCannotBeSent)
{
    EXPECT_THROW(TransportBlockCode({0, 100, 2}), std::invalid_argument);
    EXPECT_THROW(TransportBlockCode({100, 301, 2}), std::invalid_argument);
    EXPECT_THROW(TransportBlockCode({100, 302, 2, 2}), std::invalid_argument);
    EXPECT_THROW(TransportBlockCode({100, 0, 2}), std::invalid_argument);
    EXPECT_THROW(TransportBlockCode({100, 300, 0}), std::invalid_argument);
    EXPECT_THROW(TransportBlockCode({100, 300, 2, 0}), std::invalid_argument);
    EXPECT_THROW(TransportBlockCode({100, 450, 9}), std::invalid_argument);
    EXPECT_THROW(TransportBlockCode({100, 500, 2, 5}), std::invalid_argument);
    try {
        const TransportBlockCode code({10000, 8, 8});
        FAIL();
    } catch (const std::invalid_argument& refusal) {
        EXPECT_STREQ(refusal.what(), "coded bits are at least 16, a symbol for each code block, not 8");
    }
    EXPECT_NO_THROW(TransportBlockCode({10000, 16, 8}));
    EXPECT_THROW(TransportBlockCode({10000, 16, 8, 1, 2}), std::invalid_argument);
}
