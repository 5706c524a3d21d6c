// Candidates: the mistakes that may explain the faults of a stage.
#include "Candidates.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <memory>
#include <optional>
#include <string>

#include "rules/Arithmetic.h"
#include "rules/Formats.h"
#include "rules/Starts.h"

namespace morvik::comparison {

namespace {

/// A mistake and its description.
struct NamedMistake {
    Mistake mistake;
    const char* text;
    Candidate::Rank rank = Candidate::telling;
};

constexpr std::array<const char*, 12> countWords = {
    "no", "one", "two", "three", "four", "five", "six", "seven", "eight", "nine", "ten", "eleven"};

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
static_assert(borderZeros > rules::stateAlignment && borderZeros < countWords.size());

/// A word as "0xFF80".
std::string hexadecimal(int word)
{
    std::string text = "0x";
    for (int shift = 12; shift >= 0; shift -= 4) {
        text += "0123456789ABCDEF"[word >> shift & 0xF];
    }
    return text;
}

/// A mistake in the mask, and its description.
struct MaskMistake {
    Mistake mistake;
    std::string text;
};

/// Border metrics of which another number of low bits is cleared.
std::vector<MaskMistake> otherZeros()
{
    const std::string right = countWords[borderZeros];
    std::vector<MaskMistake> mistakes = {
        {{Mistake::borderMask, -1}, "the " + right + " low bits of border metrics are not cleared (rule 11)"}};
    for (unsigned zeros = rules::stateAlignment + 1; zeros < countWords.size(); ++zeros) {
        if (zeros != borderZeros) {
            mistakes.push_back({{Mistake::borderMask, -(1 << (zeros - rules::stateAlignment))},
                                std::string(countWords[zeros]) + " low bits of border metrics are cleared, not " +
                                    right + " (rule 11)"});
        }
    }
    return mistakes;
}

/// Border metrics of which some of the bits are cleared, but not the low ones up to some bit.
std::vector<MaskMistake> otherMasks()
{
    std::vector<MaskMistake> mistakes;
    for (int cleared = 1; cleared < 1 << (borderZeros - rules::stateAlignment); ++cleared) {
        if ((cleared & (cleared + 1)) != 0) {
            mistakes.push_back({{Mistake::borderMask, ~cleared},
                                "border metrics are ANDed with " +
                                    hexadecimal(rules::shiftLeftWrap(~cleared, rules::stateAlignment)) + ", not with " +
                                    hexadecimal(rules::borderMask) + " (rule 11)"});
        }
    }
    return mistakes;
}

/// Mistakes in handing on border columns, except their mask.
constexpr std::array<NamedMistake, 7> borderMistakes = {{
    {Mistake::borderOfThisPass,
     "border metrics are those of the other pass: this one's for those of the last one over the same code (rules 19 "
     "and 20)"},
    {Mistake::borderOfLastPass,
     "border metrics are those of the other pass: the last one's over the same code for this one's (rule 20)"},
    {Mistake::borderOfOtherCode, "border metrics are those of the other code's pass (rules 19 and 20)"},
    {Mistake::borderLate, "border metrics are a pass over the same code late (rules 19 and 20)"},
    {Mistake::borderOfFirstPass, "border metrics stay those of the first pass over the same code (rules 19 and 20)"},
    {Mistake::borderUnknown, "start metrics are zeros, as for an unknown state (rule 10)"},
    {Mistake::tailClipped, "the tail's branch sums are clipped like branch metrics (rule 12: they are not)"},
}};

/// Mistakes in the operations themselves.
constexpr std::array<NamedMistake, 34> namedMistakes = {{
    {Mistake::aprioriMissing, "the extrinsic values of the pass before do not arrive (rule 13)"},
    {Mistake::aprioriOfPassBefore, "a pass late: extrinsic values are those of the pass before the last (rule 13)"},
    {Mistake::aprioriUnpermuted, "extrinsic values are taken without the interleaver's permutation (rule 15)"},
    {Mistake::aprioriInverse, "extrinsic values are taken by the inverse of the permutation (rule 15)"},
    {Mistake::aprioriBefore, "extrinsic values are taken by the interleaver's address for the step before (rule 15)"},
    {Mistake::aprioriBehind, "extrinsic values are taken by the interleaver's address for the step after (rule 15)"},
    {Mistake::systematicUnpermuted, "systematic values are in the other code's order (rule 15)"},
    {Mistake::intrinsicWrapped, "the sum is cut to its low eight bits before it is halved (rule 13)"},
    {Mistake::intrinsicClipped, "the sum is clipped to eight bits before it is halved (rule 13)"},
    {Mistake::parityOfOtherCode, "the parity values are those of the other code (rule 5)"},
    {Mistake::parityNegated, "the sign of the parity is flipped (rule 5)"},
    {Mistake::negationWrapped, "the parity is negated in eight bits, where -128 stays -128 (rule 5)"},
    {Mistake::doubledWrapped, "twice the intrinsic value is cut to its low eight bits before the sum (rule 5)"},
    {Mistake::doubledClipped, "twice the intrinsic value is clipped to eight bits before the sum (rule 5)"},
    {Mistake::unclipped, "saturation is missing: the sum is wider than eight bits (rules 5 and 14)"},
    {{Mistake::wrappedTo, 8}, "saturation is missing: the sum is cut to its low eight bits (rules 5 and 14)"},
    {{Mistake::wrappedTo, 7}, "the sum is cut to its low seven bits, not clipped to eight (rules 5 and 14)"},
    {{Mistake::wrappedTo, 9},
     "the sum is cut to its low nine bits, not clipped to eight (rules 5 and 14)",
     Candidate::included},
    {{Mistake::clippedTo, 6}, "the sum is clipped to six bits, not eight (rules 5 and 14)"},
    {{Mistake::clippedTo, 7}, "the sum is clipped to seven bits, not eight (rules 5 and 14)"},
    {{Mistake::clippedTo, 9}, "the sum is clipped to nine bits, not eight (rules 5 and 14)", Candidate::included},
    {Mistake::clippedSymmetric, "the sum is clipped to -127, not -128 (rules 5 and 14)"},
    {Mistake::unwrapped, "the wrap is missing: values saturate (rule 2)"},
    {Mistake::ratioHeld, "the wrap is missing: values stay at the end of the range (rule 2)"},
    {{Mistake::computedIn, 11}, "values are 11 bits wide, not 12 (rule 2)"},
    {{Mistake::storedIn, 11}, "values are 11 bits wide, not 12 (rule 2)"},
    {{Mistake::computedIn, 10}, "values are 10 bits wide, not 12 (rule 2)"},
    {{Mistake::storedIn, 10}, "values are 10 bits wide, not 12 (rule 2)"},
    {{Mistake::computedIn, 9}, "values are 9 bits wide, not 12 (rule 2)"},
    {{Mistake::storedIn, 9}, "values are 9 bits wide, not 12 (rule 2)"},
    {{Mistake::storedIn, 8}, "values are 8 bits wide, not 12 (rule 2)"},
    {Mistake::unscaled, "the factor of 0.75 is missing (rule 14)"},
    {Mistake::uncorrected, "the correction table is missing (rule 7)"},
    {Mistake::correctedAtOnce, "corrections come a decision early (rule 7)"},
}};

constexpr int bitsOf(Stage stage)
{
    switch (stage) {
    case Stage::intrinsic:
    case Stage::branch:
    case Stage::extrinsic:
        return rules::branchBits;
    case Stage::forward:
    case Stage::backward:
    case Stage::ratio:
        break;
    }
    return passBits;
}

constexpr int signExtended(int value, int bits)
{
    const int low = value & ((1 << bits) - 1);
    return low >> (bits - 1) != 0 ? low - (1 << bits) : low;
}

Fit fitIf(bool fits)
{
    return fits ? Fit::yes : Fit::no;
}

/// Columns under a mistake, queried value by value; keeps the last one.
class Columns {
public:
    Columns(const Replay& replay, Mistake mistake) : itsReplay(replay), itsMistake(mistake) {}

