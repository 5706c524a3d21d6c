// TransportBlock: turns transport blocks into the coded bits of a transmission, and received values into code blocks:
// 3GPP TS 36.212, clauses 5.1.1 to 5.1.5.
#include "TransportBlock.h"

#include <algorithm>
#include <stdexcept>
#include <string>

#include "Crc.h"

namespace morvik::link {

namespace {

TransportFormat checked(const TransportFormat& format, const CodeBlocks& blocks)
{
    const unsigned perSymbol = format.bitsPerSymbol * format.layers;
    if (perSymbol == 0 || format.bitsPerSymbol > 8 || format.layers > 4) {
        throw std::invalid_argument("symbols of " + std::to_string(format.bitsPerSymbol) + " bits on " +
                                    std::to_string(format.layers) + " layers, expected 1 to 8 bits on 1 to 4");
    }
    if (format.codedBits % perSymbol != 0) {
        throw std::invalid_argument("coded bits are a multiple of the " + std::to_string(perSymbol) +
                                    " of a symbol, not " + std::to_string(format.codedBits));
    }
    if (format.codedBits / perSymbol < blocks.count) {
        throw std::invalid_argument("coded bits are at least " + std::to_string(blocks.count * perSymbol) +
                                    ", a symbol for each code block, not " + std::to_string(format.codedBits));
    }
    return format;
}

}  // namespace

TransportBlockCode::TransportBlockCode(const TransportFormat& format)
    : itsFormat(format), itsBlocks(codeBlocksOf(format.bits))
{
    checked(itsFormat, itsBlocks);
    layOut();
}

/// Makes the rate matching of each kind of code block, and gives every block its place in rows and buffers.
void TransportBlockCode::layOut()
{
    const unsigned bufferSize =
        itsFormat.softBufferSize == unlimitedBuffer ? unlimitedBuffer : itsFormat.softBufferSize / itsBlocks.count;
    itsWordOffsets.push_back(0);
    itsSoftOffsets.push_back(0);
    itsPayloadOffsets.push_back(0);
    for (unsigned r = 0; r < itsBlocks.count; ++r) {
        const unsigned before = r == 0 ? r : r - 1;
        if (r == 0 || itsBlocks.size(r) != itsBlocks.size(before) ||
            itsBlocks.fillersOf(r) != itsBlocks.fillersOf(before)) {
            itsKinds.emplace_back(itsBlocks.size(r), itsBlocks.fillersOf(r), bufferSize);
            itsEncoders.try_emplace(itsBlocks.size(r), itsBlocks.size(r));
        }
        itsKindOf.push_back(static_cast<std::uint8_t>(itsKinds.size() - 1));
        itsWordOffsets.push_back(itsWordOffsets.back() + wordsOf(matching(r).size()));
        itsSoftOffsets.push_back(itsSoftOffsets.back() + matching(r).size());
        itsPayloadOffsets.push_back(itsPayloadOffsets.back() + itsBlocks.payload(r));
    }
}

unsigned TransportBlockCode::codedOffset(unsigned r) const
{
    // The first blocks have as many symbols as divide evenly, the last ones, as many as the remainder, one more.
    const unsigned perSymbol = itsFormat.bitsPerSymbol * itsFormat.layers;
    const unsigned symbols = itsFormat.codedBits / perSymbol;  // G'
    const unsigned shorter = itsBlocks.count - symbols % itsBlocks.count;
    return perSymbol * (r * (symbols / itsBlocks.count) + (r > shorter ? r - shorter : 0));
}

void TransportBlockCode::encode(const PackedBlocks& information, unsigned count, PackedBlocks& buffers)
{
    buffers.words = bufferWords();
    buffers.bits.resize(count * buffers.words);
    for (unsigned kind = 0; kind < itsKinds.size(); ++kind) {
        itsPlaces.clear();
        for (unsigned b = 0; b < count; ++b) {
            for (unsigned r = 0; r < itsBlocks.count; ++r) {
                if (itsKindOf[r] != kind) {
                    continue;
                }
                itsPlaces.push_back({b, r});
                if (itsPlaces.size() == TurboEncoder::blocksAtOnce) {
                    encodePlaces(information, buffers);
                }
            }
        }
        if (!itsPlaces.empty()) {
            encodePlaces(information, buffers);
        }
    }
}

/// Encodes the code blocks of itsPlaces, which are of one kind, up to TurboEncoder::blocksAtOnce, and forgets them.
void TransportBlockCode::encodePlaces(const PackedBlocks& information, PackedBlocks& buffers)
{
    const unsigned any = itsPlaces.front().r;
    TurboEncoder& encoder = itsEncoders.at(itsBlocks.size(any));
    const auto count = static_cast<unsigned>(itsPlaces.size());
    itsFramed.words = encoder.words();
    itsFramed.bits.assign(count * itsFramed.words, 0);
    std::array<std::uint64_t*, TurboEncoder::blocksAtOnce> rows{};
    for (unsigned i = 0; i < count; ++i) {
        const Place& place = itsPlaces[i];
        frame(information.block(place.b), place.r, itsFramed.block(i));
        rows[i] = buffers.block(place.b) + itsWordOffsets[place.r];
    }
    encoder.encode(itsFramed, count, matching(any).positions(), rows.data());
    itsPlaces.clear();
}

void TransportBlockCode::frame(const std::uint64_t* row, unsigned r, std::uint64_t* block) const
{
    const std::size_t first = itsPayloadOffsets[r];
    const std::size_t end = itsPayloadOffsets[r + 1];
    const std::size_t bits = std::min<std::size_t>(end, itsBlocks.bits);
    const unsigned fillers = itsBlocks.fillersOf(r);
    if (first < bits) {
        copyBits(row, first, bits - first, block, fillers);
    }
    if (end > itsBlocks.bits) {
        const std::uint64_t parity = crc24a(row, 0, itsBlocks.bits);
        const std::size_t from = std::max<std::size_t>(first, itsBlocks.bits);
        copyBits(&parity, from - itsBlocks.bits, end - from, block, fillers + from - first);
    }
    if (itsBlocks.count > 1) {
        const std::size_t size = itsBlocks.size(r) - crcBits;
        const std::uint64_t parity = crc24b(block, 0, size);
        copyBits(&parity, 0, crcBits, block, size);
    }
}

void TransportBlockCode::select(const PackedBlocks& buffers,
                                unsigned count,
                                unsigned version,
                                PackedBlocks& coded) const
{
    coded.words = wordsOf(itsFormat.codedBits);
    coded.bits.assign(count * coded.words, 0);
    for (unsigned b = 0; b < count; ++b) {
        select(buffers.block(b), version, coded.block(b));
    }
}

void TransportBlockCode::select(const std::uint64_t* buffers, unsigned version, std::uint64_t* coded) const
{
    for (unsigned r = 0; r < itsBlocks.count; ++r) {
        matching(r).select(buffers + itsWordOffsets[r], version, codedBits(r), coded, codedOffset(r));
    }
}

void TransportBlockCode::recover(const float* received, unsigned version, float* buffer) const
{
    for (unsigned r = 0; r < itsBlocks.count; ++r) {
        matching(r).recover(received + codedOffset(r), version, codedBits(r), buffer + softOffset(r));
    }
}

void TransportBlockCode::recover(const std::int16_t* received,
                                 unsigned version,
                                 unsigned width,
                                 std::int16_t* buffer) const
{
    for (unsigned r = 0; r < itsBlocks.count; ++r) {
        matching(r).recover(received + codedOffset(r), version, codedBits(r), width, buffer + softOffset(r));
    }
}

bool TransportBlockCode::sendsOnce() const
{
    for (unsigned r = 0; r < itsBlocks.count; ++r) {
        if (codedBits(r) > matching(r).size()) {
            return false;
        }
    }
    return true;
}

void TransportBlockCode::place(const std::int8_t* received, unsigned version, std::int8_t* buffer) const
{
    for (unsigned r = 0; r < itsBlocks.count; ++r) {
        matching(r).place(received + codedOffset(r), version, codedBits(r), buffer + softOffset(r));
    }
}

bool TransportBlockCode::join(const std::uint8_t* decisions, unsigned r, std::uint64_t* row) const
{
    // Filler bits are known: leading zeros, which no CRC depends on.
    const unsigned sent = itsBlocks.size(r) - itsBlocks.fillersOf(r);
    std::vector<std::uint64_t> block(wordsOf(sent));
    packBits(decisions + itsBlocks.fillersOf(r), sent, block.data());
    copyBits(block.data(), 0, itsBlocks.payload(r), row, itsPayloadOffsets[r]);
    return (itsBlocks.count > 1 ? crc24b(block.data(), 0, sent) : crc24a(block.data(), 0, sent)) == 0;
}

bool TransportBlockCode::fits(const std::uint64_t* row) const
{
    return crc24a(row, 0, itsBlocks.bits + crcBits) == 0;
}

}  // namespace morvik::link
