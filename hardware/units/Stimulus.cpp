// Stimulus: cases for a unit: every one where there are few, else those at the edges of its arithmetic and random ones.
#include "Stimulus.h"

#include <algorithm>
#include <array>
#include <iterator>
#include <random>

#include "Units.h"
#include "rules/Algorithms.h"
#include "rules/Formats.h"

namespace morvik::units {

namespace {

using Take = std::function<void(const std::vector<std::int32_t>&)>;

constexpr unsigned states = rules::stateCount;
constexpr Range metric = rangeOf(Kind::metric);
constexpr Range soft = rangeOf(Kind::soft);
constexpr Range branchMetric = rangeOf(Kind::branch);
constexpr Range twice = rangeOf(Kind::twiceIntrinsic);

/// The low bits of a metric's register.
constexpr std::int32_t wrapped(std::int32_t value)
{
    const std::int32_t modulo = metric.highest - metric.lowest + 1;
    return ((value - metric.lowest) % modulo + modulo) % modulo + metric.lowest;
}

/// Differences of two candidates: ties, all that the correction table tells apart on both sides, and those about which
/// a comparison wraps.
std::vector<std::int32_t> decisiveDifferences()
{
    std::vector<std::int32_t> all;
    for (std::int32_t d = -30; d <= 30; ++d) {
        all.push_back(d);
    }
    for (std::int32_t d : {1023, 1024, 1025, 2046, 2047}) {
        all.push_back(d);
        all.push_back(-d);
    }
    all.push_back(metric.lowest);
    return all;
}

/// The same numbers on every machine: only the generator's raw output is used.
class Random {
public:
    explicit Random(std::uint64_t seed) : itsGenerator(seed) {}

    std::int32_t between(std::int32_t lowest, std::int32_t highest)
    {
        return lowest + static_cast<std::int32_t>(itsGenerator() % static_cast<std::uint64_t>(highest - lowest + 1));
    }

    std::int32_t of(const Range& range)
    {
        return between(range.lowest, range.highest);
    }

    template <std::size_t count>
    std::int32_t oneOf(const std::array<std::int32_t, count>& values)
    {
        return values[static_cast<std::size_t>(itsGenerator() % count)];
    }

    /// Metrics anywhere in their register, or not far from one another as in a recursion.
    Metrics metrics()
    {
        const bool areNear = itsGenerator() % 2 == 0;
        const std::int32_t middle = of(metric);
        Metrics row{};
        for (std::int32_t& each : row) {
            each = areNear ? wrapped(middle + between(-300, 300)) : of(metric);
        }
        return row;
    }

    /// What a column carries along with its metrics.
    Metrics pending(int algorithm)
    {
        constexpr std::array<std::int32_t, 6> entries = {0, 1, 2, 3, 4, 6};
        Metrics row{};
        for (std::int32_t& each : row) {
            each = algorithm == tableAlgorithm ? oneOf(entries) : 0;
        }
        return row;
    }

    /// The second parity value of a step is 0 in this code, so that two pairs of metrics are equal (rule 5).
    Branches branches()
    {
        constexpr std::array<std::int32_t, 5> edges = {-128, -1, 0, 1, 127};
        const bool areEdges = itsGenerator() % 2 == 0;
        const std::int32_t g0 = areEdges ? oneOf(edges) : of(branchMetric);
        const std::int32_t g1 = areEdges ? oneOf(edges) : of(branchMetric);
        return {g0, g1, g1, g0};
    }

private:
    std::mt19937_64 itsGenerator;
};

/// Collects the inputs of a case, port after port.
class Case {
public:
    template <class Row>
    Case& row(const Row& values)
    {
        std::copy(values.begin(), values.end(), std::back_inserter(itsInputs));
        return *this;
    }