    const Column& at(const Place& place)
    {
        if (!itsPlace || itsPlace->pass != place.pass || itsPlace->step != place.step) {
            itsColumn = itsReplay.column(place.pass, stageOf(place.signal), place.step, itsMistake);
            itsPlace = place;
        }
        return itsColumn;
    }

    int valueAt(const Place& place)
    {
        return at(place).values[place.signal - signalsOf(stageOf(place.signal)).first];
    }

    Fit fit(const Place& place, int got)
    {
        const bool equal = got == valueAt(place);
        return equal || at(place).complete ? fitIf(equal) : Fit::unknown;
    }

private:
    const Replay& itsReplay;
    Mistake itsMistake;
    std::optional<Place> itsPlace;
    Column itsColumn;
};

class Collector {
public:
    Collector(const Model& model, const Replay& replay) : itsModel(model), itsReplay(replay) {}

    std::vector<Candidate> all(const std::vector<Fault>& faults)
    {
        addMasks(otherZeros());
        addMasks(otherMasks());
        addNamed(borderMistakes, Candidate::borders);
        addNamed(namedMistakes, Candidate::operation);
        const int bits = bitsOf(stageOf(faults.front().place.signal));
        addKeptIn(11);
        addKeptIn(10);
        addOtherPlaces();
        addRounding(faults);
        addRelations();
        constexpr std::size_t fewest = 8;  // with fewer, bits may look stuck by chance
        if (faults.size() >= fewest) {
            addStuckBits(bits);
        }
        addFlippedBits(bits);
        return std::move(itsCandidates);
    }

private:
    void addMistake(Mistake mistake, const std::string& text, Candidate::Rank rank, Candidate::Reach reach)
    {
        const auto columns = std::make_shared<Columns>(itsReplay, mistake);
        itsCandidates.push_back({text, rank, reach, [columns](const Sample& sample) {
                                     return columns->fit(sample.place, sample.got);
                                 }});
    }

