// KnownMistakes: the mistakes that are tried on the faults of a stage, and how they are told.
#include "KnownMistakes.h"

#include <array>
#include <utility>

#include "rules/Algorithms.h"
#include "rules/Arithmetic.h"
#include "rules/Formats.h"
#include "rules/Starts.h"
#include "rules/Trellis.h"

namespace morvik::comparison {

namespace {

/// A mistake and its description.
struct NamedMistake {
    Mistake mistake;
    const char* text;
};

/// How many of an aligned word's bits, all but the sign at most.
constexpr std::array<const char*, 16> countWords = {"no",
                                                    "one",
                                                    "two",
                                                    "three",
                                                    "four",
                                                    "five",
                                                    "six",
                                                    "seven",
                                                    "eight",
                                                    "nine",
                                                    "ten",
                                                    "eleven",
                                                    "twelve",
                                                    "thirteen",
                                                    "fourteen",
                                                    "fifteen"};
static_assert(countWords.size() == rules::stateAlignment + rules::stateBits);

/// The most low bits that a mask clears of those that are tried on any faults.
constexpr unsigned mostZeros = 12;

constexpr unsigned lowZeros(unsigned word)
{
    unsigned count = 0;
    while ((word >> count & 1U) == 0) {
        ++count;
    }
    return count;
}

/// The low bits that rule 11 clears in border metrics. A dump shows those from an eighth on.
constexpr unsigned borderZeros = lowZeros(static_cast<std::uint16_t>(rules::borderMask));
static_assert(borderZeros > rules::stateAlignment && borderZeros <= mostZeros);

/// A word as "0xFF80".
std::string hexadecimal(int word)
{
    std::string text = "0x";
    for (int shift = 12; shift >= 0; shift -= 4) {
        text += "0123456789ABCDEF"[word >> shift & 0xF];
    }
    return text;
}

constexpr NamedMistake startingCode = {
    Mistake::otherCodeFirst, "each half-iteration decodes the other code: half-iteration 0 the natural one (rule 15)"};

/// Mistakes in the a-priori and the systematic value, in the register or where they are used.
constexpr std::array<NamedMistake, 4> partMistakes = {{
    {Mistake::aprioriWhole, "the a-priori value counts in full, not half (rule 13)"},
    {Mistake::aprioriQuartered, "the a-priori value is halved twice (rule 13)"},
    {Mistake::systematicMissing, "the systematic value is missing (rule 13)"},
    {Mistake::intrinsicCut, "the intrinsic value lacks its bit below an eighth (rule 13)"},
}};

constexpr std::array<NamedMistake, 14> intrinsicMistakes = {{
    {Mistake::aprioriMissing, "the extrinsic values of the pass before do not arrive (rule 13)"},
    {Mistake::aprioriOfPassBefore, "a pass late: extrinsic values are those of the pass before the last (rule 13)"},
    {Mistake::aprioriUnpermuted, "extrinsic values are taken without the interleaver's permutation (rule 15)"},
    {Mistake::aprioriInverse, "extrinsic values are taken by the inverse of the permutation (rule 15)"},
    {Mistake::aprioriBefore, "extrinsic values are taken by the interleaver's address for the step before (rule 15)"},
    {Mistake::aprioriBehind, "extrinsic values are taken by the interleaver's address for the step after (rule 15)"},
    {{Mistake::aprioriMisread, AddressError{AddressError::before}},
     "extrinsic values are written to the address after their own, or read from the one before (rule 15)"},
    {{Mistake::aprioriMisread, AddressError{AddressError::behind}},
     "extrinsic values are written to the address before their own, or read from the one after (rule 15)"},
    {{Mistake::aprioriMisreadByBit, AddressError{AddressError::before}},
     "extrinsic values in natural order are written to the address after their own, or read from the one before (rule "
     "15)"},
    {{Mistake::aprioriMisreadByBit, AddressError{AddressError::behind}},
     "extrinsic values in natural order are written to the address before their own, or read from the one after (rule "
     "15)"},
    {Mistake::systematicUnpermuted, "systematic values are in the other code's order (rule 15)"},
    {{Mistake::intrinsicTimes, 1}, "the sum is not halved (rule 13)"},
    {{Mistake::intrinsicTimes, -1}, "the sum is halved twice (rule 13)"},
    {{Mistake::aprioriMask, static_cast<int>(rules::stateAlignment) - 1},
     "the bit below an eighth is kept when the a-priori value is halved (rule 13)"},
}};

constexpr std::array<NamedMistake, 12> branchMistakes = {{
    {Mistake::aprioriMissing, "the a-priori value is missing (rule 13)"},
    {Mistake::intrinsicMissing, "the intrinsic value is missing (rule 5)"},
    {{Mistake::intrinsicTimes, 1}, "the intrinsic value is doubled twice (rule 5)"},
    {{Mistake::intrinsicTimes, -1}, "the intrinsic value is not doubled (rule 5)"},
    {{Mistake::intrinsicMisread, AddressError{AddressError::before}},
     "the intrinsic value is that of the step before (rule 5)"},
    {{Mistake::intrinsicMisread, AddressError{AddressError::behind}},
     "the intrinsic value is that of the step after (rule 5)"},
    {Mistake::parityOfOtherCode, "the parity values are those of the other code (rule 5)"},
    {Mistake::parityNegated, "the sign of the parity is flipped (rule 5)"},
    {Mistake::parityMissing, "the parity is missing (rule 5)"},
    {{Mistake::parityMisread, AddressError{AddressError::before}}, "the parity is that of the step before (rule 5)"},
    {{Mistake::parityMisread, AddressError{AddressError::behind}}, "the parity is that of the step after (rule 5)"},
    {Mistake::negationWrapped, "the parity is negated in eight bits, where -128 stays -128 (rule 5)"},
}};

/// Mistakes in narrowing a branch metric or an extrinsic value to eight bits.
constexpr std::array<NamedMistake, 3> narrowingMistakes = {{
    {Mistake::unclipped, "saturation is missing: the sum is wider than eight bits (rules 5 and 14)"},
    {{Mistake::wrappedTo, 8}, "saturation is missing: the sum is cut to its low eight bits (rules 5 and 14)"},
    {Mistake::clippedSymmetric, "the sum is clipped to -127, not -128 (rules 5 and 14)"},
}};

/// Mistakes in metrics and ratios.
constexpr std::array<NamedMistake, 7> metricMistakes = {{
    {Mistake::unwrapped, "the wrap is missing: values saturate (rule 2)"},
    {Mistake::comparedPlainly, "metrics are compared as plain numbers, though they wrap (rule 3)"},
    {Mistake::uncorrected, "the correction table is missing (rule 7)"},
    {Mistake::correctedAtOnce, "corrections come a decision early (rule 7)"},
    {Mistake::correctedByMagnitude,
     "the correction table is read by the magnitude of a negative difference, which is not inverted (rule 9)"},
    {{Mistake::branchMisread, AddressError{AddressError::before}},
     "the branch metrics are those of the step before (rules 6 and 8)"},
    {{Mistake::branchMisread, AddressError{AddressError::behind}},
     "the branch metrics are those of the step after (rules 6 and 8)"},
}};

constexpr std::array<NamedMistake, 8> ratioMistakes = {{
    {{Mistake::ratioHeld, rules::stateBits}, "the wrap is missing: values stay at the end of the range (rule 2)"},
    {Mistake::branchMissing, "the branch metrics are missing (rule 8)"},
    {Mistake::aprioriMissing, "the branch metrics lack the a-priori value (rule 8)"},
    {Mistake::intrinsicMissing, "the branch metrics lack the intrinsic value (rule 8)"},
    {{Mistake::forwardMisread, AddressError{AddressError::before}},
     "the forward metrics are those of the step before (rule 8)"},
    {{Mistake::forwardMisread, AddressError{AddressError::behind}},
     "the forward metrics are those after the step (rule 8)"},
    {{Mistake::backwardMisread, AddressError{AddressError::before}},
     "the backward metrics are those before the step (rule 8)"},
    {{Mistake::backwardMisread, AddressError{AddressError::behind}},
     "the backward metrics are those of the step after (rule 8)"},
}};

constexpr std::array<NamedMistake, 9> extrinsicMistakes = {{
    {Mistake::aprioriMissing, "the a-priori value is not subtracted (rule 14)"},
    {Mistake::intrinsicMissing, "the intrinsic value is not subtracted (rule 14)"},
    {{Mistake::intrinsicTimes, 1}, "the intrinsic value is subtracted eight times, not four times (rule 14)"},
    {{Mistake::intrinsicTimes, -1}, "the intrinsic value is subtracted twice, not four times (rule 14)"},
    {{Mistake::intrinsicTimes, -2}, "the intrinsic value is subtracted once, not four times (rule 14)"},
    {{Mistake::intrinsicMisread, AddressError{AddressError::before}},
     "the intrinsic value is that of the step before (rule 14)"},
    {{Mistake::intrinsicMisread, AddressError{AddressError::behind}},
     "the intrinsic value is that of the step after (rule 14)"},
    {{Mistake::ratioMisread, AddressError{AddressError::before}}, "the ratio is that of the step before (rule 14)"},
    {{Mistake::ratioMisread, AddressError{AddressError::behind}}, "the ratio is that of the step after (rule 14)"},
}};

/// Memories of which all cells or some do not answer.
constexpr std::array<NamedMistake, 2> deadMemories = {{
    {Mistake::forwardMissing, "forward metrics read as zeros (rule 8)"},
    {Mistake::backwardMissing, "backward metrics read as zeros (rule 8)"},
}};

/// Mistakes in handing on border columns, except their mask.
constexpr std::array<NamedMistake, 10> borderMistakes = {{
    {Mistake::borderOfThisPass,
     "border metrics are those of the other pass: this one's for those of the last one over the same code (rules 19 "
     "and 20)"},
    {Mistake::borderOfLastPass,
     "border metrics are those of the other pass: the last one's over the same code for this one's (rule 20)"},
    {Mistake::borderOfOtherCode, "border metrics are those of the other code's pass (rules 19 and 20)"},
    {Mistake::borderOfBothCodes,
     "border metrics are those of the other code's pass, from half-iteration 1 on (rules 19 and 20)"},
    {Mistake::borderOfThirdPass, "border metrics are those of the other code's last pass but one (rules 19 and 20)"},
    {Mistake::borderLate, "border metrics are a pass over the same code late (rules 19 and 20)"},
    {Mistake::borderOfFirstPass, "border metrics stay those of the first pass over the same code (rules 19 and 20)"},
    {Mistake::borderUnknown, "start metrics are zeros, as for an unknown state (rule 10)"},
    {{Mistake::borderOfStep, -1}, "border metrics are those of the step before the border (rules 19 and 20)"},
    {{Mistake::borderOfStep, 1}, "border metrics are those of the step after the border (rules 19 and 20)"},
}};

constexpr std::array<NamedMistake, 4> neighbourMistakes = {{
    {{Mistake::borderOfSegment, -1},
     "border metrics are those of the neighbour before the right one (rules 19 and 20)"},
    {{Mistake::borderOfSegment, 1}, "border metrics are those of the neighbour after the right one (rules 19 and 20)"},
    {{Mistake::borderOfSegment, -2},
     "border metrics are those of the second neighbour before the right one (rules 19 and 20)"},
    {{Mistake::borderOfSegment, 2},
     "border metrics are those of the second neighbour after the right one (rules 19 and 20)"},
}};

constexpr std::array<NamedMistake, 3> forwardStartMistakes = {{
    {{Mistake::segmentsShifted, -1}, "segments start one step early (rules 17 and 19)"},
    {{Mistake::segmentsShifted, 1}, "segments start one step late (rules 17 and 19)"},
    {Mistake::startKnown, "segments start from the known state, not from an unknown one (rules 10 and 19)"},
}};

/// The backward recursion comes from behind: what starts late for it starts at an earlier step.
constexpr std::array<NamedMistake, 2> windowStartMistakes = {{
    {{Mistake::windowsShifted, -1}, "windows start one step late (rules 18 and 20)"},
    {{Mistake::windowsShifted, 1}, "windows start one step early (rules 18 and 20)"},
}};

/// The same where segments have several windows.
constexpr std::array<NamedMistake, 6> rowStartMistakes = {{
    {{Mistake::rowsShifted, -1}, "windows that end within a segment start one step late (rules 18 and 20)"},
    {{Mistake::rowsShifted, 1}, "windows that end within a segment start one step early (rules 18 and 20)"},
    {{Mistake::segmentEndsShifted, -1}, "windows that end with their segment start one step late (rules 18 and 20)"},
    {{Mistake::segmentEndsShifted, 1}, "windows that end with their segment start one step early (rules 18 and 20)"},
    {{Mistake::borderOfWindow, -1}, "border metrics are those of the window before the right one (rule 20)"},
    {{Mistake::borderOfWindow, 1}, "border metrics are those of the window after the right one (rule 20)"},
}};

/// Collects the mistakes of a stage.
class KnownList {
public:
    KnownList(const Model& model, Stage stage) : itsModel(model), itsStage(stage) {}