    const std::vector<std::int32_t>& inputs() const
    {
        return itsInputs;
    }

private:
    std::vector<std::int32_t> itsInputs;
};

void setBranch(Branches& g, unsigned pair, std::int32_t value)
{
    g[pair] = value;
    g[g.size() - 1 - pair] = value;
}

/// Each state's decision with each of the differences, at both ends of the register and amid it.
void directRecursion(Number unit, int algorithm, Random& random, const Take& take)
{
    for (unsigned state = 0; state < states; ++state) {
        const bool isForward = unit == Number::forward;
        const unsigned one = isForward ? rules::predecessor(state, 1) : rules::successor(state, 1);
        const unsigned zero = isForward ? rules::predecessor(state, 0) : rules::successor(state, 0);
        const unsigned pair = rules::branch(isForward ? one : state);
        for (const std::int32_t difference : decisiveDifferences()) {
            for (const std::int32_t first : {0, metric.highest, metric.lowest}) {
                for (const std::int32_t g : {branchMetric.lowest, 0, branchMetric.highest}) {
                    Metrics column = random.metrics();
                    Branches branches = random.branches();
                    setBranch(branches, pair, g);
                    column[one] = wrapped(first - g);
                    column[zero] = wrapped(first - difference + g);
                    take(Case().row(column).row(random.pending(algorithm)).row(branches).inputs());
                }
            }
        }
    }
}

/// The inputs of a ratio whose decisions for one bit are chosen (rule 8).
class ChosenTree {
public:
    ChosenTree(unsigned bit, Random& random) : itsBit(bit), itsRandom(random) {}

    /// The decision of a node has the difference: 0 to 3 of the pairs, 4 and 5 between two pairs, 6 between the halves.
    /// Its first candidate has the metric `best`. What it decides is the bit's best path; where it does not decide
    /// between two states, its candidates come from decisions with the differences `before`, which leave corrections.
    /// All other decisions leave none.
    std::vector<std::int32_t> inputs(unsigned node,
                                     std::int32_t difference,
                                     std::int32_t best,
                                     const std::array<std::int32_t, 2>& before)
    {
        const std::int32_t winner = difference < 0 ? best - difference : best;
        std::array<std::int32_t, 4> paths{};
        std::array<std::int32_t, 4> within{};  // the differences of the pairs
        for (unsigned pair = 0; pair < paths.size(); ++pair) {
            paths[pair] = winner - apart();
            within[pair] = apart();
        }
        if (node < 4) {
            paths[node] = best;
            within[node] = difference;
        } else if (node < 6) {
            const unsigned first = node == 4 ? 0 : 2;
            paths[first] = best;
            paths[first + 1] = best - difference;
            within[first] = before[0];
            within[first + 1] = before[1];
        } else {
            paths = {best, best - before[0], best - difference, best - difference - before[1]};
        }
        const Metrics beta = itsRandom.metrics();
        const Branches g = itsRandom.branches();
        Metrics alpha{};
        for (unsigned pair = 0; pair < paths.size(); ++pair) {
            const unsigned even = 2 * pair;
            const unsigned odd = even + 1;
            const std::int32_t first = paths[pair] - (itsBit == 1 ? g[pair] : -g[pair]);
            const std::int32_t second = first - within[pair];
            alpha[odd] = wrapped(first - beta[rules::successor(odd, itsBit)]);
            alpha[even] = wrapped(second - beta[rules::successor(even, itsBit)]);
        }
        return Case().row(alpha).row(beta).row(g).inputs();
    }

