// PackedBits: rows of bits, 64 to a word: bit i is bit i % 64 of word i / 64.
#ifndef MORVIK_LINK_CODING_PACKEDBITS_H
#define MORVIK_LINK_CODING_PACKEDBITS_H

#include <cstddef>
#include <cstdint>
#include <vector>

namespace morvik::link {

/// Consecutive blocks of bits, each in `words` words.
struct PackedBlocks {
    std::size_t words = 0;
    std::vector<std::uint64_t> bits;

    std::uint64_t* block(unsigned b)
    {
        return &bits[b * words];
    }

    const std::uint64_t* block(unsigned b) const
    {
        return &bits[b * words];
    }
};

/// Words that hold `count` bits.
constexpr std::size_t wordsOf(std::size_t count)
{
    return (count + 63) / 64;
}

/// `count` set bits, 0 to 64.
constexpr std::uint64_t lowBits(std::size_t count)
{
    return count == 0 ? 0 : ~std::uint64_t{0} >> (64 - count);
}

/// Bits `first` to `first` + `count` - 1 as a word, 1 to 64 of them. Reads only words that hold one of them.
inline std::uint64_t bitsAt(const std::uint64_t* row, std::size_t first, std::size_t count)
{
    const std::size_t shift = first % 64;
    std::uint64_t bits = row[first / 64] >> shift;
    if (shift + count > 64) {
        bits |= row[first / 64 + 1] << (64 - shift);
    }
    return bits & lowBits(count);
}

/// Copies `count` bits to position `to` of a row; the other bits of the row stay.
void copyBits(const std::uint64_t* from, std::size_t first, std::size_t count, std::uint64_t* row, std::size_t to);

/// Packs the lowest bits of `count` bytes. Clears the rest of the last word.
void packBits(const std::uint8_t* bytes, std::size_t count, std::uint64_t* row);

/// Unpacks `count` bits into bytes of 0 or 1.
void unpackBits(const std::uint64_t* row, std::size_t count, std::uint8_t* bytes);

}  // namespace morvik::link

#endif
