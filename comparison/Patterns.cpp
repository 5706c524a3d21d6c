// Patterns: what the faults of a dump have in common.
#include "Patterns.h"

#include <algorithm>
#include <array>
#include <cstdlib>

#include "Replay.h"

namespace morvik::comparison {

namespace {

/// The part of the faults that a pattern has to explain: a fault may hide behind another.
constexpr double enough = 0.9;

/// Of more faults than these, every nth is looked at.
constexpr std::size_t mostExplained = 20000;

std::vector<Fault> sample(const std::vector<Fault>& faults)
{
    const std::size_t each = (faults.size() + mostExplained - 1) / mostExplained;
    std::vector<Fault> some;
    for (std::size_t i = 0; i < faults.size(); i += each) {
        some.push_back(faults[i]);
    }
    return some;
}

/// A mistake, and what it is called.
struct NamedMistake {
    Mistake mistake;
    const char* text;
};

constexpr std::array<NamedMistake, 18> namedMistakes = {{
    {Mistake::borderBitsKept, "the seven low bits of border metrics are not cleared (rule 11)"},
    {Mistake::borderOfOtherPass,
     "border metrics are those of the other pass: this one's for the last one's, or the reverse (rule 20)"},
    {Mistake::borderUnknown, "start metrics are zeros, as for an unknown state (rule 10)"},
    {Mistake::aprioriMissing, "the extrinsic values of the pass before do not arrive (rule 13)"},
    {Mistake::aprioriOfPassBefore, "a pass late: extrinsic values are those of the pass before the last (rule 13)"},
    {Mistake::aprioriUnpermuted, "extrinsic values are taken without the interleaver's permutation (rule 15)"},
    {Mistake::aprioriInverse, "extrinsic values are taken by the inverse of the permutation (rule 15)"},
    {Mistake::aprioriBefore, "extrinsic values are taken by the interleaver's address for the step before (rule 15)"},
    {Mistake::aprioriBehind, "extrinsic values are taken by the interleaver's address for the step after (rule 15)"},
    {Mistake::systematicUnpermuted, "systematic values are in the other code's order (rule 15)"},
    {Mistake::parityOfOtherCode, "the parity values are those of the other code (rule 5)"},
    {Mistake::parityNegated, "the sign of the parity is flipped (rule 5)"},
    {Mistake::unclipped, "saturation is missing: the sum is wider than eight bits (rules 5 and 14)"},
    {Mistake::wrappedInEight, "saturation is missing: the sum is cut to its low eight bits (rules 5 and 14)"},
    {Mistake::unwrapped, "the wrap is missing: values saturate (rule 2)"},
    {Mistake::unscaled, "the factor of 0.75 is missing (rule 14)"},
    {Mistake::uncorrected, "the correction table is missing (rule 7)"},
    {Mistake::correctedAtOnce, "corrections come a decision early (rule 7)"},
}};

class Explainer {
public:
    Explainer(const Model& model, const Values& dump) : itsModel(model), itsReplay(model, dump) {}

    /// Fills in how the faults came about.
    void explain(const std::vector<Fault>& faults, Finding& finding) const
    {
        for (const NamedMistake& each : namedMistakes) {
            consider(each.text, faults, finding, [this, &each](const Fault& fault) {
                return fault.got == replayed(fault.place, fault.place.pass, each.mistake);
            });
        }
        consider("a pass late: values are those of the last pass over the same code",
                 faults,
                 finding,
                 [this](const Fault& fault) { return fault.got == valueOfLastPass(fault.place); });
        explainByRelation(faults, finding);
        explainByBits(faults, finding);
    }

private:
    /// Keeps the pattern when it explains more than those before it.
    template <class Matches>
    static void consider(const std::string& text, const std::vector<Fault>& faults, Finding& finding, Matches matches)
    {
        const auto count = std::count_if(faults.begin(), faults.end(), matches);
        const double part = static_cast<double>(count) / static_cast<double>(faults.size());
        if (part > finding.explained && part >= enough) {
            finding.how = text;
            finding.explained = part;
        }
    }

    int replayed(const Place& place, unsigned pass, Mistake mistake) const
    {
        const Stage stage = stageOf(place.signal);
        return itsReplay.column(pass, stage, place.step, mistake).values[place.signal - signalsOf(stage).first];
    }

