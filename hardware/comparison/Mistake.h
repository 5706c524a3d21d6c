// Mistake: what may be wrong with an operation of the core.
#ifndef MORVIK_HARDWARE_COMPARISON_MISTAKE_H
#define MORVIK_HARDWARE_COMPARISON_MISTAKE_H

#include <array>
#include <cstdint>

namespace morvik::comparison {

/// How the address of a memory goes wrong. Addresses are trellis steps.
struct AddressError {
    enum Kind : std::uint8_t {
        none,
        before,     ///< one too low
        behind,     ///< one too high
        stuckLow,   ///< a bit stuck at 0 where values are read
        stuckHigh,  ///< a bit stuck at 1 where values are read
        held,       ///< always the same address
    };
    /// The steps from whose first one addresses count.
    enum Range : std::uint8_t { block, segment, window };

    Kind kind = none;
    unsigned number = 0;  ///< bit, or address if held
    Range range = block;
};

/// A mistake in an operation, which makes it give other values than the core's.
struct Mistake {
    enum Kind : std::uint8_t {
        none,
        otherCodeFirst,       ///< half-iteration 0 decodes the natural code, 1 the interleaved one
        aprioriMissing,       ///< 0 for the extrinsic values of the pass before
        aprioriOfPassBefore,  ///< extrinsic values of the pass before the last one
        aprioriUnpermuted,    ///< extrinsic values in the order of the other code
        aprioriInverse,       ///< by the inverse permutation
        aprioriBefore,        ///< by the interleaver's address for the step before
        aprioriBehind,
        aprioriMisread,       ///< from the wrong address, the step of the pass before
        aprioriMisreadByBit,  ///< from the wrong address, the number of the bit in both passes
        aprioriStuck,         ///< `number` eighths, whatever was written
        aprioriWhole,         ///< not halved
        aprioriQuartered,     ///< halved twice
        aprioriMask,          ///< the low `number` bits of half the a-priori value, an aligned word, cleared
        systematicMissing,    ///< 0 for the systematic value
        systematicMisread,
        systematicUnpermuted,  ///< systematic values in the natural order, on the interleaved code
        intrinsicWrapped,      ///< the sum cut to `number` bits before it is halved
        intrinsicClipped,      ///< the sum clipped to `number` bits before it is halved
        intrinsicCut,          ///< without the bit below an eighth
        intrinsicTimes,        ///< the intrinsic value counts 2^`number` times as much
        intrinsicMissing,
        intrinsicMisread,
        parityOfOtherCode,
        parityNegated,
        parityMissing,
        parityMisread,
        negationWrapped,     ///< the parity negated in eight bits, where -128 stays -128
        doubledWrapped,      ///< twice the intrinsic value cut to `number` bits
        doubledClipped,      ///< twice the intrinsic value clipped to `number` bits
        unclipped,           ///< branch metrics and extrinsic values wider than eight bits
        clippedTo,           ///< `number` bits
        clippedSymmetric,    ///< to -127 and 127
        wrappedTo,           ///< their low `number` bits
        unwrapped,           ///< metrics and ratios saturate
        ratioHeld,           ///< only the last difference of the ratio saturates, in `number` bits
        comparedPlainly,     ///< metrics wrap, but are compared as plain numbers
        storedIn,            ///< metrics and ratios cut to `number` bits once decided
        computedIn,          ///< in registers and adders of `number` bits
        lesser,              ///< a decision for the lesser candidate: for state `number`, or see TreeNode
        branchMissing,       ///< 0 for the branch metrics
        branchMisread,       ///< branch metrics of another step
        forwardMissing,      ///< ratios from forward metrics of 0
        backwardMissing,     ///< ratios from backward metrics of 0
        forwardMisread,      ///< ratios from forward metrics of another step
        backwardMisread,     ///< ratios from backward metrics of another step
        ratioMisread,        ///< extrinsic values from the ratio of another step
        knownAs,             ///< the metric of states in which the encoder is known not to be: `number` eighths
        startKnown,          ///< segments start from the known state, not from an unknown one
        borderMask,          ///< border columns ANDed with `number`, in eighths
        borderUnknown,       ///< border columns of zeros
        borderOfThisPass,    ///< instead of the last pass's
        borderOfLastPass,    ///< instead of this pass's
        borderOfOtherCode,   ///< of the pass before, over the other code
        borderOfBothCodes,   ///< the same from half-iteration 1 on: both codes share a memory
        borderOfThirdPass,   ///< of the other code's last pass but one
        borderLate,          ///< those for the last pass over the code
        borderOfFirstPass,   ///< over the code, never updated
        borderOfSegment,     ///< of the border `number` segments behind
        borderOfWindow,      ///< of the border `number` windows behind
        borderOfStep,        ///< of the column `number` steps behind
        windowsShifted,      ///< the first step of each window's recursion is `number` steps behind
        rowsShifted,         ///< the same of windows that end within a segment
        segmentEndsShifted,  ///< the same of windows that end with their segment
        segmentsShifted,     ///< the first step of each segment's forward recursion is `number` steps behind
        tailOrder,           ///< the tail's values in the order of tailOrders[number]
        tailOfOtherCode,
        tailClipped,           ///< the branch sums of the tail clipped to `number` bits
        tailWrapped,           ///< the branch sums of the tail cut to `number` bits
        scaledBy,              ///< extrinsic values multiplied by `number` / factorUnits
        clippedBeforeScale,    ///< the difference clipped to `number` bits before it is scaled
        wrappedBeforeScale,    ///< the difference cut to `number` bits before it is scaled
        uncorrected,           ///< decisions without the correction table
        correctedAtOnce,       ///< corrections added to their own decision, not to the next
        correctedByMagnitude,  ///< the table read by the magnitude of a negative difference, which is not inverted
    };

