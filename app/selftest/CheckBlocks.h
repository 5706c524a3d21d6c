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

/// Blocks of one size, decoded in one call.
struct CheckBatch {
    unsigned K = 0;
    std::uint32_t blocks = 0;
    std::uint32_t iterations = 0;
    std::array<std::vector<std::int8_t>, 3> streams;  ///< K + 4 soft values per block
};

/// A batch for each of the 188 sizes: code words in noise with marginal decisions and, as the last block, random values
/// from -128 to 127. A batch has one block more than the widest vectors take at once.
std::vector<CheckBatch> checkBatches();

/// The digest of all soft values.
std::uint64_t digestOf(const std::vector<CheckBatch>& batches);

}  // namespace morvik::selftest

#endif
