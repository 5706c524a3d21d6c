// Mistakes: what goes wrong with soft values between an encoder and a file, and how to undo it.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_MISTAKES_H
#define MORVIK_HARDWARE_DIAGNOSIS_MISTAKES_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "hardware/testbench/SoftBlock.h"
#include "rules/Tail.h"

namespace morvik::diagnosis {

/// A block of a file, and the bits said to have been sent.
struct Case {
    SoftBlock received;
    std::vector<std::uint8_t> sent;  ///< each 0 or 1
};

/// Which rows of the file a block of K bits has.
enum class Rows : std::uint8_t {
    right,        ///< K + 4
    tailMissing,  ///< K to K + 3; the tail is taken for unknown
    first,        ///< more than K + 4, the own rows first
    last,         ///< more than K + 4, the own rows last
    ends,         ///< more than K + 4: data first, tail last
    smaller,      ///< as many as the reference says, but both were padded at the end
};

enum class Order : std::uint8_t {
    right,
    rowsReversed,      ///< the last row first
    dataReversed,      ///< the same, but for the four rows of the tail
    sentReversed,      ///< the reference has the last bit first
    sentByteReversed,  ///< the bits of each byte of the reference are reversed
    sentInverted,      ///< the reference has 0 for 1
};
constexpr std::array<Order, 6> allOrders{Order::right,
                                         Order::rowsReversed,
                                         Order::dataReversed,
                                         Order::sentReversed,
                                         Order::sentByteReversed,
                                         Order::sentInverted};

/// The streams in the file's columns: 0 systematic, 1 first parity, 2 second parity. The first entry is right.
constexpr std::array<std::array<std::uint8_t, 3>, 6> columnContents{
    {{0, 1, 2}, {0, 2, 1}, {1, 0, 2}, {2, 1, 0}, {1, 2, 0}, {2, 0, 1}}};

/// Rows of a block in a file that carry the tail, after the K others.
constexpr std::size_t tailRows = rules::tailPositions;

/// Tail values by their number in the standard, in the order of a file's tail rows.
using TailContents = std::array<std::uint8_t, rules::tailValues>;

/// The orders of the tail in files. Values are numbered as the standard puts them (3GPP TS 36.212,
/// clause 5.1.3.2.2): x z x z x z of the first encoder, then of the second. The first entry is right.
constexpr std::array<TailContents, 6> tailContents{{
    {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11},
    {0, 1, 7, 2, 3, 9, 4, 5, 11, 6, 8, 10},  // each stream goes on: x z z' of each step, then the three x'
    {0, 4, 8, 1, 5, 9, 2, 6, 10, 3, 7, 11},  // column by column
    {0, 2, 4, 1, 3, 5, 6, 8, 10, 7, 9, 11},  // x x x z z z
    {0, 3, 10, 2, 5, 7, 4, 6, 9, 1, 8, 11},  // the same column by column
    {6, 7, 8, 9, 10, 11, 0, 1, 2, 3, 4, 5},  // the second encoder first
}};

/// The mistakes of a file, all at once; none by default.
struct Mistakes {
    Rows rows = Rows::right;
    std::size_t smallerSize = 0;  ///< K where rows are `smaller`
    Order order = Order::right;
    std::size_t columns = 0;  ///< of columnContents
    unsigned flipped = 0;     ///< bit c: the sign of the file's column c
    std::size_t tail = 0;     ///< of tailContents
    int doublings = 0;        ///< the values are 2^doublings times what they should be

    /// The number of mistakes.
    unsigned count() const;
};

/// A mistake in words.
struct Explanation {
    std::string name;    ///< as data: "sign"
    std::string what;    ///< "the sign of all soft values is flipped"
    std::string change;  ///< what to do about it, as a sentence
};

/// Explains each of the mistakes.
std::vector<Explanation> explain(const Mistakes& mistakes);

/// Extracts the block's rows and bits from the file's. Leaves blocks with the right number of rows alone, unless `rows`
/// is `smaller`.
Case cut(const Case& block, const Mistakes& mistakes);

/// Undoes the order in a case that has been cut().
void restoreOrder(Case& block, Order order);

/// The case as it should have been, K + 4 rows and K bits.
Case undone(const Case& block, const Mistakes& mistakes);

}  // namespace morvik::diagnosis

#endif
