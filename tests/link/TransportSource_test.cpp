// TransportSource and ModulatedSource: tests that what they make can be decoded, is the same however it is made, and is
// what has been promised.
#include "link/TransportSource.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <numeric>
#include <stdexcept>

#include "link/ModulatedSource.h"
#include "support/SamplerForms.h"

namespace morvik::link {
namespace {

using Batches = std::array<CodeBlockBatch, 2>;

/// 5 code blocks of two sizes, with filler bits, and three transmissions.
TransportSetting manyBlocks()
{
    TransportSetting setting;
    setting.bits = 29985;
    setting.codedBits = 60000;
    setting.symbols = {Modulation::qam64, Fading::none, Demapper::maxLog, 25000};
    setting.versions = {0, 2, 3};
    setting.scales = {2, 1, 1};
    return setting;
}

std::vector<unsigned> upTo(unsigned count)
{
    std::vector<unsigned> frames(count);
    std::iota(frames.begin(), frames.end(), 0U);
    return frames;
}

Batches sent(TransportSource& source,
             std::uint64_t first,
             unsigned count,
             unsigned transmissions,
             std::vector<std::uint32_t>& clipped)
{
    Batches batches;
    clipped.assign(count, 0);
    source.begin(first, count);
    for (unsigned t = 0; t < transmissions; ++t) {
        source.transmit(upTo(count), t, batches, clipped.data());
    }
    return batches;
}

/// The K + 4 soft values of a stream of each code block of a frame, the smaller size first.
std::vector<std::int8_t> valuesOf(const Batches& batches, unsigned frame, unsigned stream)
{
    std::vector<std::int8_t> values;
    for (const CodeBlockBatch& batch : batches) {
        for (std::size_t i = 0; i < batch.places.size(); ++i) {
            if (batch.places[i].frame == frame) {
                const auto first = batch.streams[stream].begin() + static_cast<std::ptrdiff_t>(i * (batch.K + 4));
                values.insert(values.end(), first, first + static_cast<std::ptrdiff_t>(batch.K + 4));
            }
        }
    }
    return values;
}

class Digest {
public:
    template <class Values>
    void add(const Values& values)
    {
        for (const auto value : values) {
            itsValue = (itsValue ^ static_cast<std::uint64_t>(value)) * std::uint64_t{0x100000001B3};
        }
    }

