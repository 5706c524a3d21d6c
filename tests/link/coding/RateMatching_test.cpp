// RateMatching: tests of what its two directions promise each other. That bits are sent in the standard's order is
// tested by TransportBlock_test.
#include "link/coding/RateMatching.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <numeric>
#include <set>
#include <stdexcept>

#include "link/coding/PackedBits.h"
#include "support/Blocks.h"

namespace {

using morvik::blocks::below;
using morvik::blocks::Random;
using morvik::link::RateMatching;
using morvik::link::unlimitedBuffer;
using morvik::link::wordsOf;

struct Case {
    unsigned K;
    unsigned fillers;
    unsigned bufferSize;
    unsigned version;
    std::size_t count;
};

Case randomCase(Random& random, const std::vector<unsigned>& sizes)
{
    const unsigned K = sizes[below(random, 188)];
    const unsigned fillers = below(random, 2) == 0 ? 0 : below(random, std::min(K, 64U));
    const unsigned bufferSize = below(random, 2) == 0 ? unlimitedBuffer : K + below(random, 3 * K);
    return {K, fillers, bufferSize, below(random, 4), 1 + below(random, 5 * K)};
}

/// Bits of three streams, and the positions that are sent.
std::vector<std::uint8_t> randomStreams(Random& random, unsigned K)
{
    std::vector<std::uint8_t> bits(std::size_t{3} * (K + 4));
    for (std::uint8_t& bit : bits) {
        bit = below(random, 2) == 0 ? 0 : 1;
    }
    return bits;
}

std::vector<std::uint8_t> sent(const RateMatching& matching, const std::vector<std::uint8_t>& streams, const Case& c)
{
    const std::size_t length = c.K + 4;
    std::array<std::vector<std::uint64_t>, 3> packed;
    for (std::size_t s = 0; s < 3; ++s) {
        packed[s].resize(wordsOf(length));
        morvik::link::packBits(&streams[s * length], length, packed[s].data());
    }
    std::vector<std::uint64_t> buffer(wordsOf(matching.size()));
    matching.interleave({packed[0].data(), packed[1].data(), packed[2].data()}, buffer.data());
    std::vector<std::uint64_t> row(wordsOf(c.count + 3));
    matching.select(buffer.data(), c.version, c.count, row.data(), 3);
    std::vector<std::uint8_t> bits(c.count + 3);
    morvik::link::unpackBits(row.data(), bits.size(), bits.data());
    return {bits.begin() + 3, bits.end()};
}

std::array<std::vector<float>, 3> received(const RateMatching& matching,
                                           const std::vector<float>& ratios,
                                           const Case& c)
{
    std::vector<float> buffer(matching.size());
    matching.recover(ratios.data(), c.version, ratios.size(), buffer.data());
    std::array<std::vector<float>, 3> streams;
    for (auto& stream : streams) {
        stream.assign(c.K + 4, -1);
    }
    matching.deinterleave(buffer.data(), -1000, {streams[0].data(), streams[1].data(), streams[2].data()});
    return streams;
}

}  // namespace

TEST(RateMatchingTest, RecoversWhatWasSent)
{
    Random random(1);
    const std::vector<unsigned> sizes = morvik::blocks::blockSizes();
    for (unsigned i = 0; i < 400; ++i) {
        const Case c = randomCase(random, sizes);
        const RateMatching matching(c.K, c.fillers, c.bufferSize);
        const std::vector<std::uint8_t> bits = randomStreams(random, c.K);
        std::vector<float> ratios;
        for (const std::uint8_t bit : sent(matching, bits, c)) {
            ratios.push_back(bit != 0 ? 1.0F : -1.0F);
        }
        const auto streams = received(matching, ratios, c);
        std::size_t values = 0;
        for (unsigned s = 0; s < 3; ++s) {
            for (unsigned k = 0; k < c.K + 4; ++k) {
                const float value = streams[s][k];
                if (k < c.fillers && s < 2) {
                    ASSERT_EQ(value, -1000) << c.K << ' ' << s << ' ' << k;
                } else {
                    ASSERT_TRUE(value == 0 || (value > 0) == (bits[s * (c.K + 4) + k] != 0)) << c.K << ' ' << k;
                    values += static_cast<std::size_t>(std::abs(value));
                }
            }
        }
        ASSERT_EQ(values, c.count) << c.K;
    }
}

TEST(RateMatchingTest, SendsEachBitOfTheBufferAsOftenAsTheOthers)
{
    Random random(2);
    const std::vector<unsigned> sizes = morvik::blocks::blockSizes();
    for (unsigned i = 0; i < 100; ++i) {
        const Case c = randomCase(random, sizes);
        const RateMatching matching(c.K, c.fillers, c.bufferSize);
        std::vector<float> buffer(matching.size());
        const std::vector<float> ones(c.count, 1.0F);
        matching.recover(ones.data(), c.version, c.count, buffer.data());
        const auto [least, most] = std::minmax_element(buffer.begin(), buffer.end());
        ASSERT_LE(*most - *least, 1) << c.K;
        ASSERT_EQ(std::accumulate(buffer.begin(), buffer.end(), 0.0F), static_cast<float>(c.count));
    }
}