    /// How values that are wrong relate to those that are wanted.
    void explainByRelation(const std::vector<Fault>& faults, Finding& finding) const
    {
        consider("the sign is flipped", faults, finding, [](const Fault& fault) {
            return fault.got == -fault.wanted || fault.got == ~fault.wanted;
        });
        consider(
            "the wrap is missing: values stay at the end of the range (rule 2)",
            faults,
            finding,
            [](const Fault& fault) { return fault.got == (fault.wanted < 0 ? Values::largest : Values::smallest); });
        consider("values are whole numbers where eighths are expected: \"numbers\": \"real\" in a map may be missing",
                 faults,
                 finding,
                 [](const Fault& fault) { return fault.got == fault.wanted / 8 || fault.got == fault.wanted >> 3; });
        consider("zeros", faults, finding, [](const Fault& fault) { return fault.got == 0; });
        consider("values of the step before", faults, finding, [this](const Fault& fault) {
            return isOfOtherStep(fault, -1);
        });
        consider("values of the step after", faults, finding, [this](const Fault& fault) {
            return isOfOtherStep(fault, 1);
        });
    }

    static void explainByBits(const std::vector<Fault>& faults, Finding& finding)
    {
        constexpr std::size_t fewest = 8;  // with fewer, other bits may be alike by chance
        for (int bit = 0; faults.size() >= fewest && bit < 12; ++bit) {
            const std::string text = "bit " + std::to_string(bit) + " is stuck at ";
            // A carry into a value that is always even looks the same.
            consider(text + (bit == 0 ? "1, or rounding" : "1"), faults, finding, [bit](const Fault& fault) {
                return fault.got == (fault.wanted | 1 << bit);
            });
            consider(text + (bit == 0 ? "0, or rounding" : "0"), faults, finding, [bit](const Fault& fault) {
                return fault.got == (fault.wanted & ~(1 << bit));
            });
        }
        consider("one LSB too high: rounding", faults, finding, [](const Fault& fault) {
            return fault.got == fault.wanted + 1;
        });
        consider("one LSB too low: rounding", faults, finding, [](const Fault& fault) {
            return fault.got == fault.wanted - 1;
        });
        consider("off by one LSB: rounding", faults, finding, [](const Fault& fault) {
            return std::abs(fault.got - fault.wanted) == 1;
        });
        for (int bit = 1; bit < 12; ++bit) {
            consider("bit " + std::to_string(bit) + " is flipped", faults, finding, [bit](const Fault& fault) {
                return ((fault.got ^ fault.wanted) & 0xFFF) == 1 << bit;
            });
        }
    }

    /// Before the first pass over a code, there are no extrinsic values, and all else is 0.
    int valueOfLastPass(const Place& place) const
    {
        if (place.pass >= 2) {
            return replayed(place, place.pass - 2, Mistake::none);
        }
        return stageOf(place.signal) == Stage::intrinsic ? replayed(place, place.pass, Mistake::aprioriMissing) : 0;
    }

    bool isOfOtherStep(const Fault& fault, int step) const
    {
        const Place& place = fault.place;
        const bool exists = step > 0 ? place.step + 1 < itsModel.windows.K : place.step > 0;
        return exists &&
               fault.got == itsModel.values.at({place.pass, place.signal, step > 0 ? place.step + 1 : place.step - 1});
    }

