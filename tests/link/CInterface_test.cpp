// CInterface: tests of include/morvik_link.h on the shared library: a chain in its functions, and what each refuses.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>
#include <set>
#include <string>
#include <vector>

#include "morvik_link.h"
#include "morvik_v1_0_batch.h"
#include "morvik_v1_0_version.h"
#include "support/Blocks.h"
#include "support/LinkVectors.h"

namespace {

using Bytes = std::vector<std::uint8_t>;
using Floats = std::vector<float>;
using morvik::blocks::below;
using morvik::blocks::Random;

Bytes randomBits(Random& random, std::size_t count)
{
    Bytes bits(count);
    for (std::uint8_t& bit : bits) {
        bit = static_cast<std::uint8_t>(below(random, 2));
    }
    return bits;
}

/// Owns a transmitter and receiver.
class Transport {
public:
    explicit Transport(const morvik_link_format& format)
    {
        EXPECT_EQ(morvik_link_transport_create(&format, &itsTransport), MORVIK_LINK_OK);
    }

    ~Transport()
    {
        morvik_link_transport_destroy(itsTransport);
    }

    Transport(const Transport&) = delete;
    Transport& operator=(const Transport&) = delete;

    morvik_link_transport* get() const
    {
        return itsTransport;
    }

    morvik_link_places places(std::uint32_t r) const
    {
        morvik_link_places made{};
        EXPECT_EQ(morvik_link_transport_code_block(itsTransport, r, &made), MORVIK_LINK_OK);
        return made;
    }

private:
    morvik_link_transport* itsTransport = nullptr;
};

struct Streams {
    std::vector<std::int8_t> sys;
    std::vector<std::int8_t> par1;
    std::vector<std::int8_t> par2;

    explicit Streams(std::size_t size) : sys(size), par1(size), par2(size) {}
};

Bytes decode(const Streams& streams, std::uint32_t K)
{
    const morvik::blocks::Decoder decoder(2, 1);
    const auto blocks = static_cast<std::uint32_t>(streams.sys.size() / (K + 4));
    Bytes decided(std::size_t{blocks} * K);
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    outputs.dout = decided.data();
    outputs.dout_alloc = decided.size();
    EXPECT_EQ(veltra_ip_morvik_v1_0_batch_simulate_i8(decoder.state(),
                                                      streams.sys.data(),
                                                      streams.par1.data(),
                                                      streams.par2.data(),
                                                      static_cast<std::int32_t>(K + 4),
                                                      blocks,
                                                      8,
                                                      nullptr,
                                                      &outputs),
              0);
    return decided;
}

}  // namespace

TEST(LinkInterfaceTest, AgreesWithAnotherEncoder)
{
    for (const morvik::blocks::LinkVector& vector : morvik::blocks::linkVectors()) {
        const Transport transport({vector.A, vector.G, vector.Qm, 1, 0});
        Bytes coded(vector.G);
        EXPECT_EQ(morvik_link_transport_encode(transport.get(), vector.rv, 1, vector.bits.data(), coded.data()), 0);
        EXPECT_EQ(coded, vector.coded);
        morvik_link_code_blocks blocks{};
        EXPECT_EQ(morvik_link_segment(vector.A, &blocks), MORVIK_LINK_OK);
        EXPECT_EQ((std::array{blocks.count,
                              blocks.count_plus,
                              blocks.size_plus,
                              blocks.count_minus,
                              blocks.size_minus,
                              blocks.fillers}),
                  vector.segmentation);
    }
}

TEST(LinkInterfaceTest, StepsGiveWhatWholeTransportBlocksGive)
{
    Random random(1);
    const Transport transport({441, 636, 4, 1, 700});
    const Bytes sent = randomBits(random, 3 * 441);
    Bytes coded(std::size_t{3} * 636);
    ASSERT_EQ(morvik_link_transport_encode(transport.get(), 3, 3, sent.data(), coded.data()), MORVIK_LINK_OK);
    const morvik_link_places places = transport.places(0);
    ASSERT_EQ(places.size, 472U);
    ASSERT_EQ(places.fillers, 7U);
    Bytes blocks;
    for (unsigned b = 0; b < 3; ++b) {
        const std::uint8_t* const own = &sent[std::size_t{b} * 441];
        Bytes parity(24);
        ASSERT_EQ(morvik_link_crc24a(own, 441, parity.data()), MORVIK_LINK_OK);
        blocks.insert(blocks.end(), 7, 0);
        blocks.insert(blocks.end(), own, own + 441);
        blocks.insert(blocks.end(), parity.begin(), parity.end());
    }
    Bytes sys(std::size_t{3} * 476);
    Bytes par1(sys.size());
    Bytes par2(sys.size());
    ASSERT_EQ(morvik_link_turbo_encode(472, 3, blocks.data(), sys.data(), par1.data(), par2.data()), 0);
    Bytes matched(coded.size());
    ASSERT_EQ(morvik_link_rate_match(472, 7, 700, 3, 3, sys.data(), par1.data(), par2.data(), 636, matched.data()),
              MORVIK_LINK_OK);
    EXPECT_EQ(matched, coded);
    std::uint32_t size = 0;
    ASSERT_EQ(morvik_link_soft_buffer_size(472, 7, 700, &size), MORVIK_LINK_OK);
    EXPECT_EQ(size, places.buffer_size);
    EXPECT_EQ(size, morvik_link_transport_buffer_size(transport.get()));
}

