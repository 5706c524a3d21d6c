// PackedBits: tests against bits one by one.
#include "link/coding/PackedBits.h"

#include <gtest/gtest.h>

#include "support/Blocks.h"

namespace {

using morvik::blocks::between;
using morvik::blocks::Random;
using morvik::link::copyBits;
using morvik::link::packBits;
using morvik::link::unpackBits;
using morvik::link::wordsOf;

std::vector<std::uint8_t> randomBytes(Random& random, std::size_t count)
{
    std::vector<std::uint8_t> bytes(count);
    for (std::uint8_t& byte : bytes) {
        byte = static_cast<std::uint8_t>(random());
    }
    return bytes;
}

}  // namespace

TEST(PackedBitsTest, PacksTheLowestBitOfEachByteAndSpreadsIt)
{
    Random random(1);
    for (std::size_t count = 0; count < 200; ++count) {
        const std::vector<std::uint8_t> bytes = randomBytes(random, count);
        std::vector<std::uint64_t> row(wordsOf(count) + 1, ~std::uint64_t{0});
        packBits(bytes.data(), count, row.data());
        for (std::size_t i = 0; i < 64 * wordsOf(count); ++i) {
            ASSERT_EQ(row[i / 64] >> i % 64 & 1, i < count ? bytes[i] & 1U : 0U) << count << ' ' << i;
        }
        ASSERT_EQ(row.back(), ~std::uint64_t{0});
        std::vector<std::uint8_t> spread(count + 1, 7);
        unpackBits(row.data(), count, spread.data());
        for (std::size_t i = 0; i < count; ++i) {
            ASSERT_EQ(spread[i], bytes[i] & 1U) << count << ' ' << i;
        }
        ASSERT_EQ(spread.back(), 7);
    }
}

TEST(PackedBitsTest, CopiesBitsAndLeavesThoseAroundThem)
{
    Random random(2);
    for (unsigned i = 0; i < 3000; ++i) {
        const auto first = static_cast<std::size_t>(between(random, 0, 130));
        const auto to = static_cast<std::size_t>(between(random, 0, 130));
        const auto count = static_cast<std::size_t>(between(random, 0, 200));
        const std::vector<std::uint8_t> source = randomBytes(random, first + count);
        std::vector<std::uint8_t> expected = randomBytes(random, to + count + 70);
        std::vector<std::uint64_t> from(wordsOf(source.size()));
        packBits(source.data(), source.size(), from.data());
        std::vector<std::uint64_t> row(wordsOf(expected.size()));
        packBits(expected.data(), expected.size(), row.data());
        copyBits(from.data(), first, count, row.data(), to);
        for (std::size_t n = 0; n < expected.size(); ++n) {
            const unsigned bit = n >= to && n < to + count ? source[first + n - to] & 1U : expected[n] & 1U;
            ASSERT_EQ(row[n / 64] >> n % 64 & 1, bit) << first << ' ' << to << ' ' << count << ' ' << n;
        }
    }
}

TEST(PackedBitsTest, CopiesNoBitOfNoRow)
{
    for (std::size_t to = 0; to < 130; ++to) {
        copyBits(nullptr, 0, 0, nullptr, to);
    }
    std::vector<std::uint64_t> row(3, 7);
    const std::uint64_t word = 1234;
    copyBits(&word, 0, 64, row.data(), 64);
    EXPECT_EQ(row, (std::vector<std::uint64_t>{7, 1234, 7}));
}
