// Replay: single operations of the core, repeated on the values of a dump.
#ifndef MORVIK_COMPARISON_REPLAY_H
#define MORVIK_COMPARISON_REPLAY_H

#include <array>
#include <cstdint>
#include <vector>

#include "Model.h"
#include "Values.h"

namespace morvik::comparison {

/// A mistake in an operation, by which it gives other values than the core's.
enum class Mistake : std::uint8_t {
    none,
    aprioriMissing,       ///< intrinsic values from the systematic ones alone
    aprioriOfPassBefore,  ///< extrinsic values of the pass before the last one
    aprioriUnpermuted,    ///< extrinsic values in the order of the other code
    aprioriInverse,       ///< by the permutation that leads to the other code
    aprioriBefore,        ///< by the interleaver's address for the step before
    aprioriBehind,
    systematicUnpermuted,  ///< systematic values in the natural order, on the interleaved code
    parityOfOtherCode,
    parityNegated,
    unclipped,          ///< branch metrics and extrinsic values wider than eight bits
    wrappedInEight,     ///< their low eight bits
    unwrapped,          ///< metrics and ratios held at the ends of their range
    borderBitsKept,     ///< border columns with their seven low bits
    borderUnknown,      ///< border columns of zeros
    borderOfOtherPass,  ///< backward border columns of this pass for those of the last one, or the reverse
    unscaled,           ///< extrinsic values not multiplied by 0.75
    uncorrected,        ///< decisions without the correction table
    correctedAtOnce,    ///< corrections added to their own decision, not to the next
};

/// What an operation gives, in steps of the state metrics' format.
struct Column {
    std::array<std::int16_t, 8> values = {};  ///< of the stage's signals
    bool complete = true;                     ///< whether all inputs are in the dump
};

/// Takes the inputs of an operation from the dump, and from the model those that the dump lacks. So a value that
/// merely follows from a wrong one is as expected here.
class Replay {
public:
    /// Both outlive the replay.
    Replay(const Model& model, const Values& dump);

    /// All signals of a stage at a trellis step.
    Column column(unsigned pass, Stage stage, unsigned trellisStep, Mistake mistake = Mistake::none) const;

private:
    using Metrics = std::array<std::int16_t, 8>;  // aligned words
    using Branches = std::array<std::int16_t, 4>;

    std::int16_t input(const Place& place, bool& complete) const;
    template <class Aligned>
    Aligned inputs(unsigned pass, Stage stage, unsigned trellisStep, bool& complete) const;

    /// The step of the pass before whose extrinsic value a step takes.
    unsigned aprioriStep(unsigned code, unsigned trellisStep, Mistake mistake) const;
    int twiceIntrinsicFromInputs(unsigned pass, unsigned trellisStep, Mistake mistake, bool& complete) const;
    int twiceIntrinsic(unsigned pass, unsigned trellisStep, bool& complete) const;
    bool givesWhatFollows(unsigned pass, unsigned trellisStep, int twice) const;
    int extrinsicValue(int ratio, int twice, Mistake mistake) const;
    Branches branchMetrics(unsigned pass, unsigned trellisStep, int twice, Mistake mistake) const;
    /// The column to which a recursion comes from the step `from`. `hasEarlier` tells whether it came there from
    /// another step, whose decisions may have left corrections pending.
    Metrics reached(unsigned pass, Stage stage, unsigned from, bool hasEarlier, Mistake mistake, bool& complete) const;
    Metrics forwardStart(unsigned pass, unsigned segment, Mistake mistake, bool& complete) const;
    Metrics backwardStart(unsigned pass, const Window& window, Mistake mistake, bool& complete) const;
    Metrics tail(unsigned pass) const;

    Column intrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column branchColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column forwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column backwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column ratioColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;
    Column extrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const;

    const Model& itsModel;
    const Values& itsDump;
    std::vector<unsigned char> itsCorrections;  // of each decision difference, from -32768
};

}  // namespace morvik::comparison

#endif
