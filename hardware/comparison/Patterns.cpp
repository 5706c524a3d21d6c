// Patterns: what the faults of a dump have in common.
#include "Patterns.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <optional>
#include <random>
#include <set>

#include "Candidates.h"
#include "Replay.h"
#include "Where.h"

namespace morvik::comparison {

namespace {

/// The fraction of the faults that a pattern must explain: one fault may hide another.
constexpr double enough = 0.9;

/// Fewer faults may show a pattern by chance.
constexpr std::size_t telling = 4;

/// Larger sets of faults are sampled.
constexpr std::size_t mostExplained = 20000;

/// Before all faults, a candidate is tried on so many, of which it may leave twice as many as of all.
constexpr std::size_t probed = 100;
constexpr double enoughOfProbe = 0.8;

std::vector<Fault> sampleOf(const std::vector<Fault>& faults, std::size_t most)
{
    const std::size_t each = faults.size() / most + 1;
    std::vector<Fault> some;
    // Not in equal strides: those may hit only one signal or one segment.
    std::minstd_rand random;
    for (std::size_t i = 0; i < faults.size(); i += each) {
        some.push_back(faults[i + random() % std::min(each, faults.size() - i)]);
    }
    return some;
}

/// A right value is a fault, too, if the dump has other inputs of it than the core had. It is no mistake of the core.
bool isWrong(const Model& model, const Fault& fault)
{
    return fault.got != model.values.at(fault.place);
}

/// Looks for what explains all values of a stage, wrong and right alike.
class Explainer {
public:
    Explainer(const Model& model, const Values& dump, const Comparison& comparison)
        : itsModel(model), itsDump(dump), itsComparison(comparison), itsReplay(model, dump)
    {
    }

    Finding explain(Stage stage)
    {
        const std::vector<Fault> faults = faultsOf(stage);
        const Where where(itsModel, itsComparison, faults);
        Finding finding{};
        finding.stage = stage;
        finding.faults = faults.size();
        finding.where = where.text();
        finding.isByChance = distinct(faults) < telling;
        const std::vector<Fault> some = sampleOf(faults, mostExplained);
        explainByCandidates(where, some, finding);
        if (finding.how.empty()) {
            describe(some, finding);
        }
        return finding;
    }

private:
    /// Takes inputs that the dump lacks from the model: a difference that follows from others is no fault.
    std::vector<Fault> faultsOf(Stage stage)
    {
        std::vector<Fault> faults;
        for (Fault fault : itsComparison.faults) {
            if (stageOf(fault.place.signal) == stage && isWrong(itsModel, fault)) {
                fault.wanted = itsComparison.inputsAreKnown ? fault.wanted : follows(fault.place).value;
                if (fault.got != fault.wanted) {
                    faults.push_back(fault);
                }
            }
        }
        return faults.empty() ? itsComparison.faults : faults;  // those of one stage, if none is left
    }

    /// Whether all values follow from the dump's own: it lacks the last bit of intrinsic values, and they show another
    /// one than the inputs give.
    bool follow(const std::vector<Fault>& faults)
    {
        return std::all_of(faults.begin(), faults.end(), [this](const Fault& fault) {
            return follows(fault.place).value == fault.got;
        });
    }

    /// Counts distinct faults, up to `telling`. The tail has the same values in each pass, so one pass says as much as
    /// all.
    static std::size_t distinct(const std::vector<Fault>& faults)
    {
        std::set<std::array<int, 5>> all;
        for (std::size_t i = 0; i < faults.size() && all.size() < telling; ++i) {
            const Fault& each = faults[i];
            const Place& place = each.place;
            all.insert({static_cast<int>(codeOf(place.pass)),
                        static_cast<int>(place.signal),
                        static_cast<int>(place.step),
                        each.got,
                        each.wanted});
        }
        return all.size();
    }

    struct Following {
        std::int16_t value;
        Sources sources;
    };

    Following follows(const Place& place)
    {
        const Stage stage = stageOf(place.signal);
        if (!itsPlace || itsPlace->pass != place.pass || itsPlace->step != place.step ||
            stageOf(itsPlace->signal) != stage) {
            itsColumn = itsReplay.column(place.pass, stage, place.step);
            itsPlace = place;
        }
        return {itsColumn.values[place.signal - signalsOf(stage).first], itsColumn.sources};
    }

    /// The right values of a stage; only those of the first differing pass if the dump lacks inputs.
    const std::vector<Sample>& rightValues(Stage stage)
    {
        std::optional<std::vector<Sample>>& right = itsRight[static_cast<std::size_t>(stage)];
        if (right) {
            return *right;
        }
        right.emplace();
        const bool known = itsComparison.inputsAreKnown;
        const unsigned firstPass = known ? 0 : itsComparison.first->pass;
        const unsigned endPass = known ? itsDump.passes() : firstPass + 1;
        const auto [first, count] = signalsOf(stage);
        for (unsigned pass = firstPass; pass < endPass; ++pass) {
            for (unsigned step = 0; step < itsDump.steps(); ++step) {
                for (unsigned signal = first; signal < first + count; ++signal) {
                    const Place place = {pass, signal, step};
                    if (itsDump.has(place) && itsModel.values.has(place) && isRight(place)) {
                        right->push_back({place, itsDump.at(place), itsDump.at(place)});
                    }
                }
            }
        }
        return *right;
    }

