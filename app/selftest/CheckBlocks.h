// CheckBlocks: the blocks that `morvik selftest` decodes, the same on every machine.
#ifndef MORVIK_APP_SELFTEST_CHECKBLOCKS_H
#define MORVIK_APP_SELFTEST_CHECKBLOCKS_H

#include <array>
#include <cstdint>
#include <string>
#include <vector>

namespace morvik::selftest {

/// FNV-1a, 64 bits.
class Digest {
public:
    void add(std::uint8_t byte)
    {
        itsValue = (itsValue ^ byte) * 0x100000001B3ULL;
    }

    std::uint64_t value() const
    {
        return itsValue;
    }

private:
    std::uint64_t itsValue = 0xCBF29CE484222325ULL;
};

/// Sixteen hexadecimal digits.
std::string hexadecimal(std::uint64_t digest);

/// Blocks of one size that are decoded in one call.
struct CheckBatch {
    unsigned K = 0;
    std::uint32_t blocks = 0;
    std::uint32_t iterations = 0;
    std::array<std::vector<std::int8_t>, 3> streams;  ///< K + 4 soft values of each block
};

/// Some blocks of each of the 188 sizes: code words in noise in which decisions hang by a hair, and, the last block of
/// a batch, random values from -128 to 127. There are as many as the widest vectors take at once, and one more.
std::vector<CheckBatch> checkBatches();

/// Of all soft values.
std::uint64_t digestOf(const std::vector<CheckBatch>& batches);

}  // namespace morvik::selftest

#endif
