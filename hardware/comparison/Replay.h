// Replay: single operations of the core, repeated on the values of a dump.
#ifndef MORVIK_HARDWARE_COMPARISON_REPLAY_H
#define MORVIK_HARDWARE_COMPARISON_REPLAY_H

#include <array>
#include <cstdint>
#include <optional>
#include <vector>

#include "Model.h"
#include "Values.h"

namespace morvik::comparison {

/// A mistake in an operation, which makes it give other values than the core's.
struct Mistake {
    enum Kind : std::uint8_t {
        none,
        aprioriMissing,       ///< intrinsic values from the systematic ones alone
        aprioriOfPassBefore,  ///< extrinsic values of the pass before the last one
        aprioriUnpermuted,    ///< extrinsic values in the order of the other code
        aprioriInverse,       ///< by the inverse permutation
        aprioriBefore,        ///< by the interleaver's address for the step before
        aprioriBehind,
        systematicUnpermuted,  ///< systematic values in the natural order, on the interleaved code
        intrinsicWrapped,      ///< the sum cut to eight bits before it is halved
        intrinsicClipped,      ///< the sum clipped to eight bits before it is halved
        parityOfOtherCode,
        parityNegated,
        negationWrapped,    ///< the parity negated in eight bits, where -128 stays -128
        doubledWrapped,     ///< twice the intrinsic value cut to eight bits
        doubledClipped,     ///< twice the intrinsic value clipped to eight bits
        unclipped,          ///< branch metrics and extrinsic values wider than eight bits
        clippedTo,          ///< `number` bits
        clippedSymmetric,   ///< to -127 and 127
        wrappedTo,          ///< their low `number` bits
        unwrapped,          ///< metrics and ratios saturate
        ratioHeld,          ///< only the last difference of the ratio saturates
        storedIn,           ///< metrics and ratios cut to `number` bits once decided
        computedIn,         ///< in registers and adders of `number` bits
        borderMask,         ///< border columns ANDed with `number`, in eighths
        borderUnknown,      ///< border columns of zeros
        borderOfThisPass,   ///< instead of the last pass's
        borderOfLastPass,   ///< instead of this pass's
        borderOfOtherCode,  ///< of the pass before, over the other code
        borderLate,         ///< those for the last pass over the code
        borderOfFirstPass,  ///< over the code, never updated
        tailClipped,        ///< the branch sums of the tail clipped like branch metrics
        unscaled,           ///< extrinsic values not multiplied by 0.75
        uncorrected,        ///< decisions without the correction table
        correctedAtOnce,    ///< corrections added to their own decision, not to the next
    };

    constexpr Mistake(Kind what = none, int size = 0) : kind(what), number(size) {}

    friend constexpr bool operator==(const Mistake& mistake, Kind asked)
    {
        return mistake.kind == asked;
    }

    friend constexpr bool operator!=(const Mistake& mistake, Kind asked)
    {
        return mistake.kind != asked;
    }

    Kind kind;
    int number;
};

/// The result of an operation, in eighths.
struct Column {
    std::array<std::int16_t, 8> values = {};  ///< of the stage's signals
    bool complete = true;                     ///< whether all inputs are in the dump
};

/// Repeats operations on inputs from the dump, or from the model if the dump lacks them. A value that merely follows
/// from a wrong one is thus as expected.
class Replay {
public:
    /// Both must outlive the replay.
    Replay(const Model& model, const Values& dump);

    /// All signals of a stage at a trellis step.
    Column column(unsigned pass, Stage stage, unsigned trellisStep, Mistake mistake = {}) const;

    /// Classifies what intrinsic and extrinsic values lose in rounding: equal for two values of a stage if every
    /// rounding treats them alike, 0 if nothing is lost.
    unsigned roundingClass(unsigned pass, Stage stage, unsigned trellisStep) const;

private:
    using Metrics = std::array<std::int16_t, 8>;  // aligned words
    using Branches = std::array<std::int16_t, 4>;

    std::int16_t input(const Place& place, bool& complete) const;
    template <class Aligned>
    Aligned inputs(unsigned pass, Stage stage, unsigned trellisStep, bool& complete) const;

    /// The step of the previous pass whose extrinsic value a step takes.
    unsigned aprioriStep(unsigned code, unsigned trellisStep, Mistake mistake) const;
    int twiceIntrinsicFromInputs(unsigned pass, unsigned trellisStep, Mistake mistake, bool& complete) const;

    struct TwiceIntrinsic {
        int value;
        bool isSure;  ///< whether the bit below an eighth, which dumps lack, follows from the dump's own values
    };

    TwiceIntrinsic twiceIntrinsic(unsigned pass, unsigned trellisStep, bool& complete) const;
    bool isInDump(unsigned pass, Stage stage, unsigned trellisStep, const Column& column) const;
    /// Applies `compute` to twice an intrinsic value. If that is not sure, tries both values and takes the one that
    /// gives what the dump has, if either does.
    template <class Compute>
    Column fromTwiceIntrinsic(unsigned pass, Stage stage, unsigned trellisStep, Compute compute) const;
    bool givesWhatFollows(unsigned pass, unsigned trellisStep, int twice) const;
    /// 3x / 4 or x, not yet narrowed to eight bits (rule 14).
    int wideExtrinsicValue(int ratio, int twice, Mistake mistake) const;
    int extrinsicValue(int ratio, int twice, Mistake mistake) const;
    Branches branchMetrics(unsigned pass, unsigned trellisStep, int twice, Mistake mistake) const;
    /// The column that a recursion reaches from the step `from`. `hasEarlier` tells whether it came there from another
    /// step, whose decisions may have left corrections pending.
    Metrics reached(unsigned pass, Stage stage, unsigned from, bool hasEarlier, Mistake mistake, bool& complete) const;
    Metrics forwardStart(unsigned pass, unsigned segment, Mistake mistake, bool& complete) const;
    Metrics backwardStart(unsigned pass, const rules::Window& window, Mistake mistake, bool& complete) const;
    Metrics tail(unsigned pass, Mistake mistake) const;
    /// The pass whose column a segment or window starts from; nothing if the state is unknown.
    static std::optional<unsigned> borderPass(unsigned pass, bool ofThisPass, Mistake mistake);

    Column intrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column branchColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column forwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column backwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column ratioColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column extrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;

    const Model& itsModel;
    const Values& itsDump;
    std::vector<unsigned char> itsCorrections;  // by decision difference, from -32768
};

}  // namespace morvik::comparison

#endif