    template <class Mistakes>
    void addNamed(const Mistakes& mistakes, Candidate::Reach reach)
    {
        for (const NamedMistake& each : mistakes) {
            addMistake(each.mistake, each.text, each.rank, reach);
        }
    }

    void addMasks(const std::vector<MaskMistake>& mistakes)
    {
        for (const MaskMistake& each : mistakes) {
            addMistake(each.mistake, each.text, Candidate::telling, Candidate::borders);
        }
    }

    /// Adds a relation between the dump's values and the expected ones.
    template <class Relation>
    void addRelation(const std::string& text, Relation relation)
    {
        itsCandidates.push_back({text, Candidate::descriptive, Candidate::place, [relation](const Sample& sample) {
                                     return fitIf(relation(sample.got, sample.wanted));
                                 }});
    }

    /// Covers metrics that are narrow only where stored: the recursion may use bits that the dump lacks.
    void addKeptIn(int bits)
    {
        const auto computed = std::make_shared<Columns>(itsReplay, Mistake(Mistake::computedIn, bits));
        const auto stored = std::make_shared<Columns>(itsReplay, Mistake(Mistake::storedIn, bits));
        itsCandidates.push_back({"values are " + std::to_string(bits) + " bits wide, not 12 (rule 2)",
                                 Candidate::included,
                                 Candidate::operation,
                                 [computed, stored](const Sample& sample) {
                                     const Fit fit = computed->fit(sample.place, sample.got);
                                     return fit == Fit::yes ? fit : stored->fit(sample.place, sample.got);
                                 }});
    }