TEST(LinkInterfaceTest, AChainInItsFunctionsReceivesWhatWasSent)
{
    Random random(2);
    const morvik_link_format format = {7000, 12000, 6, 2, 0};
    const Transport transport(format);
    constexpr std::size_t blocks = 2;
    const Bytes sent = randomBits(random, blocks * format.transport_block_size);
    Floats buffers(blocks * morvik_link_transport_buffer_size(transport.get()));
    for (const std::uint32_t version : {0U, 2U}) {
        Bytes coded(blocks * format.coded_bits);
        ASSERT_EQ(morvik_link_transport_encode(transport.get(), version, blocks, sent.data(), coded.data()), 0);
        Floats symbols(coded.size() / 3);
        ASSERT_EQ(morvik_link_map(6, coded.data(), symbols.size() / 2, symbols.data()), MORVIK_LINK_OK);
        Floats ratios(coded.size());
        ASSERT_EQ(
            morvik_link_demap(6, MORVIK_LINK_EXACT, symbols.data(), nullptr, 0.05F, symbols.size() / 2, ratios.data()),
            MORVIK_LINK_OK);
        ASSERT_EQ(morvik_link_transport_recover(transport.get(), version, blocks, ratios.data(), buffers.data()), 0);
    }
    Bytes received(blocks * (format.transport_block_size + 24), 9);
    for (std::uint32_t r = 0; r < 2; ++r) {
        const std::uint32_t K = transport.places(r).size;
        Streams streams(blocks * (K + 4));
        ASSERT_EQ(morvik_link_transport_soft_values(transport.get(),
                                                    r,
                                                    blocks,
                                                    buffers.data(),
                                                    2,
                                                    streams.sys.data(),
                                                    streams.par1.data(),
                                                    streams.par2.data()),
                  MORVIK_LINK_OK);
        Bytes fits(blocks);
        ASSERT_EQ(morvik_link_transport_join(
                      transport.get(), r, blocks, decode(streams, K).data(), received.data(), fits.data()),
                  MORVIK_LINK_OK);
        EXPECT_EQ(fits, (Bytes{1, 1}));
    }
    Bytes fits(blocks);
    ASSERT_EQ(morvik_link_transport_check(transport.get(), blocks, received.data(), fits.data()), MORVIK_LINK_OK);
    EXPECT_EQ(fits, (Bytes{1, 1}));
    for (std::size_t b = 0; b < blocks; ++b) {
        EXPECT_TRUE(std::equal(sent.begin() + static_cast<std::ptrdiff_t>(b * 7000),
                               sent.begin() + static_cast<std::ptrdiff_t>(b * 7000 + 7000),
                               received.begin() + static_cast<std::ptrdiff_t>(b * 7024)));
    }
}