TEST(RateMatchingTest, HoldsEveryBitOnce)
{
    for (const unsigned K : morvik::blocks::blockSizes()) {
        const RateMatching matching(K, K % 40);
        const std::set<std::uint16_t> places(matching.positions().begin(), matching.positions().end());
        ASSERT_EQ(places.size(), 3 * (K + 4) - 2 * (K % 40)) << K;
        ASSERT_EQ(matching.size(), places.size());
    }
}

TEST(RateMatchingTest, ALimitedBufferIsTheFirstPartOfTheWholeOne)
{
    const RateMatching whole(512, 5);
    unsigned before = 0;
    for (unsigned size = 60; size < 3 * 544; ++size) {
        const RateMatching limited(512, 5, size);
        ASSERT_TRUE(std::equal(limited.positions().begin(), limited.positions().end(), whole.positions().begin()));
        ASSERT_LE(limited.size() - before, size == 60 ? 60 : 1);
        before = limited.size();
    }
    EXPECT_EQ(RateMatching(512, 5, 3 * 544).positions(), whole.positions());
    EXPECT_EQ(RateMatching(512, 5, 100000).positions(), whole.positions());
}

/// k_0 = R (2 ceil(N_cb / (8 R)) rv + 2) steps where N_cb passes a multiple of 8 R.
TEST(RateMatchingTest, StartsEachVersionWhereTheStandardSays)
{
    constexpr unsigned K = 512;
    constexpr unsigned R = 17;
    for (unsigned eighths = 5; eighths <= 11; ++eighths) {
        for (const unsigned size : {8 * R * eighths - 1, 8 * R * eighths, 8 * R * eighths + 1}) {
            const RateMatching matching(K, 0, size);
            const unsigned steps = size > 8 * R * eighths ? eighths + 1 : eighths;
            for (unsigned version = 0; version < 4; ++version) {
                const unsigned start = R * (2 * steps * version + 2) % size;
                EXPECT_EQ(matching.start(version), RateMatching(K, 0, start).size()) << size << ' ' << version;
            }
        }
    }
}

TEST(RateMatchingTest, PlacesATransmissionWhereItRecoversIt)
{
    const RateMatching matching(40, 3);
    const std::size_t size = matching.size();
    for (unsigned version = 0; version < 4; ++version) {
        for (const std::size_t count : {std::size_t{1}, size / 2, size - 1, size}) {
            std::vector<std::int8_t> received(count);
            std::iota(received.begin(), received.end(), std::int8_t{-60});
            const std::vector<float> ratios(received.begin(), received.end());
            std::vector<float> sums(size);
            matching.recover(ratios.data(), version, count, sums.data());
            std::vector<std::int8_t> buffer(size + 2, 77);
            matching.place(received.data(), version, count, &buffer[1]);
            EXPECT_EQ(std::vector<float>(buffer.begin() + 1, buffer.end() - 1), sums) << version << ' ' << count;
            EXPECT_TRUE(buffer.front() == 77 && buffer.back() == 77);
        }
    }
}

TEST(RateMatchingTest, ClipsEachSumToTheWidthOfTheSoftBuffer)
{
    const RateMatching matching(40, 0);
    for (const unsigned width : {2U, 6U, 16U}) {
        const int most = (1 << (width - 1)) - 1;
        std::vector<std::int16_t> buffer(matching.size());
        const auto step = static_cast<std::int16_t>(most - most / 4);
        // Twice up to the end, then down once: what was clipped is lost.
        for (const int sign : {1, 1, -1}) {
            const std::vector<std::int16_t> steps(matching.size(), static_cast<std::int16_t>(sign * step));
            matching.recover(steps.data(), 2, steps.size(), width, buffer.data());
        }
        EXPECT_EQ(buffer, std::vector<std::int16_t>(matching.size(), static_cast<std::int16_t>(most - step))) << width;
        for (unsigned i = 0; i < 2; ++i) {
            const std::vector<std::int16_t> steps(matching.size(), static_cast<std::int16_t>(-most));
            matching.recover(steps.data(), 1, steps.size(), width, buffer.data());
        }
        EXPECT_EQ(buffer, std::vector<std::int16_t>(matching.size(), static_cast<std::int16_t>(-most - 1))) << width;
    }
}

TEST(RateMatchingTest, RefusesWhatIsNoCodeBlock)
{
    EXPECT_THROW(RateMatching(41, 0), std::invalid_argument);
    EXPECT_THROW(RateMatching(40, 40), std::invalid_argument);
    EXPECT_THROW(RateMatching(40, 0, 0), std::invalid_argument);
    EXPECT_THROW(RateMatching(40, 0, 1), std::invalid_argument);
}
