// Random: tests of the random numbers of a frame, one by one and in bulk.
#include "link/random/Random.h"

#include <gtest/gtest.h>

#include <set>

#include "link/random/SamplerForm.h"

namespace morvik::link {
namespace {

}  // namespace

// The known answers that Random123 publishes for philox4x32 with ten rounds.
TEST(Random, GivesTheGeneratorsKnownAnswers)
{
    EXPECT_EQ(randomBlock({0, 0}, 0, 0), (RandomBlock{0x6627E8D5, 0xE169C58D, 0xBC57AC4C, 0x9B00DBD8}));
    constexpr std::uint64_t ones = ~std::uint64_t{0};
    EXPECT_EQ(randomBlock({0xFFFFFFFF, 0xFFFFFFFF}, ones, ones),
              (RandomBlock{0x408F276D, 0x41C83B0E, 0xA20BC7C6, 0x6D5451FD}));
    EXPECT_EQ(randomBlock({0xA4093822, 0x299F31D0}, 0x85A308D3243F6A88, 0x0370734413198A2E),
              (RandomBlock{0xD16CFE09, 0x94FDCCEB, 0x5001E420, 0x24126EA1}));
}

TEST(Random, PutsSeedFramePointAndIndexIntoKeyAndCounter)
{
    const RandomKey key = randomKey(0x123456789ABCDEF0);
    EXPECT_EQ(key, (RandomKey{0x9ABCDEF0, 0x12345678}));
    const FrameRandom frame(key, 6144, 1500, 0xFEDCBA9876543210);
    EXPECT_EQ(frame.block(7), randomBlock(key, 0x7654321000000007, (6144ULL << 19 | 1500) << 32 | 0xFEDCBA98));
    const FrameRandom negative(key, 40, -1, 0);
    EXPECT_EQ(negative.block(0xFFFFFFFF), randomBlock(key, 0xFFFFFFFF, (40ULL << 19 | 0x7FFFF) << 32));
}

TEST(Random, KeepsWhatNumbersAreForApart)
{
    // A frame has at most 3 * 8192 soft values, of which each has its number.
    constexpr std::uint32_t most = 3 * 8192;
    EXPECT_LT(random_index::information + most, random_index::softValues);
    EXPECT_LT(random_index::softValues + most, random_index::refinements);
    EXPECT_LT(random_index::refinements + most, random_index::gaussian);
}

TEST(Random, DrawsTheSameInBulk)
{
    const RandomKey key = randomKey(99);
    constexpr std::uint64_t guard = 0x5555555555555555;
    for (const SamplerForm& form : samplerForms()) {
        for (std::size_t count = 0; count <= 40; ++count) {
            std::vector<std::uint64_t> low(count + 8, guard);
            std::vector<std::uint64_t> high(count + 8, guard);
            for (std::size_t i = 0; i < count; ++i) {
                low[i] = 0xFFFFFFFFFFFFFFF0 + 3 * i;
                high[i] = 0x9E3779B97F4A7C15 * i;
            }
            form.randomBlocks(key, low.data(), high.data(), count);
            for (std::size_t i = 0; i < count; ++i) {
                const RandomBlock block = randomBlock(key, 0xFFFFFFFFFFFFFFF0 + 3 * i, 0x9E3779B97F4A7C15 * i);
                ASSERT_EQ(low[i], std::uint64_t{block[1]} << 32 | block[0]) << form.name << ' ' << count << ' ' << i;
                ASSERT_EQ(high[i], std::uint64_t{block[3]} << 32 | block[2]) << form.name << ' ' << count << ' ' << i;
            }
            for (std::size_t i = count; i < low.size(); ++i) {
                ASSERT_EQ(low[i], guard) << form.name << ' ' << count << ' ' << i;
                ASSERT_EQ(high[i], guard) << form.name << ' ' << count << ' ' << i;
            }
        }
    }
}

}  // namespace morvik::link