TEST(LinkInterfaceTest, SoftBuffersOfWholeStepsGiveTheirValues)
{
    Random random(3);
    const Transport transport({441, 636, 4, 1, 0});
    const morvik_link_places places = transport.places(0);
    Floats ratios(636);
    for (float& ratio : ratios) {
        ratio = static_cast<float>(morvik::blocks::between(random, -30, 30)) / 4;
    }
    std::vector<std::int16_t> steps(636);
    ASSERT_EQ(morvik_link_soft_values_i16(ratios.data(), 636, 4, 6, steps.data()), MORVIK_LINK_OK);
    EXPECT_EQ(*std::max_element(steps.begin(), steps.end()), 30);
    std::vector<std::int16_t> sums(places.buffer_size);
    Floats plain(places.buffer_size);
    ASSERT_EQ(morvik_link_transport_recover_i16(transport.get(), 1, 1, steps.data(), 6, sums.data()), 0);
    ASSERT_EQ(morvik_link_transport_recover(transport.get(), 1, 1, ratios.data(), plain.data()), 0);
    Streams fromSteps(places.size + 4);
    ASSERT_EQ(
        morvik_link_transport_soft_values_i16(
            transport.get(), 0, 1, sums.data(), fromSteps.sys.data(), fromSteps.par1.data(), fromSteps.par2.data()),
        MORVIK_LINK_OK);
    Streams fromRatios(places.size + 4);
    ASSERT_EQ(morvik_link_transport_soft_values(transport.get(),
                                                0,
                                                1,
                                                plain.data(),
                                                4,
                                                fromRatios.sys.data(),
                                                fromRatios.par1.data(),
                                                fromRatios.par2.data()),
              MORVIK_LINK_OK);
    EXPECT_EQ(fromSteps.sys, fromRatios.sys);
    EXPECT_EQ(fromSteps.par2, fromRatios.par2);
    EXPECT_EQ(fromSteps.par1[6], -128);
    // The same by single steps.
    std::vector<std::int8_t> values(plain.size());
    ASSERT_EQ(morvik_link_soft_values(plain.data(), plain.size(), 4, values.data()), MORVIK_LINK_OK);
    Streams bySteps(places.size + 4);
    ASSERT_EQ(morvik_link_deinterleave_i8(
                  472, 7, 0, 1, values.data(), -128, bySteps.sys.data(), bySteps.par1.data(), bySteps.par2.data()),
              MORVIK_LINK_OK);
    EXPECT_EQ(bySteps.sys, fromRatios.sys);
    EXPECT_EQ(bySteps.par1, fromRatios.par1);
    EXPECT_EQ(bySteps.par2, fromRatios.par2);
}

/// The sum of values, each times its place from 1 on.
template <class Value>
std::int64_t weighted(const std::vector<Value>& values)
{
    std::int64_t sum = 0;
    for (std::size_t i = 0; i < values.size(); ++i) {
        sum += static_cast<std::int64_t>(i + 1) * values[i];
    }
    return sum;
}

// The tests of the Python package and of the Octave functions expect the same numbers.
TEST(LinkInterfaceTest, SoftBuffersOfSixBitsHoldTheSameNumbersInEachLanguage)
{
    const Transport transport({7000, 9000, 4, 1, 16000});
    std::vector<std::int16_t> buffers(morvik_link_transport_buffer_size(transport.get()));
    std::vector<std::int16_t> steps(9000);
    Floats ratios(9000);
    for (const std::uint32_t t : {0U, 1U, 2U}) {
        for (std::uint32_t i = 0; i < 9000; ++i) {
            ratios[i] = (static_cast<float>((7919 * i + 31 * t) % 1021) - 510) / 16;
        }
        ASSERT_EQ(morvik_link_soft_values_i16(ratios.data(), 9000, 1, 6, steps.data()), MORVIK_LINK_OK);
        ASSERT_EQ(
            morvik_link_transport_recover_i16(transport.get(), t == 1 ? 2 : 0, 1, steps.data(), 6, buffers.data()),
            MORVIK_LINK_OK);
    }
    EXPECT_EQ(buffers.size(), 15817U);
    EXPECT_EQ(*std::min_element(buffers.begin(), buffers.end()), -32);
    EXPECT_EQ(*std::max_element(buffers.begin(), buffers.end()), 31);
    EXPECT_EQ(weighted(buffers), -14906593);
    const std::array<std::array<std::int64_t, 3>, 2> expected = {
        {{-1142900, -603343, -15771}, {-3348177, 776852, -132104}}};
    for (std::uint32_t r = 0; r < expected.size(); ++r) {
        Streams streams(transport.places(r).size + 4);
        ASSERT_EQ(
            morvik_link_transport_soft_values_i16(
                transport.get(), r, 1, buffers.data(), streams.sys.data(), streams.par1.data(), streams.par2.data()),
            MORVIK_LINK_OK);
        EXPECT_EQ(weighted(streams.sys), expected[r][0]);
        EXPECT_EQ(weighted(streams.par1), expected[r][1]);
        EXPECT_EQ(weighted(streams.par2), expected[r][2]);
    }
}

