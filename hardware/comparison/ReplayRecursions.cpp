// Replay: single operations of the core, repeated on the values of a dump: recursions, their starts, and ratios.
#include <cstddef>
#include <type_traits>

#include "AlignedWords.h"
#include "Decisions.h"
#include "Replay.h"
#include "hardware/testbench/Corrections.h"
#include "rules/Starts.h"

namespace morvik::comparison {

namespace {

/// The first pass over the code of this pass.
unsigned firstPassOf(unsigned pass)
{
    while (!rules::isFirstPass(pass)) {
        pass = rules::passBefore(pass);
    }
    return pass;
}

/// The bits by which words are shifted up so that they wrap like narrower registers.
unsigned shiftOf(Mistake mistake)
{
    return mistake == Mistake::computedIn ? static_cast<unsigned>(int{rules::stateBits} - mistake.number) : 0;
}

/// Calls use(rule, value) with the decision rule over a type of values.
template <class Value, class Use>
auto withRuleOver(bool isCorrected, const Corrections<Value>& corrections, Use use)
{
    return isCorrected ? use(rules::DecideMaxHash<Value, Corrections<Value>>(corrections), Value())
                       : use(rules::DecideMax<Value>(), Value());
}

/// Calls use(rule, value) with the decision rule and a value of its type.
template <class Use>
auto withRule(int algorithm, Mistake mistake, Use use)
{
    using Word = std::int16_t;
    const Corrections<Word> table{corrections(), shiftOf(mistake), mistake != Mistake::correctedByMagnitude};
    const bool isCorrected = algorithm == 2 && mistake != Mistake::uncorrected;
    if (isCorrected && mistake == Mistake::correctedAtOnce) {
        return use(rules::DecideMaxStar<Word, Corrections<Word>>(table), Word());
    }
    switch (mistake.kind) {
    case Mistake::unwrapped:
        return withRuleOver(isCorrected, Corrections<Held>{corrections()}, use);
    case Mistake::comparedPlainly:
        return withRuleOver(isCorrected, Corrections<Plain>{corrections()}, use);
    case Mistake::lesser:
        return withRuleOver(isCorrected, Corrections<Leaf>{corrections()}, use);
    default:
        return withRuleOver(isCorrected, table, use);
    }
}

template <class Decision, class Value>
rules::Column<Decision> nextColumn(const Decision& rule,
                                   bool isForward,
                                   const rules::Column<Decision>& metrics,
                                   const std::array<Value, 4>& branches)
{
    return isForward ? rules::forwardStep(rule, metrics, branches) : rules::backwardStep(rule, metrics, branches);
}

template <class Decision, class Value>
rules::Column<Decision> settledColumn(const Decision& rule, const std::array<Value, 8>& values)
{
    rules::Column<Decision> metrics{};
    for (std::size_t state = 0; state < values.size(); ++state) {
        metrics[state] = rule.metric(values[state]);
    }
    return metrics;
}

/// Plain metrics have nothing pending.
template <class Value>
void takePending(Value&, const Value&)
{
}

template <class Value>
void takePending(rules::PendingMetric<Value>& metric, const rules::PendingMetric<Value>& from)
{
    metric.pending = from.pending;
}

template <class Aligned>
Aligned shifted(Aligned words, unsigned bits)
{
    for (auto& word : words) {
        word = rules::wrap16(rules::shiftLeftWrap(word, bits));
    }
    return words;
}

/// Metrics as the registers hold them.
template <class Metrics>
Metrics registered(Metrics metrics, Mistake mistake)
{
    if (mistake.kind == Mistake::storedIn || mistake.kind == Mistake::computedIn) {
        for (auto& metric : metrics) {
            metric = rules::wrap16(cutTo(metric, mistake.number));
        }
    }
    return metrics;
}

/// A bit's best path, one decision of whose tree is for the lesser candidate if the bit is the node's.
template <unsigned bit, class Decision>
std::int16_t bestWord(const Decision& rule,
                      std::array<Leaf, 8> forward,
                      const std::array<Leaf, 8>& backward,
                      const std::array<Leaf, 4>& branches,
                      const TreeNode& node)
{
    for (unsigned state = 0; state < forward.size(); ++state) {
        forward[state].states = 1U << state;
        forward[state].reversed = node.bit == bit ? node.states : 0;
    }
    return rules::bestPath<bit>(rule, forward, backward, branches).value;
}

template <class Metrics>
Metrics border(Metrics column, Mistake mistake)
{
    const std::int16_t mask = mistake == Mistake::borderUnknown ? std::int16_t{0}
                              : mistake == Mistake::borderMask  ? rules::wrap16(mistake.number * eighth)
                                                                : rules::borderMask;
    for (auto& metric : column) {
        metric = rules::maskBits(metric, mask);
    }
    return column;
}

/// The metrics of an encoder that is known to be in state 0.
std::array<std::int16_t, rules::stateCount> knownColumn(Mistake mistake)
{
    std::array<std::int16_t, rules::stateCount> column{};
    for (unsigned state = 0; state < column.size(); ++state) {
        column[state] = mistake == Mistake::knownAs && state != 0 ? rules::wrap16(mistake.number * eighth)
                                                                  : rules::knownMetric<std::int16_t>(state, INT16_MIN);
    }
    return column;
}

/// The steps by which the end of a window is shifted, where its recursion starts.
int shiftOfWindow(const rules::Cut& cut, const rules::Window& window, Mistake mistake)
{
    const bool endsSegment = window.row + 1 == cut.rows();
    const bool isShifted = mistake == Mistake::windowsShifted || (mistake == Mistake::rowsShifted && !endsSegment) ||
                           (mistake == Mistake::segmentEndsShifted && endsSegment);
    return isShifted && !cut.startsAtTail(window) ? mistake.number : 0;
}

/// The window whose recursion starts at the step.
std::optional<rules::Window> windowFrom(const rules::Cut& cut, unsigned trellisStep, Mistake mistake)
{
    const rules::Window own = cut.windowAt(trellisStep);
    if (own.last == trellisStep && shiftOfWindow(cut, own, mistake) == 0) {
        return own;
    }
    const unsigned end = trellisStep - static_cast<unsigned>(mistake.number);  // wraps to above K below 0
    if (mistake.number == 0 || end >= cut.K()) {
        return std::nullopt;
    }
    const rules::Window other = cut.windowAt(end);
    return other.last == end && shiftOfWindow(cut, other, mistake) != 0 ? std::optional(other) : std::nullopt;
}

/// Whether a segment's forward recursion starts at the step.
bool startsForward(const rules::Cut& cut, unsigned trellisStep, Mistake mistake)
{
    if (mistake != Mistake::segmentsShifted || trellisStep == 0) {
        return cut.startsSegment(trellisStep);
    }
    const unsigned start = trellisStep - static_cast<unsigned>(mistake.number);  // wraps to above K below 0
    return start > 0 && cut.startsSegment(start);
}

}  // namespace

Replay::Metrics Replay::stepped(const StepInputs& from, Mistake mistake) const
{
    const unsigned shift = shiftOf(mistake);
    const auto advance = [&](const auto& rule, auto kind) {
        using Value = decltype(kind);
        auto column = settledColumn(rule, fromWords<Value>(shifted(from.metrics, shift)));
        if (from.hasEarlier) {
            const auto before = nextColumn(rule,
                                           from.isForward,
                                           settledColumn(rule, fromWords<Value>(shifted(from.earlierMetrics, shift))),
                                           fromWords<Value>(shifted(from.earlierBranches, shift)));
            for (std::size_t state = 0; state < column.size(); ++state) {
                takePending(column[state], before[state]);
            }
        }
        const auto next = nextColumn(rule, from.isForward, column, fromWords<Value>(shifted(from.branches, shift)));
        Metrics words{};
        for (std::size_t state = 0; state < words.size(); ++state) {
            words[state] = static_cast<std::int16_t>(wordOf(rule.stored(next[state])) >> shift);
        }
        return words;
    };
    return withRule(itsModel.generics.C_ALGORITHM_TYPE, mistake, advance);
}

Replay::Metrics Replay::reached(
    unsigned pass, Stage stage, unsigned from, bool hasEarlier, Mistake mistake, Sources& sources) const
{
    StepInputs step{};
    step.isForward = stage == Stage::forward;
    step.metrics = metrics(pass, stage, from, sources);
    step.branches = branches(pass, from, mistake, sources);
    step.hasEarlier = hasEarlier && itsModel.generics.C_ALGORITHM_TYPE == 2;
    if (step.hasEarlier) {
        const unsigned earlier = step.isForward ? from - 1 : from + 1;
        step.earlierMetrics = metrics(pass, stage, earlier, sources);
        step.earlierBranches = branches(pass, earlier, mistake, sources);
    }
    Metrics next = stepped(step, mistake);
    if (mistake == Mistake::lesser) {
        const auto state = static_cast<std::size_t>(mistake.number);
        const std::int16_t lesser = next[state];
        next = stepped(step, {});
        next[state] = lesser;
    }
    return next;
}

std::optional<unsigned> Replay::borderPass(unsigned pass, bool ofThisPass, Mistake mistake)
{
    if (rules::isFirstPass(pass)) {
        return mistake == Mistake::borderOfBothCodes && pass > 0 ? std::optional(pass - 1) : std::nullopt;
    }
    const unsigned right = ofThisPass ? pass : rules::passBefore(pass);
    switch (mistake.kind) {
    case Mistake::borderOfThisPass:
        return pass;
    case Mistake::borderOfLastPass:
        return rules::passBefore(pass);
    case Mistake::borderOfOtherCode:
    case Mistake::borderOfBothCodes:
        return pass - 1;
    case Mistake::borderOfThirdPass:
        return pass > 2 ? std::optional(pass - 3) : std::nullopt;
    case Mistake::borderLate:
        return rules::isFirstPass(right) ? std::nullopt : std::optional(rules::passBefore(right));
    case Mistake::borderOfFirstPass:
        return firstPassOf(pass);
    default:
        return right;
    }
}

unsigned Replay::borderSource(bool isForward, unsigned from, Mistake mistake, Sources& sources) const
{
    const rules::Cut& cut = itsModel.cut;
    const auto number = static_cast<unsigned>(mistake.number);  // wraps to above K below 0
    unsigned source = from;
    if (mistake == Mistake::borderOfSegment) {
        source = from + number * cut.segmentLength();
    } else if (mistake == Mistake::borderOfStep) {
        source = from + number;
    } else if (mistake == Mistake::borderOfWindow && !isForward) {
        source = mistake.number > 0 ? cut.windowAt(from).last + 1 : cut.windowAt(from - 1).first;
    }
    // At the ends of the block, there is no border.
    const bool hasBorder = source < cut.K() && source != (isForward ? cut.K() - 1 : 0);
    sources.open = sources.open || !hasBorder;
    return hasBorder ? source : from;
}

Replay::Metrics Replay::forwardStart(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const
{
    if (trellisStep == 0 && mistake != Mistake::borderUnknown) {
        return knownColumn(mistake);
    }
    const auto last = borderPass(pass, false, mistake);
    if (!last && mistake == Mistake::startKnown) {
        return knownColumn(mistake);
    }
    if (!last || trellisStep == 0) {
        return {};
    }
    const unsigned from = borderSource(true, trellisStep - 1, mistake, sources);
    const bool hasEarlier = !startsForward(itsModel.cut, from, mistake);
    return border(reached(*last, Stage::forward, from, hasEarlier, mistake, sources), mistake);
}

Column Replay::forwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    Sources sources;
    const rules::Cut& cut = itsModel.cut;
    if (startsForward(cut, trellisStep, mistake)) {
        const Metrics start = forwardStart(pass, trellisStep, mistake, sources);
        return inEighths(registered(start, mistake), sources);
    }
    const bool hasEarlier = !startsForward(cut, trellisStep - 1, mistake);
    const Metrics next = reached(pass, Stage::forward, trellisStep - 1, hasEarlier, mistake, sources);
    return inEighths(registered(next, mistake), sources);
}

std::array<int, 6> Replay::tailValues(unsigned pass, Mistake mistake) const
{
    const Code& code = mistake == Mistake::tailOfOtherCode ? itsModel.codes[1 - codeOf(pass)] : codeUsed(pass, mistake);
    const Code& ofParity = mistake == Mistake::parityOfOtherCode ? itsModel.codes[1 - codeOf(pass)] : code;
    std::array<int, 6> values{};
    for (std::size_t i = 0; i < values.size(); ++i) {
        const std::size_t place =
            mistake == Mistake::tailOrder ? tailOrders[static_cast<std::size_t>(mistake.number)].from[i] : i;
        values[i] = (place % 2 == 0 ? code.systematic : ofParity.parity)[itsModel.cut.K() + place / 2];
    }
    return values;
}

Replay::Metrics Replay::tail(unsigned pass, Mistake mistake) const
{
    const auto narrowed = [&](int sum) {
        return mistake == Mistake::tailClipped   ? clippedTo(sum, mistake.number)
               : mistake == Mistake::tailWrapped ? cutTo(sum, mistake.number)
                                                 : sum;
    };
    const std::array<int, 6> values = tailValues(pass, mistake);
    rules::Tail<int> steps{};
    for (std::size_t i = 0; i < rules::tailSteps; ++i) {
        const int sum = narrowed(values[2 * i] + values[2 * i + 1]);
        const int difference = narrowed(values[2 * i] - values[2 * i + 1]);
        steps.x[i] = (sum + difference) / 2;  // these have the narrowed sum and difference
        steps.p[i] = (sum - difference) / 2;
    }
    Metrics column{};
    const auto metrics = rules::tailColumn(steps);
    for (std::size_t state = 0; state < column.size(); ++state) {
        column[state] = rules::wrap16(metrics[state]);
    }
    return column;
}

Replay::Metrics Replay::backwardStart(
    unsigned pass, const rules::Window& window, unsigned trellisStep, Mistake mistake, Sources& sources) const
{
    const rules::Cut& cut = itsModel.cut;
    if (cut.startsAtTail(window)) {
        return border(tail(pass, mistake), mistake);
    }
    // A window's own last column is not there before the next pass.
    const bool isOwn = mistake == Mistake::borderOfWindow && mistake.number < 0;
    const auto left = borderPass(pass, cut.startsFromThisPass(window) && !isOwn, mistake);
    if (!left) {
        return {};
    }
    const unsigned from = borderSource(false, trellisStep + 1, mistake, sources);
    const bool hasEarlier = !windowFrom(cut, from, mistake);
    return border(reached(*left, Stage::backward, from, hasEarlier, mistake, sources), mistake);
}

Column Replay::backwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    Sources sources;
    const rules::Cut& cut = itsModel.cut;
    if (const auto window = windowFrom(cut, trellisStep, mistake)) {
        const Metrics start = backwardStart(pass, *window, trellisStep, mistake, sources);
        return inEighths(registered(start, mistake), sources);
    }
    const bool hasEarlier = !windowFrom(cut, trellisStep + 1, mistake);
    const Metrics next = reached(pass, Stage::backward, trellisStep + 1, hasEarlier, mistake, sources);
    return inEighths(registered(next, mistake), sources);
}

