// CInterface: the functions of include/morvik_link.h.
#include <algorithm>
#include <array>
#include <cmath>
#include <new>
#include <stdexcept>
#include <vector>

#include "link/coding/Crc.h"
#include "link/coding/SoftValues.h"
#include "link/coding/TransportBlock.h"
#include "link/modulation/Demapper.h"
#include "link/modulation/Mapper.h"
#include "morvik_link.h"
#include "rules/BlockSizes.h"
#include "rules/Tail.h"

namespace link = morvik::link;

struct morvik_link_transport {
    link::TransportBlockCode code;
};

namespace {

constexpr unsigned unlimited(std::uint32_t size)
{
    return size == 0 ? link::unlimitedBuffer : size;
}

/// The first status of the list that is none.
template <std::size_t count>
std::int32_t firstOf(const std::int32_t (&statuses)[count])
{
    const auto* const wrong = std::find_if(
        std::begin(statuses), std::end(statuses), [](std::int32_t status) { return status != MORVIK_LINK_OK; });
    return wrong == std::end(statuses) ? MORVIK_LINK_OK : *wrong;
}

constexpr std::int32_t unless(bool good, std::int32_t status)
{
    return good ? MORVIK_LINK_OK : status;
}

template <typename... Pointer>
std::int32_t present(const Pointer*... pointers)
{
    return unless((... && (pointers != nullptr)), MORVIK_LINK_NULL_POINTER);
}

std::int32_t checkedCodeBlock(std::uint32_t K, std::uint32_t fillers)
{
    return firstOf({unless(morvik::rules::findBlockSize(K) != nullptr, MORVIK_LINK_BLOCK_SIZE),
                    unless(fillers < K, MORVIK_LINK_FILLERS)});
}

std::int32_t checkedVersion(std::uint32_t version)
{
    return unless(version < link::redundancyVersions, MORVIK_LINK_REDUNDANCY_VERSION);
}

std::int32_t checkedPositive(float number, std::int32_t status)
{
    return unless(std::isfinite(number) && number > 0, status);
}

std::int32_t checkedWidth(std::uint32_t width)
{
    return unless(width >= 2 && width <= 16, MORVIK_LINK_WIDTH);
}

std::int32_t checkedBitsPerSymbol(std::uint32_t bits)
{
    return unless(bits == 1 || (bits >= 2 && bits <= 8 && bits % 2 == 0), MORVIK_LINK_BITS_PER_SYMBOL);
}

link::Modulation modulationOf(std::uint32_t bitsPerSymbol)
{
    return link::modulations[bitsPerSymbol / 2];
}

std::int32_t checkedFormat(const morvik_link_format& format)
{
    const std::uint64_t perSymbol = std::uint64_t{format.bits_per_symbol} * format.layers;
    const std::int32_t status = firstOf({
        unless(format.transport_block_size >= 1 && format.transport_block_size <= link::mostTransportBits,
               MORVIK_LINK_TRANSPORT_BLOCK_SIZE),
        checkedBitsPerSymbol(format.bits_per_symbol),
        unless(format.layers >= 1 && format.layers <= 4, MORVIK_LINK_LAYERS),
    });
    if (status != MORVIK_LINK_OK) {
        return status;
    }
    const unsigned count = link::codeBlocksOf(format.transport_block_size).count;
    return unless(format.coded_bits % perSymbol == 0 && format.coded_bits / perSymbol >= count, MORVIK_LINK_CODED_BITS);
}

/// Calls `work`, and tells of what it throws.
template <typename Work>
std::int32_t guarded(std::int32_t checked, Work work)
{
    if (checked != MORVIK_LINK_OK) {
        return checked;
    }
    try {
        work();
        return MORVIK_LINK_OK;
    } catch (const std::invalid_argument&) {
        return MORVIK_LINK_BUFFER_SIZE;  // all else has been checked
    } catch (const std::exception&) {
        return MORVIK_LINK_OUT_OF_MEMORY;
    }
}

/// A row of bits, packed.
std::vector<std::uint64_t> packed(const std::uint8_t* bits, std::size_t count)
{
    std::vector<std::uint64_t> row(link::wordsOf(count));
    link::packBits(bits, count, row.data());
    return row;
}

template <std::uint32_t (*crc)(const std::uint64_t*, std::size_t, std::size_t)>
std::int32_t writeParity(const std::uint8_t* bits, std::size_t count, std::uint8_t* parity)
{
    return guarded(present(bits, parity), [=] {
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
    return guarded(firstOf({present(buffers, streams[0], streams[1], streams[2]), checkedCodeBlock(K, fillers)}), [=] {
        const link::RateMatching matching(K, fillers, unlimited(bufferSize));
        for (std::size_t b = 0; b < blocks; ++b) {
            const std::size_t at = b * (K + morvik::rules::tailPositions);
            matching.deinterleave<Value>(
                buffers + b * matching.size(), filler, {streams[0] + at, streams[1] + at, streams[2] + at});
        }
    });
}

/// Code block r of each transport block, after `toSoftValues` has made the core's values of its soft buffer.
template <typename Sum, typename ToSoftValues>
std::int32_t softValuesOf(const morvik_link_transport* transport,
                          std::uint32_t r,
                          std::size_t blocks,
                          const Sum* buffers,
                          const std::array<std::int8_t*, 3>& streams,
                          ToSoftValues toSoftValues)
{
    return guarded(MORVIK_LINK_OK, [=] {
        const link::TransportBlockCode& code = transport->code;
        const link::RateMatching& matching = code.matching(r);
        std::vector<std::int8_t> values(matching.size());
        for (std::size_t b = 0; b < blocks; ++b) {
            toSoftValues(buffers + b * code.softSize() + code.softOffset(r), values.size(), values.data());
            const std::size_t at = b * (code.blocks().size(r) + morvik::rules::tailPositions);
            matching.deinterleave<std::int8_t>(
                values.data(), link::fillerValue, {streams[0] + at, streams[1] + at, streams[2] + at});
        }
    });
}

/// A null pointer is told by another check.
std::int32_t checkedNumber(const morvik_link_transport* transport, std::uint32_t r)
{
    return unless(transport == nullptr || r < transport->code.blocks().count, MORVIK_LINK_CODE_BLOCK);
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

std::int32_t morvik_link_segment(std::uint32_t transport_block_size, morvik_link_code_blocks* code_blocks)
{
    const std::int32_t status =
        firstOf({present(code_blocks),
                 unless(transport_block_size >= 1 && transport_block_size <= link::mostTransportBits,
                        MORVIK_LINK_TRANSPORT_BLOCK_SIZE)});
    return guarded(status, [=] {
        const link::CodeBlocks blocks = link::codeBlocksOf(transport_block_size);
        *code_blocks = {
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
    return guarded(firstOf({present(bits, sys, par1, par2), checkedCodeBlock(K, 0)}), [=] {
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
                                    std::uint32_t buffer_size,
                                    std::uint32_t version,
                                    std::size_t blocks,
                                    const std::uint8_t* sys,
                                    const std::uint8_t* par1,
                                    const std::uint8_t* par2,
                                    std::size_t count,
                                    std::uint8_t* coded)
{
    const std::int32_t status =
        firstOf({present(sys, par1, par2, coded), checkedCodeBlock(K, fillers), checkedVersion(version)});
    return guarded(status, [=] {
        const link::RateMatching matching(K, fillers, unlimited(buffer_size));
        const std::size_t length = K + morvik::rules::tailPositions;
        std::vector<std::uint64_t> buffer(link::wordsOf(matching.size()));
        std::vector<std::uint64_t> row(link::wordsOf(count));
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
                                          std::uint32_t buffer_size,
                                          std::uint32_t* size)
{
    return guarded(firstOf({present(size), checkedCodeBlock(K, fillers)}),
                   [=] { *size = link::RateMatching(K, fillers, unlimited(buffer_size)).size(); });
}

std::int32_t morvik_link_rate_recover(std::uint32_t K,
                                      std::uint32_t fillers,
                                      std::uint32_t buffer_size,
                                      std::uint32_t version,
                                      std::size_t blocks,
                                      const float* ratios,
                                      std::size_t count,
                                      float* buffers)
{
    const std::int32_t status =
        firstOf({present(ratios, buffers), checkedCodeBlock(K, fillers), checkedVersion(version)});
    return guarded(status, [=] {
        const link::RateMatching matching(K, fillers, unlimited(buffer_size));
        for (std::size_t b = 0; b < blocks; ++b) {
            matching.recover(ratios + b * count, version, count, buffers + b * matching.size());
        }
    });
}

std::int32_t morvik_link_rate_recover_i16(std::uint32_t K,
                                          std::uint32_t fillers,
                                          std::uint32_t buffer_size,
                                          std::uint32_t version,
                                          std::size_t blocks,
                                          const std::int16_t* steps,
                                          std::size_t count,
                                          std::uint32_t width,
                                          std::int16_t* buffers)
{
    const std::int32_t status =
        firstOf({present(steps, buffers), checkedCodeBlock(K, fillers), checkedVersion(version), checkedWidth(width)});
    return guarded(status, [=] {
        const link::RateMatching matching(K, fillers, unlimited(buffer_size));
        for (std::size_t b = 0; b < blocks; ++b) {
            matching.recover(steps + b * count, version, count, width, buffers + b * matching.size());
        }
    });
}

std::int32_t morvik_link_deinterleave(std::uint32_t K,
                                      std::uint32_t fillers,
                                      std::uint32_t buffer_size,
                                      std::size_t blocks,
                                      const float* buffers,
                                      float filler,
                                      float* sys,
                                      float* par1,
                                      float* par2)
{
    return deinterleave<float>(K, fillers, buffer_size, blocks, buffers, filler, {sys, par1, par2});
}

std::int32_t morvik_link_deinterleave_i8(std::uint32_t K,
                                         std::uint32_t fillers,
                                         std::uint32_t buffer_size,
                                         std::size_t blocks,
                                         const std::int8_t* buffers,
                                         std::int8_t filler,
                                         std::int8_t* sys,
                                         std::int8_t* par1,
                                         std::int8_t* par2)
{
    return deinterleave<std::int8_t>(K, fillers, buffer_size, blocks, buffers, filler, {sys, par1, par2});
}

std::int32_t morvik_link_soft_values(const float* ratios, std::size_t count, float scale, std::int8_t* values)
{
    return guarded(firstOf({present(ratios, values), checkedPositive(scale, MORVIK_LINK_SCALE)}),
                   [=] { link::softValues(ratios, count, scale, values); });
}

std::int32_t morvik_link_soft_values_i16(
    const float* ratios, std::size_t count, float scale, std::uint32_t width, std::int16_t* values)
{
    const std::int32_t status =
        firstOf({present(ratios, values), checkedPositive(scale, MORVIK_LINK_SCALE), checkedWidth(width)});
    return guarded(status, [=] { link::softValues(ratios, count, scale, width, values); });
}

std::int32_t morvik_link_map(std::uint32_t bits_per_symbol, const std::uint8_t* bits, std::size_t count, float* symbols)
{
    return guarded(firstOf({present(bits, symbols), checkedBitsPerSymbol(bits_per_symbol)}), [=] {
        const std::vector<std::uint64_t> row = packed(bits, count * bits_per_symbol);
        link::mapSymbols(modulationOf(bits_per_symbol), row.data(), count, symbols);
    });
}

std::int32_t morvik_link_demap(std::uint32_t bits_per_symbol,
                               std::int32_t demapper,
                               const float* symbols,
                               const float* gains,
                               float noise_variance,
                               std::size_t count,
                               float* ratios)
{
    const std::int32_t status =
        firstOf({present(symbols, ratios),
                 checkedBitsPerSymbol(bits_per_symbol),
                 unless(demapper == MORVIK_LINK_MAX_LOG || demapper == MORVIK_LINK_EXACT, MORVIK_LINK_DEMAPPER),
                 checkedPositive(noise_variance, MORVIK_LINK_NOISE_VARIANCE)});
    return guarded(status, [=] {
        link::demapSymbols(modulationOf(bits_per_symbol),
                           demapper == MORVIK_LINK_EXACT ? link::Demapper::exact : link::Demapper::maxLog,
                           symbols,
                           gains,
                           noise_variance,
                           count,
                           ratios);
    });
}

std::int32_t morvik_link_transport_create(const morvik_link_format* format, morvik_link_transport** made)
{
    const std::int32_t status = present(format, made);
    return guarded(status == MORVIK_LINK_OK ? checkedFormat(*format) : status, [=] {
        *made = new morvik_link_transport{link::TransportBlockCode({format->transport_block_size,
                                                                    format->coded_bits,
                                                                    format->bits_per_symbol,
                                                                    format->layers,
                                                                    unlimited(format->soft_buffer_size)})};
    });
}

void morvik_link_transport_destroy(morvik_link_transport* transport)
{
    delete transport;
}

std::int32_t morvik_link_transport_code_block(const morvik_link_transport* transport,
                                              std::uint32_t r,
                                              morvik_link_places* places)
{
    return guarded(firstOf({present(transport, places), checkedNumber(transport, r)}), [=] {
        const link::TransportBlockCode& code = transport->code;
        *places = {code.blocks().size(r),
                   code.blocks().fillersOf(r),
                   code.blocks().payload(r),
                   static_cast<std::uint32_t>(code.payloadOffset(r)),
                   code.codedBits(r),
                   code.codedOffset(r),
                   code.matching(r).size(),
                   static_cast<std::uint32_t>(code.softOffset(r))};
    });
}

std::uint32_t morvik_link_transport_buffer_size(const morvik_link_transport* transport)
{
    return transport == nullptr ? 0 : static_cast<std::uint32_t>(transport->code.softSize());
}

std::int32_t morvik_link_transport_encode(morvik_link_transport* transport,
                                          std::uint32_t version,
                                          std::size_t blocks,
                                          const std::uint8_t* bits,
                                          std::uint8_t* coded)
{
    return guarded(firstOf({present(transport, bits, coded), checkedVersion(version)}), [=] {
        link::TransportBlockCode& code = transport->code;
        const link::TransportFormat& format = code.format();
        link::PackedBlocks information{link::wordsOf(format.bits), {}};
        link::PackedBlocks buffers;
        link::PackedBlocks rows;
        for (std::size_t done = 0; done < blocks; done += link::TurboEncoder::blocksAtOnce) {
            const auto now =
                static_cast<unsigned>(std::min(blocks - done, std::size_t{link::TurboEncoder::blocksAtOnce}));
            information.bits.resize(now * information.words);
            for (unsigned b = 0; b < now; ++b) {
                link::packBits(bits + (done + b) * format.bits, format.bits, information.block(b));
            }
            code.encode(information, now, buffers);
            code.select(buffers, now, version, rows);
            for (unsigned b = 0; b < now; ++b) {
                link::unpackBits(rows.block(b), format.codedBits, coded + (done + b) * format.codedBits);
            }
        }
    });
}

std::int32_t morvik_link_transport_recover(const morvik_link_transport* transport,
                                           std::uint32_t version,
                                           std::size_t blocks,
                                           const float* ratios,
                                           float* buffers)
{
    return guarded(firstOf({present(transport, ratios, buffers), checkedVersion(version)}), [=] {
        const link::TransportBlockCode& code = transport->code;
        for (std::size_t b = 0; b < blocks; ++b) {
            code.recover(ratios + b * code.format().codedBits, version, buffers + b * code.softSize());
        }
    });
}

std::int32_t morvik_link_transport_recover_i16(const morvik_link_transport* transport,
                                               std::uint32_t version,
                                               std::size_t blocks,
                                               const std::int16_t* steps,
                                               std::uint32_t width,
                                               std::int16_t* buffers)
{
    const std::int32_t status =
        firstOf({present(transport, steps, buffers), checkedVersion(version), checkedWidth(width)});
    return guarded(status, [=] {
        const link::TransportBlockCode& code = transport->code;
        for (std::size_t b = 0; b < blocks; ++b) {
            code.recover(steps + b * code.format().codedBits, version, width, buffers + b * code.softSize());
        }
    });
}

std::int32_t morvik_link_transport_soft_values(const morvik_link_transport* transport,
                                               std::uint32_t r,
                                               std::size_t blocks,
                                               const float* buffers,
                                               float scale,
                                               std::int8_t* sys,
                                               std::int8_t* par1,
                                               std::int8_t* par2)
{
    const std::int32_t status = firstOf({present(transport, buffers, sys, par1, par2),
                                         checkedNumber(transport, r),
                                         checkedPositive(scale, MORVIK_LINK_SCALE)});
    return status != MORVIK_LINK_OK ? status
                                    : softValuesOf(transport,
                                                   r,
                                                   blocks,
                                                   buffers,
                                                   {sys, par1, par2},
                                                   [=](const float* sums, std::size_t count, std::int8_t* values) {
                                                       link::softValues(sums, count, scale, values);
                                                   });
}

std::int32_t morvik_link_transport_soft_values_i16(const morvik_link_transport* transport,
                                                   std::uint32_t r,
                                                   std::size_t blocks,
                                                   const std::int16_t* buffers,
                                                   std::int8_t* sys,
                                                   std::int8_t* par1,
                                                   std::int8_t* par2)
{
    const std::int32_t status = firstOf({present(transport, buffers, sys, par1, par2), checkedNumber(transport, r)});
    return status != MORVIK_LINK_OK
               ? status
               : softValuesOf(transport,
                              r,
                              blocks,
                              buffers,
                              {sys, par1, par2},
                              [](const std::int16_t* sums, std::size_t count, std::int8_t* values) {
                                  link::softValues(sums, count, values);
                              });
}

std::int32_t morvik_link_transport_join(const morvik_link_transport* transport,
                                        std::uint32_t r,
                                        std::size_t blocks,
                                        const std::uint8_t* decisions,
                                        std::uint8_t* bits,
                                        std::uint8_t* fits)
{
    return guarded(firstOf({present(transport, decisions, bits), checkedNumber(transport, r)}), [=] {
        const link::TransportBlockCode& code = transport->code;
        const link::CodeBlocks& parts = code.blocks();
        const std::size_t total = parts.bits + link::crcBits;
        std::vector<std::uint64_t> row(link::wordsOf(total));
        for (std::size_t b = 0; b < blocks; ++b) {
            const std::uint8_t* const own = decisions + b * parts.size(r);
            const bool crcFits = code.join(own, r, row.data());
            std::transform(own + parts.fillersOf(r),
                           own + parts.fillersOf(r) + parts.payload(r),
                           bits + b * total + code.payloadOffset(r),
                           [](std::uint8_t bit) { return static_cast<std::uint8_t>(bit & 1); });
            if (fits != nullptr) {
                fits[b] = crcFits ? 1 : 0;
            }
        }
    });
}

std::int32_t morvik_link_transport_check(const morvik_link_transport* transport,
                                         std::size_t blocks,
                                         const std::uint8_t* bits,
                                         std::uint8_t* fits)
{
    return guarded(present(transport, bits, fits), [=] {
        const std::size_t total = transport->code.blocks().bits + link::crcBits;
        for (std::size_t b = 0; b < blocks; ++b) {
            fits[b] = transport->code.fits(packed(bits + b * total, total).data()) ? 1 : 0;
        }
    });
}