TEST(LinkInterfaceTest, RecoversInFloatsAndInSteps)
{
    std::uint32_t size = 0;
    ASSERT_EQ(morvik_link_soft_buffer_size(40, 0, 0, &size), MORVIK_LINK_OK);
    ASSERT_EQ(size, 132U);
    Floats buffer(size);
    const Floats ratios(2 * size, 1.5F);
    ASSERT_EQ(morvik_link_rate_recover(40, 0, 0, 2, 1, ratios.data(), ratios.size(), buffer.data()), MORVIK_LINK_OK);
    EXPECT_EQ(buffer, Floats(size, 3));
    std::vector<std::int16_t> sums(size);
    const std::vector<std::int16_t> steps(2 * size, 30);
    ASSERT_EQ(morvik_link_rate_recover_i16(40, 0, 0, 2, 1, steps.data(), steps.size(), 6, sums.data()), 0);
    EXPECT_EQ(sums, std::vector<std::int16_t>(size, 31));
    Floats sys(44);
    Floats par1(44);
    Floats par2(44);
    ASSERT_EQ(morvik_link_deinterleave(40, 0, 0, 1, buffer.data(), 0, sys.data(), par1.data(), par2.data()),
              MORVIK_LINK_OK);
    EXPECT_EQ(sys, Floats(44, 3));
    EXPECT_EQ(par2, Floats(44, 3));
}

TEST(LinkInterfaceTest, RefusesFormats)
{
    morvik_link_transport* made = nullptr;
    const auto create = [&made](const morvik_link_format& format) {
        return morvik_link_transport_create(&format, &made);
    };
    EXPECT_EQ(create({0, 100, 2, 1, 0}), MORVIK_LINK_TRANSPORT_BLOCK_SIZE);
    EXPECT_EQ(create({(1U << 24) + 1, 100, 2, 1, 0}), MORVIK_LINK_TRANSPORT_BLOCK_SIZE);
    EXPECT_EQ(create({100, 300, 3, 1, 0}), MORVIK_LINK_BITS_PER_SYMBOL);
    EXPECT_EQ(create({100, 300, 0, 1, 0}), MORVIK_LINK_BITS_PER_SYMBOL);
    EXPECT_EQ(create({100, 300, 10, 1, 0}), MORVIK_LINK_BITS_PER_SYMBOL);
    EXPECT_EQ(create({100, 300, 2, 0, 0}), MORVIK_LINK_LAYERS);
    EXPECT_EQ(create({100, 300, 2, 5, 0}), MORVIK_LINK_LAYERS);
    EXPECT_EQ(create({100, 302, 4, 1, 0}), MORVIK_LINK_CODED_BITS);
    EXPECT_EQ(create({7000, 8, 8, 1, 0}), MORVIK_LINK_CODED_BITS);
    EXPECT_EQ(create({7000, 16, 8, 1, 1}), MORVIK_LINK_BUFFER_SIZE);
    EXPECT_EQ(morvik_link_transport_create(nullptr, &made), MORVIK_LINK_NULL_POINTER);
    EXPECT_EQ(made, nullptr);
    morvik_link_transport_destroy(nullptr);
    EXPECT_EQ(morvik_link_transport_buffer_size(nullptr), 0U);
}

TEST(LinkInterfaceTest, RefusesArgumentsOfTransportBlocks)
{
    const Transport transport({100, 300, 2, 1, 0});
    morvik_link_transport* const own = transport.get();
    Bytes bits(500);
    Floats floats(500);
    std::vector<std::int16_t> steps(500);
    Streams s(500);
    std::int8_t* const values = s.sys.data();
    morvik_link_places places{};
    EXPECT_EQ(morvik_link_transport_code_block(own, 1, &places), MORVIK_LINK_CODE_BLOCK);
    EXPECT_EQ(morvik_link_transport_code_block(nullptr, 1, &places), MORVIK_LINK_NULL_POINTER);
    EXPECT_EQ(morvik_link_transport_encode(own, 4, 1, bits.data(), bits.data()), MORVIK_LINK_REDUNDANCY_VERSION);
    EXPECT_EQ(morvik_link_transport_encode(own, 0, 1, nullptr, bits.data()), MORVIK_LINK_NULL_POINTER);
    EXPECT_EQ(morvik_link_transport_recover(own, 4, 1, floats.data(), floats.data()), MORVIK_LINK_REDUNDANCY_VERSION);
    EXPECT_EQ(morvik_link_transport_recover_i16(own, 0, 1, steps.data(), 17, steps.data()), MORVIK_LINK_WIDTH);
    EXPECT_EQ(morvik_link_transport_soft_values(own, 1, 1, floats.data(), 1, values, values, values),
              MORVIK_LINK_CODE_BLOCK);
    EXPECT_EQ(morvik_link_transport_soft_values(own, 0, 1, floats.data(), 0, values, values, values),
              MORVIK_LINK_SCALE);
    EXPECT_EQ(morvik_link_transport_soft_values_i16(own, 1, 1, steps.data(), values, values, values),
              MORVIK_LINK_CODE_BLOCK);
    EXPECT_EQ(morvik_link_transport_join(own, 1, 1, bits.data(), bits.data(), nullptr), MORVIK_LINK_CODE_BLOCK);
    EXPECT_EQ(morvik_link_transport_check(own, 1, nullptr, bits.data()), MORVIK_LINK_NULL_POINTER);
}

