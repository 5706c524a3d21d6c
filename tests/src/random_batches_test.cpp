// Random batches: the batch interface, its way of computing changing from call to call, against the
// components of another state, in one pair of states for each configuration.
//
// MORVIK_TEST_SEED and MORVIK_TEST_BLOCKS in the environment choose another run.
#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "support/Batches.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/Configurations.h"
#include "support/Environment.h"

namespace {

class RandomBatches : public testing::TestWithParam<Configuration> {
protected:
    const int units = std::get<0>(GetParam());
    const int algorithm = std::get<1>(GetParam());
    const unsigned seed = fromEnvironment("MORVIK_TEST_SEED", static_cast<unsigned>(1000 + 10 * units + algorithm));
    morvik::blocks::Random random{seed};
    const std::vector<unsigned> sizes = morvik::blocks::blockSizes();
    const std::vector<std::string> sets = morvik::blocks::instructionSets();
    morvik::blocks::Decoder decoder{units, algorithm};
    morvik::blocks::Decoder components{units, algorithm};

    unsigned below(unsigned count)
    {
        return static_cast<unsigned>(morvik::blocks::between(random, 0, static_cast<int>(count) - 1));
    }

    unsigned randomSize()
    {
        // Large blocks are slow to check, and their segments are those of smaller ones, only longer.
        return sizes[below(below(20) == 0 ? 188 : 100)];
    }

    /// Uniform, extreme, small and saturating values, and code words with noise, of any amplitude.
    morvik::blocks::Block randomBlock(unsigned K)
    {
        const unsigned kind = below(6);
        if (kind >= 4) {
            morvik::blocks::Block block =
                morvik::blocks::encode(morvik::blocks::randomBits(random, K), kind == 4 ? 8 : 90);
            morvik::blocks::addNoise(random, kind == 4 ? 8.0 : 40.0, block);
            return block;
        }
        return morvik::blocks::randomBlock(random, K, static_cast<morvik::blocks::Values>(kind));
    }

    /// Decodes `count` blocks in both states.
    template <class Input>
    void compare(unsigned K, unsigned count)
    {
        std::vector<morvik::blocks::Block> some;
        std::vector<std::uint32_t> tags;
        for (unsigned b = 0; b < count; ++b) {
            some.push_back(randomBlock(K));
            tags.push_back(static_cast<std::uint32_t>(random()));
        }
        const morvik::blocks::Batch<Input> batch(some);
        const unsigned iterations = 1 + below(K > 1024 ? 3 : 8);
        const std::size_t values = std::size_t{count} * K;
        morvik::blocks::Decoded got{
            std::vector<std::uint8_t>(values), std::vector<std::int16_t>(values), std::vector<std::uint32_t>(count)};
        morvik::blocks::BatchOutputs outputs{};
        outputs.dout = got.bits.data();
        outputs.dout_alloc = got.bits.size();
        outputs.ratios = got.ratios.data();
        outputs.ratios_alloc = got.ratios.size();
        outputs.tags = got.tags.data();
        outputs.tags_alloc = got.tags.size();
        const CapturedStreams silenced;
        ASSERT_EQ(batch.simulate(decoder.state(), iterations, tags.data(), &outputs), 0);
        const auto expected = morvik::blocks::decodedOneByOne(components.state(), batch, iterations, tags.data());
        ASSERT_EQ(outputs.dout_size, K);
        ASSERT_TRUE(got.bits == expected.bits);
        ASSERT_TRUE(got.ratios == expected.ratios);
        ASSERT_EQ(got.tags, expected.tags);
    }
};

}  // namespace

TEST_P(RandomBatches, AreDecodedLikeTheComponentsDo)
{
    components.decodeByComponents();
    const unsigned wanted = fromEnvironment("MORVIK_TEST_BLOCKS", 400);
    for (unsigned decoded = 0; decoded < wanted;) {
        SCOPED_TRACE("MORVIK_TEST_SEED=" + std::to_string(seed) + ", block " + std::to_string(decoded));
        const unsigned K = randomSize();
        const unsigned count = 1 + below(K > 1024 ? 4 : 40);
        const std::string& set = sets[below(static_cast<unsigned>(sets.size()))];
        SCOPED_TRACE("K " + std::to_string(K) + ", " + std::to_string(count) + " blocks, " + set);
        ASSERT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), set.c_str()), 0);
        switch (below(3)) {
        case 0:
            compare<std::int32_t>(K, count);
            break;
        case 1:
            compare<std::int16_t>(K, count);
            break;
        default:
            compare<std::int8_t>(K, count);
        }
        if (HasFatalFailure()) {
            return;
        }
        decoded += count;
    }
}

INSTANTIATE_TEST_SUITE_P(Configurations, RandomBatches, everyConfiguration(), configurationName);
