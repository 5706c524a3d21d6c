// PackedBits: rows of bits, 64 to a word.
#include "PackedBits.h"

#include <algorithm>
#include <cstring>

namespace morvik::link {

namespace {

constexpr std::uint64_t everyByte = 0x0101010101010101;

/// A word of memory whose first byte is the lowest, and back, whatever the machine's order.
std::uint64_t lowestFirst(std::uint64_t word)
{
#if __BYTE_ORDER__ == __ORDER_BIG_ENDIAN__
    return __builtin_bswap64(word);
#else
    return word;
#endif
}

/// Bit j of the result is the lowest bit of byte j.
std::uint64_t packEight(const std::uint8_t* bytes)
{
    std::uint64_t eight;
    std::memcpy(&eight, bytes, sizeof eight);
    eight = lowestFirst(eight);
    // Byte j moves to bit 56 + j; the other products stay below bit 56 or leave the word.
    return (eight & everyByte) * 0x0102040810204080 >> 56;
}

/// Byte j of the result is bit j.
std::uint64_t spreadEight(std::uint64_t bits)
{
    // Byte j keeps bit j of the eight; adding 127 moves it to the top, whichever it was.
    const std::uint64_t eight = (bits & 0xFF) * everyByte & 0x8040201008040201;
    return (eight + 0x7F * everyByte) >> 7 & everyByte;
}

}  // namespace

void copyBits(const std::uint64_t* from, std::size_t first, std::size_t count, std::uint64_t* row, std::size_t to)
{
    const auto copyPart = [&](std::size_t bits) {
        const std::size_t shift = to % 64;
        row[to / 64] = (row[to / 64] & ~(lowBits(bits) << shift)) | bitsAt(from, first, bits) << shift;
        first += bits;
        to += bits;
        count -= bits;
    };
    if (to % 64 != 0 && count > 0) {
        copyPart(std::min(count, 64 - to % 64));
    }
    const std::size_t words = count / 64;
    const std::size_t shift = first % 64;
    const std::uint64_t* const source = from + first / 64;
    for (std::size_t i = 0; i < words; ++i) {
        row[to / 64 + i] = shift == 0 ? source[i] : source[i] >> shift | source[i + 1] << (64 - shift);
    }
    first += 64 * words;
    to += 64 * words;
    count -= 64 * words;
    if (count > 0) {
        copyPart(count);
    }
}

void packBits(const std::uint8_t* bytes, std::size_t count, std::uint64_t* row)
{
    std::fill_n(row, wordsOf(count), 0);
    const std::size_t whole = count / 8 * 8;
    for (std::size_t i = 0; i < whole; i += 8) {
        row[i / 64] |= packEight(bytes + i) << i % 64;
    }
    for (std::size_t i = whole; i < count; ++i) {
        row[i / 64] |= std::uint64_t{bytes[i] & 1U} << i % 64;
    }
}

void unpackBits(const std::uint64_t* row, std::size_t count, std::uint8_t* bytes)
{
    const std::size_t whole = count / 8 * 8;
    for (std::size_t i = 0; i < whole; i += 8) {
        const std::uint64_t eight = lowestFirst(spreadEight(row[i / 64] >> i % 64));
        std::memcpy(bytes + i, &eight, sizeof eight);
    }
    for (std::size_t i = whole; i < count; ++i) {
        bytes[i] = static_cast<std::uint8_t>(row[i / 64] >> i % 64 & 1);
    }
}

}  // namespace morvik::link
