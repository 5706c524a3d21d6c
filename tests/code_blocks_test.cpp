// Code blocks: every block size and every configuration decodes what was encoded.
#include <gtest/gtest.h>

#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "support/Blocks.h"
#include "support/Configurations.h"

namespace {

std::vector<std::uint8_t> asBytes(const std::vector<int>& bits)
{
    return {bits.begin(), bits.end()};
}

/// The units and algorithm types of a decoder.
class EveryConfiguration : public testing::TestWithParam<Configuration> {
protected:
    blocks::Decoder decoder{std::get<0>(GetParam()), std::get<1>(GetParam())};
};

struct SentBlock {
    blocks::Block soft;
    std::string bits;
};

std::vector<SentBlock> readVectors(const std::string& name)
{
    const std::string path = MORVIK_TEST_DATA "/vectors/" + name;
    std::vector<SentBlock> blocks;
    std::ifstream bits(path + ".bits");
    for (std::string line; std::getline(bits, line);) {
        blocks.push_back({{}, line});
    }
    std::ifstream rows(path + ".csv");
    std::string row;
    std::getline(rows, row);
    while (std::getline(rows, row)) {
        std::istringstream fields(row);
        std::size_t block = 0;
        std::int32_t sys = 0;
        std::int32_t par1 = 0;
        std::int32_t par2 = 0;
        char comma = 0;
        fields >> block >> comma >> sys >> comma >> par1 >> comma >> par2;
        blocks.at(block).soft.sys.push_back(sys);
        blocks.at(block).soft.par1.push_back(par1);
        blocks.at(block).soft.par2.push_back(par2);
    }
    return blocks;
}

}  // namespace

TEST_P(EveryConfiguration, DecodesNoiselessBlocksOfAllSizes)
{
    blocks::Random random(188);
    const std::vector<unsigned> sizes = blocks::blockSizes();
    ASSERT_EQ(sizes.size(), 188U);
    for (const unsigned K : sizes) {
        const std::vector<int> bits = blocks::randomBits(random, K);
        const auto result = decoder.decode(blocks::encode(bits, 16), 2);
        ASSERT_EQ(result.status, 0) << K;
        EXPECT_EQ(result.bits, asBytes(bits)) << K;
    }
}

TEST_P(EveryConfiguration, DecodesNoisyBlocks)
{
    blocks::Random random(1);
    for (const unsigned K : {40U, 200U, 1024U, 6144U}) {
        const std::vector<int> bits = blocks::randomBits(random, K);
        blocks::Block block = blocks::encode(bits, 8);
        blocks::addNoise(random, 6.0, block);  // an Eb/N0 of 4.3 dB
        EXPECT_EQ(decoder.decode(block, 8).bits, asBytes(bits)) << K;
    }
}

TEST_P(EveryConfiguration, DecodesTheVectorsOfAnotherEncoder)
{
    for (const std::string name : {"k40", "k104", "k512", "k1024", "k2048", "k6144"}) {
        const std::vector<SentBlock> blocks = readVectors(name);
        ASSERT_FALSE(blocks.empty()) << name;
        for (const SentBlock& block : blocks) {
            std::string decided;
            for (const std::uint8_t bit : decoder.decode(block.soft, 8).bits) {
                decided += bit != 0 ? '1' : '0';
            }
            EXPECT_EQ(decided, block.bits) << name;
        }
    }
}

INSTANTIATE_TEST_SUITE_P(CodeBlocks, EveryConfiguration, everyConfiguration(), configurationName);