    std::vector<KnownMistake> all()
    {
        switch (itsStage) {
        case Stage::intrinsic:
            addIntrinsic();
            break;
        case Stage::branch:
            addBranch();
            break;
        case Stage::forward:
            addRecursion();
            addNamed(forwardStartMistakes);
            break;
        case Stage::backward:
            addRecursion();
            addWindows();
            addTail();
            break;
        case Stage::ratio:
            addMetrics();
            addNamed(ratioMistakes);
            addSizes({Mistake::ratioHeld, "the ratio is clipped to ", " bits, not wrapped at twelve (rule 2)"}, 5, 11);
            addNamed(partMistakes);
            addNamed(deadMemories, Candidate::place);
            addDecisionsOfRatio();
            break;
        case Stage::extrinsic:
            addExtrinsic();
            break;
        }
        if (itsStage != Stage::forward && itsStage != Stage::ratio) {
            add(startingCode, Candidate::core);
        }
        return std::move(itsMistakes);
    }

private:
    /// A mistake of a number of bits, and the words around the number.
    struct Sized {
        Mistake::Kind kind;
        const char* before;
        const char* after;
    };

    void add(const NamedMistake& named, Candidate::Reach reach = Candidate::operation)
    {
        itsMistakes.push_back({named.mistake, named.text, reach});
    }