    void addOtherPlaces()
    {
        const auto columns = std::make_shared<Columns>(itsReplay, Mistake());
        // Before the first pass over a code there are no extrinsic values, and all else is 0.
        const auto first = std::make_shared<Columns>(itsReplay, Mistake(Mistake::aprioriMissing));
        itsCandidates.push_back({"a pass late: values are those of the last pass over the same code",
                                 Candidate::descriptive,
                                 Candidate::place,
                                 [columns, first](const Sample& sample) {
                                     Place place = sample.place;
                                     if (!rules::isFirstPass(place.pass)) {
                                         place.pass = rules::passBefore(place.pass);
                                         return columns->fit(place, sample.got);
                                     }
                                     const bool hasSystematic = stageOf(place.signal) == Stage::intrinsic;
                                     return hasSystematic ? first->fit(place, sample.got) : fitIf(sample.got == 0);
                                 }});
        const auto addStep = [&](const char* text, int distance) {
            const unsigned K = itsModel.cut.K();
            itsCandidates.push_back(
                {text, Candidate::descriptive, Candidate::place, [columns, distance, K](const Sample& sample) {
                     Place place = sample.place;
                     place.step += static_cast<unsigned>(distance);  // wraps to above K below 0
                     return place.step < K ? columns->fit(place, sample.got) : Fit::unknown;
                 }});
        };
        addStep("values of the step before", -1);
        addStep("values of the step after", 1);
    }

    /// A different rounding changes all values that lose the same bits by the same amount.
    void addRounding(const std::vector<Fault>& faults)
    {
        std::array<std::array<std::size_t, 3>, roundingClasses> counts{};  // of differences of -1 to 1 LSB
        for (const Fault& fault : faults) {
            const int difference = fault.got - fault.wanted;
            if (std::abs(difference) == 1) {
                ++counts[classOf(itsReplay, fault.place)][difference > 0 ? 2 : 0];
            }
        }
        std::array<int, roundingClasses> differences{};
        for (std::size_t i = 1; i < roundingClasses; ++i) {
            differences[i] = counts[i][2] > counts[i][0] ? 1 : counts[i][0] > 0 ? -1 : 0;
        }
        const auto [least, most] = std::minmax_element(differences.begin(), differences.end());
        const char* const text = *least == 0  ? "one LSB too high: rounding"
                                 : *most == 0 ? "one LSB too low: rounding"
                                              : "off by one LSB: rounding";
        itsCandidates.push_back({text,
                                 Candidate::descriptive,
                                 Candidate::operation,
                                 [&replay = itsReplay, differences](const Sample& sample) {
                                     const int difference = differences[classOf(replay, sample.place)];
                                     return fitIf(sample.got - sample.wanted == difference);
                                 }});
    }

    static std::size_t classOf(const Replay& replay, const Place& place)
    {
        return replay.roundingClass(place.pass, stageOf(place.signal), place.step);
    }

    void addRelations()
    {
        addRelation("the sign is flipped", [](int got, int wanted) {
            // The smallest value of 8 or 12 bits has no negative.
            const bool stays = wanted == 0 || wanted == -128 || wanted == Values::smallest;
            return got == -wanted || got == ~wanted || (stays && got == wanted);
        });
        addRelation(
            "values are whole numbers where eighths are expected: \"numbers\": \"real\" in a map may be missing",
            [](int got, int wanted) {
                const bool hasPoint = wanted % 8 != 0;
                return got == wanted / 8 || got == wanted >> 3 || (hasPoint && got == wanted);
            });
        addRelation("zeros", [](int got, int) { return got == 0; });
    }

    void addStuckBits(int bits)
    {
        for (int bit = 0; bit < bits; ++bit) {
            const std::string text = "bit " + std::to_string(bit) + " is stuck at ";
            addRelation(text + '1',
                        [bits, bit](int got, int wanted) { return got == signExtended(wanted | 1 << bit, bits); });
            addRelation(text + '0',
                        [bits, bit](int got, int wanted) { return got == signExtended(wanted & ~(1 << bit), bits); });
        }
    }

    void addFlippedBits(int bits)
    {
        for (int bit = 0; bit < bits; ++bit) {
            addRelation("bit " + std::to_string(bit) + " is flipped",
                        [bits, bit](int got, int wanted) { return got == signExtended(wanted ^ 1 << bit, bits); });
        }
    }

    static constexpr std::size_t roundingClasses = 32;

    const Model& itsModel;
    const Replay& itsReplay;
    std::vector<Candidate> itsCandidates;
};

}  // namespace

std::vector<Candidate> candidates(const Model& model, const Replay& replay, const std::vector<Fault>& faults)
{
    return Collector(model, replay).all(faults);
}

}  // namespace morvik::comparison
