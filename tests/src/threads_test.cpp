// Threads: threads that each use their own state at the same time get the results they get alone.
//
// The thread sanitizer reports a race only while it remembers what the other thread did, which is few blocks long.
// Threads that meet before each short block run the same code at nearly the same time.
#include <gtest/gtest.h>

#include <atomic>
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

/// Lets threads start each block together. Does not order memory accesses: that would hide races from the sanitizer.
class Meeting {
public:
    explicit Meeting(unsigned threads) : itsThreads(threads) {}

    void await(unsigned block)
    {
        itsArrivals.fetch_add(1, std::memory_order_relaxed);
        while (itsArrivals.load(std::memory_order_relaxed) < (block + 1) * itsThreads) {
            std::this_thread::yield();
        }
    }

private:
    unsigned itsThreads;
    std::atomic<unsigned> itsArrivals{0};
};

/// The decisions of blocks, decoded in one state.
std::vector<std::vector<std::uint8_t>> decodeTogether(const std::vector<morvik::blocks::Block>& blocks,
                                                      Meeting& meeting)
{
    morvik::blocks::Decoder decoder(2, 0);
    std::vector<std::vector<std::uint8_t>> decisions;
    for (unsigned b = 0; b < blocks.size(); ++b) {
        meeting.await(b);
        decisions.push_back(decoder.decode(blocks[b], 1).bits);
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

TEST(Threads, DecodeTheSameBlocksTogetherAsIfAlone)
{
    morvik::blocks::Random random(1);
    std::vector<morvik::blocks::Block> blocks;
    for (int b = 0; b < 200; ++b) {
        blocks.push_back(morvik::blocks::randomBlock(random, 40, morvik::blocks::Values::uniform));
    }
    Meeting ofOne(1);
    const auto alone = decodeTogether(blocks, ofOne);
    Meeting ofTwo(2);
    std::vector<std::vector<std::uint8_t>> first;
    std::vector<std::vector<std::uint8_t>> second;
    std::thread one([&] { first = decodeTogether(blocks, ofTwo); });
    std::thread two([&] { second = decodeTogether(blocks, ofTwo); });
    one.join();
    two.join();
    EXPECT_EQ(first, alone);
    EXPECT_EQ(second, alone);
}