    /// A difference beyond the correction table.
    std::int32_t apart()
    {
        return itsRandom.between(30, 300);
    }

private:
    unsigned itsBit;
    Random& itsRandom;
};

constexpr unsigned nodesOfTree = states - 1;

void directRatio(Random& random, const Take& take)
{
    for (unsigned bit = 0; bit < 2; ++bit) {
        ChosenTree tree(bit, random);
        for (unsigned node = 0; node < nodesOfTree; ++node) {
            for (const std::int32_t difference : decisiveDifferences()) {
                for (const std::int32_t best : {0, metric.highest, metric.lowest}) {
                    take(tree.inputs(node, difference, best, {tree.apart(), tree.apart()}));
                }
            }
        }
    }
}

/// Decisions between candidates with corrections pending: about as far apart as the corrections are, or equal.
void directPending(Random& random, const Take& take)
{
    for (unsigned bit = 0; bit < 2; ++bit) {
        ChosenTree tree(bit, random);
        for (unsigned node = 4; node < nodesOfTree; ++node) {
            for (std::int32_t difference = -7; difference <= 7; ++difference) {
                for (const std::int32_t first : {0, 8, 30}) {  // corrections of 6, 3 and 0
                    for (const std::int32_t second : {0, 8, 30}) {
                        take(tree.inputs(node, difference, random.of(metric), {first, second}));
                    }
                }
            }
        }
    }
}

/// Half way from the largest extrinsic value to the next one, before type 1 scales it: 127.5 / 0.75.
constexpr std::int32_t scaledEdge =
    ((2 * rules::largestOf(rules::branchBits) + 1) << rules::scaleBits) / (2 * rules::scaleNumerator);

/// For every intrinsic value the differences about which the result is clipped or rounded, and every ratio with a few.
void directExtrinsic(const Take& take)
{
    for (std::int32_t t = twice.lowest; t <= twice.highest; ++t) {
        for (const std::int32_t ratio : {metric.lowest, -1, 0, 1, metric.highest}) {
            take({ratio, t});
        }
        for (const std::int32_t middle : {-scaledEdge, -128, 0, 128, scaledEdge}) {
            for (std::int32_t difference = middle - 3; difference <= middle + 3; ++difference) {
                take({2 * t + difference, t});
            }
        }
    }
    for (const std::int32_t t : {twice.lowest, -1, 0, 1, twice.highest}) {
        for (std::int32_t ratio = metric.lowest; ratio <= metric.highest; ++ratio) {
            take({ratio, t});
        }
    }
}

/// All combinations of the extremes and 0, then every value of each input.
void directTail(Random& random, const Take& take)
{
    constexpr std::array<std::int32_t, 3> edges = {soft.lowest, 0, soft.highest};
    std::vector<std::int32_t> inputs(std::size_t{2} * rules::tailSteps);
    for (unsigned combination = 0; combination < 729; ++combination) {  // 3^6
        unsigned rest = combination;
        for (std::int32_t& input : inputs) {
            input = edges[rest % edges.size()];
            rest /= static_cast<unsigned>(edges.size());
        }
        take(inputs);
    }
    for (std::size_t swept = 0; swept < inputs.size(); ++swept) {
        for (std::int32_t value = soft.lowest; value <= soft.highest; ++value) {
            for (std::int32_t& input : inputs) {
                input = random.oneOf(edges);
            }
            inputs[swept] = value;
            take(inputs);
        }
    }
}

void everyPair(const Range& first, const Range& second, const Take& take)
{
    for (std::int32_t a = first.lowest; a <= first.highest; ++a) {
        for (std::int32_t b = second.lowest; b <= second.highest; ++b) {
            take({a, b});
        }
    }
}

void everyAddress(const std::vector<unsigned>& sizes, const Take& take)
{
    for (const unsigned K : sizes) {
        for (unsigned step = 0; step < K; ++step) {
            take({static_cast<std::int32_t>(K), static_cast<std::int32_t>(step)});
        }
    }
}

/// Every value of each state; the states have different ones.
void everyColumn(const Take& take)
{
    constexpr std::int32_t apart = 512;
    for (std::int32_t value = metric.lowest; value <= metric.highest; ++value) {
        std::vector<std::int32_t> column;
        for (unsigned state = 0; state < states; ++state) {
            column.push_back(wrapped(value + apart * static_cast<std::int32_t>(state)));
        }
        take(column);
    }
}

/// Whether every case was given.
bool direct(Number unit, const StimulusSettings& settings, Random& random, const Take& take)
{
    switch (unit) {
    case Number::intrinsic:
        everyPair(rangeOf(Kind::apriori), soft, take);
        return true;
    case Number::branch:
        everyPair(twice, soft, take);
        return true;
    case Number::address:
        everyAddress(settings.blockSizes, take);
        return true;
    case Number::border:
        everyColumn(take);
        return true;
    case Number::forward:
    case Number::backward:
        directRecursion(unit, settings.algorithm, random, take);
        return false;
    case Number::ratio:
        directRatio(random, take);
        if (settings.algorithm == tableAlgorithm) {
            directPending(random, take);
        }
        return false;
    case Number::extrinsic:
        directExtrinsic(take);
        return false;
    case Number::tail:
        break;
    }
    directTail(random, take);
    return false;
}

std::vector<std::int32_t> randomCase(Number unit, int algorithm, Random& random)
{
    switch (unit) {
    case Number::ratio:
        return Case().row(random.metrics()).row(random.metrics()).row(random.branches()).inputs();
    case Number::forward:
    case Number::backward:
        return Case().row(random.metrics()).row(random.pending(algorithm)).row(random.branches()).inputs();
    default:
        break;
    }
    std::vector<std::int32_t> inputs;
    for (const Port& port : allUnits()[static_cast<std::size_t>(unit)].inputs) {
        for (unsigned i = 0; i < port.count; ++i) {
            inputs.push_back(random.of(rangeOf(port.kind)));
        }
    }
    return inputs;
}

bool isInTable(const Port& port, int algorithm)
{
    return port.kind != Kind::pending || algorithm == tableAlgorithm;
}

}  // namespace

Extent stimulate(Number unit, const StimulusSettings& settings, const Take& take)
{
    Extent extent;
    Random random(settings.seed);
    extent.isExhaustive = direct(unit, settings, random, [&](const std::vector<std::int32_t>& inputs) {
        ++extent.directed;
        take(inputs);
    });
    extent.random = extent.isExhaustive ? 0 : settings.randomCases;
    for (std::uint64_t i = 0; i < extent.random; ++i) {
        take(randomCase(unit, settings.algorithm, random));
    }
    return extent;
}

tables::Table tableOf(Number unit, int algorithm)
{
    const Unit& described = allUnits()[static_cast<std::size_t>(unit)];
    tables::Table table{described.name, {}};
    for (const auto* ports : {&described.inputs, &described.outputs}) {
        for (const Port& port : *ports) {
            for (unsigned i = 0; i < port.count && isInTable(port, algorithm); ++i) {
                table.columns.push_back({nameOf(port, i), rangeOf(port.kind).bits, isSigned(port.kind)});
            }
        }
    }
    return table;
}

tables::Row rowOf(Number unit,
                  int algorithm,
                  const std::vector<std::int32_t>& inputs,
                  const std::vector<std::int32_t>& outputs)
{
    const Unit& described = allUnits()[static_cast<std::size_t>(unit)];
    tables::Row row;
    const auto append = [&](const std::vector<Port>& ports, const std::vector<std::int32_t>& values) {
        auto next = values.begin();
        for (const Port& port : ports) {
            for (unsigned i = 0; i < port.count; ++i, ++next) {
                if (isInTable(port, algorithm)) {
                    row.push_back(*next);
                }
            }
        }
    };
    append(described.inputs, inputs);
    append(described.outputs, outputs);
    return row;
}

std::vector<std::int32_t> inputsOf(Number unit, int algorithm, const tables::Row& row)
{
    std::vector<std::int32_t> inputs;
    auto next = row.begin();
    for (const Port& port : allUnits()[static_cast<std::size_t>(unit)].inputs) {
        for (unsigned i = 0; i < port.count; ++i) {
            inputs.push_back(isInTable(port, algorithm) ? static_cast<std::int32_t>(*next++) : 0);
        }
    }
    return inputs;
}

}  // namespace morvik::units
