// Candidates: the mistakes that may explain the faults of a stage.
#include "Candidates.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <memory>
#include <string>

#include "KnownMistakes.h"
#include "rules/Formats.h"
#include "rules/Starts.h"

namespace morvik::comparison {

namespace {

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
        if (!itsIsFilled || itsPlace.pass != place.pass || itsPlace.step != place.step) {
            itsColumn = itsReplay.column(place.pass, stageOf(place.signal), place.step, itsMistake);
            itsPlace = place;
            itsIsFilled = true;
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
        const Sources& sources = at(place).sources;
        return equal || (sources.complete && !sources.open) ? fitIf(equal) : sources.open ? Fit::open : Fit::unknown;
    }

private:
    const Replay& itsReplay;
    Mistake itsMistake;
    bool itsIsFilled = false;
    Place itsPlace{};  ///< of the column
    Column itsColumn;
};

class Collector {
public:
    Collector(const Model& model, const Replay& replay) : itsModel(model), itsReplay(replay) {}

    std::vector<Candidate> all(const std::vector<Fault>& faults)
    {
        const Stage stage = stageOf(faults.front().place.signal);
        constexpr std::size_t fewest = 8;  // with fewer, sizes may fit and bits may look stuck by chance
        const bool isFitting = faults.size() >= fewest;
        addAll(knownMistakes(itsModel, stage));
        if (isFitting) {
            addAll(fittedMistakes(itsModel, stage));
        }
        if (stage == Stage::forward || stage == Stage::backward) {
            addFittedMask(faults);
            for (const int bits : {11, 10, 9, 8}) {
                addKeptIn(bits);
            }
        }
        if (stage == Stage::forward) {
            add(otherKnownMetric(faults.front().got));
        }
        addOtherPlaces();
        addRounding(faults);
        addRelations();
        const int bits = bitsOf(stage);
        if (isFitting) {
            addStuckBits(bits);
            addStuckBitsTogether(bits, faults);
            addStuckWord(faults.front().got);
            addConstant(faults.front().got - faults.front().wanted, bits);
        }
        if (stage == Stage::intrinsic) {
            addStuckApriori(faults);
        }
        addFlippedBits(bits);
        return std::move(itsCandidates);
    }

private:
    void addAll(const std::vector<KnownMistake>& mistakes)
    {
        for (const KnownMistake& each : mistakes) {
            add(each);
        }
    }

    void add(const KnownMistake& known)
    {
        const auto columns = std::make_shared<Columns>(itsReplay, known.mistake);
        itsCandidates.push_back({known.text,
                                 known.rank,
                                 known.reach,
                                 [columns](const Sample& sample) { return columns->fit(sample.place, sample.got); },
                                 known.family,
                                 known.detail,
                                 changesIntrinsic(known.mistake)});
    }

    /// A mask keeps the bits that a wrong border column has, and clears those that it lacks. Of other bits, nothing is
    /// known.
    void addFittedMask(const std::vector<Fault>& faults)
    {
        Columns unmasked(itsReplay, Mistake(Mistake::borderMask, -1));
        int kept = 0;
        int cleared = 0;
        for (const Fault& fault : faults) {
            kept |= fault.got;
            cleared |= unmasked.valueAt(fault.place) & ~fault.got;
        }
        const int right = rules::shiftRight(rules::borderMask, rules::stateAlignment);
        const int mask = signExtended(kept | (right & ~cleared), int{rules::stateBits});
        if (mask != 0) {
            add(otherMask(mask));
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

    /// Several bits that are lost or set in most of the faults where they should not be.
    void addStuckBitsTogether(int bits, const std::vector<Fault>& faults)
    {
        const auto isMost = [](std::size_t part, std::size_t rest) {
            return part > 9 * rest;
        };
        std::array<std::vector<int>, 2> stuck;
        for (int bit = 0; bit < bits; ++bit) {
            std::array<std::array<std::size_t, 2>, 2> counts{};  // [wanted][got]
            for (const Fault& fault : faults) {
                ++counts[static_cast<unsigned>(fault.wanted >> bit) & 1U][static_cast<unsigned>(fault.got >> bit) & 1U];
            }
            if (isMost(counts[1][0], counts[1][1]) && isMost(counts[0][0], counts[0][1])) {
                stuck[0].push_back(bit);
            } else if (isMost(counts[0][1], counts[0][0]) && isMost(counts[1][1], counts[1][0])) {
                stuck[1].push_back(bit);
            }
        }
        const std::size_t count = stuck[0].size() + stuck[1].size();
        if (count < 2 || count == static_cast<std::size_t>(bits)) {
            return;  // known as a bit or a word
        }
        const int low = wordOf(stuck[0]);
        const int high = wordOf(stuck[1]);
        const std::string atLow = stuck[0].empty() ? "" : wordsOf(stuck[0]) + " stuck at 0";
        const std::string atHigh = stuck[1].empty() ? "" : wordsOf(stuck[1]) + " stuck at 1";
        addRelation(
            atLow + (atLow.empty() || atHigh.empty() ? "" : ", ") + atHigh,
            [bits, low, high](int got, int wanted) { return got == signExtended((wanted & ~low) | high, bits); });
    }

    static int wordOf(const std::vector<int>& bits)
    {
        int word = 0;
        for (const int bit : bits) {
            word |= 1 << bit;
        }
        return word;
    }

    /// "bit 3 is", "bits 0, 1 and 4 are"
    static std::string wordsOf(const std::vector<int>& bits)
    {
        std::string text = (bits.size() == 1 ? "bit " : "bits ") + std::to_string(bits.front());
        for (std::size_t i = 1; i < bits.size(); ++i) {
            text += (i + 1 == bits.size() ? " and " : ", ") + std::to_string(bits[i]);
        }
        return text + (bits.size() == 1 ? " is" : " are");
    }

    /// Cells of the extrinsic values' memory that read as zeros. A single one may hold any value.
    void addStuckApriori(const std::vector<Fault>& faults)
    {
        const auto add = [this](Mistake mistake, const std::string& text) {
            this->add({mistake, text, Candidate::place, Candidate::included});
        };
        add(Mistake::aprioriMissing, "extrinsic values read as zeros (rule 13)");
        const auto address = extrinsicAddress(itsModel, faults.front().place);
        if (!address || std::any_of(faults.begin(), faults.end(), [&](const Fault& fault) {
                return extrinsicAddress(itsModel, fault.place) != address;
            })) {
            return;
        }
        for (int value = rules::smallestOf(rules::branchBits); value <= rules::largestOf(rules::branchBits); ++value) {
            if (value != 0) {
                add({Mistake::aprioriStuck, value}, "extrinsic values read as " + std::to_string(value) + " (rule 13)");
            }
        }
    }

    /// A cell of a memory that is never written, or a register that is held.
    void addStuckWord(int word)
    {
        if (word == 0) {
            return;  // known as zeros
        }
        addRelation("values stay at " + std::to_string(word), [word](int got, int) { return got == word; });
    }

    /// An offset, before a register that holds its ends or behind it.
    void addConstant(int offset, int bits)
    {
        addRelation("a constant of " + std::to_string(offset) + " is added", [offset, bits](int got, int wanted) {
            const int end = 1 << (bits - 1);
            return got == wanted + offset || got == rules::clip(wanted + offset, -end, end - 1);
        });
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