    template <class Mistakes>
    void addNamed(const Mistakes& mistakes, Candidate::Reach reach = Candidate::operation)
    {
        for (const NamedMistake& each : mistakes) {
            add(each, reach);
        }
    }

    /// `included` sizes are those from which on a mistake without a size may fit as well.
    void addSizes(
        const Sized& sized, int fewest, int most, int included = 16, Candidate::Reach reach = Candidate::operation)
    {
        for (int bits = fewest; bits <= most; ++bits) {
            itsMistakes.push_back({{sized.kind, bits},
                                   sized.before + std::string(countWords[static_cast<std::size_t>(bits)]) + sized.after,
                                   reach,
                                   bits < included ? Candidate::telling : Candidate::included});
        }
    }

    void addIntrinsic()
    {
        addNamed(intrinsicMistakes);
        addNamed(partMistakes);
        addSizes(
            {Mistake::intrinsicWrapped, "the sum is cut to its low ", " bits before it is halved (rule 13)"}, 5, 9);
        addSizes({Mistake::intrinsicClipped, "the sum is clipped to ", " bits before it is halved (rule 13)"}, 5, 9);
        addMasksOfApriori();
        addTail();
    }

    void addMasksOfApriori()
    {
        for (unsigned zeros = rules::stateAlignment + 1; zeros < borderZeros + 2; ++zeros) {
            itsMistakes.push_back({{Mistake::aprioriMask, static_cast<int>(zeros)},
                                   std::string(countWords[zeros]) +
                                       " low bits of half the a-priori value are "
                                       "cleared, not " +
                                       countWords[rules::stateAlignment] + " (rule 13)"});
        }
    }

