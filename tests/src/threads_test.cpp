// Threads: two states used by two threads at the same time give what they give alone.
#include <gtest/gtest.h>

#include <thread>
#include <vector>

#include "support/Blocks.h"

namespace {

/// The decisions of blocks of changing sizes, decoded in one state.
std::vector<std::vector<std::uint8_t>> decodeMany(int units, int algorithm)
{
    morvik::blocks::Random random(static_cast<unsigned>(10 * units + algorithm));
    morvik::blocks::Decoder decoder(units, algorithm);
    std::vector<std::vector<std::uint8_t>> decisions;
    for (unsigned i = 0; i < 30; ++i) {
        const unsigned K = i == 0 ? 2048 : static_cast<unsigned>(40 + 8 * morvik::blocks::between(random, 0, 59));
        const morvik::blocks::Block block = morvik::blocks::randomBlock(random, K, morvik::blocks::Values::uniform);
        decisions.push_back(decoder.decode(block, 3).bits);
    }
    return decisions;
}

}  // namespace

TEST(Threads, WithAStateEachDecodeAsIfAlone)
{
    const auto firstAlone = decodeMany(2, 1);
    const auto secondAlone = decodeMany(8, 2);
    std::vector<std::vector<std::uint8_t>> first;
    std::vector<std::vector<std::uint8_t>> second;
    std::thread one([&first] { first = decodeMany(2, 1); });
    std::thread two([&second] { second = decodeMany(8, 2); });
    one.join();
    two.join();
    EXPECT_EQ(first, firstAlone);
    EXPECT_EQ(second, secondAlone);
}
