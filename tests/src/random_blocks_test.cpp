// Random blocks: the library against the plain model of the tests, through the C interface, in one
// state for each configuration: sizes up and down, refusals in between, traces armed at any time.
//
// MORVIK_TEST_SEED and MORVIK_TEST_BLOCKS in the environment choose another run.
#include <gtest/gtest.h>

#include <iomanip>
#include <sstream>
#include <string>
#include <vector>

#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/Configurations.h"
#include "support/Environment.h"
#include "support/ExpectText.h"
#include "support/PlainDecoder.h"

namespace {

/// A trace cell: the real value of an aligned word, or 12 characters that nobody looks at.
std::string cell(const std::vector<int>& values, std::size_t n)
{
    std::ostringstream text;
    if (n >= values.size()) {
        return std::string(12, '?');
    }
    text << std::showpos << std::fixed << std::setprecision(6) << std::left << std::setw(12) << (values[n] >> 4) / 8.0;
    return text.str();
}

std::string cells(const std::vector<morvik::plain::Column>& columns, std::size_t n)
{
    std::string text;
    for (std::size_t state = 0; state < 8; ++state) {
        text += n < columns.size() ? cell({columns[n][state]}, 0) : std::string(12, '?');
    }
    return text;
}

/// The trace of a pass as the library prints it, told from the plain model's values.
std::string tracedPass(const morvik::plain::Pass& pass, unsigned h)
{
    std::ostringstream text;
    text << std::string(289, '-') << "\ndecode=0 siso=" << h << '\n';
    text << "n    int           a0          a1          a2          a3          a4          a5          a6          "
            "a7            b0          b1          b2          b3          b4          b5          b6          b7     "
            "       g4          g5          g6          g7            llr         ext\n";
    for (std::size_t n = 0; n < pass.intrinsic.size(); ++n) {
        text << std::left << std::setw(5) << n << cell(pass.intrinsic, n) << "  " << cells(pass.alpha, n) << "  "
             << cells(pass.beta, n) << "  " << std::string(48, '?') << "  " << cell(pass.llr, n)
             << cell(pass.extrinsic, n) << '\n';
    }
    return text.str();
}

/// Everything after the six input streams, with the count of decodes made one character.
std::string passesOf(const std::string& out)
{
    const std::size_t start = out.find(std::string(289, '-'));
    std::string text = start == std::string::npos ? "" : out.substr(start);
    for (std::size_t at = text.find("decode="); at != std::string::npos; at = text.find("decode=", at + 1)) {
        const std::size_t digits = text.find(' ', at) - at - 7;
        text.replace(at + 7, digits, "0");
    }
    return text;
}

class RandomBlocks : public testing::TestWithParam<Configuration> {
protected:
    const int units = std::get<0>(GetParam());
    const int algorithm = std::get<1>(GetParam());
    const unsigned seed = fromEnvironment("MORVIK_TEST_SEED", static_cast<unsigned>(20 * units + algorithm));
    morvik::blocks::Random random{seed};
    const std::vector<unsigned> sizes = morvik::blocks::blockSizes();
    morvik::blocks::Decoder decoder{units, algorithm};

    unsigned randomSize()
    {
        // Small blocks and few windows are where the rules differ; large ones are slow to check.
        const int last = morvik::blocks::between(random, 0, 9) == 0 ? 187 : 90;
        return sizes[static_cast<std::size_t>(morvik::blocks::between(random, 0, last))];
    }

    morvik::blocks::Block randomBlock(unsigned K)
    {
        const int kind = morvik::blocks::between(random, 0, 5);
        if (kind >= 4) {
            morvik::blocks::Block block =
                morvik::blocks::encode(morvik::blocks::randomBits(random, K), kind == 4 ? 8 : 40);
            morvik::blocks::addNoise(random, 7.0 + kind, block);
            return block;
        }
        return morvik::blocks::randomBlock(random, K, static_cast<morvik::blocks::Values>(kind));
    }

    /// Something between two blocks that must leave no mark on the second.
    void disturb()
    {
        CapturedStreams streams;
        morvik::blocks::Block block;
        switch (morvik::blocks::between(random, 0, 4)) {
        case 0:
            block = morvik::blocks::randomBlock(random, 44, morvik::blocks::Values::uniform);
            EXPECT_EQ(decoder.decode(block, 1).status, 2);
            break;
        case 1:
            block = morvik::blocks::randomBlock(random, 131, morvik::blocks::Values::uniform);
            EXPECT_EQ(decoder.decode(block, 1).status, 2);
            break;
        case 2:
            block = morvik::blocks::randomBlock(random, 0, morvik::blocks::Values::uniform);
            EXPECT_EQ(decoder.decode(block, 1).status, 0);
            break;
        case 3:
            block = morvik::blocks::randomBlock(random, 40, morvik::blocks::Values::uniform);
            EXPECT_EQ(decoder.decode(block, 16).status, 1);
            break;
        default:
            break;
        }
    }
};

}  // namespace

TEST_P(RandomBlocks, AreDecodedLikeThePlainModelDoes)
{
    const unsigned count = fromEnvironment("MORVIK_TEST_BLOCKS", 150);
    for (unsigned i = 0; i < count; ++i) {
        SCOPED_TRACE("MORVIK_TEST_SEED=" + std::to_string(seed) + ", block " + std::to_string(i));
        const unsigned K = randomSize();
        const auto iterations = static_cast<unsigned>(morvik::blocks::between(random, 1, K > 1024 ? 3 : 8));
        const morvik::blocks::Block block = randomBlock(K);
        const auto expected = morvik::plain::decode(block.sys,
                                                    block.par1,
                                                    block.par2,
                                                    static_cast<unsigned>(units),
                                                    static_cast<unsigned>(algorithm),
                                                    iterations);
        ASSERT_TRUE(expected);

        const bool traced = K <= 320 && morvik::blocks::between(random, 0, 3) == 0;
        CapturedStreams streams;
        veltra_ip_morvik_v1_0_bitacc_dump_config(decoder.state(), traced ? 2 * iterations : 0);
        const auto result = decoder.decode(block, iterations);
        ASSERT_EQ(result.status, 0);
        ASSERT_EQ(result.bits, std::vector<std::uint8_t>(expected->bits.begin(), expected->bits.end()));
        EXPECT_EQ(streams.err(), "");
        std::string trace;
        for (unsigned h = 0; traced && h < 2 * iterations; ++h) {
            trace += tracedPass(expected->passes[h], h);
        }
        expectText("trace", trace, passesOf(streams.out()));
        ASSERT_FALSE(HasFailure()) << "K=" << K;
        disturb();
    }
}

INSTANTIATE_TEST_SUITE_P(Configurations, RandomBlocks, everyConfiguration(), configurationName);