    void addNarrowing()
    {
        addNamed(narrowingMistakes);
        for (const int bits : {4, 5, 6, 7, 9, 10}) {
            const char* const eight = " bits, not clipped to eight (rules 5 and 14)";
            addSizes({Mistake::wrappedTo, "the sum is cut to its low ", eight}, bits, bits, 9);
            addSizes(
                {Mistake::clippedTo, "the sum is clipped to ", " bits, not eight (rules 5 and 14)"}, bits, bits, 9);
        }
    }

    void addBranch()
    {
        addNamed(branchMistakes);
        addNamed(partMistakes);
        addSizes(
            {Mistake::doubledWrapped, "twice the intrinsic value is cut to its low ", " bits before the sum (rule 5)"},
            6,
            8);
        addSizes({Mistake::doubledClipped, "twice the intrinsic value is clipped to ", " bits before the sum (rule 5)"},
                 6,
                 8);
        addNarrowing();
    }

    void addMetrics()
    {
        addNamed(metricMistakes);
        for (int bits = rules::stateBits - 1; bits >= 5; --bits) {
            const std::string text = "values are " + std::to_string(bits) + " bits wide, not 12 (rule 2)";
            itsMistakes.push_back({{Mistake::computedIn, bits}, text});
            itsMistakes.push_back({{Mistake::storedIn, bits}, text});
        }
    }

    void addRecursion()
    {
        addMetrics();
        addBorders();
        addDecisionsOfStates();
    }

    void addBorders()
    {
        for (unsigned zeros = rules::stateAlignment; zeros <= mostZeros; ++zeros) {
            if (zeros != borderZeros) {
                itsMistakes.push_back(otherMask(-(1 << (zeros - rules::stateAlignment))));
            }
        }
        addNamed(borderMistakes, Candidate::borders);
        addNamed(neighbourMistakes, Candidate::borders);
    }

    void addWindows()
    {
        addNamed(windowStartMistakes);
        if (itsModel.cut.rows() > 1) {
            addNamed(rowStartMistakes);
        }
    }

