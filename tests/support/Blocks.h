// Blocks: code blocks for tests, made from a seed, and a decoder to hand them to.
#ifndef MORVIK_TESTS_SUPPORT_BLOCKS_H
#define MORVIK_TESTS_SUPPORT_BLOCKS_H

#include <cstdint>
#include <random>
#include <string>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik::blocks {

/// The same numbers on every machine: only the raw output of the generator is used.
using Random = std::mt19937;

/// A number from `first` to `last`.
int between(Random& random, int first, int last);

using Stream = std::vector<std::int32_t>;

/// The three streams of a block as the C interface takes them, K + 4 values each.
struct Block {
    Stream sys;
    Stream par1;
    Stream par2;
};

/// All 188 block sizes, ascending.
std::vector<unsigned> blockSizes();

std::vector<int> randomBits(Random& random, unsigned K);

/// The turbo encoder of 3GPP TS 36.212, clause 5.1.3.2: each coded bit b as the soft value
/// amplitude * (2 b - 1), the tail in the standard's order.
Block encode(const std::vector<int>& bits, int amplitude);

/// Adds noise of about the given standard deviation (a sum of uniform numbers).
void addNoise(Random& random, double deviation, Block& block);

/// How the soft values of a block without a code are drawn.
enum class Values {
    uniform,     ///< -128 to 127
    extreme,     ///< -128 or 127 alone
    small,       ///< -2 to 2: many ties
    saturating,  ///< far beyond -128 to 127, among them values that wrap in 32 bits
};

Block randomBlock(Random& random, unsigned K, Values values);

/// A decoder state that is released at the end of its life.
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

    /// From now on the components decode, so that their columns and values can be looked at.
    void decodeByComponents();

    struct Result {
        int status;
        std::vector<std::uint8_t> bits;  ///< empty unless status is 0
        std::uint32_t tag;
    };

    /// One simulation call with room enough for the decisions.
    Result decode(const Block& block, unsigned iterations, std::uint32_t tag = 0);

private:
    veltra_ip_morvik_v1_0_state* itsState;
};

}  // namespace morvik::blocks

#endif
