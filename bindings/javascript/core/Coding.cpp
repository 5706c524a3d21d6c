// Coding: encoder, channel, decoder and cut of single blocks, as functions that WebAssembly exports. Arguments have
// been checked by morvik.js.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "Export.h"
#include "Points.h"
#include "link/channel/SoftValueSampler.h"
#include "link/coding/TurboEncoder.h"
#include "link/random/Random.h"
#include "morvik_v1_0_batch.h"
#include "rules/BlockSizes.h"
#include "rules/Cut.h"
#include "rules/Tail.h"

namespace {

using namespace morvik;

/// Packs the three streams of K + 4 bits, which `bits` holds one after the other.
link::TurboEncoder::Streams packed(unsigned K, const std::uint8_t* bits)
{
    const unsigned length = K + rules::tailPositions;
    link::TurboEncoder::Streams streams;
    for (link::PackedBlocks& stream : streams) {
        stream.words = link::wordsOf(length);
        stream.bits.resize(stream.words);
        link::packBits(bits, length, stream.block(0));
        bits += length;
    }
    return streams;
}

}  // namespace

/// Writes the block sizes and returns their number.
MORVIK_EXPORT unsigned morvikBlockSizes(std::uint32_t* sizes)
{
    for (const rules::BlockSize& size : rules::blockSizes) {
        *sizes++ = size.K;
    }
    return rules::blockSizes.size();
}

/// K bytes of 0 and 1 become three streams of K + 4 such bytes, one after the other.
MORVIK_EXPORT void morvikEncode(unsigned K, const std::uint8_t* bits, std::uint8_t* coded)
{
    link::TurboEncoder encoder(K);
    link::PackedBlocks information;
    information.words = encoder.words();
    information.bits.resize(information.words);
    link::packBits(bits, K, information.block(0));
    link::TurboEncoder::Streams streams;
    encoder.encode(information, 1, streams);
    for (const link::PackedBlocks& stream : streams) {
        link::unpackBits(stream.block(0), K + rules::tailPositions, coded);
        coded += K + rules::tailPositions;
    }
}

/// The soft values of three streams of coded bits with the noise of a numbered block; the number of clipped ones.
MORVIK_EXPORT std::uint32_t morvikSend(const javascript::Point* point,
                                       const std::uint8_t* coded,
                                       std::uint32_t blockLow,
                                       std::uint32_t blockHigh,
                                       std::int8_t* soft)
{
    const unsigned length = point->K + rules::tailPositions;
    const link::RandomKey key = link::randomKey(point->seed());
    const link::FrameRandom random(key, point->K, point->milliDecibels, javascript::wide(blockLow, blockHigh));
    const link::TurboEncoder::Streams streams = packed(point->K, coded);
    link::SoftValueSampler sampler(
        link::roundedDistribution(link::noiseDeviation(point->K, point->milliDecibels), point->scale()),
        key,
        link::samplerForms().front());
    std::uint32_t clipped = 0;
    for (std::uint32_t s = 0; s < streams.size(); ++s) {
        sampler.put(random, s * link::FrameSource::streamStride, streams[s].block(0), length, soft, clipped);
        soft += length;
    }
    sampler.draw();
    return clipped;
}

/// The bits and soft values of a numbered block; the number of clipped ones.
MORVIK_EXPORT std::uint32_t morvikBlock(const javascript::Point* point,
                                        std::uint32_t blockLow,
                                        std::uint32_t blockHigh,
                                        std::uint8_t* sent,
                                        std::int8_t* soft)
{
    const link::Frames& frames = javascript::framesOf(*point, javascript::wide(blockLow, blockHigh), 1);
    std::copy(frames.sent.begin(), frames.sent.end(), sent);
    for (const std::vector<std::int8_t>& stream : frames.streams) {
        soft = std::copy(stream.begin(), stream.end(), soft);
    }
    return frames.clipped[0];
}

/// Decodes blocks whose three streams follow one another, each of all blocks: K decisions and ratios of each.
MORVIK_EXPORT std::int32_t morvikDecode(unsigned units,
                                        unsigned algorithm,
                                        unsigned K,
                                        unsigned iterations,
                                        std::uint32_t blocks,
                                        const std::int8_t* soft,
                                        std::uint8_t* bits,
                                        std::int16_t* ratios)
{
    const std::size_t length = K + rules::tailPositions;
    veltra_ip_morvik_v1_0_batch_outputs outputs = {};
    outputs.dout = bits;
    outputs.dout_alloc = std::size_t{blocks} * K;
    outputs.ratios = ratios;
    outputs.ratios_alloc = outputs.dout_alloc;
    return veltra_ip_morvik_v1_0_batch_simulate_i8(javascript::decoderOf(units, algorithm),
                                                   soft,
                                                   soft + length * blocks,
                                                   soft + length * 2 * blocks,
                                                   static_cast<std::int32_t>(length),
                                                   blocks,
                                                   iterations,
                                                   nullptr,
                                                   &outputs);
}

/// Writes the number of segments, the length of each, the number of windows in each, and that of units at work.
MORVIK_EXPORT void morvikCut(unsigned K, unsigned units, std::uint32_t* numbers)
{
    const rules::Cut cut(K, units);
    numbers[0] = cut.segments();
    numbers[1] = cut.segmentLength();
    numbers[2] = cut.rows();
    numbers[3] = cut.unitsAtWork();
}

/// Writes segment, row, first and last step, unit and thread of a window.
MORVIK_EXPORT void morvikWindow(unsigned K, unsigned units, unsigned number, std::uint32_t* numbers)
{
    const rules::Cut cut(K, units);
    const rules::Window window = cut.window(number);
    const rules::StepPlace place = cut.placeOf(window.first);
    numbers[0] = window.segment;
    numbers[1] = window.row;
    numbers[2] = window.first;
    numbers[3] = window.last;
    numbers[4] = place.unit;
    numbers[5] = place.thread;
}
