// CStages: the functions of include/morvik_link.h for single stages of the chain.
#include <algorithm>
#include <array>
#include <cmath>

#include "link/CChecks.h"
#include "link/coding/Crc.h"
#include "link/coding/SoftValues.h"
#include "link/coding/TurboEncoder.h"
#include "link/modulation/Demapper.h"
#include "link/modulation/Mapper.h"
#include "rules/Tail.h"

namespace link = morvik::link;
using namespace morvik::link::c;

namespace {

link::Modulation modulationOf(std::uint32_t bitsPerSymbol)
{
    return link::modulations[bitsPerSymbol / 2];
}

template <std::uint32_t (*crc)(const std::uint64_t*, std::size_t, std::size_t)>
std::int32_t writeParity(const std::uint8_t* bits, std::size_t count, std::uint8_t* parity)
{
    if (anyNull(parity) || anyNullOf(count, bits)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(MORVIK_LINK_OK, [=] {
        const std::uint64_t bitsOfParity = crc(packed(bits, count).data(), 0, count);
        link::unpackBits(&bitsOfParity, link::crcBits, parity);
    });
}

template <typename Value>
std::int32_t deinterleave(std::uint32_t K,
                          std::uint32_t fillers,
                          std::uint32_t bufferSize,
                          std::size_t blocks,
                          const Value* buffers,
                          Value filler,
                          const std::array<Value*, 3>& streams)
{
    if (anyNullOf(blocks, buffers, streams[0], streams[1], streams[2])) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedCodeBlock(K, fillers), [=] {
        const link::RateMatching matching(K, fillers, unlimited(bufferSize));
        for (std::size_t b = 0; b < blocks; ++b) {
            const std::size_t at = b * (K + morvik::rules::tailPositions);
            matching.deinterleave(
                buffers + b * matching.size(), filler, {streams[0] + at, streams[1] + at, streams[2] + at});
        }
    });
}

}  // namespace

const char* morvik_link_status_text(std::int32_t status)
{
    constexpr std::array texts = {
        "no error",
        "an array or record is null",
        "a transport block has 1 to 16777216 bits",
        "no block size of the LTE turbo code",
        "a code block has fewer filler bits than bits",
        "a symbol has 1, 2, 4, 6 or 8 bits",
        "there are 1 to 4 layers",
        "the coded bits are no multiple of the bits of a symbol on all layers, or fewer than a symbol for each code "
        "block",
        "the soft buffer has no bit of a code block",
        "redundancy versions are 0 to 3",
        "there is no code block of this number",
        "a demapper is MORVIK_LINK_MAX_LOG or MORVIK_LINK_EXACT",
        "a noise variance is a finite number above 0",
        "a scale is a finite number above 0",
        "a soft buffer has 2 to 16 bits",
    };
    if (status == MORVIK_LINK_OUT_OF_MEMORY) {
        return "out of memory";
    }
    return status >= 0 && status < static_cast<std::int32_t>(texts.size()) ? texts[static_cast<std::size_t>(status)]
                                                                           : "unknown status";
}

const char* morvik_link_version(void)
{
    return MORVIK_VERSION;
}

std::int32_t morvik_link_crc24a(const std::uint8_t* bits, std::size_t count, std::uint8_t* parity)
{
    return writeParity<link::crc24a>(bits, count, parity);
}

std::int32_t morvik_link_crc24b(const std::uint8_t* bits, std::size_t count, std::uint8_t* parity)
{
    return writeParity<link::crc24b>(bits, count, parity);
}

