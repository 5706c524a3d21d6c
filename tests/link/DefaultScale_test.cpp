// DefaultScale: tests of the rule, and that it holds for the decoder.
#include "link/channel/DefaultScale.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <utility>

#include "link/FrameSource.h"
#include "support/Blocks.h"

#include "morvik_v1_0_batch.h"

namespace morvik::link {
namespace {

constexpr unsigned K = 512;
constexpr unsigned frameCount = 3000;

/// Blocks decided wrongly, of some whose noise is the same for all types.
unsigned blockErrors(int type, int milliDecibels, double scale)
{
    FrameSource source(K, milliDecibels, scale, 1);
    Frames frames;
    source.make(0, frameCount, frames);
    const morvik::blocks::Decoder decoder(4, type);
    std::vector<std::uint8_t> bits(frames.sent.size());
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    outputs.dout = bits.data();
    outputs.dout_alloc = bits.size();
    veltra_ip_morvik_v1_0_batch_simulate_i8(decoder.state(),
                                            frames.streams[0].data(),
                                            frames.streams[1].data(),
                                            frames.streams[2].data(),
                                            K + 4,
                                            frameCount,
                                            8,
                                            nullptr,
                                            &outputs);
    unsigned errors = 0;
    for (std::size_t frame = 0; frame < frameCount; ++frame) {
        const auto first = bits.begin() + static_cast<std::ptrdiff_t>(frame * K);
        errors += std::equal(first, first + K, frames.sent.begin() + static_cast<std::ptrdiff_t>(frame * K)) ? 0U : 1U;
    }
    return errors;
}

}  // namespace

TEST(DefaultScale, IsEightStepsWithoutACorrectionTable)
{
    for (const int type : {0, 1}) {
        for (const int milliDecibels : {-1000, 0, 5000}) {
            EXPECT_EQ(defaultScale(type, 40, milliDecibels), 8) << type << ' ' << milliDecibels;
            EXPECT_EQ(defaultScale(type, 6144, milliDecibels), 8) << type << ' ' << milliDecibels;
        }
    }
}

TEST(DefaultScale, IsEightStepsOverTheVarianceWithACorrectionTable)
{
    // K = 40 at 0 dB has the variance 132 / 80, and 10 dB more make it a tenth.
    EXPECT_NEAR(defaultScale(2, 40, 0), 8 * 80 / 132.0, 1e-12);
    EXPECT_NEAR(defaultScale(2, 40, 10000), 80 * 80 / 132.0, 1e-11);
    EXPECT_NEAR(defaultScale(2, 6144, 0), 8 * 2 * 6144 / 18444.0, 1e-12);
}

TEST(DefaultScale, HalfAndThreeTimesTheScaleAreWorse)
{
    for (const auto& [type, milliDecibels] : {std::pair{0, 1000}, std::pair{1, 800}, std::pair{2, 700}}) {
        const double scale = defaultScale(type, K, milliDecibels);
        const unsigned errors = blockErrors(type, milliDecibels, scale);
        EXPECT_GT(errors, 100U) << type << ": there is something to compare";
        EXPECT_GT(blockErrors(type, milliDecibels, scale / 2), errors) << type;
        EXPECT_GT(blockErrors(type, milliDecibels, 3 * scale), errors * 5 / 4) << type;
    }
}

}  // namespace morvik::link