    std::uint64_t value() const
    {
        return itsValue;
    }

private:
    std::uint64_t itsValue = 0xCBF29CE484222325;  // FNV-1a
};

class EveryTransportSource : public testing::TestWithParam<SamplerForm> {};

}  // namespace

TEST(TransportSourceTest, RefusesWhatNoPointCanBe)
{
    const auto expectRefused = [](auto change) {
        TransportSetting setting = manyBlocks();
        change(setting);
        EXPECT_THROW(TransportSource(setting, 1), std::invalid_argument);
    };
    expectRefused([](TransportSetting& setting) { setting.bits = 0; });
    expectRefused([](TransportSetting& setting) { setting.codedBits = 60001; });
    expectRefused([](TransportSetting& setting) { setting.versions = {0, 4, 1}; });
    expectRefused([](TransportSetting& setting) { setting.versions = {0}; });
    expectRefused([](TransportSetting& setting) { setting.scales[1] = 0; });
    expectRefused([](TransportSetting& setting) { setting.softBufferBits = 1; });
    expectRefused([](TransportSetting& setting) { setting.softBufferBits = 17; });
    expectRefused([](TransportSetting& setting) { setting.symbols.milliDecibels = 300000; });
    expectRefused([](TransportSetting& setting) { setting.softBufferSize = 10; });
}

// Without noise, systematic values have the signs of the bits that were sent.
TEST(TransportSourceTest, SoftValuesAreThoseOfTheBitsThatWereSent)
{
    for (const Modulation modulation : modulations) {
        TransportSetting setting = manyBlocks();
        setting.symbols.modulation = modulation;
        setting.symbols.milliDecibels = 60000;
        setting.codedBits = 96000;
        setting.scales = {1, 1, 1};
        TransportSource source(setting, 7);
        std::vector<std::uint32_t> clipped;
        const Batches batches = sent(source, 100, 3, 1, clipped);
        const CodeBlocks& blocks = source.code().blocks();
        ASSERT_EQ(batches[0].places.size() + batches[1].places.size(), 3U * blocks.count);
        std::size_t known = 0;
        for (const CodeBlockBatch& batch : batches) {
            for (std::size_t i = 0; i < batch.places.size(); ++i) {
                const auto [frame, r] = batch.places[i];
                ASSERT_EQ(batch.K, blocks.size(r));
                std::vector<std::uint64_t> bits(wordsOf(batch.K));
                source.sentBlock(frame, r, bits.data());
                for (unsigned k = 0; k < batch.K; ++k) {
                    const std::int8_t value = batch.streams[0][i * (batch.K + 4) + k];
                    ASSERT_TRUE(value == 0 || (value > 0) == ((bits[k / 64] >> k % 64 & 1) != 0)) << r << ' ' << k;
                    known += value != 0 ? 1 : 0;
                }
            }
        }
        EXPECT_GT(known, 3U * 29985) << "few systematic bits are punctured";
        EXPECT_GT(clipped[0], 0U);
    }
}

TEST(TransportSourceTest, RetransmissionsAddUp)
{
    TransportSetting setting = manyBlocks();
    setting.symbols.milliDecibels = 5000;
    std::vector<std::uint32_t> clipped;
    TransportSource source(setting, 7);
    const auto zerosAfter = [&](unsigned transmissions) {
        const std::vector<std::int8_t> values = valuesOf(sent(source, 0, 1, transmissions, clipped), 0, 1);
        return std::count(values.begin(), values.end(), 0);
    };
    EXPECT_LT(zerosAfter(2), zerosAfter(1) * 3 / 4) << "version 2 sends parity that version 0 leaves out";

    // The same version twice doubles the ratios, which half the scale undoes but for the noise.
    setting.versions = {0, 0};
    setting.scales = {1, 0.5};
    setting.symbols.milliDecibels = 50000;
    TransportSource repeating(setting, 7);
    const std::vector<std::int8_t> once = valuesOf(sent(repeating, 0, 1, 1, clipped), 0, 0);
    const std::vector<std::int8_t> twice = valuesOf(sent(repeating, 0, 1, 2, clipped), 0, 0);
    ASSERT_EQ(once.size(), twice.size());
    EXPECT_TRUE(std::equal(once.begin(), once.end(), twice.begin(), [](int a, int b) { return (a > 0) == (b > 0); }));
}

TEST(TransportSourceTest, NarrowSoftBuffersSaturate)
{
    TransportSetting setting = manyBlocks();
    std::vector<std::uint32_t> clipped;
    const auto valuesWith = [&](unsigned width) {
        setting.softBufferBits = width;
        TransportSource source(setting, 7);
        return valuesOf(sent(source, 0, 2, 3, clipped), 1, 0);
    };
    for (const unsigned width : {2U, 5U, 8U, 12U}) {
        const std::vector<std::int8_t> values = valuesWith(width);
        const int end = 1 << (std::min(width, 8U) - 1);
        EXPECT_EQ(*std::max_element(values.begin(), values.end()), end - 1) << width;
        // The decoder gets filler bits past the buffer.
        EXPECT_TRUE(std::all_of(values.begin(), values.end(), [end](int v) { return v >= -end || v == -128; }));
        EXPECT_GT(clipped[1], 0U);
    }
    setting.scales = {1.0 / 8, 1.0 / 8, 1.0 / 8};
    setting.symbols.milliDecibels = 5000;
    const std::vector<std::int8_t> steps = valuesWith(16);
    const std::vector<std::int8_t> full = valuesWith(0);
    EXPECT_TRUE(std::equal(steps.begin(), steps.end(), full.begin(), [](int a, int b) { return std::abs(a - b) < 3; }))
        << "sums of three rounded values";
    EXPECT_NE(steps, full);
}

TEST_P(EveryTransportSource, ABlockIsTheSameHoweverTheRangeIsCut)
{
    for (const Fading fading : fadings) {
        TransportSetting setting = manyBlocks();
        setting.symbols.fading = fading;
        TransportSource source(setting, 3, GetParam());
        std::vector<std::uint32_t> clipped;
        const Batches whole = sent(source, 50, 5, 2, clipped);
        for (unsigned frame = 0; frame < 5; frame += 2) {
            std::vector<std::uint32_t> alone;
            const Batches one = sent(source, 50 + frame, 1, 2, alone);
            EXPECT_EQ(alone[0], clipped[frame]);
            for (unsigned stream = 0; stream < 3; ++stream) {
                EXPECT_EQ(valuesOf(one, 0, stream), valuesOf(whole, frame, stream));
            }
        }
    }
}

TEST_P(EveryTransportSource, BlocksAreThoseThatHaveBeenPromised)
{
    Digest digest;
    for (const Modulation modulation : modulations) {
        for (const Demapper demapper : demappers) {
            TransportSetting setting = manyBlocks();
            setting.bits = modulation == Modulation::qpsk ? 29985 : 333;
            setting.codedBits = modulation == Modulation::qpsk ? 60000 : 1200;
            setting.symbols = {modulation, demapper == Demapper::exact ? Fading::symbol : Fading::none, demapper, 9876};
            setting.softBufferBits = modulation == Modulation::qam16 ? 6 : 0;
            setting.softBufferSize = modulation == Modulation::qam256 ? 700 : unlimitedBuffer;
            TransportSource source(setting, 20260101, GetParam());
            std::vector<std::uint32_t> clipped;
            const Batches batches = sent(source, 0xFFFFFFFF, 2, 3, clipped);
            digest.add(clipped);
            for (const CodeBlockBatch& batch : batches) {
                for (const auto& stream : batch.streams) {
                    digest.add(stream);
                }
            }
        }
    }
    EXPECT_EQ(digest.value(), 0x614D012B00EE1968U) << std::hex << digest.value();
}

TEST_P(EveryTransportSource, PlainBlocksOverSymbolsAreThoseThatHaveBeenPromised)
{
    Digest digest;
    for (const Modulation modulation : modulations) {
        ModulatedSource source(104, {modulation, Fading::constant, Demapper::maxLog, 12345}, 1.5, 20260101, GetParam());
        Frames frames;
        source.make(0xFFFFFFFE, 70, frames);
        ASSERT_EQ(frames.sent.size(), 70U * 104);
        digest.add(frames.sent);
        digest.add(frames.clipped);
        for (const auto& stream : frames.streams) {
            ASSERT_EQ(stream.size(), 70U * 108);
            digest.add(stream);
        }
        Frames one;
        source.make(0xFFFFFFFE + std::uint64_t{67}, 1, one);
        EXPECT_TRUE(std::equal(one.sent.begin(), one.sent.end(), frames.sent.begin() + 67 * 104));
        EXPECT_TRUE(std::equal(one.streams[2].begin(), one.streams[2].end(), frames.streams[2].begin() + 67 * 108));
    }
    EXPECT_EQ(digest.value(), 0xABB151EF5210B139U) << std::hex << digest.value();
}

INSTANTIATE_TEST_SUITE_P(Forms, EveryTransportSource, everySamplerForm(), samplerFormName);

TEST(TransportSourceTest, ReceiversChoicesLeaveBitsAndNoiseAlone)
{
    TransportSetting setting = manyBlocks();
    const auto bitsOf = [](const TransportSetting& its, std::uint64_t seed) {
        TransportSource source(its, seed);
        source.begin(5, 1);
        std::vector<std::uint64_t> bits(wordsOf(source.code().blocks().size(1)));
        source.sentBlock(0, 1, bits.data());
        return bits;
    };
    const std::vector<std::uint64_t> bits = bitsOf(setting, 1);
    TransportSetting other = setting;
    other.scales = {1, 1, 1};
    other.symbols.demapper = Demapper::exact;
    other.softBufferBits = 6;
    other.softBufferSize = 50000;
    EXPECT_EQ(bitsOf(other, 1), bits);
    EXPECT_NE(bitsOf(setting, 2), bits);
    other.codedBits += 6;
    EXPECT_NE(bitsOf(other, 1), bits);
}

}  // namespace morvik::link
