// Crc: the cyclic redundancy checks of 3GPP TS 36.212, clause 5.1.1.
//
// The remainder is kept with the highest power of D in bit 0, the order in which bits are packed and sent.
#include "Crc.h"

#include <algorithm>
#include <array>

#include "PackedBits.h"

namespace morvik::link {

namespace {

/// The generator without D^24: bit i is the coefficient of D^(23 - i).
constexpr std::uint32_t generatorA = 0xDF3261;
constexpr std::uint32_t generatorB = 0xC60001;

/// Entry b is the remainder after the eight bits b.
using Table = std::array<std::uint32_t, 256>;

constexpr Table tableOf(std::uint32_t generator)
{
    Table table{};
    for (std::uint32_t byte = 0; byte < table.size(); ++byte) {
        std::uint32_t remainder = byte;
        for (unsigned i = 0; i < 8; ++i) {
            remainder = remainder >> 1 ^ ((remainder & 1) != 0 ? generator : 0);
        }
        table[byte] = remainder;
    }
    return table;
}

constexpr Table tableA = tableOf(generatorA);
constexpr Table tableB = tableOf(generatorB);

std::uint32_t remainderOf(
    const Table& table, std::uint32_t generator, const std::uint64_t* row, std::size_t first, std::size_t count)
{
    std::uint32_t remainder = 0;
    for (std::size_t done = 0; done < count; done += 64) {
        const std::size_t now = std::min(count - done, std::size_t{64});
        std::uint64_t bits = bitsAt(row, first + done, now);
        for (std::size_t i = 0; i < now / 8; ++i, bits >>= 8) {
            remainder = remainder >> 8 ^ table[(remainder ^ bits) & 0xFF];
        }
        for (std::size_t i = 0; i < now % 8; ++i, bits >>= 1) {
            remainder = remainder >> 1 ^ (((remainder ^ bits) & 1) != 0 ? generator : 0);
        }
    }
    return remainder;
}

}  // namespace

std::uint32_t crc24a(const std::uint64_t* row, std::size_t first, std::size_t count)
{
    return remainderOf(tableA, generatorA, row, first, count);
}

std::uint32_t crc24b(const std::uint64_t* row, std::size_t first, std::size_t count)
{
    return remainderOf(tableB, generatorB, row, first, count);
}

}  // namespace morvik::link