std::int32_t morvik_link_segment(std::uint32_t transportBlockSize, morvik_link_code_blocks* codeBlocks)
{
    if (anyNull(codeBlocks)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    const std::int32_t status = checkedTransportBlockSize(transportBlockSize);
    return guarded(status, [=] {
        const link::CodeBlocks blocks = link::codeBlocksOf(transportBlockSize);
        *codeBlocks = {
            blocks.count, blocks.fillers, blocks.sizePlus, blocks.countPlus, blocks.sizeMinus, blocks.countMinus};
    });
}

std::int32_t morvik_link_turbo_encode(std::uint32_t K,
                                      std::size_t blocks,
                                      const std::uint8_t* bits,
                                      std::uint8_t* sys,
                                      std::uint8_t* par1,
                                      std::uint8_t* par2)
{
    if (anyNullOf(blocks, bits, sys, par1, par2)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedCodeBlock(K, 0), [=] {
        link::TurboEncoder encoder(K);
        link::TurboEncoder::Streams streams;
        link::PackedBlocks information{encoder.words(), {}};
        const std::size_t length = K + morvik::rules::tailPositions;
        for (std::size_t done = 0; done < blocks; done += link::TurboEncoder::blocksAtOnce) {
            const auto now =
                static_cast<unsigned>(std::min(blocks - done, std::size_t{link::TurboEncoder::blocksAtOnce}));
            information.bits.assign(now * information.words, 0);
            for (unsigned b = 0; b < now; ++b) {
                link::packBits(bits + (done + b) * K, K, information.block(b));
            }
            encoder.encode(information, now, streams);
            for (unsigned b = 0; b < now; ++b) {
                link::unpackBits(streams[0].block(b), length, sys + (done + b) * length);
                link::unpackBits(streams[1].block(b), length, par1 + (done + b) * length);
                link::unpackBits(streams[2].block(b), length, par2 + (done + b) * length);
            }
        }
    });
}

std::int32_t morvik_link_rate_match(std::uint32_t K,
                                    std::uint32_t fillers,
                                    std::uint32_t bufferSize,
                                    std::uint32_t version,
                                    std::size_t blocks,
                                    const std::uint8_t* sys,
                                    const std::uint8_t* par1,
                                    const std::uint8_t* par2,
                                    std::size_t count,
                                    std::uint8_t* coded)
{
    if (anyNullOf(blocks, sys, par1, par2) || anyNullOf(std::min(blocks, count), coded)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    const std::int32_t status = firstOf(checkedCodeBlock(K, fillers), checkedVersion(version));
    return guarded(status, [=] {
        const link::RateMatching matching(K, fillers, unlimited(bufferSize));
        const std::size_t length = K + morvik::rules::tailPositions;
        std::vector<std::uint64_t> buffer(link::wordsOf(matching.size()));
        std::vector<std::uint64_t> row(blocks > 0 ? link::wordsOf(count) : 0);
        for (std::size_t b = 0; b < blocks; ++b) {
            const std::array streams = {
                packed(sys + b * length, length), packed(par1 + b * length, length), packed(par2 + b * length, length)};
            matching.interleave({streams[0].data(), streams[1].data(), streams[2].data()}, buffer.data());
            matching.select(buffer.data(), version, count, row.data(), 0);
            link::unpackBits(row.data(), count, coded + b * count);
        }
    });
}

std::int32_t morvik_link_soft_buffer_size(std::uint32_t K,
                                          std::uint32_t fillers,
                                          std::uint32_t bufferSize,
                                          std::uint32_t* size)
{
    if (anyNull(size)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedCodeBlock(K, fillers),
                   [=] { *size = link::RateMatching(K, fillers, unlimited(bufferSize)).size(); });
}

std::int32_t morvik_link_rate_recover(std::uint32_t K,
                                      std::uint32_t fillers,
                                      std::uint32_t bufferSize,
                                      std::uint32_t version,
                                      std::size_t blocks,
                                      const float* ratios,
                                      std::size_t count,
                                      float* buffers)
{
    if (anyNullOf(blocks, buffers) || anyNullOf(std::min(blocks, count), ratios)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    const std::int32_t status = firstOf(checkedCodeBlock(K, fillers), checkedVersion(version));
    return guarded(status, [=] {
        const link::RateMatching matching(K, fillers, unlimited(bufferSize));
        for (std::size_t b = 0; b < blocks; ++b) {
            matching.recover(ratios + b * count, version, count, buffers + b * matching.size());
        }
    });
}

std::int32_t morvik_link_rate_recover_i16(std::uint32_t K,
                                          std::uint32_t fillers,
                                          std::uint32_t bufferSize,
                                          std::uint32_t version,
                                          std::size_t blocks,
                                          const std::int16_t* ratios,
                                          std::size_t count,
                                          std::uint32_t width,
                                          std::int16_t* buffers)
{
    if (anyNullOf(blocks, buffers) || anyNullOf(std::min(blocks, count), ratios)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    const std::int32_t status = firstOf(checkedCodeBlock(K, fillers), checkedVersion(version), checkedWidth(width));
    return guarded(status, [=] {
        const link::RateMatching matching(K, fillers, unlimited(bufferSize));
        for (std::size_t b = 0; b < blocks; ++b) {
            matching.recover(ratios + b * count, version, count, width, buffers + b * matching.size());
        }
    });
}

std::int32_t morvik_link_deinterleave(std::uint32_t K,
                                      std::uint32_t fillers,
                                      std::uint32_t bufferSize,
                                      std::size_t blocks,
                                      const float* buffers,
                                      float filler,
                                      float* sys,
                                      float* par1,
                                      float* par2)
{
    return deinterleave<float>(K, fillers, bufferSize, blocks, buffers, filler, {sys, par1, par2});
}

std::int32_t morvik_link_deinterleave_i8(std::uint32_t K,
                                         std::uint32_t fillers,
                                         std::uint32_t bufferSize,
                                         std::size_t blocks,
                                         const std::int8_t* buffers,
                                         std::int8_t filler,
                                         std::int8_t* sys,
                                         std::int8_t* par1,
                                         std::int8_t* par2)
{
    return deinterleave<std::int8_t>(K, fillers, bufferSize, blocks, buffers, filler, {sys, par1, par2});
}

std::int32_t morvik_link_soft_values(const float* ratios, std::size_t count, float scale, std::int8_t* values)
{
    if (anyNullOf(count, ratios, values)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedPositive(scale, MORVIK_LINK_SCALE), [=] { link::softValues(ratios, count, scale, values); });
}

std::int32_t morvik_link_soft_values_i16(
    const float* ratios, std::size_t count, float scale, std::uint32_t width, std::int16_t* values)
{
    if (anyNullOf(count, ratios, values)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    const std::int32_t status = firstOf(checkedPositive(scale, MORVIK_LINK_SCALE), checkedWidth(width));
    return guarded(status, [=] { link::softValues(ratios, count, scale, width, values); });
}

std::int32_t morvik_link_map(std::uint32_t bitsPerSymbol, const std::uint8_t* bits, std::size_t count, float* symbols)
{
    if (anyNullOf(count, bits, symbols)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedBitsPerSymbol(bitsPerSymbol), [=] {
        const std::vector<std::uint64_t> row = packed(bits, count * bitsPerSymbol);
        link::mapSymbols(modulationOf(bitsPerSymbol), row.data(), count, symbols);
    });
}

std::int32_t morvik_link_demap(std::uint32_t bitsPerSymbol,
                               std::int32_t demapper,
                               const float* symbols,
                               const float* gains,
                               float noiseVariance,
                               std::size_t count,
                               float* ratios)
{
    if (anyNullOf(count, symbols, ratios)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    const std::int32_t status =
        firstOf(checkedBitsPerSymbol(bitsPerSymbol),
                unless(demapper == MORVIK_LINK_MAX_LOG || demapper == MORVIK_LINK_EXACT, MORVIK_LINK_DEMAPPER),
                checkedPositive(noiseVariance, MORVIK_LINK_NOISE_VARIANCE));
    return guarded(status, [=] {
        link::demapAnySymbols(modulationOf(bitsPerSymbol),
                              demapper == MORVIK_LINK_EXACT ? link::Demapper::exact : link::Demapper::maxLog,
                              symbols,
                              gains,
                              noiseVariance,
                              count,
                              ratios);
    });
}
