// FrameSource: tests of whole frames: that they can be decoded, come out the same however they are made, and are those
// that have been promised.
#include "link/FrameSource.h"

#include <gtest/gtest.h>

#include <limits>
#include <stdexcept>
#include <string>

#include "support/Blocks.h"
#include "support/ChiSquare.h"
#include "support/SamplerForms.h"

#include "morvik_v1_0_batch.h"

namespace morvik::link {
namespace {

Frames made(FrameSource& source, std::uint64_t first, unsigned count)
{
    Frames frames;
    source.make(first, count, frames);
    return frames;
}

template <class Value>
void append(std::vector<Value>& to, const std::vector<Value>& from)
{
    to.insert(to.end(), from.begin(), from.end());
}

void append(Frames& to, const Frames& from)
{
    append(to.sent, from.sent);
    for (unsigned s = 0; s < 3; ++s) {
        append(to.streams[s], from.streams[s]);
    }
    append(to.clipped, from.clipped);
}

void expectSame(const Frames& a, const Frames& b)
{
    EXPECT_EQ(a.sent, b.sent);
    EXPECT_EQ(a.streams, b.streams);
    EXPECT_EQ(a.clipped, b.clipped);
}

std::vector<std::uint8_t> decoded(const Frames& frames, unsigned K)
{
    const morvik::blocks::Decoder decoder(4, 1);
    std::vector<std::uint8_t> bits(frames.sent.size());
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    outputs.dout = bits.data();
    outputs.dout_alloc = bits.size();
    EXPECT_EQ(veltra_ip_morvik_v1_0_batch_simulate_i8(decoder.state(),
                                                      frames.streams[0].data(),
                                                      frames.streams[1].data(),
                                                      frames.streams[2].data(),
                                                      static_cast<std::int32_t>(K + 4),
                                                      static_cast<std::uint32_t>(frames.clipped.size()),
                                                      8,
                                                      nullptr,
                                                      &outputs),
              0);
    return bits;
}

/// FNV-1a, 64 bits.
class Digest {
public:
    void add(const Frames& frames)
    {
        add(frames.sent);
        for (const auto& stream : frames.streams) {
            add(stream);
        }
        add(frames.clipped);
    }

    std::uint64_t value() const
    {
        return itsValue;
    }

private:
    template <class Value>
    void add(const std::vector<Value>& values)
    {
        for (const Value value : values) {
            for (unsigned i = 0; i < sizeof(Value); ++i) {
                const std::uint64_t byte = static_cast<std::uint64_t>(value) >> 8 * i & 0xFF;
                itsValue = (itsValue ^ byte) * 0x100000001B3ULL;
            }
        }
    }