    /// The tail's mistakes show at once in all values, and nowhere else.
    void addTail()
    {
        for (std::size_t i = 0; i < tailOrders.size(); ++i) {
            itsMistakes.push_back({{Mistake::tailOrder, static_cast<int>(i)},
                                   std::string(tailOrders[i].text) + " (rule 12)",
                                   Candidate::borders});
        }
        add({Mistake::tailOfOtherCode, "the tail is the other code's (rule 12)"}, Candidate::borders);
        if (itsStage == Stage::intrinsic) {
            return;
        }
        add({Mistake::parityOfOtherCode, "the parity values are those of the other code (rule 5)"}, Candidate::borders);
        add({{Mistake::tailClipped, 8},
             "the tail's branch sums are clipped like branch metrics (rule 12: they are not)"},
            Candidate::borders);
        add({{Mistake::tailWrapped, 8}, "the tail's branch sums are cut to their low eight bits (rule 12)"},
            Candidate::borders);
        for (const int bits : {5, 6, 7, 9, 10}) {
            addSizes({Mistake::tailClipped, "the tail's branch sums are clipped to ", " bits (rule 12: they are not)"},
                     bits,
                     bits,
                     16,
                     Candidate::borders);
        }
    }

    void addDecisionsOfStates()
    {
        for (int state = 0; state < static_cast<int>(rules::stateCount); ++state) {
            itsMistakes.push_back(
                {{Mistake::lesser, state},
                 "the decision for state " + std::to_string(state) + " takes the lesser candidate (rule 6)"});
        }
    }

    void addDecisionsOfRatio()
    {
        constexpr std::array<std::pair<unsigned, const char*>, 7> nodes = {{{0x03, "states 0 and 1"},
                                                                            {0x0C, "states 2 and 3"},
                                                                            {0x30, "states 4 and 5"},
                                                                            {0xC0, "states 6 and 7"},
                                                                            {0x0F, "states 0 to 3"},
                                                                            {0xF0, "states 4 to 7"},
                                                                            {0xFF, "all states"}}};
        for (const unsigned bit : {0U, 1U}) {
            for (const auto& [states, words] : nodes) {
                itsMistakes.push_back({{Mistake::lesser, numberOf({bit, states})},
                                       "the decision between " + std::string(words) + " for bit " +
                                           std::to_string(bit) + " takes the lesser candidate (rule 8)"});
            }
        }
    }

    void addExtrinsic()
    {
        addNamed(extrinsicMistakes);
        addNamed(partMistakes);
        addNarrowing();
        if (rules::extrinsicScale(itsModel.generics.C_ALGORITHM_TYPE) == 1) {
            return;
        }
        add({{Mistake::scaledBy, factorUnits}, "the factor of 0.75 is missing (rule 14)"});
        for (const int bits : {7, 8, 9, 10, 11}) {
            const char* const scaled = " bits before it is scaled, not afterwards (rule 14)";
            addSizes({Mistake::clippedBeforeScale, "the difference is clipped to ", scaled}, bits, bits);
        }
        for (const int bits : {8, 9, 10, 11, 12}) {
            const char* const scaled = " bits before it is scaled (rule 14)";
            addSizes({Mistake::wrappedBeforeScale, "the difference is cut to its low ", scaled}, bits, bits);
        }
    }

    const Model& itsModel;
    Stage itsStage;
    std::vector<KnownMistake> itsMistakes;
};

}  // namespace

std::vector<KnownMistake> knownMistakes(const Model& model, Stage stage)
{
    return KnownList(model, stage).all();
}

KnownMistake otherKnownMetric(int metric)
{
    const int right = rules::knownMetric(1, rules::smallestOf(rules::stateBits));
    return {{Mistake::knownAs, metric},
            "states other than 0 start with " + std::to_string(metric) + ", not with " + std::to_string(right) +
                " (rule 10)",
            Candidate::borders};
}

KnownMistake otherMask(int mask)
{
    const std::string right = countWords[borderZeros];
    const unsigned zeros = rules::stateAlignment + lowZeros(static_cast<unsigned>(mask));
    const bool isPlain = mask == -(1 << (zeros - rules::stateAlignment));
    const std::string text =
        !isPlain ? "border metrics are ANDed with " + hexadecimal(rules::shiftLeftWrap(mask, rules::stateAlignment)) +
                       ", not with " + hexadecimal(rules::borderMask)
        : zeros == rules::stateAlignment
            ? "the " + right + " low bits of border metrics are not cleared"
            : std::string(countWords[zeros]) + " low bits of border metrics are cleared, not " + right;
    return {{Mistake::borderMask, mask},
            text + " (rule 11)",
            Candidate::borders,
            Candidate::telling,
            masks,
            isPlain ? 0U : 1U};
}

}  // namespace morvik::comparison