    bool isRight(const Place& place)
    {
        const Following wanted = follows(place);
        return (wanted.sources.complete || !itsComparison.inputsAreKnown) && !wanted.sources.inferred &&
               wanted.value == itsDump.at(place);
    }

    /// The fraction of the faults that the candidate explains; 0 if it contradicts more than it may, or says nothing of
    /// half of them.
    static double explainedBy(const Candidate& candidate, const std::vector<Fault>& faults, double fraction = enough)
    {
        const double all = static_cast<double>(faults.size());
        std::size_t missed = 0;
        std::size_t open = 0;
        for (const Fault& fault : faults) {
            const Fit fit = candidate.fits(fault);
            missed += fit == Fit::no || fit == Fit::unknown ? 1U : 0U;
            open += fit == Fit::open ? 1U : 0U;
            if (static_cast<double>(missed) > (1 - fraction) * all || static_cast<double>(2 * open) > all) {
                return 0;
            }
        }
        return (all - static_cast<double>(missed + open)) / all;
    }

    /// How far a mistake may reach without contradicting a right value.
    enum class Reach : std::uint8_t { nowhere, limited, everywhere };

    Reach reachOf(const Candidate& candidate, const Where& where, Stage stage)
    {
        if (candidate.reach == Candidate::core) {
            return std::none_of(stages.begin(), stages.end(), [&](Stage each) { return contradicts(candidate, each); })
                       ? Reach::everywhere
                       : Reach::nowhere;
        }
        const Where limited = candidate.reach == Candidate::borders     ? where.ofBorders()
                              : candidate.reach == Candidate::operation ? where.ofOperation()
                                                                        : where;
        const Where everywhere = limited.spread();
        auto reach = Reach::everywhere;
        for (const Sample& sample : rightValues(stage)) {
            if (everywhere.contains(sample.place) && candidate.fits(sample) == Fit::no) {
                if (limited.contains(sample.place)) {
                    return Reach::nowhere;
                }
                reach = Reach::limited;
            }
        }
        return reach;
    }

    /// Whether a right value of the stage would be another under the mistake.
    bool contradicts(const Candidate& candidate, Stage stage)
    {
        const std::vector<Sample>& right = rightValues(stage);
        return std::any_of(
            right.begin(), right.end(), [&](const Sample& sample) { return candidate.fits(sample) == Fit::no; });
    }

    void explainByCandidates(const Where& where, const std::vector<Fault>& faults, Finding& finding)
    {
        const std::vector<Fault> some = sampleOf(faults, probed);
        std::vector<Candidate> best;
        auto rank = Candidate::descriptive;
        const bool isOfLastBit = follow(faults);
        for (const Candidate& each : candidates(itsModel, itsReplay, faults)) {
            if (isOfLastBit && !each.recomputes) {
                continue;  // all would follow without a mistake, too
            }
            const double part = explainedBy(each, some, enoughOfProbe) > 0 ? explainedBy(each, faults) : 0;
            const bool isBetter = part > finding.explained || each.rank < rank;
            if (part <= 0 || part < finding.explained || (!isBetter && each.rank > rank)) {
                continue;
            }
            const Reach reach = reachOf(each, where, finding.stage);
            if (reach == Reach::nowhere) {
                continue;
            }
            if (isBetter) {
                best.clear();
            }
            finding.explained = part;
            rank = each.rank;
            best.push_back(each);
            if (each.reach != Candidate::place && faults.size() > 1) {
                const Where shown = where.ofBorders();
                finding.where = (reach == Reach::everywhere ? shown.spread() : shown).text();
            }
        }
        finding.how = simplestOf(best);
    }

    /// The texts of the candidates but those of a family that say the same in more detail.
    static std::vector<std::string> simplestOf(const std::vector<Candidate>& candidates)
    {
        std::vector<std::string> texts;
        for (const Candidate& each : candidates) {
            const bool isSimplest = std::none_of(candidates.begin(), candidates.end(), [&](const Candidate& other) {
                return each.family != 0 && other.family == each.family && other.detail < each.detail;
            });
            if (isSimplest && std::find(texts.begin(), texts.end(), each.text) == texts.end()) {
                texts.push_back(each.text);
            }
        }
        return texts;
    }

