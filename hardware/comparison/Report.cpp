// Report: a comparison as text.
#include "Report.h"

#include <algorithm>
#include <cmath>
#include <cstdarg>
#include <cstdio>
#include <vector>

#include "Patterns.h"
#include "base/Text.h"

namespace morvik::comparison {

namespace {

constexpr unsigned contextSteps = 3;  // before and after the first difference

__attribute__((format(printf, 1, 2))) std::string format(const char* form, ...)
{
    va_list arguments;
    va_start(arguments, form);
    va_list again;
    va_copy(again, arguments);
    const int length = std::vsnprintf(nullptr, 0, form, arguments);
    va_end(arguments);
    std::string text(static_cast<std::size_t>(std::max(length, 0)) + 1, '\0');
    std::vsnprintf(text.data(), text.size(), form, again);
    va_end(again);
    text.pop_back();
    return text;
}

const char* codeName(unsigned pass)
{
    return codeOf(pass) == 0 ? "natural" : "interleaved";
}

/// The names of a stage's values and of the operation that gives them.
struct StageWords {
    const char* values;
    const char* operation;
};

StageWords wordsOf(Stage stage)
{
    switch (stage) {
    case Stage::intrinsic:
        return {"intrinsic values",
                "the intrinsic value: half the extrinsic value plus the systematic value (rule 13)"};
    case Stage::branch:
        return {"branch metrics", "the branch metrics: sums of intrinsic and parity values, clipped (rule 5)"};
    case Stage::forward:
        return {"forward metrics", "the forward recursion (rules 6 and 7)"};
    case Stage::backward:
        return {"backward metrics", "the backward recursion (rules 6 and 7)"};
    case Stage::ratio:
        return {"log-likelihood ratios", "the log-likelihood ratio (rule 8)"};
    case Stage::extrinsic:
        break;
    }
    return {"extrinsic values", "the extrinsic value: ratio - 4 x intrinsic value, scaled and clipped (rule 14)"};
}

/// The only text, or "either A, or B".
std::string eitherOf(const std::vector<std::string>& texts)
{
    std::string all = texts.size() > 1 ? "either " : "";
    for (const std::string& each : texts) {
        all += (&each == &texts.front() ? "" : ", or ") + each;
    }
    return all;
}

class Reporter {
public:
    explicit Reporter(const Compared& compared)
        : itsCompared(compared), itsComparison(compared.comparison), itsModel(compared.model), itsDump(compared.dump)
    {
    }

    Report report()
    {
        addVerdictOnAll();
        addCoverage();
        if (itsComparison.first) {
            itsText += '\n';
            addFirst();
            addCounts();
            addExamined();
            addFindings();
        } else if (itsCompared.countsAlways) {
            itsText += '\n';
            addCounts();
        }
        return {itsText, itsFindings};
    }

    std::string firstDifference()
    {
        addFirst();
        addFindings();
        return itsText;
    }

    std::string headline() const
    {
        const Place& place = *itsComparison.first;
        return format("%s of half-iteration %u, step %u: expected %d, got %s",
                      passSignals[place.signal].name,
                      place.pass,
                      place.step,
                      itsModel.values.at(place),
                      gotText(place).c_str());
    }

private:
    void addVerdictOnAll()
    {
        const Comparison& all = itsComparison;
        itsText =
            itsCompared.name + format(": compared %u of %u half-iterations, ", all.passes, itsDump.values.passes());
        itsText +=
            std::to_string(all.compared()) + " of " + base::counted(itsCompared.coverage.computed, "value") + ": ";
        itsText += all.first ? base::counted(all.different(), "difference") : "all equal to the model";
        if (all.unknown() > 0 && !all.ignoresUnknown) {
            itsText += all.knownDifferent() == 0 ? ", all of them" : ", " + std::to_string(all.unknown()) + " of them";
            itsText += " unknown values (x)";
        }
        itsText += '\n';
    }

