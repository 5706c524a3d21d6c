// Replay: single operations of the core, repeated on the values of a dump.
#ifndef MORVIK_HARDWARE_COMPARISON_REPLAY_H
#define MORVIK_HARDWARE_COMPARISON_REPLAY_H

#include <array>
#include <cstdint>
#include <optional>

#include "Mistake.h"
#include "Model.h"
#include "Values.h"

namespace morvik::comparison {

/// Where the inputs of an operation come from.
struct Sources {
    bool complete = true;  ///< whether all inputs are in the dump
    /// Whether the last bit of an intrinsic value is taken from what was computed from it, against its own inputs.
    bool inferred = false;
    bool open = false;  ///< whether the mistake leaves open what an input is, as beyond the end of a memory
};

/// The result of an operation, in eighths.
struct Column {
    std::array<std::int16_t, 8> values = {};  ///< of the stage's signals
    Sources sources;
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

    std::int16_t input(const Place& place, Sources& sources) const;
    template <class Aligned>
    Aligned inputs(unsigned pass, Stage stage, unsigned trellisStep, Sources& sources) const;
    Metrics metrics(unsigned pass, Stage stage, unsigned trellisStep, Sources& sources) const;
    Branches branches(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const;
    const Code& codeUsed(unsigned pass, Mistake mistake) const;
    /// The step from whose address a value is read, if the mistake is that it is misread.
    unsigned addressed(unsigned trellisStep, Mistake mistake, Mistake::Kind misread, Sources& sources) const;

    /// The step of the previous pass whose extrinsic value a step takes.
    unsigned aprioriStep(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const;
    int aprioriValue(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const;
    int systematicValue(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const;
    int twiceIntrinsicFromInputs(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const;

    struct TwiceIntrinsic {
        int value;
        bool isInferred;  ///< whether this bit is not that of the inputs, but of the values computed from it
        bool isSure;      ///< whether the bit below an eighth, which dumps lack, follows from the dump's own values
    };

    TwiceIntrinsic twiceIntrinsic(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const;
    bool isInDump(unsigned pass, Stage stage, unsigned trellisStep, const Column& column) const;
    /// Applies `compute` to twice an intrinsic value, as the mistake has it. If that is not sure, tries both values and
    /// takes the one that gives what the dump has, if either does.
    template <class Compute>
    Column fromTwiceIntrinsic(unsigned pass, Stage stage, unsigned trellisStep, Mistake mistake, Compute compute) const;
    bool givesWhatFollows(unsigned pass, unsigned trellisStep, int twice, Mistake mistake) const;
    /// The scaled difference of ratio and intrinsic value, not yet narrowed to eight bits (rule 14).
    int wideExtrinsicValue(int ratio, int twice, Mistake mistake) const;
    int extrinsicValue(int ratio, int twice, Mistake mistake) const;
    Branches branchMetrics(unsigned pass, unsigned trellisStep, int twice, Mistake mistake, Sources& sources) const;
    /// The branch metrics that the ratio of a step takes.
    Branches branchesOfRatio(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const;

    /// What a step of a recursion takes, of it and of the step before it, whose decisions may have left corrections
    /// pending.
    struct StepInputs {
        bool isForward;
        Metrics metrics;
        Branches branches;
        bool hasEarlier;
        Metrics earlierMetrics;
        Branches earlierBranches;
    };

    Metrics stepped(const StepInputs& from, Mistake mistake) const;
    /// The column that a recursion reaches from the step `from`. `hasEarlier` tells whether it came there from another
    /// step.
    Metrics reached(
        unsigned pass, Stage stage, unsigned from, bool hasEarlier, Mistake mistake, Sources& sources) const;

    Metrics forwardStart(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const;
    Metrics backwardStart(
        unsigned pass, const rules::Window& window, unsigned trellisStep, Mistake mistake, Sources& sources) const;
    /// The step from which a recursion reaches the border column that another one starts from.
    unsigned borderSource(bool isForward, unsigned from, Mistake mistake, Sources& sources) const;
    /// Systematic and parity value of each step of the tail in turn.
    std::array<int, 6> tailValues(unsigned pass, Mistake mistake) const;
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
};

}  // namespace morvik::comparison

#endif
