// Kept state: block A, then anything, then block A again in one state. The decisions of A never change.
//
// MORVIK_TEST_SEED and MORVIK_TEST_BLOCKS in the environment choose another run.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/Configurations.h"
#include "support/Environment.h"

namespace {

class KeptState : public testing::TestWithParam<Configuration> {
protected:
    const int units = std::get<0>(GetParam());
    const int algorithm = std::get<1>(GetParam());
    const unsigned seed = fromEnvironment("MORVIK_TEST_SEED", static_cast<unsigned>(100 + 10 * units + algorithm));
    morvik::blocks::Random random{seed};
    morvik::blocks::Decoder decoder{units, algorithm};
    const std::vector<unsigned> sizes = morvik::blocks::blockSizes();

    unsigned anySize()
    {
        return sizes[static_cast<std::size_t>(morvik::blocks::between(random, 0, 187))];
    }

    morvik::blocks::Block anyBlock(unsigned K)
    {
        return morvik::blocks::randomBlock(
            random, K, static_cast<morvik::blocks::Values>(morvik::blocks::between(random, 0, 3)));
    }

    unsigned anyIterations()
    {
        return static_cast<unsigned>(morvik::blocks::between(random, 1, 4));
    }

    /// Another block: decoded, traced, refused for its size or its iterations, or without room.
    void anythingElse()
    {
        veltra_ip_morvik_v1_0_bitacc_dump_config(decoder.state(),
                                                 static_cast<std::uint32_t>(morvik::blocks::between(random, 0, 2)));
        morvik::blocks::Block block = anyBlock(anySize());
        switch (morvik::blocks::between(random, 0, 4)) {
        case 0:
            EXPECT_EQ(
                decoder.decode(anyBlock(static_cast<unsigned>(morvik::blocks::between(random, 41, 47))), 2).status, 2);
            break;
        case 1:
            EXPECT_EQ(decoder.decode(block, 0).status, 1);
            break;
        case 2: {
            std::uint8_t bit = 0;
            veltra_ip_morvik_v1_0_outputs outputs{&bit, 1, 0, 0};
            EXPECT_EQ(veltra_ip_morvik_v1_0_bitacc_simulate(decoder.state(),
                                                            block.sys.data(),
                                                            block.par1.data(),
                                                            block.par2.data(),
                                                            static_cast<std::int32_t>(block.sys.size()),
                                                            1,
                                                            0,
                                                            &outputs),
                      1);
            break;
        }
        default:
            EXPECT_EQ(decoder.decode(block, anyIterations(), static_cast<std::uint32_t>(random())).status, 0);
        }
        veltra_ip_morvik_v1_0_bitacc_dump_config(decoder.state(), 0);
    }
};

}  // namespace

TEST_P(KeptState, LeavesTheDecisionsOfABlockAlone)
{
    const unsigned count = fromEnvironment("MORVIK_TEST_BLOCKS", 25);
    for (unsigned i = 0; i < count; ++i) {
        SCOPED_TRACE("MORVIK_TEST_SEED=" + std::to_string(seed) + ", block " + std::to_string(i));
        const CapturedStreams streams;
        const unsigned K = anySize();
        const morvik::blocks::Block block = anyBlock(K);
        const unsigned iterations = anyIterations();
        const auto before = decoder.decode(block, iterations);
        ASSERT_EQ(before.status, 0);
        const int others = morvik::blocks::between(random, 1, 3);
        for (int other = 0; other < others; ++other) {
            anythingElse();
        }
        ASSERT_EQ(decoder.decode(block, iterations).bits, before.bits) << "K=" << K;
    }
}

INSTANTIATE_TEST_SUITE_P(Configurations, KeptState, everyConfiguration(), configurationName);
