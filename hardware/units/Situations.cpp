// Situations: counts what cases meet in the arithmetic of a unit: clips, wraps, ties, corrections.
#include "Situations.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <numeric>
#include <type_traits>
#include <utility>

#include "Steps.h"
#include "Units.h"
#include "rules/Algorithms.h"

namespace morvik::units {

namespace {

constexpr unsigned states = rules::stateCount;
constexpr unsigned decisionsOfBit = states - 1;  // of the ratio's tree
constexpr unsigned pairsOfBit = states / 2;      // the first of them, on which nothing is pending yet

/// The corrections of the table in eighths, the greatest first (rule 9).
const std::vector<int>& entries()
{
    static const std::vector<int> all = [] {
        std::vector<int> found;
        for (int difference = 0; found.empty() || found.back() != 0; ++difference) {
            const int entry = eighthsOf(corrections()[difference]);
            if (found.empty() || found.back() != entry) {
                found.push_back(entry);
            }
        }
        return found;
    }();
    return all;
}

std::vector<Situation> ofDecisions(const char* place, unsigned places, bool isRatio, int algorithm)
{
    const std::vector<std::uint64_t> counts(places);
    std::vector<Situation> all = {{"first candidate greater", place, counts},
                                  {"second candidate greater", place, counts},
                                  {"tie", place, counts},
                                  {"comparison wraps", place, counts}};
    if (algorithm == tableAlgorithm) {
        for (const int entry : entries()) {
            all.push_back({"correction " + std::to_string(entry) + ", first candidate", place, counts});
            all.push_back({"correction " + std::to_string(entry) + ", second candidate", place, counts});
        }
        const unsigned withoutPending = isRatio ? 2 * pairsOfBit : 0;
        for (const char* const name :
             {"pending correction added", "tie of different corrections", "corrections would turn it"}) {
            all.push_back({name, place, std::vector<std::uint64_t>(places - withoutPending)});
        }
    }
    all.push_back({"a sum wraps", "", {0}});
    if (isRatio) {
        all.push_back({"the ratio wraps", "", {0}});
    }
    return all;
}

std::vector<Situation> ofExtrinsicValues(int algorithm)
{
    std::vector<Situation> all = {{"clipped to 127", "", {0}}, {"clipped to -128", "", {0}}};
    if (rules::extrinsicScale(algorithm) != 1) {
        all.push_back({"rounded down, positive", "", {0}});
        all.push_back({"rounded down, negative", "", {0}});
    }
    return all;
}

std::vector<Situation> situationsOf(Number unit, int algorithm)
{
    switch (unit) {
    case Number::intrinsic:
        return {{"a-priori value odd, positive", "", {0}},
                {"a-priori value odd, negative", "", {0}},
                {"sum odd", "", {0}},
                {"sum above 127", "", {0}},
                {"sum below -128", "", {0}}};
    case Number::branch:
        return {{"clipped to 127", "metric", {0, 0}},
                {"clipped to -128", "metric", {0, 0}},
                {"127 without clipping", "metric", {0, 0}},
                {"-128 without clipping", "metric", {0, 0}}};
    case Number::forward:
    case Number::backward:
        return ofDecisions("state", states, false, algorithm);
    case Number::ratio:
        return ofDecisions("decision", 2 * decisionsOfBit, true, algorithm);
    case Number::extrinsic:
        return ofExtrinsicValues(algorithm);
    case Number::address:
        return {{"first address", "", {0}}, {"address above the one before", "", {0}}, {"address modulo K", "", {0}}};
    case Number::tail:
        return {{"branch sum beyond eight bits", "step", {0, 0, 0}},
                {"low bits cleared", "state", std::vector<std::uint64_t>(states)}};
    case Number::border:
        break;
    }
    return {{"low bits cleared", "state", std::vector<std::uint64_t>(states)},
            {"no low bits to clear", "state", std::vector<std::uint64_t>(states)}};
}

/// Hands out the situations of a case in their order.
class Counter {
public:
    Counter(std::vector<Situation>& all, unsigned place) : itsNext(all.begin()), itsPlace(place) {}

