// Checker: compares the values of a simulation with the model while they appear.
#include "Checker.h"

#include <algorithm>
#include <cstddef>
#include <numeric>
#include <sstream>
#include <utility>

#include "base/Text.h"
#include "hardware/comparison/Comparison.h"
#include "hardware/comparison/Coverage.h"
#include "hardware/comparison/Dump.h"
#include "hardware/comparison/NameMap.h"
#include "hardware/comparison/Report.h"
#include "hardware/testbench/Decoder.h"

namespace morvik::checker {

Checker::Checker(const veltra_ip_morvik_v1_0_generics& generics) : itsGenerics(generics)
{
    std::ostringstream warnings;
    const Decoder allowed(generics, warnings);
}

void Checker::start(const SoftBlock& block, unsigned iterations, std::ostream& warnings)
{
    forget();
    comparison::Model model = comparison::computeModel(block, itsGenerics, iterations, warnings);
    itsPairs.resize(std::size_t{model.values.passes()} * model.values.steps() * signalCount);
    // Nothing below fails: there is a whole block or none.
    itsModel = std::move(model);
    itsPasses = itsModel->values.passes();
    itsSteps = itsModel->values.steps();
    forAllPlaces([this](const Place& place) {
        itsPairs[index(place)] = {itsModel->values.at(place), Values::missing};
    });
    ++itsBlocks;
}

void Checker::forget()
{
    if (itsSituations) {
        itsSituations = situations();
    }
    itsModel.reset();
    itsPasses = 0;
    itsSteps = 0;
    itsCounts = {};
    itsDifferences = 0;
}

template <class Function>
void Checker::forAllPlaces(Function function) const
{
    for (unsigned pass = 0; pass < itsPasses; ++pass) {
        for (unsigned step = 0; step < itsSteps; ++step) {
            for (unsigned signal = 0; signal < signalCount; ++signal) {
                function(Place{pass, signal, step});
            }
        }
    }
}

Seen Checker::seen(unsigned signal) const
{
    return {itsCounts[signal], hasBlock() ? passes() * (itsModel->cut.K() + stepsAfterBits(stageOf(signal))) : 0};
}

Standing Checker::standing() const
{
    if (itsDifferences > 0) {
        return Standing::differs;
    }
    bool isAny = false;
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        const Seen each = seen(signal);
        if (each.seen > 0 && each.seen < each.expected) {
            return Standing::incomplete;
        }
        isAny = isAny || each.seen > 0;
    }
    return isAny ? Standing::agrees : Standing::incomplete;
}

std::string Checker::name() const
{
    return "block " + std::to_string(itsBlocks - 1);
}

template <class Format>
std::string Checker::formatted(Format format) const
{
    comparison::Dump record(passes(), steps());
    forAllPlaces([&](const Place& place) { record.values.set(place, itsPairs[index(place)].got); });
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        record.given[signal] = itsCounts[signal] > 0;
    }
    comparison::completeTwins(name(), {}, record);
    const comparison::Comparison found = comparison::compare(*itsModel, record.values);
    const comparison::Coverage coverage = comparison::coverageOf(*itsModel, record);
    return format({found, coverage, *itsModel, record, name(), true, {}, "the record", true});
}

bool Checker::isRight(const Place& place) const
{
    const auto is = [this](const Place& each) {
        const Pair& pair = itsPairs[index(each)];
        return pair.got == pair.wanted;
    };
    return is(place) || is({place.pass, comparison::twinOf(place.signal), place.step});
}

void Checker::countSituations()
{
    if (!itsSituations) {
        coverage::CoreCounts none;
        none.core = coverage::coreOf(itsGenerics);
        coverage::Counts counts;
        counts.add(none);
        itsSituations = std::move(counts);
    }
}

coverage::Counts Checker::situations() const
{
    coverage::Counts sum = *itsSituations;
    const std::uint64_t observed = std::accumulate(itsCounts.begin(), itsCounts.end(), std::uint64_t{0});
    if (observed > itsDifferences) {
        sum.add(coverage::countsAt(*itsModel, [this](const Place& place) { return isRight(place); }));
    }
    return sum;
}

std::string Checker::headline() const
{
    return formatted(comparison::headlineOf);
}

std::string Checker::firstDifference() const
{
    return formatted(comparison::firstDifferenceOf);
}

std::string Checker::report() const
{
    if (std::all_of(itsCounts.begin(), itsCounts.end(), [](std::uint32_t count) { return count == 0; })) {
        return name() + ": nothing has been observed\n";
    }
    std::string text = formatted(comparison::textOf);
    if (itsSituations) {
        const coverage::Counts counts = situations();
        constexpr std::size_t namesNone = 0;
        text += "situations: " + coverage::summary(counts, namesNone) + ", in " +
                base::counted(counts.blocks(), "block") + '\n';
    }
    return text;
}

}  // namespace morvik::checker