    const Model& itsModel;
    Replay itsReplay;
};

/// A kind of place in a block.
struct Kind {
    const char* text;
    bool (*matches)(const Windows&, const Place&);
};

bool startsSegment(const Windows& windows, const Place& place)
{
    return place.step < windows.K && place.step % windows.segmentLength == 0;
}

bool startsWindow(const Windows& windows, const Place& place)
{
    return place.step < windows.K && windows.at(place.step).last == place.step;
}

constexpr bool isForward(const Place& place)
{
    return stageOf(place.signal) == Stage::forward;
}

constexpr bool isBackward(const Place& place)
{
    return stageOf(place.signal) == Stage::backward;
}

/// The narrow ones first.
constexpr std::array<Kind, 6> kinds = {{
    {"at the beginning of segment 0 alone",
     [](const Windows&, const Place& place) {
         return isForward(place) && place.step == 0;
     }},
    {"at the tail alone: where the last window starts",
     [](const Windows& windows, const Place& place) {
         return isBackward(place) && place.step + 1 == windows.K;
     }},
    {"in the tail alone",
     [](const Windows& windows, const Place& place) {
         return place.step >= windows.K;
     }},
    {"at window edges alone: where segments start",
     [](const Windows& windows, const Place& place) {
         return isForward(place) && startsSegment(windows, place);
     }},
    {"at window edges alone: where windows start",
     [](const Windows& windows, const Place& place) {
         return isBackward(place) && startsWindow(windows, place);
     }},
    {"in segment 0 alone",
     [](const Windows& windows, const Place& place) {
         return windows.segments > 1 && place.step < windows.segmentLength;
     }},
}};

/// What a property of all faults is, when it is one and the same.
template <class Property>
std::optional<unsigned> common(const std::vector<Fault>& faults, Property property)
{
    const unsigned first = property(faults.front().place);
    const bool all =
        std::all_of(faults.begin(), faults.end(), [&](const Fault& fault) { return property(fault.place) == first; });
    return all ? std::optional<unsigned>(first) : std::nullopt;
}

void append(std::string& text, const std::string& part)
{
    text += (text.empty() ? "" : ", ") + part;
}

/// Faults that are but the differences of the first pass tell nothing of passes.
std::string whereOf(const Windows& windows, const std::vector<Fault>& faults, bool ofAllPasses)
{
    std::string text;
    if (faults.size() == 1) {
        return "at one place alone";
    }
    const auto* const kind = std::find_if(kinds.begin(), kinds.end(), [&](const Kind& each) {
        return std::all_of(
            faults.begin(), faults.end(), [&](const Fault& fault) { return each.matches(windows, fault.place); });
    });
    if (kind != kinds.end()) {
        append(text, kind->text);
    }
    const auto pass = common(faults, [](const Place& place) { return place.pass; });
    const auto code = common(faults, [](const Place& place) { return codeOf(place.pass); });
    if (ofAllPasses && pass) {
        append(text, "in half-iteration " + std::to_string(*pass) + " alone");
    } else if (ofAllPasses && code) {
        append(text, *code == 0 ? "on the natural code alone" : "on the interleaved code alone");
    }
    const auto signal = common(faults, [](const Place& place) { return place.signal; });
    if (signal && signalsOf(stageOf(*signal)).count > 1) {
        append(text, "in " + std::string(passSignals[*signal]) + " alone");
    }
    const auto segment = common(faults, [&](const Place& place) { return place.step / windows.segmentLength; });
    if (kind == kinds.end() && segment && *segment > 0 && *segment < windows.segments) {
        append(text, "in segment " + std::to_string(*segment) + " alone");
    }
    return text;
}

/// How many values of the dump are the model's, were its numbers other by these.
struct Agreement {
    std::uint64_t compared = 0;
    std::uint64_t equal = 0;
};

Agreement agreement(const Model& model, const Values& dump, unsigned passes, unsigned steps)
{
    Agreement found;
    for (unsigned pass = passes; pass < dump.passes(); ++pass) {
        for (unsigned signal = 0; signal < signalCount; ++signal) {
            for (unsigned step = steps; step < dump.steps(); ++step) {
                const Place theirs = {pass, signal, step};
                const Place ours = {pass - passes, signal, step - steps};
                if (dump.has(theirs) && model.values.has(ours)) {
                    ++found.compared;
                    found.equal += dump.at(theirs) == model.values.at(ours) ? 1U : 0U;
                }
            }
        }
    }
    return found;
}

}  // namespace

std::vector<Finding> findPatterns(const Model& model, const Values& dump, const Comparison& comparison)
{
    const std::vector<Fault>& faults = comparison.faults;
    const Explainer explainer(model, dump);
    std::vector<Finding> findings;
    for (const Fault& each : faults) {
        const Stage stage = stageOf(each.place.signal);
        if (std::any_of(findings.begin(), findings.end(), [&](const Finding& known) { return known.stage == stage; })) {
            continue;
        }
        std::vector<Fault> ofStage;
        std::copy_if(faults.begin(), faults.end(), std::back_inserter(ofStage), [&](const Fault& fault) {
            return stageOf(fault.place.signal) == stage;
        });
        Finding finding{};
        finding.stage = stage;
        finding.faults = ofStage.size();
        finding.where = whereOf(model.windows, ofStage, comparison.inputsAreKnown);
        explainer.explain(sample(ofStage), finding);
        findings.push_back(finding);
    }
    return findings;
}

std::optional<std::string> findShift(const Model& model, const Values& dump)
{
    constexpr std::uint64_t fewest = 32;
    const auto agrees = [&](unsigned passes, unsigned steps) {
        const Agreement found = agreement(model, dump, passes, steps);
        return found.compared >= fewest &&
               static_cast<double>(found.equal) >= enough * static_cast<double>(found.compared);
    };
    if (agrees(0, 0)) {
        return std::nullopt;
    }
    if (agrees(1, 0)) {
        return "the dump is a pass late, or counts half-iterations from 1; \"first_half_iteration\": 1 in a map says "
               "so";
    }
    if (agrees(2, 0)) {
        return "the dump is a pass late: its values are those of the last pass over the same code";
    }
    if (agrees(0, 1)) {
        return "the dump is a step late, or counts steps from 1; \"first_step\": 1 in a map says so";
    }
    if (agrees(1, 1)) {
        return "the dump counts half-iterations and steps from 1; \"first_half_iteration\": 1 and \"first_step\": 1 in "
               "a map say so";
    }
    return std::nullopt;
}

}  // namespace morvik::comparison