    /// Describes what holds for the wrong values, but would not for right ones.
    static void describe(const std::vector<Fault>& faults, Finding& finding)
    {
        const auto consider = [&](const std::string& text, auto holds) {
            const auto count = std::count_if(
                faults.begin(), faults.end(), [&](const Fault& fault) { return holds(fault.got, fault.wanted); });
            const double part = static_cast<double>(count) / static_cast<double>(faults.size());
            if (part >= enough && part > finding.explained) {
                finding.shared = text;
                finding.explained = part;
            }
        };
        consider("one LSB too high", [](int got, int wanted) { return got == wanted + 1; });
        consider("one LSB too low", [](int got, int wanted) { return got == wanted - 1; });
        consider("off by one LSB", [](int got, int wanted) { return std::abs(got - wanted) == 1; });
        consider("zero", [](int got, int) { return got == 0; });
        consider("of the other sign", [](int got, int wanted) { return got == -wanted || got == ~wanted; });
        consider("at the end of the range",
                 [](int got, int wanted) { return got == (wanted < 0 ? Values::largest : Values::smallest); });
        for (unsigned bit = 0; bit < passBits; ++bit) {
            consider("wrong in bit " + std::to_string(bit) + " alone",
                     [bit](int got, int wanted) { return ((got ^ wanted) & 0xFFF) == 1 << bit; });
        }
    }

    const Model& itsModel;
    const Values& itsDump;
    const Comparison& itsComparison;
    Replay itsReplay;
    std::optional<Place> itsPlace;  ///< of the column
    Column itsColumn;
    std::array<std::optional<std::vector<Sample>>, stages.size()> itsRight;  ///< right values, once they are asked for
};

/// Values of the dump that tell whether its numbers are shifted: wrong ones, and right ones where the model has others
/// at the place that they would be for.
struct Agreement {
    std::uint64_t wrong = 0;
    std::uint64_t telling = 0;
    std::uint64_t equal = 0;  ///< of these: equal to the model once shifted
};

Agreement agreement(const Model& model, const Values& dump, unsigned passes, unsigned steps)
{
    Agreement found;
    for (unsigned pass = passes; pass < dump.passes(); ++pass) {
        for (unsigned signal = 0; signal < signalCount; ++signal) {
            for (unsigned step = steps; step < dump.steps(); ++step) {
                const Place theirs = {pass, signal, step};
                const Place ours = {pass - passes, signal, step - steps};
                // Tables have zeros where the core computes nothing.
                if (dump.has(theirs) && model.values.has(theirs) && model.values.has(ours)) {
                    const bool isEqual = dump.at(theirs) == model.values.at(ours);
                    const bool isRight = dump.at(theirs) == model.values.at(theirs);
                    found.wrong += isRight ? 0U : 1U;
                    found.telling += isRight && isEqual ? 0U : 1U;
                    found.equal += isEqual && !isRight ? 1U : 0U;
                }
            }
        }
    }
    return found;
}

bool isEnough(std::uint64_t part, std::uint64_t all)
{
    return static_cast<double>(part) >= enough * static_cast<double>(all);
}

/// A shift of the dump's numbers, and its description.
struct Shift {
    unsigned passes;
    unsigned steps;
    const char* text;
};

constexpr std::array<Shift, 4> shifts = {{
    {1, 0, "the dump is a pass late, or counts half-iterations from 1; \"first_half_iteration\": 1 in a map says so"},
    {2, 0, "the dump is a pass late: its values are those of the last pass over the same code"},
    {0, 1, "the dump is a step late, or counts steps from 1; \"first_step\": 1 in a map says so"},
    {1,
     1,
     "the dump counts half-iterations and steps from 1; \"first_half_iteration\": 1 and \"first_step\": 1 in a map "
     "say so"},
}};

/// One cause of all findings is likelier than several that explain as much.
void keepSharedCauses(std::vector<Finding>& findings)
{
    if (findings.empty()) {
        return;
    }
    std::vector<std::string> shared = findings.front().how;
    for (const Finding& each : findings) {
        shared.erase(std::remove_if(shared.begin(),
                                    shared.end(),
                                    [&](const std::string& how) {
                                        return std::find(each.how.begin(), each.how.end(), how) == each.how.end();
                                    }),
                     shared.end());
    }
    for (Finding& each : findings) {
        each.how = shared.empty() ? each.how : shared;
    }
}

}  // namespace

std::vector<Finding> findPatterns(const Model& model, const Values& dump, const Comparison& comparison)
{
    Explainer explainer(model, dump, comparison);
    std::vector<Finding> findings;
    for (const Fault& each : comparison.faults) {
        const Stage stage = stageOf(each.place.signal);
        const bool isKnown =
            std::any_of(findings.begin(), findings.end(), [&](const Finding& known) { return known.stage == stage; });
        if (!isKnown && isWrong(model, each)) {
            findings.push_back(explainer.explain(stage));
        }
    }
    keepSharedCauses(findings);
    return findings;
}

std::vector<std::string> findShifts(const Model& model, const Values& dump)
{
    constexpr std::uint64_t fewest = 32;
    std::vector<std::string> found;
    double best = 0;
    for (const Shift& shift : shifts) {
        const Agreement each = agreement(model, dump, shift.passes, shift.steps);
        const double part = static_cast<double>(each.equal) / static_cast<double>(each.telling);
        if (each.wrong < fewest || !isEnough(each.equal, each.telling) || part < best) {
            continue;
        }
        if (part > best) {
            found.clear();
        }
        best = part;
        found.emplace_back(shift.text);
    }
    return found;
}

}  // namespace morvik::comparison