    constexpr Mistake(Kind what = none, int size = 0) : kind(what), number(size) {}
    constexpr Mistake(Kind what, AddressError wrong) : kind(what), address(wrong) {}

    friend constexpr bool operator==(const Mistake& mistake, Kind asked)
    {
        return mistake.kind == asked;
    }

    friend constexpr bool operator!=(const Mistake& mistake, Kind asked)
    {
        return mistake.kind != asked;
    }

    Kind kind;
    int number = 0;
    AddressError address;
};

/// Whether an intrinsic value is wrong where it is used, though its register is right: it is computed anew.
constexpr bool changesIntrinsic(const Mistake& mistake)
{
    switch (mistake.kind) {
    case Mistake::aprioriMissing:
    case Mistake::aprioriWhole:
    case Mistake::aprioriQuartered:
    case Mistake::systematicMissing:
    case Mistake::intrinsicCut:
        return true;
    default:
        return false;
    }
}

/// The denominator of factors.
constexpr int factorUnits = 64;

/// A decision in the tree of a bit's ratio: the states between whose branches it decides, a bit for each.
struct TreeNode {
    unsigned bit;
    unsigned states;
};

/// The number by which a mistake names the decision.
constexpr int numberOf(const TreeNode& node)
{
    return static_cast<int>(node.bit << 8U | node.states);
}

constexpr TreeNode treeNodeOf(int number)
{
    return {static_cast<unsigned>(number) >> 8U, static_cast<unsigned>(number) & 0xFFU};
}

/// A wrong order of a code's tail: from which place each value is taken. Places: systematic and parity value of each
/// step in turn.
struct TailOrder {
    const char* text;
    std::array<unsigned, 6> from;
};

constexpr std::array<TailOrder, 10> tailOrders = {{
    {"systematic and parity values of the tail are swapped", {1, 0, 3, 2, 5, 4}},
    {"the tail's steps are in reverse", {4, 5, 2, 3, 0, 1}},
    {"the tail's values are in reverse", {5, 4, 3, 2, 1, 0}},
    {"the tail's first three values are taken for the systematic ones, the others for the parity", {0, 3, 1, 4, 2, 5}},
    {"the tail's first three values are taken for the parity, the others for the systematic ones", {3, 0, 4, 1, 5, 2}},
    {"the tail's systematic values come first, then its parity, but are taken in turn", {0, 2, 4, 1, 3, 5}},
    {"the tail's values are taken a step late", {4, 5, 0, 1, 2, 3}},
    {"the tail's values are taken a step early", {2, 3, 4, 5, 0, 1}},
    {"the tail's first two steps are swapped", {2, 3, 0, 1, 4, 5}},
    {"the tail's last two steps are swapped", {0, 1, 4, 5, 2, 3}},
}};

}  // namespace morvik::comparison

#endif
