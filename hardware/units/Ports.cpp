// Ports: the units by number and name, and the values that they take and give.
#include "Ports.h"

#include <algorithm>
#include <utility>

#include "Units.h"
#include "rules/BlockSizes.h"

namespace morvik::units {

namespace {

/// Hands out the inputs of a unit one after the other.
class Inputs {
public:
    explicit Inputs(const std::vector<std::int32_t>& values) : itsNext(values.data()) {}

    std::int32_t one()
    {
        return *itsNext++;
    }

    template <class Row>
    Row row()
    {
        Row values{};
        std::copy_n(itsNext, values.size(), values.begin());
        itsNext += values.size();
        return values;
    }

    Column column()
    {
        Column column;
        column.metrics = row<Metrics>();
        column.pending = row<Metrics>();
        return column;
    }

private:
    const std::int32_t* itsNext;
};

template <class Row>
std::vector<std::int32_t> listOf(const Row& row)
{
    return {row.begin(), row.end()};
}

std::vector<std::int32_t> listOf(const Column& column)
{
    std::vector<std::int32_t> values = listOf(column.metrics);
    values.insert(values.end(), column.pending.begin(), column.pending.end());
    return values;
}

void expectBlockSize(std::int32_t size, std::int32_t step)
{
    const auto K = static_cast<std::uint32_t>(size);
    if (rules::findBlockSize(K) == nullptr) {
        throw BadInput("block_size " + std::to_string(size) + " is no block size of 3GPP TS 36.212");
    }
    if (static_cast<std::uint32_t>(step) >= K) {
        throw BadInput("step " + std::to_string(step) + " is not allowed, expected 0 to " + std::to_string(K - 1));
    }
}

void expectWithin(const Port& port, unsigned index, std::int32_t value, int algorithm)
{
    if (value == unknownValue) {
        throw BadInput(nameOf(port, index) + " has bits that are x or z");
    }
    if (port.kind == Kind::step) {
        return;  // its end follows from the block size
    }
    const Range& range = rangeOf(port.kind);
    const bool hasTable = port.kind != Kind::pending || algorithm == tableAlgorithm;
    const std::int32_t highest = hasTable ? range.highest : 0;
    if (value < range.lowest || value > highest) {
        throw BadInput(nameOf(port, index) + ' ' + std::to_string(value) + " is not allowed, expected " +
                       (hasTable ? std::to_string(range.lowest) + " to " + std::to_string(highest)
                                 : "0: only the algorithm with a table has pending corrections"));
    }
}

void expectAllowed(const Unit& unit, int algorithm, const std::vector<std::int32_t>& inputs)
{
    expectAlgorithm(algorithm);
    if (inputs.size() != valuesOf(unit.inputs)) {
        throw BadInput(std::string(unit.name) + " takes " + std::to_string(valuesOf(unit.inputs)) + " values, not " +
                       std::to_string(inputs.size()));
    }
    auto next = inputs.begin();
    for (const Port& port : unit.inputs) {
        for (unsigned i = 0; i < port.count; ++i) {
            expectWithin(port, i, *next++, algorithm);
        }
    }
}

}  // namespace

const std::vector<Unit>& allUnits()
{
    constexpr auto states = static_cast<unsigned>(Metrics{}.size());
    constexpr auto branches = static_cast<unsigned>(Branches{}.size());
    constexpr auto tailSteps = static_cast<unsigned>(TailValues{}.size());
    const Port g = {"g", Kind::branch, branches};
    const Port pending = {"pending", Kind::pending, states};
    static const std::vector<Unit> all = {
        {"intrinsic",
         {{"apriori", Kind::apriori, 1}, {"systematic", Kind::soft, 1}},
         {{"twice_intrinsic", Kind::twiceIntrinsic, 1}}},
        {"branch", {{"twice_intrinsic", Kind::twiceIntrinsic, 1}, {"parity", Kind::soft, 1}}, {g}},
        {"forward",
         {{"alpha", Kind::metric, states}, pending, g},
         {{"next", Kind::metric, states}, {"next_pending", Kind::pending, states}}},
        {"backward",
         {{"beta", Kind::metric, states}, pending, g},
         {{"previous", Kind::metric, states}, {"previous_pending", Kind::pending, states}}},
        {"ratio", {{"alpha", Kind::metric, states}, {"beta", Kind::metric, states}, g}, {{"ratio", Kind::metric, 1}}},
        {"extrinsic",
         {{"ratio", Kind::metric, 1}, {"twice_intrinsic", Kind::twiceIntrinsic, 1}},
         {{"extrinsic", Kind::apriori, 1}}},
        {"address", {{"block_size", Kind::blockSize, 1}, {"step", Kind::step, 1}}, {{"address", Kind::step, 1}}},
        {"tail",
         {{"systematic", Kind::soft, tailSteps}, {"parity", Kind::soft, tailSteps}},
         {{"beta", Kind::metric, states}}},
        {"border", {{"column", Kind::metric, states}}, {{"border", Kind::metric, states}}},
    };
    return all;
}

std::optional<Number> findUnit(std::string_view name)
{
    for (std::size_t i = 0; i < allUnits().size(); ++i) {
        if (name == allUnits()[i].name) {
            return static_cast<Number>(i);
        }
    }
    return std::nullopt;
}

unsigned valuesOf(const std::vector<Port>& ports)
{
    unsigned count = 0;
    for (const Port& port : ports) {
        count += port.count;
    }
    return count;
}

std::string nameOf(const Port& port, unsigned index)
{
    return port.name + (port.count > 1 ? std::to_string(index) : std::string());
}

void expectAlgorithm(int algorithm)
{
    if (algorithm < 0 || algorithm > tableAlgorithm) {
        throw BadInput("algorithm " + std::to_string(algorithm) + " is not allowed, expected 0 to 2");
    }
}

std::vector<std::int32_t> compute(Number unit, int algorithm, const std::vector<std::int32_t>& inputs)
{
    expectAllowed(allUnits()[static_cast<std::size_t>(unit)], algorithm, inputs);
    Inputs in(inputs);
    switch (unit) {
    case Number::intrinsic:
        return {twiceIntrinsic(inputs[0], inputs[1])};
    case Number::branch:
        return listOf(branchMetrics(inputs[0], inputs[1]));
    case Number::forward:
    case Number::backward: {
        const Column from = in.column();
        const auto step = unit == Number::forward ? forward : backward;
        return listOf(step(algorithm, from, in.row<Branches>()));
    }
    case Number::ratio: {
        const auto alpha = in.row<Metrics>();
        const auto beta = in.row<Metrics>();
        return {ratio(algorithm, alpha, beta, in.row<Branches>())};
    }
    case Number::extrinsic:
        return {extrinsic(algorithm, inputs[0], inputs[1])};
    case Number::address:
        expectBlockSize(inputs[0], inputs[1]);
        return {static_cast<std::int32_t>(
            address(static_cast<std::uint32_t>(inputs[0]), static_cast<std::uint32_t>(inputs[1])))};
    case Number::tail: {
        const auto systematic = in.row<TailValues>();
        return listOf(tail(systematic, in.row<TailValues>()));
    }
    case Number::border:
        break;
    }
    return listOf(border(in.row<Metrics>()));
}

}  // namespace morvik::units
