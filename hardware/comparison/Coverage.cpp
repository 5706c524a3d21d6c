// Coverage: how many of the core's values a dump has.
#include "Coverage.h"

#include <algorithm>

#include "base/Text.h"
#include "rules/Schedule.h"

namespace morvik::comparison {

namespace {

bool isInDump(const Values& dump, const Place& place)
{
    return dump.at(place) != Values::missing;
}

bool hasPass(const Values& dump, unsigned pass)
{
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        for (unsigned step = 0; step < dump.steps(); ++step) {
            if (isInDump(dump, {pass, signal, step})) {
                return true;
            }
        }
    }
    return false;
}

void countGaps(const Model& model, const Values& dump, unsigned pass, unsigned signal, Coverage& coverage)
{
    const std::uint64_t before = coverage.gaps;
    for (unsigned step = 0; step < dump.steps(); ++step) {
        const Place place = {pass, signal, step};
        if (model.values.has(place) && !isInDump(dump, place)) {
            ++coverage.gaps;
            coverage.firstGap = coverage.firstGap ? coverage.firstGap : place;
        }
    }
    auto& signals = coverage.gapSignals;
    if (coverage.gaps > before && std::find(signals.begin(), signals.end(), signal) == signals.end()) {
        signals.push_back(signal);
    }
}

std::uint64_t countOf(const Values& values)
{
    std::uint64_t count = 0;
    for (unsigned pass = 0; pass < values.passes(); ++pass) {
        for (unsigned signal = 0; signal < signalCount; ++signal) {
            for (unsigned step = 0; step < values.steps(); ++step) {
                count += values.has({pass, signal, step}) ? 1U : 0U;
            }
        }
    }
    return count;
}

}  // namespace

Coverage coverageOf(const Model& model, const Dump& dump)
{
    Coverage coverage;
    coverage.computed = countOf(model.values);
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        if (!dump.given[signal]) {
            (dump.values.isCopy(signal) ? coverage.copiedSignals : coverage.absentSignals).push_back(signal);
        }
    }
    for (unsigned pass = 0; pass < dump.values.passes(); ++pass) {
        if (!hasPass(dump.values, pass)) {
            coverage.absentPasses.push_back(pass);
            continue;
        }
        for (unsigned signal = 0; signal < signalCount; ++signal) {
            if (dump.given[signal]) {
                countGaps(model, dump.values, pass, signal, coverage);
            }
        }
    }
    std::sort(coverage.gapSignals.begin(), coverage.gapSignals.end());
    const auto& absent = coverage.absentPasses;
    if (!absent.empty() && absent.front() + absent.size() == dump.values.passes()) {
        const unsigned iterations = rules::completeIterations(absent.front());
        if (iterations > 0 && rules::halfIterations(iterations) == absent.front()) {
            coverage.iterations = iterations;
        }
    }
    return coverage;
}

std::vector<std::string> lacksOf(const Coverage& coverage)
{
    std::vector<std::string> lacks;
    if (!coverage.absentPasses.empty()) {
        const auto number = [](unsigned pass) {
            return std::to_string(pass);
        };
        lacks.push_back(base::plural("half-iteration", coverage.absentPasses.size()) + ' ' +
                        base::listed(coverage.absentPasses, number, [](unsigned) { return true; }));
    }
    if (coverage.firstGap) {
        const Place& first = *coverage.firstGap;
        lacks.push_back(base::counted(coverage.gaps, "value") + " of " + signalNames(coverage.gapSignals) +
                        "; the first is " + passSignals[first.signal].name + " of half-iteration " +
                        std::to_string(first.pass) + ", step " + std::to_string(first.step));
    }
    if (!coverage.absentSignals.empty()) {
        lacks.push_back(base::plural("signal", coverage.absentSignals.size()) + ' ' +
                        signalNames(coverage.absentSignals));
    }
    for (const unsigned signal : coverage.copiedSignals) {
        lacks.push_back(std::string("signal ") + passSignals[signal].name + ", which is always " +
                        passSignals[twinOf(signal)].name);
    }
    return lacks;
}

}  // namespace morvik::comparison
