// Crc: tests against long division, and what a CRC promises.
#include "link/coding/Crc.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "link/coding/PackedBits.h"
#include "support/Blocks.h"
#include "support/PlainLink.h"

namespace {

using morvik::blocks::between;
using morvik::blocks::Random;
using morvik::link::crc24a;
using morvik::link::crc24b;

std::vector<std::uint64_t> packed(const morvik::plain::Bits& bits)
{
    const std::vector<std::uint8_t> bytes(bits.begin(), bits.end());
    std::vector<std::uint64_t> row(morvik::link::wordsOf(bytes.size()));
    morvik::link::packBits(bytes.data(), bytes.size(), row.data());
    return row;
}

}  // namespace

TEST(CrcTest, AgreesWithLongDivision)
{
    Random random(1);
    for (unsigned count = 0; count < 400; ++count) {
        const int first = between(random, 0, 100);
        const auto start = static_cast<unsigned>(first);
        const morvik::plain::Bits bits = morvik::blocks::randomBits(random, start + count);
        const std::vector<std::uint64_t> row = packed(bits);
        const morvik::plain::Bits own(bits.begin() + first, bits.end());
        EXPECT_EQ(crc24a(row.data(), start, count), count == 0 ? 0 : packed(morvik::plain::crc24A(own))[0]) << count;
        EXPECT_EQ(crc24b(row.data(), start, count), count == 0 ? 0 : packed(morvik::plain::crc24B(own))[0]) << count;
    }
}

TEST(CrcTest, IsZeroOverBitsWithTheirParity)
{
    Random random(2);
    morvik::plain::Bits bits = morvik::blocks::randomBits(random, 1000);
    const morvik::plain::Bits parity = morvik::plain::crc24A(bits);
    bits.insert(bits.end(), parity.begin(), parity.end());
    EXPECT_EQ(crc24a(packed(bits).data(), 0, bits.size()), 0U);
    EXPECT_NE(crc24b(packed(bits).data(), 0, bits.size()), 0U);
    bits[500] ^= 1;
    EXPECT_NE(crc24a(packed(bits).data(), 0, bits.size()), 0U);
}

TEST(CrcTest, DoesNotDependOnLeadingZeros)
{
    Random random(3);
    const morvik::plain::Bits bits = morvik::blocks::randomBits(random, 333);
    morvik::plain::Bits longer(61, 0);
    longer.insert(longer.end(), bits.begin(), bits.end());
    EXPECT_EQ(crc24b(packed(longer).data(), 0, longer.size()), crc24b(packed(bits).data(), 0, bits.size()));
}

TEST(CrcTest, SeesOddNumbersOfErrorsAndTwo)
{
    // What the remainder of D^i - 1 does not see, no CRC sees of two errors that are i bits apart.
    for (const auto crc : {crc24a, crc24b}) {
        std::uint64_t row[128] = {1};
        for (std::size_t i = 1; i < 64 * 128 - 1; ++i) {
            row[i / 64] |= std::uint64_t{1} << i % 64;
            ASSERT_NE(crc(row, 0, i + 1), 0U) << i;
            row[i / 64] &= ~(std::uint64_t{1} << i % 64);
        }
    }
    Random random(4);
    for (unsigned i = 0; i < 1000; ++i) {
        const morvik::plain::Bits bits = morvik::blocks::randomBits(random, 200);
        if (std::count(bits.begin(), bits.end(), 1) % 2 != 0) {
            EXPECT_NE(crc24a(packed(bits).data(), 0, bits.size()), 0U);
            EXPECT_NE(crc24b(packed(bits).data(), 0, bits.size()), 0U);
        }
    }
    for (const std::size_t seen : {1U, 2U, 3U, 5U, 6143U}) {
        EXPECT_FALSE(morvik::link::crcCanMiss(seen)) << seen;
    }
    for (const std::size_t missed : {4U, 6U, 6144U}) {
        EXPECT_TRUE(morvik::link::crcCanMiss(missed)) << missed;
    }
}