TEST(LinkInterfaceTest, RefusesArgumentsOfSteps)
{
    Bytes bits(500);
    std::uint8_t* const b = bits.data();
    Floats floats(500);
    float* const f = floats.data();
    std::vector<std::int16_t> steps(500);
    std::vector<std::int8_t> values(500);
    std::uint32_t size = 7;
    morvik_link_code_blocks blocks{};
    EXPECT_EQ(morvik_link_crc24a(nullptr, 1, b), MORVIK_LINK_NULL_POINTER);
    EXPECT_EQ(morvik_link_crc24b(b, 1, nullptr), MORVIK_LINK_NULL_POINTER);
    EXPECT_EQ(morvik_link_segment(0, &blocks), MORVIK_LINK_TRANSPORT_BLOCK_SIZE);
    EXPECT_EQ(morvik_link_turbo_encode(41, 1, b, b, b, b), MORVIK_LINK_BLOCK_SIZE);
    EXPECT_EQ(morvik_link_rate_match(41, 0, 0, 0, 1, b, b, b, 10, b), MORVIK_LINK_BLOCK_SIZE);
    EXPECT_EQ(morvik_link_rate_match(40, 40, 0, 0, 1, b, b, b, 10, b), MORVIK_LINK_FILLERS);
    EXPECT_EQ(morvik_link_rate_match(40, 0, 1, 0, 1, b, b, b, 10, b), MORVIK_LINK_BUFFER_SIZE);
    EXPECT_EQ(morvik_link_rate_match(40, 0, 0, 4, 1, b, b, b, 10, b), MORVIK_LINK_REDUNDANCY_VERSION);
    EXPECT_EQ(morvik_link_soft_buffer_size(40, 0, 1, &size), MORVIK_LINK_BUFFER_SIZE);
    EXPECT_EQ(size, 7U);
    EXPECT_EQ(morvik_link_rate_recover(40, 0, 0, 4, 1, f, 10, f), MORVIK_LINK_REDUNDANCY_VERSION);
    EXPECT_EQ(morvik_link_rate_recover_i16(40, 0, 0, 0, 1, steps.data(), 10, 1, steps.data()), MORVIK_LINK_WIDTH);
    EXPECT_EQ(morvik_link_deinterleave(42, 0, 0, 1, f, 0, f, f, f), MORVIK_LINK_BLOCK_SIZE);
    EXPECT_EQ(morvik_link_deinterleave_i8(40, 0, 0, 1, nullptr, 0, nullptr, nullptr, nullptr),
              MORVIK_LINK_NULL_POINTER);
    EXPECT_EQ(morvik_link_soft_values(f, 1, -1, values.data()), MORVIK_LINK_SCALE);
    EXPECT_EQ(morvik_link_soft_values_i16(f, 1, std::numeric_limits<float>::infinity(), 8, steps.data()),
              MORVIK_LINK_SCALE);
    EXPECT_EQ(morvik_link_map(3, b, 1, f), MORVIK_LINK_BITS_PER_SYMBOL);
    EXPECT_EQ(morvik_link_demap(2, 2, f, nullptr, 1, 1, f), MORVIK_LINK_DEMAPPER);
    EXPECT_EQ(morvik_link_demap(2, 0, f, nullptr, 0, 1, f), MORVIK_LINK_NOISE_VARIANCE);
    EXPECT_EQ(morvik_link_demap(2, 0, f, nullptr, std::numeric_limits<float>::quiet_NaN(), 1, f),
              MORVIK_LINK_NOISE_VARIANCE);
}