    void addCoverage()
    {
        const Coverage& coverage = itsCompared.coverage;
        if (itsComparison.ignoresUnknown && itsComparison.unknown() > 0) {
            itsText += "  ignored: " + base::counted(itsComparison.unknown(), "unknown value") + " (x)\n";
        }
        for (const std::string& each : itsDump.waveform ? itsDump.waveform->notes : std::vector<std::string>()) {
            itsText += "  by the map: " + each + '\n';
        }
        for (const std::string& each : lacksOf(coverage)) {
            itsText += "  not" + inValues() + ": " + each + '\n';
        }
        if (coverage.isComplete() || itsCompared.isPartial) {
            return;
        }
        itsText += "Incomplete: values of its signals are missing. Use --partial if that is intended";
        if (coverage.iterations) {
            itsText += format("; for a simulation of fewer iterations, give --iterations %u", *coverage.iterations);
        }
        itsText += ".\n";
    }

    void addFirst()
    {
        const Place& place = *itsComparison.first;
        addPlace(place);
        addValue(place);
        addContext(place);
        addInputs(place);
    }

    std::string inValues() const
    {
        return std::string(" in ") + itsCompared.values;
    }

    /// Adds the variable and time of a value, if the dump is a waveform.
    void addSource(const Place& place)
    {
        if (!itsDump.waveform) {
            return;
        }
        const Waveform& waveform = *itsDump.waveform;
        const std::size_t index = itsDump.values.index(place);
        itsText += "  variable        " + waveform.names.at(waveform.variables[index]) + '\n';
        itsText += "  time            " + (waveform.unit.empty() ? "#" : std::string()) +
                   std::to_string(waveform.times[index]) + (waveform.unit.empty() ? "" : ' ' + waveform.unit) + '\n';
    }

    void addPlace(const Place& place)
    {
        const rules::Cut& cut = itsModel.cut;
        const std::uint32_t line = itsDump.lineOf(place);
        itsText += "First difference, in the order of computation (" + itsCompared.name +
                   (line > 0 ? ':' + std::to_string(line) : "") + "):\n";
        itsText += format("  half-iteration  %u, on the %s code\n", place.pass, codeName(place.pass));
        const rules::StepPlace where = itsModel.cut.placeOf(place.step);
        const rules::Window window = cut.windowAt(place.step);
        itsText += format("  unit            %u, thread %u\n", where.unit, where.thread);
        itsText += format("  segment         %u of %u, steps %u to %u\n",
                          where.segment,
                          cut.segments(),
                          where.segment * cut.segmentLength(),
                          (where.segment + 1) * cut.segmentLength() - 1);
        itsText +=
            format("  window          %u of %u, steps %u to %u\n", where.row, cut.rows(), window.first, window.last);
        itsText += format("  trellis step    %u, %s\n", place.step, bitText(place).c_str());
        itsText += format("  signal          %s\n", passSignals[place.signal].name);
        addSource(place);
        itsText += '\n';
    }

    std::string bitText(const Place& place) const
    {
        if (place.step >= itsModel.cut.K()) {
            return "after the bits";
        }
        const unsigned bit = codeOf(place.pass) == 0 ? place.step : itsModel.codes[1].order[place.step];
        return "bit " + std::to_string(bit) + " of the block";
    }

    static std::string valueLine(const char* name, int value)
    {
        return format(
            "  %-12s%9d%12.3f%7s0x%03x\n", name, value, value / 8.0, "", static_cast<unsigned>(value) & 0xFFFU);
    }

    void addValue(const Place& place)
    {
        itsText += "                decimal        real         hex\n";
        itsText += valueLine("expected", itsModel.values.at(place));
        itsText += itsDump.values.has(place) ? valueLine("got", itsDump.values.at(place))
                                             : format("  %-12s%9s%12s%12s\n", "got", "x", "x", "x");
        itsText += '\n';
    }

    void addContext(const Place& place)
    {
        const unsigned first = place.step - std::min(place.step, contextSteps);
        const unsigned last = std::min(place.step + contextSteps, itsDump.values.steps() - 1);
        itsText += format("  %8s%12s%12s\n", "step", "expected", "got");
        for (unsigned step = first; step <= last; ++step) {
            const Place each = {place.pass, place.signal, step};
            if (!itsModel.values.has(each)) {
                continue;
            }
            const bool isThere = itsDump.values.at(each) != Values::missing;
            const bool differs = isThere && itsDump.values.at(each) != itsModel.values.at(each);
            itsText += format("%s %9u%12d%12s%s\n",
                              step == place.step ? ">" : " ",
                              step,
                              itsModel.values.at(each),
                              gotText(each).c_str(),
                              differs ? " *" : "");
        }
        itsText += '\n';
    }

