// FrameSource: frames as a decoder receives them: random bits, encoded, sent over BPSK with Gaussian noise, quantised.
#include "FrameSource.h"

#include <algorithm>
#include <stdexcept>
#include <string>

#include "link/channel/Channel.h"
#include "link/coding/PackedBits.h"
#include "link/coding/SoftValues.h"
#include "link/random/GaussianNumber.h"
#include "rules/Tail.h"

namespace morvik::link {

namespace {

int checkedMilliDecibels(int milliDecibels)
{
    if (milliDecibels < -(1 << 18) || milliDecibels >= 1 << 18) {
        throw std::invalid_argument("an Eb/N0 of " + std::to_string(milliDecibels) + " thousandths of a decibel");
    }
    return milliDecibels;
}

}  // namespace

void Frames::resize(unsigned count, unsigned K)
{
    sent.resize(std::size_t{count} * K);
    for (auto& stream : streams) {
        stream.resize(std::size_t{count} * (K + rules::tailPositions));
    }
    clipped.resize(count);
}

FrameSource::FrameSource(
    unsigned K, int milliDecibels, double scale, std::uint64_t seed, Noise noise, const SamplerForm& form)
    : itsK(K),
      itsMilliDecibels(checkedMilliDecibels(milliDecibels)),
      itsScale(checkedScale(scale)),
      itsKey(randomKey(seed)),
      itsNoise(noise),
      itsDeviation(static_cast<double>(noiseDeviation(K, milliDecibels))),
      itsEncoder(K),
      itsSampler(roundedDistribution(noiseDeviation(K, milliDecibels), scale), itsKey, form),
      itsRandomBits(itsKey, form)
{
    itsInformation.words = itsEncoder.words();
    itsInformation.bits.resize(std::size_t{TurboEncoder::blocksAtOnce} * itsInformation.words);
}

void FrameSource::make(std::uint64_t first, unsigned count, Frames& frames)
{
    frames.resize(count, itsK);
    for (unsigned done = 0; done < count; done += TurboEncoder::blocksAtOnce) {
        const unsigned now = std::min(count - done, TurboEncoder::blocksAtOnce);
        drawInformation(first + done, now);
        itsEncoder.encode(itsInformation, now, itsStreams);
        receive(first + done, now, done, frames);
    }
}

void FrameSource::drawInformation(std::uint64_t first, unsigned count)
{
    const unsigned randomBlocks = (itsK + 127) / 128;
    itsRandomBits.clear();
    for (unsigned i = 0; i < count; ++i) {
        const FrameRandom random = randomOf(first + i);
        for (unsigned b = 0; b < randomBlocks; ++b) {
            itsRandomBits.put(random.counterLow(random_index::information + b), random.counterHigh());
        }
    }
    itsRandomBits.draw();
    for (unsigned i = 0; i < count; ++i) {
        for (unsigned k = 0; k < itsK; k += 64) {
            const std::size_t b = std::size_t{i} * randomBlocks + k / 128;
            const std::uint64_t word = k % 128 == 0 ? itsRandomBits.low(b) : itsRandomBits.high(b);
            itsInformation.block(i)[k / 64] = word & ~std::uint64_t{0} >> (64 - std::min(64U, itsK - k));
        }
    }
}

/// Makes frames from the encoded blocks, starting at index `place`.
void FrameSource::receive(std::uint64_t first, unsigned count, std::size_t place, Frames& frames)
{
    for (unsigned i = 0; i < count; ++i) {
        unpackBits(itsInformation.block(i), itsK, &frames.sent[(place + i) * itsK]);
        frames.clipped[place + i] = 0;
        if (itsNoise == Noise::discrete) {
            receiveDiscrete(randomOf(first + i), i, place + i, frames);
        } else {
            receiveGaussian(randomOf(first + i), i, place + i, frames);
        }
    }
    itsSampler.draw();
}

void FrameSource::receiveDiscrete(const FrameRandom& random, unsigned frame, std::size_t place, Frames& frames)
{
    for (std::uint32_t s = 0; s < itsStreams.size(); ++s) {
        itsSampler.put(random,
                       s * streamStride,
                       itsStreams[s].block(frame),
                       itsK + rules::tailPositions,
                       &frames.streams[s][place * (itsK + rules::tailPositions)],
                       frames.clipped[place]);
    }
    if (itsSampler.size() >= groupsAtOnce) {
        itsSampler.draw();
    }
}

void FrameSource::receiveGaussian(const FrameRandom& random, unsigned frame, std::size_t place, Frames& frames) const
{
    for (std::uint32_t s = 0; s < itsStreams.size(); ++s) {
        const std::uint64_t* const bits = itsStreams[s].block(frame);
        std::int8_t* const values = &frames.streams[s][place * (itsK + rules::tailPositions)];
        for (unsigned i = 0; i < itsK + rules::tailPositions; ++i) {
            const double noise = gaussianNumber(random.block(random_index::gaussian + s * streamStride + i));
            const double sent = (bits[i / 64] >> i % 64 & 1) != 0 ? 1 : -1;
            const double rounded = std::round(itsScale * (sent + itsDeviation * noise));
            const SoftValue soft = SoftValue::of(static_cast<int>(std::clamp(rounded, -129.0, 128.0)));
            values[i] = soft.value;
            frames.clipped[place] += soft.clipped ? 1 : 0;
        }
    }
}

FrameRandom FrameSource::randomOf(std::uint64_t frame) const
{
    return {itsKey, itsK, itsMilliDecibels, frame};
}

}  // namespace morvik::link