Column Replay::ratioColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    Sources sources;
    const unsigned shift = shiftOf(mistake);
    const auto metricsOf = [&](Stage stage, Mistake::Kind misread, Mistake::Kind missing) {
        const unsigned step = addressed(trellisStep, mistake, misread, sources);
        return mistake == missing ? Metrics{} : shifted(metrics(pass, stage, step, sources), shift);
    };
    const Metrics a = metricsOf(Stage::forward, Mistake::forwardMisread, Mistake::forwardMissing);
    const Metrics b = metricsOf(Stage::backward, Mistake::backwardMisread, Mistake::backwardMissing);
    const auto g = shifted(branchesOfRatio(pass, trellisStep, mistake, sources), shift);
    const auto ratio = [&](const auto& rule, auto kind) {
        using Value = decltype(kind);
        const auto forward = fromWords<Value>(a);
        const auto backward = fromWords<Value>(b);
        const auto branches = fromWords<Value>(g);
        if constexpr (std::is_same_v<Value, Leaf>) {
            const TreeNode node = treeNodeOf(mistake.number);
            return rules::subWrap(bestWord<1>(rule, forward, backward, branches, node),
                                  bestWord<0>(rule, forward, backward, branches, node));
        } else {
            const int one = wordOf(rules::bestPath<1>(rule, forward, backward, branches));
            const int zero = wordOf(rules::bestPath<0>(rule, forward, backward, branches));
            const bool isHeld = mistake == Mistake::ratioHeld;
            return isHeld ? rules::wrap16(clippedTo(one - zero, mistake.number))
                          : wordOf(rules::logLikelihoodRatio(rule, forward, backward, branches));
        }
    };
    const std::int16_t word = withRule(itsModel.generics.C_ALGORITHM_TYPE, mistake, ratio);
    const auto unshifted = static_cast<std::int16_t>(word >> shift);
    return inEighths(registered(std::array<std::int16_t, 1>{unshifted}, mistake), sources);
}

}  // namespace morvik::comparison