    std::string gotText(const Place& place) const
    {
        return itsDump.values.has(place)         ? std::to_string(itsDump.values.at(place))
               : itsDump.values.isUnknown(place) ? "x"
                                                 : "-";
    }

    void addInputs(const Place& place)
    {
        bool differ = false;
        bool known = true;
        for (const InputState& input : itsComparison.inputs) {
            const std::string state = input.present == 0     ? "not" + inValues()
                                      : input.different == 0 ? "agrees"
                                                             : "differs";
            const unsigned all = signalsOf(input.stage).count;
            const std::string part = input.present > 0 && input.present < all ? " where it is" + inValues() : "";
            itsText += format("  input %-10s of half-iteration %u, step %u: %s%s\n",
                              nameOf(input.stage).c_str(),
                              input.pass,
                              input.step,
                              state.c_str(),
                              part.c_str());
            differ = differ || input.different > 0;
            known = known && input.present == all;
        }
        addVerdict(place, differ, known);
    }

    void addVerdict(const Place& place, bool differ, bool known)
    {
        const std::string operation = startText(place);
        if (differ) {
            itsText += "An input differs as well, so the value may merely follow from it.\n\n";
        } else if (itsComparison.inputs.empty()) {
            itsText += "It does not depend on earlier values. At fault: " + operation + ".\n\n";
        } else if (known) {
            itsText += "All its inputs agree. At fault: " + operation + ".\n\n";
        } else {
            itsText += "At fault: " + operation + ", or an operation before it that is not" + inValues() + ".\n\n";
        }
    }

    /// The operation that gives a value, or where its start column comes from.
    std::string startText(const Place& place) const
    {
        const rules::Cut& cut = itsModel.cut;
        const Stage stage = stageOf(place.signal);
        if (stage == Stage::forward && cut.startsSegment(place.step)) {
            return place.step == 0 ? "the known state at the beginning (rule 10)"
                   : rules::isFirstPass(place.pass)
                       ? "the unknown state at the start of the segment (rules 10 and 19)"
                       : "the border metrics at the start of the segment (rules 11 and 19), or the step "
                         "that leads to them";
        }
        if (stage == Stage::backward && cut.windowAt(place.step).last == place.step) {
            return cut.startsAtTail(cut.windowAt(place.step)) ? "the metrics of the tail (rule 12)"
                   : rules::isFirstPass(place.pass)
                       ? "the unknown state at the start of the window (rules 10 and 20)"
                       : "the border metrics at the start of the window (rules 11 and 20), or the step "
                         "that leads to them";
        }
        return wordsOf(stage).operation;
    }

    void addCounts()
    {
        itsText += format("%-10s%10s%9s%9s%13s%9s   %s\n",
                          "signal",
                          "compared",
                          "missing",
                          "unknown",
                          "differences",
                          "faults",
                          "first difference");
        for (unsigned i = 0; i < signalCount; ++i) {
            const SignalCount& count = itsComparison.signals[i];
            if (count.compared + count.unknown == 0) {
                continue;
            }
            itsText += format("%-10s%10llu%9llu%9llu%13llu%9llu",
                              passSignals[i].name,
                              static_cast<unsigned long long>(count.compared),
                              static_cast<unsigned long long>(count.missing),
                              static_cast<unsigned long long>(count.unknown),
                              static_cast<unsigned long long>(count.different),
                              static_cast<unsigned long long>(count.faults));
            itsText +=
                count.first ? format("   half-iteration %u, step %u\n", count.first->pass, count.first->step) : "\n";
        }
    }

