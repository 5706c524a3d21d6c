// ChainMistakes: what goes wrong with transport blocks between code words and soft values: rate matching, redundancy
// versions, soft buffer, code blocks and symbols of 3GPP TS 36.212, clauses 5.1.2 to 5.1.5, and TS 36.211, clause 7.1.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINMISTAKES_H
#define MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINMISTAKES_H

#include <array>
#include <cstdint>
#include <string>
#include <vector>

#include "hardware/diagnosis/Mistakes.h"
#include "link/coding/TransportBlock.h"
#include "link/modulation/Modulation.h"

namespace morvik::diagnosis {

/// How the transport blocks are said to be sent.
struct ChainFormat {
    unsigned bits = 0;       ///< A
    unsigned codedBits = 0;  ///< of one transmission, G
    link::Modulation modulation = link::Modulation::qpsk;
    std::vector<unsigned> versions = {0};             ///< redundancy version of each transmission
    unsigned softBufferSize = link::unlimitedBuffer;  ///< N_IR
};

/// The coding of a format. Throws std::invalid_argument for one that cannot be sent.
link::TransportFormat codingOf(const ChainFormat& format);

/// The sub-block interleaver.
enum class Interleaver : std::uint8_t {
    right,
    naturalColumns,  ///< columns are read from left to right, not in the order of Table 5.1.4-1
    byRows,          ///< read as written
    sameParities,    ///< the second parity is read as the others, not one position later
    dummiesLast,     ///< dummy bits stand at the end
};

/// The order of the streams in the circular buffer.
enum class BufferOrder : std::uint8_t {
    right,
    paritiesSwapped,  ///< the second parity's bit comes first in each pair
    paritiesApart,    ///< one parity stream after the other
    systematicLast,   ///< parities come first
};

/// The bits of a symbol.
enum class SymbolOrder : std::uint8_t {
    right,
    reversed,    ///< the last one first
    swapped,     ///< those of Q before those of I in each pair
    separated,   ///< all of I, then all of Q
    levelsLast,  ///< pairs are reversed: signs come last
};

/// Bits of symbols whose values have the wrong sign.
enum class Flip : std::uint8_t {
    none,
    all,
    levels,      ///< all but the first two, which are the signs of I and Q
    inPhase,     ///< those of I
    quadrature,  ///< those of Q
};

/// The division of a transmission's bits over code blocks.
enum class Split : std::uint8_t {
    right,
    longerFirst,  ///< the first blocks, not the last, have a symbol more
    backwards,    ///< the last code block comes first
};

/// The size of a circular buffer: the likeliest, and the least and greatest that values cannot tell from it. 0 is none.
struct BufferSize {
    unsigned best = 0;
    unsigned from = 0;
    unsigned to = 0;
};

/// The mistakes of a file, all at once; none by default.
struct ChainMistakes {
    std::vector<unsigned> versions;  ///< of each transmission, if others than said; else empty
    BufferSize bufferSize;           ///< N_cb, if another than said
    bool fillersSent = false;        ///< filler bits have places in the circular buffer, like data
    Interleaver interleaver = Interleaver::right;
    BufferOrder buffer = BufferOrder::right;
    bool noOffset = false;  ///< redundancy versions start at multiples of k_0 without its constant part, 2 R
    Split split = Split::right;
    SymbolOrder symbol = SymbolOrder::right;
    Flip flip = Flip::none;
    int doublings = 0;  ///< the values are 2^doublings times what they should be

    /// The number of mistakes: each other redundancy version is one.
    unsigned count(const ChainFormat& format) const;
};

/// The mistakes that a format allows, each by itself, by kind: those of one kind exclude each other. Without versions,
/// soft buffer and scale.
std::vector<std::vector<ChainMistakes>> kindsOfMistakes(const ChainFormat& format);

/// Both.
ChainMistakes joined(ChainMistakes one, const ChainMistakes& other);

/// The mistakes with one less: without each of them in turn.
std::vector<ChainMistakes> withoutOne(const ChainMistakes& mistakes, const ChainFormat& format);

/// Each mistake of these kinds by itself, or each two of different kinds.
std::vector<ChainMistakes> combinationsOf(const std::vector<std::vector<ChainMistakes>>& kinds, bool inPairs);

/// Explains each of the mistakes.
std::vector<Explanation> explain(const ChainMistakes& mistakes, const ChainFormat& format);

/// The circular buffer of a code block, as the mistakes make it, without dummy bits.
struct CircularBuffer {
    std::vector<std::uint16_t> places;                        ///< of each bit: its stream times K + 4, plus position
    std::array<unsigned, link::redundancyVersions> starts{};  ///< of each redundancy version
};

/// The circular buffer before its size is limited.
class WholeBuffer {
public:
    WholeBuffer(unsigned K, unsigned fillers, const ChainMistakes& mistakes);

    /// Positions with dummy and filler bits, K_w.
    unsigned size() const
    {
        return static_cast<unsigned>(itsBefore.size()) - 1;
    }

    /// Its first N_cb positions, 1 to size(). They may be without a bit.
    CircularBuffer limited(unsigned size) const;

    /// How many bits those have, and where versions start in them.
    unsigned bits(unsigned size) const
    {
        return itsBefore[size];
    }
    std::array<unsigned, link::redundancyVersions> starts(unsigned size) const;

    /// The least size that is tried.
    unsigned leastSize() const
    {
        return 4 * itsRows;
    }

    const std::vector<std::uint16_t>& places() const
    {
        return itsPlaces;
    }

private:
    unsigned itsRows;  // of the sub-block interleaver
    bool itsHasOffset;
    std::vector<std::uint16_t> itsPlaces;
    std::vector<unsigned> itsBefore;  // bits before each position
};

/// N_cb of a code block whose buffer has `whole` positions.
unsigned bufferSizeOf(const ChainFormat& format, const ChainMistakes& mistakes, unsigned count, unsigned whole);

/// The first coded bit of each code block in a transmission, and how many it has.
struct Part {
    unsigned first;
    unsigned count;
};
std::vector<Part> partsOf(const link::TransportBlockCode& code, Split split);

/// Puts the values of each symbol's bits into their order, and their signs right: floats, or signs of 8 bits.
template <class Value>
std::vector<Value> restoredSymbols(const std::vector<Value>& values,
                                   link::Modulation modulation,
                                   const ChainMistakes& mistakes);

}  // namespace morvik::diagnosis

#endif
