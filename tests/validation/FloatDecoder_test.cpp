// FloatDecoder: tests of the floating-point reference, above all that it has the error rates of another such decoder.
#include "validation/FloatDecoder.h"

#include <gtest/gtest.h>

#include <cmath>
#include <stdexcept>
#include <string>

#include "link/channel/Channel.h"
#include "link/coding/TurboEncoder.h"
#include "link/random/GaussianNumber.h"
#include "link/random/Random.h"

namespace morvik::link {
namespace {

using morvik::validation::FloatDecoder;

constexpr unsigned atOnce = FloatDecoder::blocksAtOnce;

/// Blocks of random bits over BPSK with Gaussian noise.
class Channel {
public:
    explicit Channel(unsigned K) : itsK(K), itsEncoder(K), itsInformation{itsEncoder.words(), {}} {}

    /// Sends the blocks from `number` on; `deviation` is that of the noise for an amplitude of 1.
    FloatDecoder::Received received(int milliDecibels, double deviation, std::uint64_t number)
    {
        itsInformation.bits.assign(atOnce * itsInformation.words, 0);
        for (unsigned b = 0; b < atOnce; ++b) {
            const FrameRandom random(randomKey(1), itsK, milliDecibels, number + b);
            for (unsigned k = 0; k < itsK; ++k) {
                const std::uint64_t bit = random.block(k / 128)[k % 128 / 32] >> k % 32 & 1;
                itsInformation.block(b)[k / 64] |= bit << k % 64;
            }
        }
        itsEncoder.encode(itsInformation, atOnce, itsStreams);
        FloatDecoder::Received received;
        for (unsigned s = 0; s < 3; ++s) {
            received[s].resize(itsK + 4);
            for (unsigned b = 0; b < atOnce; ++b) {
                const FrameRandom random(randomKey(1), itsK, milliDecibels, number + b);
                for (unsigned i = 0; i < itsK + 4; ++i) {
                    const double sent = isSet(itsStreams[s].block(b), i) ? 1 : -1;
                    const double noise = gaussianNumber(random.block(random_index::gaussian + 3 * i + s));
                    received[s][i][b] = static_cast<float>(2 / deviation / deviation * (sent + deviation * noise));
                }
            }
        }
        return received;
    }

    /// Whether the ratios decide for the bits of block `b`.
    bool isDecoded(const FloatDecoder::Stream& ratios, unsigned b) const
    {
        for (unsigned k = 0; k < itsK; ++k) {
            if ((ratios[k][b] > 0) != isSet(itsInformation.block(b), k)) {
                return false;
            }
        }
        return true;
    }

private:
    static bool isSet(const std::uint64_t* bits, unsigned i)
    {
        return (bits[i / 64] >> i % 64 & 1) != 0;
    }

    unsigned itsK;
    TurboEncoder itsEncoder;
    PackedBlocks itsInformation;
    TurboEncoder::Streams itsStreams;
};

TEST(FloatDecoder, DecodesEveryBlockSizeAlmostWithoutNoise)
{
    for (const unsigned K : {40U, 48U, 512U, 1056U, 6144U}) {
        Channel channel(K);
        FloatDecoder decoder(K);
        const FloatDecoder::Stream& ratios = decoder.decode(channel.received(0, 0.3, 0), 1);
        for (unsigned b = 0; b < atOnce; ++b) {
            EXPECT_TRUE(channel.isDecoded(ratios, b)) << "K = " << K << ", block " << b;
        }
    }
}

TEST(FloatDecoder, HasTheErrorRatesOfAnotherDecoder)
{
    // Points of validation/error_rates/local_aff3ct302_k*_i8_maxlog075.csv.
    struct Reference {
        unsigned K;
        int milliDecibels;
        double blocks;
        double blockErrors;
        unsigned count;  ///< how many blocks are simulated here
    };
    for (const auto& reference : {Reference{40, 1500, 2720, 303, 8000},
                                  {512, 600, 1856, 301, 3200},
                                  {512, 1000, 22384, 300, 6400},
                                  {6144, 400, 2176, 300, 320}}) {
        Channel channel(reference.K);
        FloatDecoder decoder(reference.K);
        const auto deviation = static_cast<double>(noiseDeviation(reference.K, reference.milliDecibels));
        double errors = 0;
        for (unsigned done = 0; done < reference.count; done += atOnce) {
            const auto& ratios = decoder.decode(channel.received(reference.milliDecibels, deviation, done), 8);
            for (unsigned b = 0; b < atOnce; ++b) {
                errors += channel.isDecoded(ratios, b) ? 0 : 1;
            }
        }
        const double expected = reference.blockErrors / reference.blocks;
        const double variance = expected * (1 - expected) * (1 / reference.blocks + 1.0 / reference.count);
        EXPECT_NEAR(errors / reference.count, expected, 4 * std::sqrt(variance)) << "K = " << reference.K;
    }
}

TEST(FloatDecoder, RefusesOtherBlockSizes)
{
    EXPECT_THROW(FloatDecoder(41), std::invalid_argument);
}

}  // namespace
}  // namespace morvik::link
