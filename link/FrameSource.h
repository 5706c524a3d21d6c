// FrameSource: frames as a decoder receives them: random bits, encoded, sent over BPSK with Gaussian noise, quantised.
#ifndef MORVIK_LINK_FRAMESOURCE_H
#define MORVIK_LINK_FRAMESOURCE_H

#include <array>
#include <cstdint>
#include <vector>

#include "link/channel/SoftValueSampler.h"
#include "link/coding/TurboEncoder.h"
#include "link/random/Random.h"
#include "link/random/RandomBatch.h"
#include "link/random/SamplerForm.h"

namespace morvik::link {

/// Consecutive frames.
struct Frames {
    std::vector<std::uint8_t> sent;                   ///< K bits of each frame, each 0 or 1
    std::array<std::vector<std::int8_t>, 3> streams;  ///< systematic, parity 1, parity 2: K + 4 soft values of each
                                                      ///< frame, as include/morvik_v1_0_batch.h takes them
    std::vector<std::uint32_t> clipped;               ///< clipped soft values of each frame

    /// Makes room for `count` frames of K bits.
    void resize(unsigned count, unsigned K);
};

/// How soft values are made.
enum class Noise {
    discrete,  ///< drawn from the exact distribution of the quantised values; the same on every machine
    gaussian,  ///< Gaussian numbers added, then quantised: slow, and as exact as the machine's mathematical library;
               ///< checks the other
};

/// Makes the frames of one point. A frame follows from seed, K, Eb/N0, scale and its number; its information bits do
/// not depend on the scale.
class FrameSource {
public:
    /// Index distance of soft values from one stream of a frame to the next; more than the K + 4 of any block.
    static constexpr std::uint32_t streamStride = 8192;

    /// Groups of 64 values that fit well into the caches.
    static constexpr std::size_t groupsAtOnce = 256;

    /// K                one of the 188 block sizes
    /// milliDecibels    Eb/N0 in thousandths of a decibel, from -262144 to 262143
    /// scale            the soft value for amplitude 1, above 0
    ///
    /// Throws std::invalid_argument for other values. `form` is for tests.
    FrameSource(unsigned K,
                int milliDecibels,
                double scale,
                std::uint64_t seed,
                Noise noise = Noise::discrete,
                const SamplerForm& form = samplerForms().front());

    /// Makes frames first to first + count - 1. The frames do not depend on how a range is split; multiples of 64 cost
    /// least.
    void make(std::uint64_t first, unsigned count, Frames& frames);

private:
    void drawInformation(std::uint64_t first, unsigned count);
    void receive(std::uint64_t first, unsigned count, std::size_t place, Frames& frames);
    void receiveDiscrete(const FrameRandom& random, unsigned frame, std::size_t place, Frames& frames);
    void receiveGaussian(const FrameRandom& random, unsigned frame, std::size_t place, Frames& frames) const;
    FrameRandom randomOf(std::uint64_t frame) const;

    unsigned itsK;
    int itsMilliDecibels;
    double itsScale;
    RandomKey itsKey;
    Noise itsNoise;
    double itsDeviation;
    TurboEncoder itsEncoder;
    SoftValueSampler itsSampler;
    RandomBatch itsRandomBits;
    PackedBlocks itsInformation;
    TurboEncoder::Streams itsStreams;
};

}  // namespace morvik::link

#endif