    Counter& at(unsigned place)
    {
        itsPlace = place;
        return *this;
    }

    Counter& next(bool isMet)
    {
        itsNext->counts[itsPlace] += isMet ? 1U : 0U;
        ++itsNext;
        return *this;
    }

private:
    std::vector<Situation>::iterator itsNext;
    unsigned itsPlace;
};

/// A decision between two candidates.
struct Decision {
    rules::Value difference = 0;  ///< of the candidates, as it wraps
    bool wraps = false;
    bool addsPending = false;       ///< a correction other than 0
    bool isTieOfDifferent = false;  ///< of candidates with different corrections pending
    bool wouldTurn = false;         ///< if the candidates were compared with what is pending with them
};

/// The decisions of a step, or those of a ratio's tree, by their numbers.
struct Watched {
    std::array<Decision, states> decisions = {};
    bool sumWraps = false;

    template <class Metric>
    void operator()(unsigned number, const Metric& c1, const Metric& c2)
    {
        const auto difference = rules::wrap16(c1.value() - c2.value());
        const Metric& winner = difference < 0 ? c2 : c1;
        const bool differ = c1.pending() != c2.pending();
        const auto withPending = rules::wrap16(difference + c1.pending() - c2.pending());
        decisions[number] = {difference,
                             difference != c1.value() - c2.value(),
                             winner.pending() != 0,
                             difference == 0 && differ,
                             (difference < 0) != (withPending < 0)};
        sumWraps = sumWraps || c1.wrap != Wrap::none || c2.wrap != Wrap::none;
        addSum(winner.value() + winner.pending());
    }

    void addSum(std::int32_t exact)
    {
        sumWraps = sumWraps || rules::wrap16(exact) != exact;
    }
};

template <class Row>
auto rowAt(const std::vector<std::int32_t>& inputs, std::size_t first)
{
    Row row{};
    std::copy_n(inputs.begin() + static_cast<std::ptrdiff_t>(first), row.size(), row.begin());
    return row;
}

/// Counts a decision in its place. What may be pending is counted next.
Counter countDecision(const Decision& met, unsigned place, int algorithm, std::vector<Situation>& all)
{
    Counter counter(all, place);
    counter.next(met.difference > 0).next(met.difference < 0).next(met.difference == 0).next(met.wraps);
    if (algorithm == tableAlgorithm) {
        const int correction = eighthsOf(corrections()[met.difference]);
        for (const int entry : entries()) {
            counter.next(entry == correction && met.difference >= 0);
            counter.next(entry == correction && met.difference < 0);
        }
    }
    return counter;
}

/// Counts what is pending with the candidates of a decision, in its place among those that may have something pending.
void countPending(const Decision& met, unsigned place, Counter counter)
{
    counter.at(place).next(met.addsPending).next(met.isTieOfDifferent).next(met.wouldTurn);
}

/// Hands decisions over to what watches them.
struct See {
    Watched* watched;

