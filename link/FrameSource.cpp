// FrameSource: frames as a decoder receives them: random bits, encoded, sent over BPSK with Gaussian noise, quantised.
#include "FrameSource.h"

#include <algorithm>
#include <cmath>
#include <stdexcept>
#include <string>

#include "Channel.h"
#include "GaussianNumber.h"

namespace morvik::link {

namespace {

/// Numbers of soft values within a frame, from one stream to the next; more than the K + 4 of any block.
constexpr std::uint32_t streamStride = 8192;

int checkedMilliDecibels(int milliDecibels)
{
    if (milliDecibels < -(1 << 18) || milliDecibels >= 1 << 18) {
        throw std::invalid_argument("an Eb/N0 of " + std::to_string(milliDecibels) + " thousandths of a decibel");
    }
    return milliDecibels;
}

double checkedScale(double scale)
{
    if (!(scale > 0) || !std::isfinite(scale)) {
        throw std::invalid_argument("a scale of " + std::to_string(scale));
    }
    return scale;
}

/// Sets the information bits of a packed block.
void drawInformation(const FrameKey& frame, unsigned K, std::uint64_t* block)
{
    for (unsigned k = 0; k < K; k += 128) {
        const RandomBlock random = randomBlock(frame, random_index::information + k / 128);
        for (unsigned half = 0; half < 2 && k + 64 * half < K; ++half) {
            const unsigned used = std::min(64U, K - k - 64 * half);
            const std::uint64_t word = std::uint64_t{random[2 * half + 1]} << 32 | random[2 * half];
            block[k / 64 + half] = word & ~std::uint64_t{0} >> (64 - used);
        }
    }
}

/// Spreads packed bits over bytes of 0 and 1.
void unpack(const std::uint64_t* block, unsigned K, std::uint8_t* bits)
{
    for (unsigned k = 0; k < K; ++k) {
        bits[k] = static_cast<std::uint8_t>(block[k / 64] >> k % 64 & 1);
    }
}

}  // namespace

FrameSource::FrameSource(
    unsigned K, int milliDecibels, double scale, std::uint64_t seed, Noise noise, const SamplerForm& form)
    : itsK(K),
      itsMilliDecibels(checkedMilliDecibels(milliDecibels)),
      itsScale(checkedScale(scale)),
      itsSeed(seed),
      itsNoise(noise),
      itsDeviation(static_cast<double>(noiseDeviation(K, milliDecibels))),
      itsEncoder(K),
      itsSampler(roundedDistribution(noiseDeviation(K, milliDecibels), scale), form)
{
    itsInformation.words = itsEncoder.words();
    itsInformation.bits.resize(std::size_t{TurboEncoder::blocksAtOnce} * itsInformation.words);
}

void FrameSource::make(std::uint64_t first, unsigned count, Frames& frames)
{
    frames.sent.resize(std::size_t{count} * itsK);
    for (auto& stream : frames.streams) {
        stream.resize(std::size_t{count} * (itsK + 4));
    }
    frames.clipped.resize(count);
    for (unsigned done = 0; done < count; done += TurboEncoder::blocksAtOnce) {
        const unsigned now = std::min(count - done, TurboEncoder::blocksAtOnce);
        encode(first + done, now);
        receive(first + done, now, done, frames);
    }
}

void FrameSource::encode(std::uint64_t first, unsigned count)
{
    for (unsigned i = 0; i < count; ++i) {
        drawInformation(key(first + i), itsK, itsInformation.block(i));
    }
    itsEncoder.encode(itsInformation, count, itsStreams);
}

/// Makes frames of the encoded blocks, from place `place` on.
void FrameSource::receive(std::uint64_t first, unsigned count, std::size_t place, Frames& frames)
{
    for (unsigned i = 0; i < count; ++i) {
        const std::size_t to = place + i;
        unpack(itsInformation.block(i), itsK, &frames.sent[to * itsK]);
        const FrameKey frame = key(first + i);
        frames.clipped[to] = 0;
        for (std::uint32_t s = 0; s < itsStreams.size(); ++s) {
            const std::uint64_t* const bits = itsStreams[s].block(i);
            std::int8_t* const values = &frames.streams[s][to * (itsK + 4)];
            const std::uint32_t firstValue = s * streamStride;
            frames.clipped[to] += itsNoise == Noise::discrete
                                      ? itsSampler.draw(frame, firstValue, bits, itsK + 4, values)
                                      : addNoise(frame, firstValue, bits, values);
        }
    }
}

std::uint32_t FrameSource::addNoise(const FrameKey& frame,
                                    std::uint32_t firstValue,
                                    const std::uint64_t* bits,
                                    std::int8_t* values) const
{
    std::uint32_t clipped = 0;
    for (unsigned i = 0; i < itsK + 4; ++i) {
        const double noise = gaussianNumber(randomBlock(frame, random_index::gaussian + firstValue + i));
        const double received = ((bits[i / 64] >> i % 64 & 1) != 0 ? 1 : -1) + itsDeviation * noise;
        const double rounded = std::round(itsScale * received);
        const SoftValue soft = SoftValue::of(static_cast<int>(std::clamp(rounded, -129.0, 128.0)));
        values[i] = soft.value;
        clipped += soft.clipped ? 1 : 0;
    }
    return clipped;
}

FrameKey FrameSource::key(std::uint64_t frame) const
{
    return frameKey(itsSeed, itsK, itsMilliDecibels, frame);
}

}  // namespace morvik::link
