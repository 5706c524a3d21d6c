// Blocks: seeded code blocks for tests, and a decoder for them.
#ifndef MORVIK_TESTS_SUPPORT_BLOCKS_H
#define MORVIK_TESTS_SUPPORT_BLOCKS_H

#include <cstdint>
#include <random>
#include <string>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik::blocks {

/// Gives the same numbers on every machine: only the generator's raw output is used.
using Random = std::mt19937;

/// A number from `first` to `last`.
int between(Random& random, int first, int last);

/// A number below `count`.
inline unsigned below(Random& random, unsigned count)
{
    return static_cast<unsigned>(random() % count);
}

using Stream = std::vector<std::int32_t>;

/// The three streams of a block for the C interface, K + 4 values each.
struct Block {
    Stream sys;
    Stream par1;
    Stream par2;
};

/// All 188 block sizes, ascending.
std::vector<unsigned> blockSizes();

std::vector<int> randomBits(Random& random, unsigned K);

/// Encodes by 3GPP TS 36.212, clause 5.1.3.2. Each coded bit b becomes the soft value
/// amplitude * (2 b - 1); the tail is in the standard's order.
Block encode(const std::vector<int>& bits, int amplitude);

/// Adds noise of about the given standard deviation (a sum of uniform numbers).
void addNoise(Random& random, double deviation, Block& block);

/// The distribution of the soft values of an uncoded block.
enum class Values {
    uniform,     ///< -128 to 127
    extreme,     ///< only -128 and 127
    small,       ///< -2 to 2: many ties
    saturating,  ///< far beyond -128 to 127, including values that wrap in 32 bits
};

Block randomBlock(Random& random, unsigned K, Values values);

/// Owns a decoder state.
class Decoder {
public:
    Decoder(int units, int algorithm, int tagWidth = 8);
    ~Decoder();
    Decoder(const Decoder&) = delete;
    Decoder& operator=(const Decoder&) = delete;

    veltra_ip_morvik_v1_0_state* state() const
    {
        return itsState;
    }

    /// Switches to decoding by the components, so that their columns and values can be inspected.
    void decodeByComponents();

    struct Result {
        int status;
        std::vector<std::uint8_t> bits;  ///< empty unless status is 0
        std::uint32_t tag;
    };

    /// Makes one simulation call, with enough room for the decisions.
    Result decode(const Block& block, unsigned iterations, std::uint32_t tag = 0);

private:
    veltra_ip_morvik_v1_0_state* itsState;
};

}  // namespace morvik::blocks

#endif