TEST(LinkInterfaceTest, NothingIsDoneForNoBlocks)
{
    constexpr std::size_t huge = std::numeric_limits<std::size_t>::max() / 2 + 1;
    std::uint8_t* const none = nullptr;
    float* const f = nullptr;
    std::int16_t* const steps = nullptr;
    std::int8_t* const v = nullptr;
    Bytes parity(24, 7);
    for (const auto crc : {morvik_link_crc24a, morvik_link_crc24b}) {
        EXPECT_EQ(crc(none, 0, parity.data()), MORVIK_LINK_OK);
        EXPECT_EQ(parity, Bytes(24, 0));
        EXPECT_EQ(crc(none, 0, none), MORVIK_LINK_NULL_POINTER);
    }
    EXPECT_EQ(morvik_link_turbo_encode(40, 0, none, none, none, none), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_rate_match(40, 0, 0, 0, 0, none, none, none, huge, none), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_rate_match(40, 0, 1, 0, 0, none, none, none, 1, none), MORVIK_LINK_BUFFER_SIZE);
    EXPECT_EQ(morvik_link_rate_recover(40, 0, 0, 0, 0, f, huge, f), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_rate_recover(40, 0, 0, 4, 0, f, huge, f), MORVIK_LINK_REDUNDANCY_VERSION);
    EXPECT_EQ(morvik_link_rate_recover(40, 0, 0, 0, 1, f, huge, f), MORVIK_LINK_NULL_POINTER);
    EXPECT_EQ(morvik_link_rate_recover_i16(40, 0, 0, 0, 0, steps, huge, 6, steps), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_deinterleave(40, 0, 0, 0, f, 0, f, f, f), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_deinterleave_i8(40, 0, 0, 0, v, 0, v, v, v), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_soft_values(f, 0, 1, v), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_soft_values_i16(f, 0, 1, 6, steps), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_map(6, none, 0, f), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_demap(6, MORVIK_LINK_EXACT, f, f, 1, 0, f), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_demap(6, MORVIK_LINK_EXACT, f, f, 0, 0, f), MORVIK_LINK_NOISE_VARIANCE);
    const Transport transport({7000, 14000, 2, 1, 0});
    EXPECT_EQ(morvik_link_transport_encode(transport.get(), 0, 0, none, none), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_transport_recover(transport.get(), 0, 0, f, f), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_transport_recover_i16(transport.get(), 0, 0, steps, 6, steps), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_transport_soft_values(transport.get(), 1, 0, f, 1, v, v, v), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_transport_soft_values_i16(transport.get(), 1, 0, steps, v, v, v), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_transport_join(transport.get(), 1, 0, none, none, none), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_transport_check(transport.get(), 0, none, none), MORVIK_LINK_OK);
    EXPECT_EQ(morvik_link_transport_check(nullptr, 0, none, none), MORVIK_LINK_NULL_POINTER);
}

TEST(LinkInterfaceTest, RatiosAreFinite)
{
    for (const std::uint32_t bits : {1U, 2U, 4U, 6U, 8U}) {
        for (const std::int32_t demapper : {MORVIK_LINK_MAX_LOG, MORVIK_LINK_EXACT}) {
            const Floats symbols = {0, 0.7F, -3e38F, 3e38F};
            Floats ratios(4 / (bits == 1 ? 1U : 2U) * bits);
            for (const float variance : {1e-45F, 1e-38F, 1.0F}) {
                ASSERT_EQ(morvik_link_demap(
                              bits, demapper, symbols.data(), nullptr, variance, ratios.size() / bits, ratios.data()),
                          MORVIK_LINK_OK);
                EXPECT_TRUE(std::all_of(ratios.begin(), ratios.end(), [](float ratio) { return std::isfinite(ratio); }))
                    << bits << ' ' << demapper << ' ' << variance;
            }
        }
    }
}

TEST(LinkInterfaceTest, EveryStatusHasItsText)
{
    std::set<std::string> texts;
    for (std::int32_t status = MORVIK_LINK_OK; status <= MORVIK_LINK_WIDTH; ++status) {
        texts.insert(morvik_link_status_text(status));
    }
    texts.insert(morvik_link_status_text(MORVIK_LINK_OUT_OF_MEMORY));
    EXPECT_EQ(texts.size(), 16U);
    for (const std::int32_t status : {-1, MORVIK_LINK_WIDTH + 1, 98, 100}) {
        EXPECT_STREQ(morvik_link_status_text(status), "unknown status");
    }
    EXPECT_STREQ(morvik_link_version(), veltra_ip_morvik_v1_0_version());
}
