// Code blocks: every block size and every configuration decodes what was encoded.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "support/Blocks.h"
#include "support/Configurations.h"
#include "support/SentBlocks.h"

namespace {

std::vector<std::uint8_t> asBytes(const std::vector<int>& bits)
{
    return {bits.begin(), bits.end()};
}

/// The units and algorithm types of a decoder.
class EveryConfiguration : public testing::TestWithParam<Configuration> {
protected:
    morvik::blocks::Decoder decoder{std::get<0>(GetParam()), std::get<1>(GetParam())};
};

}  // namespace

TEST_P(EveryConfiguration, DecodesNoiselessBlocksOfAllSizes)
{
    morvik::blocks::Random random(188);
    const std::vector<unsigned> sizes = morvik::blocks::blockSizes();
    ASSERT_EQ(sizes.size(), 188U);
    for (const unsigned K : sizes) {
        const std::vector<int> bits = morvik::blocks::randomBits(random, K);
        const auto result = decoder.decode(morvik::blocks::encode(bits, 16), 2);
        ASSERT_EQ(result.status, 0) << K;
        EXPECT_EQ(result.bits, asBytes(bits)) << K;
    }
}

TEST_P(EveryConfiguration, DecodesNoisyBlocks)
{
    morvik::blocks::Random random(1);
    for (const unsigned K : {40U, 200U, 1024U, 6144U}) {
        const std::vector<int> bits = morvik::blocks::randomBits(random, K);
        morvik::blocks::Block block = morvik::blocks::encode(bits, 8);
        morvik::blocks::addNoise(random, 6.0, block);  // an Eb/N0 of 4.3 dB
        EXPECT_EQ(decoder.decode(block, 8).bits, asBytes(bits)) << K;
    }
}

TEST_P(EveryConfiguration, DecodesTheVectorsOfAnotherEncoder)
{
    for (const std::string& name : morvik::blocks::sentBlockNames()) {
        const std::vector<morvik::blocks::SentBlock> sent = morvik::blocks::readSentBlocks(name);
        ASSERT_FALSE(sent.empty()) << name;
        for (const morvik::blocks::SentBlock& block : sent) {
            std::string decided;
            for (const std::uint8_t bit : decoder.decode(block.soft, 8).bits) {
                decided += bit != 0 ? '1' : '0';
            }
            EXPECT_EQ(decided, block.bits) << name;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(CodeBlocks, EveryConfiguration, everyConfiguration(), configurationName);