    template <class Metric>
    void operator()(unsigned number, const Metric& c1, const Metric& c2) const
    {
        (*watched)(number, c1, c2);
    }
};

template <class Rule>
using Watch = WatchedDecision<Rule, See, true>;

void countStep(bool isForward, int algorithm, const std::vector<std::int32_t>& inputs, std::vector<Situation>& all)
{
    Watched watched;
    const Column from = {rowAt<Metrics>(inputs, 0), rowAt<Metrics>(inputs, states)};
    const auto g = wordsOf(rowAt<Branches>(inputs, std::size_t{2} * states));
    advanced(algorithm, from, [&](const auto& rule, auto column) {
        Watch<std::decay_t<decltype(rule)>> watch(rule, false, See{&watched});
        rules::Column<decltype(watch)> metrics{};
        for (unsigned state = 0; state < states; ++state) {
            metrics[state].itself = column[state];
        }
        watch.restart();
        metrics = isForward ? rules::forwardStep(watch, metrics, g) : rules::backwardStep(watch, metrics, g);
        return column;
    });
    for (unsigned state = 0; state < states; ++state) {
        const Decision& met = watched.decisions[state];
        const Counter counter = countDecision(met, state, algorithm, all);
        if (algorithm == tableAlgorithm) {
            countPending(met, state, counter);
        }
    }
    all.back().counts[0] += watched.sumWraps ? 1U : 0U;
}

/// Where the tree's decisions of a bit are counted, by their numbers: pairs of states, then pairs of these, then the
/// last one.
constexpr unsigned placeOfNode(unsigned node)
{
    return node >= pairsOfBit ? node - pairsOfBit : node > 1 ? node + 2 : decisionsOfBit - 1;
}

/// Counts the decisions that lead to the best path of a bit: no other one can be seen in the ratio.
void countPath(const Watched& watched, unsigned bitsBefore, int algorithm, std::vector<Situation>& all)
{
    for (unsigned node = 1; node < states; node = 2 * node + (watched.decisions[node].difference < 0 ? 1 : 0)) {
        const Decision& met = watched.decisions[node];
        const unsigned place = placeOfNode(node);
        const Counter counter = countDecision(met, bitsBefore * decisionsOfBit + place, algorithm, all);
        if (algorithm == tableAlgorithm && place >= pairsOfBit) {
            countPending(met, bitsBefore * (decisionsOfBit - pairsOfBit) + place - pairsOfBit, counter);
        }
    }
}

void countRatio(int algorithm, const std::vector<std::int32_t>& inputs, std::vector<Situation>& all)
{
    Watched ofOne;
    Watched ofZero;
    const auto alpha = wordsOf(rowAt<Metrics>(inputs, 0));
    const auto beta = wordsOf(rowAt<Metrics>(inputs, states));
    const auto g = wordsOf(rowAt<Branches>(inputs, std::size_t{2} * states));
    const std::int32_t difference = withRule(algorithm, [&](const auto& rule) {
        using Rule = std::decay_t<decltype(rule)>;
        Watch<Rule> one(rule, true, See{&ofOne});
        Watch<Rule> zero(rule, true, See{&ofZero});
        one.restart();
        zero.restart();
        return rules::bestPath<1>(one, alpha, beta, g) - rules::bestPath<0>(zero, alpha, beta, g);
    });
    for (unsigned state = 0; state < states; ++state) {
        for (const unsigned bit : {0U, 1U}) {
            ofOne.addSum(std::int32_t{alpha[state]} + beta[rules::successor(state, bit)]);
        }
    }
    countPath(ofOne, 0, algorithm, all);
    countPath(ofZero, 1, algorithm, all);
    all[all.size() - 2].counts[0] += ofOne.sumWraps || ofZero.sumWraps ? 1U : 0U;
    all.back().counts[0] += rules::wrap16(difference) != difference ? 1U : 0U;
}

void countBranches(const std::vector<std::int32_t>& inputs, std::vector<Situation>& all)
{
    const auto& range = rangeOf(Kind::branch);
    const auto sums = rules::branchSums<std::int32_t>(inputs[0], inputs[1], 0);
    for (unsigned metric = 0; metric < all.front().counts.size(); ++metric) {
        const std::int32_t sum = sums[metric];
        Counter(all, metric)
            .next(sum > range.highest)
            .next(sum < range.lowest)
            .next(sum == range.highest)
            .next(sum == range.lowest);
    }
}

void countExtrinsic(int algorithm, const std::vector<std::int32_t>& inputs, std::vector<Situation>& all)
{
    const auto& range = rangeOf(Kind::apriori);
    const double scaled = (inputs[0] - 2 * inputs[1]) * rules::extrinsicScale(algorithm);
    const double rounded = std::floor(scaled);
    const bool isClipped = rounded > range.highest || rounded < range.lowest;
    Counter counter(all, 0);
    counter.next(rounded > range.highest).next(rounded < range.lowest);
    if (rules::extrinsicScale(algorithm) != 1) {
        const bool isRounded = !isClipped && scaled != rounded;
        counter.next(isRounded && scaled > 0).next(isRounded && scaled < 0);
    }
}

/// Counts the metrics that are not `kept` as they were.
void countCleared(const Metrics& whole, const Metrics& kept, Situation& situation)
{
    for (unsigned state = 0; state < states; ++state) {
        situation.counts[state] += whole[state] != kept[state] ? 1U : 0U;
    }
}

void countTail(const std::vector<std::int32_t>& inputs, std::vector<Situation>& all)
{
    const auto x = rowAt<TailValues>(inputs, 0);
    const auto p = rowAt<TailValues>(inputs, x.size());
    const auto& range = rangeOf(Kind::branch);
    for (std::size_t step = 0; step < x.size(); ++step) {
        const auto sums = rules::branchSums<std::int32_t>(x[step], p[step], 0);
        const auto [least, most] = std::minmax_element(sums.begin(), sums.end());
        all[0].counts[step] += *least < range.lowest || *most > range.highest ? 1U : 0U;
    }
    const auto whole = rules::tailColumn<std::int32_t>({{x[0], x[1], x[2]}, {p[0], p[1], p[2]}, {}});
    countCleared(whole, tail(x, p), all[1]);
}

void countBorder(const std::vector<std::int32_t>& inputs, std::vector<Situation>& all)
{
    const auto column = rowAt<Metrics>(inputs, 0);
    countCleared(column, border(column), all[0]);
    for (unsigned state = 0; state < states; ++state) {
        all[1].counts[state] += border(column)[state] == column[state] ? 1U : 0U;
    }
}

void countIntrinsic(const std::vector<std::int32_t>& inputs, std::vector<Situation>& all)
{
    const std::int32_t apriori = inputs[0];
    const std::int32_t sum = twiceIntrinsic(apriori, inputs[1]);
    const auto& range = rangeOf(Kind::branch);
    const bool isOdd = apriori % 2 != 0;
    Counter(all, 0)
        .next(isOdd && apriori > 0)
        .next(isOdd && apriori < 0)
        .next(sum % 2 != 0)
        .next(sum > range.highest)
        .next(sum < range.lowest);
}

}  // namespace

std::uint64_t Situation::total() const
{
    return std::accumulate(counts.begin(), counts.end(), std::uint64_t{0});
}

std::uint64_t Situation::fewest() const
{
    return *std::min_element(counts.begin(), counts.end());
}

Situations::Situations(Number unit, int algorithm)
    : itsUnit(unit), itsAlgorithm(algorithm), itsAll(situationsOf(unit, algorithm))
{
}

void Situations::countAddress(const std::vector<std::int32_t>& inputs, std::int32_t address)
{
    const bool isFirst = inputs[1] == 0;
    Counter(itsAll, 0)
        .next(isFirst)
        .next(!isFirst && address > itsLastAddress)
        .next(!isFirst && address < itsLastAddress);
    itsLastAddress = address;
}

void Situations::add(const std::vector<std::int32_t>& inputs, const std::vector<std::int32_t>& outputs)
{
    switch (itsUnit) {
    case Number::intrinsic:
        return countIntrinsic(inputs, itsAll);
    case Number::branch:
        return countBranches(inputs, itsAll);
    case Number::forward:
    case Number::backward:
        return countStep(itsUnit == Number::forward, itsAlgorithm, inputs, itsAll);
    case Number::ratio:
        return countRatio(itsAlgorithm, inputs, itsAll);
    case Number::extrinsic:
        return countExtrinsic(itsAlgorithm, inputs, itsAll);
    case Number::address:
        return countAddress(inputs, outputs[0]);
    case Number::tail:
        return countTail(inputs, itsAll);
    case Number::border:
        return countBorder(inputs, itsAll);
    }
}

}  // namespace morvik::units
