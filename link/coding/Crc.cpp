// Crc: the cyclic redundancy checks of 3GPP TS 36.212, clause 5.1.1.
//
// The remainder is kept with the highest power of D in bit 0, the order in which bits are packed and sent.
#include "Crc.h"

#include <array>

#include "PackedBits.h"

namespace morvik::link {

namespace {

/// The generator without D^24: bit i is the coefficient of D^(23 - i).
constexpr std::uint32_t generatorA = 0xDF3261;
constexpr std::uint32_t generatorB = 0xC60001;

/// Entry b of table i is the remainder after the eight bits b and 8 i zeros.
using Tables = std::array<std::array<std::uint32_t, 256>, 8>;

constexpr Tables tablesOf(std::uint32_t generator)
{
    Tables tables{};
    for (std::uint32_t byte = 0; byte < 256; ++byte) {
        std::uint32_t remainder = byte;
        for (auto& table : tables) {
            for (unsigned i = 0; i < 8; ++i) {
                remainder = remainder >> 1 ^ ((remainder & 1) != 0 ? generator : 0);
            }
            table[byte] = remainder;
        }
    }
    return tables;
}

constexpr Tables tablesA = tablesOf(generatorA);
constexpr Tables tablesB = tablesOf(generatorB);

std::uint32_t remainderOf(
    const Tables& tables, std::uint32_t generator, const std::uint64_t* row, std::size_t first, std::size_t count)
{
    std::uint32_t remainder = 0;
    const std::size_t whole = count / 64 * 64;
    for (std::size_t done = 0; done < whole; done += 64) {
        const std::uint64_t bits = bitsAt(row, first + done, 64) ^ remainder;
        remainder = 0;
        for (unsigned i = 0; i < tables.size(); ++i) {
            remainder ^= tables[7 - i][bits >> 8 * i & 0xFF];
        }
    }
    if (whole < count) {
        std::uint64_t bits = bitsAt(row, first + whole, count - whole);
        for (std::size_t i = whole; i < count; ++i, bits >>= 1) {
            remainder = remainder >> 1 ^ (((remainder ^ bits) & 1) != 0 ? generator : 0);
        }
    }
    return remainder;
}

}  // namespace

std::uint32_t crc24a(const std::uint64_t* row, std::size_t first, std::size_t count)
{
    return remainderOf(tablesA, generatorA, row, first, count);
}

std::uint32_t crc24b(const std::uint64_t* row, std::size_t first, std::size_t count)
{
    return remainderOf(tablesB, generatorB, row, first, count);
}

}  // namespace morvik::link
