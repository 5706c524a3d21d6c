// CTransport: the functions of include/morvik_link.h for whole transport blocks.
#include <algorithm>
#include <array>

#include "link/CChecks.h"
#include "link/coding/SoftValues.h"
#include "link/coding/TransportBlock.h"
#include "rules/Tail.h"

namespace link = morvik::link;
using namespace morvik::link::c;

struct morvik_link_transport {
    link::TransportBlockCode code;
};

namespace {

std::int32_t checkedFormat(const morvik_link_format& format)
{
    const std::uint64_t perSymbol = std::uint64_t{format.bits_per_symbol} * format.layers;
    const std::int32_t status = firstOf(checkedTransportBlockSize(format.transport_block_size),
                                        checkedBitsPerSymbol(format.bits_per_symbol),
                                        unless(format.layers >= 1 && format.layers <= 4, MORVIK_LINK_LAYERS));
    if (status != MORVIK_LINK_OK) {
        return status;
    }
    const unsigned count = link::codeBlocksOf(format.transport_block_size).count;
    return unless(format.coded_bits % perSymbol == 0 && format.coded_bits / perSymbol >= count, MORVIK_LINK_CODED_BITS);
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
            matching.deinterleave(
                values.data(), link::fillerValue, {streams[0] + at, streams[1] + at, streams[2] + at});
        }
    });
}

std::int32_t checkedNumber(const morvik_link_transport& transport, std::uint32_t r)
{
    return unless(r < transport.code.blocks().count, MORVIK_LINK_CODE_BLOCK);
}

}  // namespace

std::int32_t morvik_link_transport_create(const morvik_link_format* format, morvik_link_transport** made)
{
    if (anyNull(format, made)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedFormat(*format), [=] {
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
    if (anyNull(transport, places)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedNumber(*transport, r), [=] {
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
    if (anyNull(transport) || anyNullOf(blocks, bits, coded)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedVersion(version), [=] {
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
    if (anyNull(transport) || anyNullOf(blocks, ratios, buffers)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedVersion(version), [=] {
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
    if (anyNull(transport) || anyNullOf(blocks, steps, buffers)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    const std::int32_t status = firstOf(checkedVersion(version), checkedWidth(width));
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
    if (anyNull(transport) || anyNullOf(blocks, buffers, sys, par1, par2)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    const std::int32_t status = firstOf(checkedNumber(*transport, r), checkedPositive(scale, MORVIK_LINK_SCALE));
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
    if (anyNull(transport) || anyNullOf(blocks, buffers, sys, par1, par2)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    const std::int32_t status = checkedNumber(*transport, r);
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
    if (anyNull(transport) || anyNullOf(blocks, decisions, bits)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(checkedNumber(*transport, r), [=] {
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
    if (anyNull(transport) || anyNullOf(blocks, bits, fits)) {
        return MORVIK_LINK_NULL_POINTER;
    }
    return guarded(MORVIK_LINK_OK, [=] {
        const std::size_t total = transport->code.blocks().bits + link::crcBits;
        for (std::size_t b = 0; b < blocks; ++b) {
            fits[b] = transport->code.fits(packed(bits + b * total, total).data()) ? 1 : 0;
        }
    });
}
