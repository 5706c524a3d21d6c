// Checksum: the SHA-256 of a file (FIPS 180-4).
#include "Checksum.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <fstream>
#include <string>
#include <tuple>

#include "Error.h"
#include "InputFile.h"
#include "TextFile.h"

namespace morvik::base {

namespace {

using Hash = std::array<std::uint32_t, 8>;
using Block = std::array<unsigned char, 64>;
using Schedule = std::array<std::uint32_t, 64>;

/// The fractional parts of the square roots of the first eight primes.
constexpr Hash initialHash = {
    0x6A09E667, 0xBB67AE85, 0x3C6EF372, 0xA54FF53A, 0x510E527F, 0x9B05688C, 0x1F83D9AB, 0x5BE0CD19};

/// The fractional parts of the cube roots of the first 64 primes.
constexpr Schedule roundConstants = {
    0x428A2F98, 0x71374491, 0xB5C0FBCF, 0xE9B5DBA5, 0x3956C25B, 0x59F111F1, 0x923F82A4, 0xAB1C5ED5,
    0xD807AA98, 0x12835B01, 0x243185BE, 0x550C7DC3, 0x72BE5D74, 0x80DEB1FE, 0x9BDC06A7, 0xC19BF174,
    0xE49B69C1, 0xEFBE4786, 0x0FC19DC6, 0x240CA1CC, 0x2DE92C6F, 0x4A7484AA, 0x5CB0A9DC, 0x76F988DA,
    0x983E5152, 0xA831C66D, 0xB00327C8, 0xBF597FC7, 0xC6E00BF3, 0xD5A79147, 0x06CA6351, 0x14292967,
    0x27B70A85, 0x2E1B2138, 0x4D2C6DFC, 0x53380D13, 0x650A7354, 0x766A0ABB, 0x81C2C92E, 0x92722C85,
    0xA2BFE8A1, 0xA81A664B, 0xC24B8B70, 0xC76C51A3, 0xD192E819, 0xD6990624, 0xF40E3585, 0x106AA070,
    0x19A4C116, 0x1E376C08, 0x2748774C, 0x34B0BCB5, 0x391C0CB3, 0x4ED8AA4A, 0x5B9CCA4F, 0x682E6FF3,
    0x748F82EE, 0x78A5636F, 0x84C87814, 0x8CC70208, 0x90BEFFFA, 0xA4506CEB, 0xBEF9A3F7, 0xC67178F2};

constexpr std::uint32_t rotated(std::uint32_t word, unsigned count)
{
    return word >> count | word << (32 - count);
}

Schedule scheduleOf(const Block& block)
{
    Schedule words{};
    for (std::size_t i = 0; i < block.size(); ++i) {
        words[i / 4] = words[i / 4] << 8 | block[i];
    }
    for (std::size_t i = 16; i < words.size(); ++i) {
        const std::uint32_t near = words[i - 2];
        const std::uint32_t far = words[i - 15];
        words[i] = words[i - 16] + (rotated(far, 7) ^ rotated(far, 18) ^ far >> 3) + words[i - 7] +
                   (rotated(near, 17) ^ rotated(near, 19) ^ near >> 10);
    }
    return words;
}

void update(Hash& hash, const Block& block)
{
    const Schedule words = scheduleOf(block);
    auto [a, b, c, d, e, f, g, h] = hash;
    for (std::size_t i = 0; i < words.size(); ++i) {
        const std::uint32_t first =
            h + (rotated(e, 6) ^ rotated(e, 11) ^ rotated(e, 25)) + ((e & f) ^ (~e & g)) + roundConstants[i] + words[i];
        const std::uint32_t second = (rotated(a, 2) ^ rotated(a, 13) ^ rotated(a, 22)) + ((a & b) ^ (a & c) ^ (b & c));
        h = g;
        g = f;
        f = e;
        e = d + first;
        d = c;
        c = b;
        b = a;
        a = first + second;
    }
    const Hash mixed = {a, b, c, d, e, f, g, h};
    for (std::size_t i = 0; i < hash.size(); ++i) {
        hash[i] += mixed[i];
    }
}

/// Pads the last `count` bytes of the message, fewer than a block, with a bit 1, zeros and the message's size in bits.
void finish(Hash& hash, Block& block, std::size_t count, std::uint64_t messageBytes)
{
    constexpr std::size_t sizeAt = std::tuple_size_v<Block> - sizeof messageBytes;
    block[count] = 0x80;
    std::fill(block.begin() + static_cast<std::ptrdiff_t>(count) + 1, block.end(), static_cast<unsigned char>(0));
    if (count >= sizeAt) {
        update(hash, block);
        block.fill(0);
    }
    const std::uint64_t bits = 8 * messageBytes;
    for (std::size_t i = 0; i < sizeof bits; ++i) {
        block[sizeAt + i] = static_cast<unsigned char>(bits >> 8 * (sizeof bits - 1 - i) & 0xFF);
    }
    update(hash, block);
}

std::string digits(const Hash& hash)
{
    std::string text;
    for (const std::uint32_t word : hash) {
        for (int shift = 28; shift >= 0; shift -= 4) {
            text += "0123456789abcdef"[word >> shift & 15];
        }
    }
    return text;
}

}  // namespace

std::string sha256(const std::string& fileName)
{
    expectRegularFile(fileName);
    std::ifstream file = openFile(fileName);
    Hash hash = initialHash;
    Block block{};
    std::uint64_t bytes = 0;
    while (file.read(reinterpret_cast<char*>(block.data()), block.size())) {
        update(hash, block);
        bytes += block.size();
    }
    if (file.bad()) {
        throw fileError(fileName, "read");
    }
    const auto rest = static_cast<std::size_t>(file.gcount());
    finish(hash, block, rest, bytes + rest);
    return digits(hash);
}

}  // namespace morvik::base