    /// Adds how faults were told from other differences.
    void addExamined()
    {
        itsText += itsComparison.inputsAreKnown
                       ? "Faults are values that do not follow from their inputs" + inValues() +
                             "; other differences are consequences.\n"
                       : "Without their inputs" + inValues() +
                             ", faults cannot be told from consequences: only the first stage that differs is "
                             "examined.\n";
        const auto agreesAllTheSame = [](const SignalCount& count) {
            return count.faults > 0 && count.different == 0;
        };
        if (std::any_of(itsComparison.signals.begin(), itsComparison.signals.end(), agreesAllTheSame)) {
            itsText += std::string("Where a fault is not a difference, the core had the right inputs, but ") +
                       itsCompared.values + " has wrong ones.\n";
        }
        itsText += '\n';
    }

    template <std::uint64_t SignalCount::*member>
    std::uint64_t sum(Stage stage) const
    {
        std::uint64_t count = 0;
        for (unsigned i = 0; i < signalsOf(stage).count; ++i) {
            count += itsComparison.signals[signalsOf(stage).first + i].*member;
        }
        return count;
    }

    void addUnknown()
    {
        const auto add = [this](Stage stage, const std::string& count, const char* what) {
            itsText += "Found in " + std::string(wordsOf(stage).values) + ", " + count + ":\n  " + what + ".\n";
            itsFindings.push_back(std::string(wordsOf(stage).values) + ": " + what);
        };
        const Stage first = stageOf(itsComparison.first->signal);
        for (const Stage stage : stages) {
            const std::uint64_t faults = sum<&SignalCount::unknownFaults>(stage);
            const std::uint64_t unknown = itsComparison.ignoresUnknown ? 0 : sum<&SignalCount::unknown>(stage);
            if (faults > 0) {
                add(stage, base::counted(faults, "fault"), "unknown (x), though all inputs are known");
            } else if (!itsComparison.inputsAreKnown && stage == first && unknown > 0) {
                add(stage, base::counted(unknown, "difference"), "unknown (x)");
            }
        }
    }

    void addFindings()
    {
        addUnknown();
        if (!itsCompared.otherRuns.empty()) {
            itsFindings.push_back(std::string(itsCompared.values) + " is what the model computes " +
                                  eitherOf(itsCompared.otherRuns));
            itsText += "Found: " + itsFindings.back() + ".\n";
        } else if (const auto shifts = findShifts(itsModel, itsDump.values); !shifts.empty()) {
            itsFindings.push_back(eitherOf(shifts));
            itsText += "Found: " + itsFindings.back() + ".\n";
            return;
        }
        for (const Finding& finding : findPatterns(itsModel, itsDump.values, itsComparison)) {
            if (itsCompared.otherRuns.empty() || !finding.how.empty()) {  // otherwise explained already
                addFinding(finding);
            }
        }
    }

    void addFinding(const Finding& finding)
    {
        itsText += std::string("Found in ") + wordsOf(finding.stage).values + ", " +
                   base::counted(finding.faults, itsComparison.inputsAreKnown ? "fault" : "difference");
        itsText += (finding.where.empty() ? "" : ", " + finding.where) + ":\n  ";
        const std::string part = format("%.0f %% of them", std::floor(100 * finding.explained));
        const std::string how = finding.how.empty() ? "no known pattern" : eitherOf(finding.how);
        const char* const chance =
            finding.isByChance && !finding.how.empty() ? "; with so few, this may be chance" : "";
        itsFindings.push_back(std::string(wordsOf(finding.stage).values) + ": " + how + chance);
        if (!finding.how.empty()) {
            itsText += how + (finding.explained < 1 ? ", in " + part : "") + chance + ".\n";
            return;
        }
        itsText += how;
        if (!finding.shared.empty()) {
            itsText += finding.faults == 1 ? "; it is " : finding.explained < 1 ? "; " + part + " are " : "; all are ";
            itsText += finding.shared;
        }
        itsText += ".\n";
    }

    const Compared& itsCompared;
    const Comparison& itsComparison;
    const Model& itsModel;
    const Dump& itsDump;
    std::string itsText;
    std::vector<std::string> itsFindings;
};

}  // namespace

Report reportOf(const Compared& compared)
{
    return Reporter(compared).report();
}

std::string textOf(const Compared& compared)
{
    return reportOf(compared).text;
}

std::string firstDifferenceOf(const Compared& compared)
{
    return Reporter(compared).firstDifference();
}

std::string headlineOf(const Compared& compared)
{
    return Reporter(compared).headline();
}

}  // namespace morvik::comparison