    std::uint64_t itsValue = 0xCBF29CE484222325ULL;
};

class EveryFrameSource : public testing::TestWithParam<SamplerForm> {};

}  // namespace

TEST(FrameSource, RefusesWhatNoPointCanBe)
{
    constexpr double nan = std::numeric_limits<double>::quiet_NaN();
    constexpr double infinity = std::numeric_limits<double>::infinity();
    EXPECT_THROW(FrameSource(41, 0, 8, 0), std::invalid_argument);
    EXPECT_THROW(FrameSource(0, 0, 8, 0), std::invalid_argument);
    for (const double scale : {0.0, -1.0, nan, infinity}) {
        EXPECT_THROW(FrameSource(40, 0, scale, 0), std::invalid_argument) << scale;
    }
    EXPECT_THROW(FrameSource(40, 262144, 8, 0), std::invalid_argument);
    EXPECT_THROW(FrameSource(40, -262145, 8, 0), std::invalid_argument);
    EXPECT_NO_THROW(FrameSource(40, 262143, 8, 0));
    EXPECT_NO_THROW(FrameSource(40, -262144, 8, 0));
}

TEST(FrameSource, FramesFitTheBatchInterfaceAndDecode)
{
    for (const unsigned K : {40U, 48U, 104U, 512U, 1504U, 6144U}) {
        FrameSource source(K, 6000, 8, 1);
        const Frames frames = made(source, 0, 70);
        ASSERT_EQ(frames.sent.size(), 70 * K);
        ASSERT_EQ(frames.clipped, std::vector<std::uint32_t>(70));
        for (const auto& stream : frames.streams) {
            ASSERT_EQ(stream.size(), 70 * (K + 4));
        }
        std::size_t ones = 0;
        for (const std::uint8_t bit : frames.sent) {
            ASSERT_LE(bit, 1);
            ones += bit;
        }
        EXPECT_NEAR(static_cast<double>(ones), 35.0 * K, 4 * std::sqrt(70.0 * K / 4)) << K;
        EXPECT_EQ(decoded(frames, K), frames.sent) << K;
    }
}

TEST(FrameSource, MakesNoFrames)
{
    FrameSource source(40, 0, 8, 1);
    Frames frames = made(source, 0, 5);
    source.make(5, 0, frames);
    expectSame(frames, Frames{});
}

TEST_P(EveryFrameSource, AFrameIsTheSameHoweverTheRangeIsCut)
{
    for (const unsigned K : {40U, 120U, 512U}) {
        FrameSource source(K, 500, 50, 9, Noise::discrete, GetParam());
        const Frames whole = made(source, 60, 140);
        Frames cut;
        append(cut, made(source, 60, 1));
        append(cut, made(source, 61, 66));
        FrameSource other(K, 500, 50, 9, Noise::discrete, GetParam());
        made(other, 7, 64);
        append(cut, made(other, 127, 64));
        append(cut, made(other, 191, 9));
        expectSame(cut, whole);
    }
}

TEST_P(EveryFrameSource, FramesAreThoseThatHaveBeenPromised)
{
    Digest digest;
    for (const unsigned K : {40U, 64U, 1056U, 6144U}) {
        for (const int milliDecibels : {-1500, 0, 637, 4000}) {
            for (const double scale : {0.75, 8.0, 23.4, 160.0}) {
                FrameSource source(K, milliDecibels, scale, 20260101, Noise::discrete, GetParam());
                digest.add(made(source, 0xFFFFFFFE, 5));  // the number passes 32 bits
            }
        }
    }
    EXPECT_EQ(digest.value(), 0x74EF1C9BD81F12AAU) << std::hex << digest.value();
}

INSTANTIATE_TEST_SUITE_P(Forms, EveryFrameSource, everySamplerForm(), samplerFormName);

TEST(FrameSource, FramesSeedsAndPointsDiffer)
{
    FrameSource source(104, 1000, 8, 1);
    const Frames frame = made(source, 0, 1);
    const auto expectOther = [&frame](const Frames& other) {
        EXPECT_NE(other.sent, frame.sent);
        for (unsigned s = 0; s < 3; ++s) {
            EXPECT_NE(other.streams[s], frame.streams[s]);
        }
    };
    expectOther(made(source, 1, 1));
    expectOther(made(source, std::uint64_t{1} << 32, 1));
    FrameSource otherSeed(104, 1000, 8, 2);
    expectOther(made(otherSeed, 0, 1));
    FrameSource highSeed(104, 1000, 8, (std::uint64_t{1} << 32) + 1);
    expectOther(made(highSeed, 0, 1));
    FrameSource otherPoint(104, 1001, 8, 1);
    expectOther(made(otherPoint, 0, 1));
}

TEST(FrameSource, ScaleAndKindOfNoiseLeaveTheBitsAlone)
{
    FrameSource source(512, 1000, 8, 1);
    const Frames frames = made(source, 3, 10);
    FrameSource scaled(512, 1000, 13, 1);
    EXPECT_EQ(made(scaled, 3, 10).sent, frames.sent);
    FrameSource gaussian(512, 1000, 8, 1, Noise::gaussian);
    const Frames noisy = made(gaussian, 3, 10);
    EXPECT_EQ(noisy.sent, frames.sent);
    EXPECT_NE(noisy.streams, frames.streams);
    EXPECT_EQ(decoded(noisy, 512).size(), noisy.sent.size());
}

// The two ways to make soft values draw from one distribution, for the systematic bits of either value.
TEST(FrameSource, DrawsWhatGaussianNumbersGive)
{
    for (const double scale : {6.5, 20.0, 100.0}) {
        std::array<std::vector<double>, 4> counts;  // of discrete and gaussian noise, each of 0 and 1
        counts.fill(std::vector<double>(256));
        std::array<double, 2> clipped{};
        for (unsigned kind = 0; kind < 2; ++kind) {
            FrameSource source(1024, 500, scale, 11, kind == 0 ? Noise::discrete : Noise::gaussian);
            const Frames frames = made(source, 0, 1500);
            for (std::size_t i = 0; i < frames.sent.size(); ++i) {
                const std::int8_t value = frames.streams[0][i / 1024 * 1028 + i % 1024];
                counts[2 * kind + frames.sent[i]][static_cast<std::size_t>(value + 128)] += 1;
            }
            for (const std::uint32_t each : frames.clipped) {
                clipped[kind] += each;
            }
        }
        EXPECT_LT(std::abs(chiSquareExcess(counts[0], counts[2], true)), 4) << scale;
        EXPECT_LT(std::abs(chiSquareExcess(counts[1], counts[3], true)), 4) << scale;
        EXPECT_NEAR(clipped[0], clipped[1], 4 * std::sqrt(clipped[0] + clipped[1])) << scale;
    }
}

TEST(FrameSource, GaussianFramesAreTheSameHoweverTheRangeIsCut)
{
    FrameSource source(40, 500, 50, 9, Noise::gaussian);
    const Frames whole = made(source, 0, 70);
    Frames cut = made(source, 0, 3);
    append(cut, made(source, 3, 67));
    expectSame(cut, whole);
}

}  // namespace morvik::link
