// Comparison: where a dump departs from the model, and which values do not follow from their inputs.
#include "Comparison.h"

namespace morvik::comparison {

namespace {

class Comparer {
public:
    Comparer(const Model& model, const Values& dump, Unknown unknown)
        : itsModel(model), itsDump(dump), itsReplay(model, dump)
    {
        itsResult.ignoresUnknown = unknown == Unknown::isIgnored;
    }

    Comparison compare()
    {
        for (unsigned pass = 0; pass < itsDump.passes(); ++pass) {
            comparePass(pass);
        }
        if (itsResult.allFaults() == 0 && itsResult.first) {
            itsResult.inputsAreKnown = false;
            takeFirstStage();
        }
        if (itsResult.first) {
            itsResult.inputs = inputsOf(itsModel, *itsResult.first);
            for (InputState& input : itsResult.inputs) {
                lookAt(input);
            }
        }
        return itsResult;
    }

private:
    /// Whether the value takes part in the comparison.
    bool counts(const Place& place) const
    {
        return itsDump.has(place) || (itsDump.isUnknown(place) && !itsResult.ignoresUnknown);
    }

    void comparePass(unsigned pass)
    {
        const std::uint64_t before = itsResult.compared();
        for (const Stage stage : stages) {
            for (const unsigned step : stepsInOrder(itsModel.cut, stage)) {
                compareColumn(pass, stage, step);
            }
        }
        itsResult.passes += itsResult.compared() > before ? 1U : 0U;
    }

    void compareColumn(unsigned pass, Stage stage, unsigned step)
    {
        const auto [first, count] = signalsOf(stage);
        std::optional<Column> follows;
        for (unsigned i = 0; i < count; ++i) {
            const Place place = {pass, first + i, step};
            if (itsDump.isCopy(place.signal)) {
                continue;
            }
            itsResult.signals[place.signal].unknown += itsDump.isUnknown(place) ? 1U : 0U;
            itsResult.signals[place.signal].missing += itsDump.at(place) == Values::missing ? 1U : 0U;
            if (counts(place)) {
                follows = follows ? follows : itsReplay.column(pass, stage, step);
                compareValue(place, follows->values[i], follows->sources.complete);
            }
        }
    }

    void compareValue(const Place& place, std::int16_t wanted, bool complete)
    {
        SignalCount& count = itsResult.signals[place.signal];
        ++count.compared;
        const std::int16_t got = itsDump.at(place);
        if (got != itsModel.values.at(place)) {
            ++count.different;
            if (!count.first) {
                count.first = place;
            }
            if (!itsResult.first) {
                itsResult.first = place;
            }
        }
        if (complete && got != wanted) {
            keepFault({place, got, wanted}, count);
        }
    }

    void keepFault(const Fault& fault, SignalCount& count)
    {
        ++count.faults;
        if (itsDump.has(fault.place)) {
            itsResult.faults.push_back(fault);
        } else {
            ++count.unknownFaults;
        }
    }

    void takeFirstStage()
    {
        const Stage stage = stageOf(itsResult.first->signal);
        const auto [first, count] = signalsOf(stage);
        const unsigned pass = itsResult.first->pass;
        for (const unsigned step : stepsInOrder(itsModel.cut, stage)) {
            for (unsigned i = 0; i < count; ++i) {
                const Place place = {pass, first + i, step};
                if (itsDump.has(place) && !itsDump.isCopy(place.signal) &&
                    itsDump.at(place) != itsModel.values.at(place)) {
                    itsResult.faults.push_back({place, itsDump.at(place), itsModel.values.at(place)});
                }
            }
        }
    }

    void lookAt(InputState& input) const
    {
        const auto [first, count] = signalsOf(input.stage);
        for (unsigned i = 0; i < count; ++i) {
            const Place place = {input.pass, first + i, input.step};
            if (counts(place)) {
                ++input.present;
                input.different += itsDump.at(place) != itsModel.values.at(place) ? 1U : 0U;
            }
        }
    }

    const Model& itsModel;
    const Values& itsDump;
    Replay itsReplay;
    Comparison itsResult;
};

InputState inputAt(Stage stage, unsigned pass, unsigned step)
{
    InputState input{};
    input.stage = stage;
    input.pass = pass;
    input.step = step;
    return input;
}

/// A recursion's column follows from one column and its branch metrics.
std::vector<InputState> columnInputs(Stage stage, unsigned pass, unsigned step)
{
    return {inputAt(stage, pass, step), inputAt(Stage::branch, pass, step)};
}

std::vector<InputState> forwardInputs(const rules::Cut& cut, const Place& place)
{
    if (place.step == 0) {
        return {};
    }
    const bool isStart = cut.startsSegment(place.step);
    if (isStart && rules::isFirstPass(place.pass)) {
        return {};
    }
    return columnInputs(Stage::forward, isStart ? rules::passBefore(place.pass) : place.pass, place.step - 1);
}

std::vector<InputState> backwardInputs(const rules::Cut& cut, const Place& place)
{
    const rules::Window window = cut.windowAt(place.step);
    if (place.step < window.last) {
        return columnInputs(Stage::backward, place.pass, place.step + 1);
    }
    if (cut.startsAtTail(window) || rules::isFirstPass(place.pass)) {
        return {};
    }
    const unsigned from = cut.startsFromThisPass(window) ? place.pass : rules::passBefore(place.pass);
    return columnInputs(Stage::backward, from, place.step + 1);
}

template <std::uint64_t SignalCount::*member>
std::uint64_t sum(const std::array<SignalCount, signalCount>& signals)
{
    std::uint64_t total = 0;
    for (const SignalCount& each : signals) {
        total += each.*member;
    }
    return total;
}

}  // namespace

std::vector<InputState> inputsOf(const Model& model, const Place& place)
{
    switch (stageOf(place.signal)) {
    case Stage::intrinsic:
        if (place.pass == 0 || place.step >= model.cut.K()) {
            return {};
        }
        return {inputAt(Stage::extrinsic, place.pass - 1, model.codes[codeOf(place.pass)].order[place.step])};
    case Stage::branch:
        return {inputAt(Stage::intrinsic, place.pass, place.step)};
    case Stage::forward:
        return forwardInputs(model.cut, place);
    case Stage::backward:
        return backwardInputs(model.cut, place);
    case Stage::ratio:
        return {inputAt(Stage::forward, place.pass, place.step),
                inputAt(Stage::backward, place.pass, place.step),
                inputAt(Stage::branch, place.pass, place.step)};
    case Stage::extrinsic:
        break;
    }
    return {inputAt(Stage::ratio, place.pass, place.step), inputAt(Stage::intrinsic, place.pass, place.step)};
}

std::uint64_t Comparison::compared() const
{
    return sum<&SignalCount::compared>(signals);
}

std::uint64_t Comparison::different() const
{
    return sum<&SignalCount::different>(signals);
}

std::uint64_t Comparison::unknown() const
{
    return sum<&SignalCount::unknown>(signals);
}

std::uint64_t Comparison::knownCompared() const
{
    return compared() - (ignoresUnknown ? 0 : unknown());
}

std::uint64_t Comparison::knownDifferent() const
{
    return different() - (ignoresUnknown ? 0 : unknown());
}

std::uint64_t Comparison::allFaults() const
{
    return sum<&SignalCount::faults>(signals);
}

Comparison compare(const Model& model, const Values& dump, Unknown unknown)
{
    return Comparer(model, dump, unknown).compare();
}

}  // namespace morvik::comparison
