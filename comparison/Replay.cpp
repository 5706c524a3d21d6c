// Replay: single operations of the core, repeated on the values of a dump.
#include "Replay.h"

#include <cstddef>
#include <memory>

#include "Decisions.h"
#include "src/TCalculationEngineModBase.h"
#include "src/TNumberFormat.h"

namespace morvik::comparison {

namespace {

constexpr int step = 16;  // of the state metrics' format, in aligned words
constexpr int stepMask = -step;
constexpr int branchLowest = -2048;  // the branch format's limits in aligned words
constexpr int branchHighest = 2032;

std::vector<unsigned char> corrections()
{
    const std::unique_ptr<TNumberFormat> format(TNumberFormat::create("Fix_12_3"));
    return TCalculationEngineModBase::createLUT(16, *format);
}

/// A branch metric or extrinsic value as eight bits of a step each hold it (rules 5 and 14).
int narrowed(int value, Mistake mistake)
{
    if (mistake == Mistake::unclipped) {
        return arithmetic::wrap16(value);
    }
    if (mistake == Mistake::wrappedInEight) {
        return static_cast<std::int8_t>(value >> 4) * step;
    }
    return arithmetic::clip(value, branchLowest, branchHighest);
}

/// Calls use(rule, value) with the rule of decisions and a value of its kind.
template <class Use>
auto withRule(int algorithm, Mistake mistake, const unsigned char* middle, Use use)
{
    using Word = std::int16_t;
    if (algorithm != 2 || mistake == Mistake::uncorrected) {
        return mistake == Mistake::unwrapped ? use(trellis::DecideMax<Held>(), Held())
                                             : use(trellis::DecideMax<Word>(), Word());
    }
    if (mistake == Mistake::correctedAtOnce) {
        return use(trellis::DecideMaxStar<Word, Corrections<Word>>(Corrections<Word>{middle}), Word());
    }
    return mistake == Mistake::unwrapped
               ? use(trellis::DecideMaxHash<Held, Corrections<Held>>(Corrections<Held>{middle}), Held())
               : use(trellis::DecideMaxHash<Word, Corrections<Word>>(Corrections<Word>{middle}), Word());
}

template <class Decision, class Value>
trellis::Column<Decision> nextColumn(const Decision& rule,
                                     bool isForward,
                                     const trellis::Column<Decision>& metrics,
                                     const std::array<Value, 4>& branches)
{
    return isForward ? trellis::forwardStep(rule, metrics, branches) : trellis::backwardStep(rule, metrics, branches);
}

template <class Decision, class Value>
trellis::Column<Decision> settledColumn(const Decision& rule, const std::array<Value, 8>& values)
{
    trellis::Column<Decision> metrics{};
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
void takePending(trellis::PendingMetric<Value>& metric, const trellis::PendingMetric<Value>& from)
{
    metric.pending = from.pending;
}

bool startsSegment(const Windows& windows, unsigned trellisStep)
{
    return trellisStep < windows.K && trellisStep % windows.segmentLength == 0;
}

template <class Words>
Column inSteps(const Words& words, bool complete)
{
    Column column;
    for (std::size_t i = 0; i < words.size(); ++i) {
        column.values[i] = static_cast<std::int16_t>(words[i] >> 4);
    }
    column.complete = complete;
    return column;
}

}  // namespace

Replay::Replay(const Model& model, const Values& dump) : itsModel(model), itsDump(dump), itsCorrections(corrections())
{
}

Column Replay::column(unsigned pass, Stage stage, unsigned trellisStep, Mistake mistake) const
{
    switch (stage) {
    case Stage::intrinsic:
        return intrinsicColumn(pass, trellisStep, mistake);
    case Stage::branch:
        return branchColumn(pass, trellisStep, mistake);
    case Stage::forward:
        return forwardColumn(pass, trellisStep, mistake);
    case Stage::backward:
        return backwardColumn(pass, trellisStep, mistake);
    case Stage::ratio:
        return ratioColumn(pass, trellisStep, mistake);
    default:
        return extrinsicColumn(pass, trellisStep, mistake);
    }
}

std::int16_t Replay::input(const Place& place, bool& complete) const
{
    const bool inDump = itsDump.has(place);
    complete = complete && inDump;
    return arithmetic::wrap16((inDump ? itsDump : itsModel.values).at(place) * step);
}

template <class Aligned>
Aligned Replay::inputs(unsigned pass, Stage stage, unsigned trellisStep, bool& complete) const
{
    Aligned words{};
    for (unsigned i = 0; i < words.size(); ++i) {
        words[i] = input({pass, signalsOf(stage).first + i, trellisStep}, complete);
    }
    return words;
}

unsigned Replay::aprioriStep(unsigned code, unsigned trellisStep, Mistake mistake) const
{
    const unsigned K = itsModel.windows.K;
    const auto& order = itsModel.codes[code].order;
    switch (mistake) {
    case Mistake::aprioriUnpermuted:
        return trellisStep;
    case Mistake::aprioriInverse:
        return itsModel.codes[1 - code].order[trellisStep];
    case Mistake::aprioriBefore:
        return order[(trellisStep + K - 1) % K];
    case Mistake::aprioriBehind:
        return order[(trellisStep + 1) % K];
    default:
        return order[trellisStep];
    }
}

int Replay::twiceIntrinsicFromInputs(unsigned pass, unsigned trellisStep, Mistake mistake, bool& complete) const
{
    const unsigned d = codeOf(pass);
    const Code& code = itsModel.codes[d];
    const bool isTail = trellisStep >= itsModel.windows.K;
    int apriori = 0;
    const unsigned back = mistake == Mistake::aprioriOfPassBefore ? 2 : 1;
    if (!isTail && pass >= back && mistake != Mistake::aprioriMissing) {
        const unsigned from = aprioriStep(d, trellisStep, mistake);
        apriori = input({pass - back, signalsOf(Stage::extrinsic).first, from}, complete);
    }
    const bool unpermuted = mistake == Mistake::systematicUnpermuted && !isTail;
    const int systematic = (unpermuted ? itsModel.codes[1 - d] : code).systematic[trellisStep];
    return ((apriori / 2) & stepMask) + systematic;  // rule 13, before the last division
}

int Replay::twiceIntrinsic(unsigned pass, unsigned trellisStep, bool& complete) const
{
    // A dump lacks the bit below a step. Hardware whose intrinsic value has other reasons than the inputs may have
    // another one there than follows from them: then what is computed with it tells.
    const int kept = input({pass, signalsOf(Stage::intrinsic).first, trellisStep}, complete);
    bool ignored = true;
    const int computed = twiceIntrinsicFromInputs(pass, trellisStep, Mistake::none, ignored);
    const int likely = ((computed / 2) & stepMask) == kept ? computed : 2 * kept;
    const int other = likely ^ step;
    return !givesWhatFollows(pass, trellisStep, likely) && givesWhatFollows(pass, trellisStep, other) ? other : likely;
}

bool Replay::givesWhatFollows(unsigned pass, unsigned trellisStep, int twice) const
{
    if (trellisStep >= itsModel.windows.K) {
        return true;
    }
    bool complete = true;
    const auto branches = inputs<Branches>(pass, Stage::branch, trellisStep, complete);
    const int ratio = input({pass, signalsOf(Stage::ratio).first, trellisStep}, complete);
    const int extrinsic = input({pass, signalsOf(Stage::extrinsic).first, trellisStep}, complete);
    return complete && branchMetrics(pass, trellisStep, twice, Mistake::none) == branches &&
           extrinsicValue(ratio, twice, Mistake::none) == extrinsic;
}

Column Replay::intrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const int twice = twiceIntrinsicFromInputs(pass, trellisStep, mistake, complete);
    return inSteps(std::array<int, 1>{twice / 2}, complete);
}

Replay::Branches Replay::branchMetrics(unsigned pass, unsigned trellisStep, int twice, Mistake mistake) const
{
    const unsigned d = codeOf(pass);
    int parity = itsModel.codes[mistake == Mistake::parityOfOtherCode ? 1 - d : d].parity[trellisStep];
    if (mistake == Mistake::parityNegated) {
        parity = -parity;
    }
    Branches metrics{};
    const auto sums = trellis::branchSums(twice, parity, 0);
    for (std::size_t i = 0; i < sums.size(); ++i) {
        metrics[i] = arithmetic::wrap16(narrowed(sums[i], mistake));
    }
    return metrics;
}

Column Replay::branchColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const int twice = twiceIntrinsic(pass, trellisStep, complete);
    return inSteps(branchMetrics(pass, trellisStep, twice, mistake), complete);
}

Replay::Metrics Replay::reached(
    unsigned pass, Stage stage, unsigned from, bool hasEarlier, Mistake mistake, bool& complete) const
{
    const bool isForward = stage == Stage::forward;
    const auto metrics = inputs<Metrics>(pass, stage, from, complete);
    const auto branches = inputs<Branches>(pass, Stage::branch, from, complete);
    const int algorithm = itsModel.generics.C_ALGORITHM_TYPE;
    Metrics earlierMetrics{};
    Branches earlierBranches{};
    hasEarlier = hasEarlier && algorithm == 2;
    if (hasEarlier) {
        const unsigned earlier = isForward ? from - 1 : from + 1;
        earlierMetrics = inputs<Metrics>(pass, stage, earlier, complete);
        earlierBranches = inputs<Branches>(pass, Stage::branch, earlier, complete);
    }
    const auto advance = [&](const auto& rule, auto kind) {
        using Value = decltype(kind);
        auto column = settledColumn(rule, fromWords<Value>(metrics));
        if (hasEarlier) {
            const auto before = nextColumn(rule,
                                           isForward,
                                           settledColumn(rule, fromWords<Value>(earlierMetrics)),
                                           fromWords<Value>(earlierBranches));
            for (std::size_t state = 0; state < column.size(); ++state) {
                takePending(column[state], before[state]);
            }
        }
        const auto next = nextColumn(rule, isForward, column, fromWords<Value>(branches));
        Metrics words{};
        for (std::size_t state = 0; state < words.size(); ++state) {
            words[state] = wordOf(rule.stored(next[state]));
        }
        return words;
    };
    return withRule(algorithm, mistake, itsCorrections.data() + itsCorrections.size() / 2, advance);
}

namespace {

template <class Metrics>
Metrics border(Metrics column, Mistake mistake)
{
    for (auto& metric : column) {
        metric = mistake == Mistake::borderUnknown    ? std::int16_t{0}
                 : mistake == Mistake::borderBitsKept ? metric
                                                      : arithmetic::maskBits(metric, arithmetic::borderMask);
    }
    return column;
}

}  // namespace

Replay::Metrics Replay::forwardStart(unsigned pass, unsigned segment, Mistake mistake, bool& complete) const
{
    if (segment == 0 && mistake != Mistake::borderUnknown) {
        Metrics known;
        known.fill(-16384);  // rule 10
        known[0] = 0;
        return known;
    }
    if (pass < 2 || segment == 0) {
        return {};
    }
    const unsigned length = itsModel.windows.segmentLength;
    return border(reached(pass - 2, Stage::forward, segment * length - 1, length > 1, mistake, complete), mistake);
}

Column Replay::forwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const Windows& windows = itsModel.windows;
    if (startsSegment(windows, trellisStep)) {
        const Metrics start = forwardStart(pass, trellisStep / windows.segmentLength, mistake, complete);
        return inSteps(start, complete);
    }
    const bool hasEarlier = !startsSegment(windows, trellisStep - 1);
    const Metrics next = reached(pass, Stage::forward, trellisStep - 1, hasEarlier, mistake, complete);
    return inSteps(next, complete);
}

Replay::Metrics Replay::tail(unsigned pass) const
{
    const Code& code = itsModel.codes[codeOf(pass)];
    trellis::Tail<int> steps{};
    for (unsigned i = 0; i < 3; ++i) {
        steps.x[i] = code.systematic[itsModel.windows.K + i];
        steps.p[i] = code.parity[itsModel.windows.K + i];
    }
    Metrics column{};
    const auto metrics = trellis::tailColumn(steps);
    for (std::size_t state = 0; state < column.size(); ++state) {
        column[state] = arithmetic::wrap16(metrics[state]);
    }
    return column;
}

Replay::Metrics Replay::backwardStart(unsigned pass, const Window& window, Mistake mistake, bool& complete) const
{
    const Windows& windows = itsModel.windows;
    if (windows.isFinal(window)) {
        return border(tail(pass), mistake);
    }
    if (pass < 2) {
        return {};
    }
    // Rule 20: the last row of three or more starts from what the first row has just left.
    bool ofThisPass = windows.rows >= 3 && window.row + 1 == windows.rows;
    ofThisPass = ofThisPass != (mistake == Mistake::borderOfOtherPass);
    const unsigned from = window.last + 1;
    const bool hasEarlier = from < windows.at(from).last;
    return border(reached(ofThisPass ? pass : pass - 2, Stage::backward, from, hasEarlier, mistake, complete), mistake);
}

Column Replay::backwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const Window& window = itsModel.windows.at(trellisStep);
    if (trellisStep == window.last) {
        const Metrics start = backwardStart(pass, window, mistake, complete);
        return inSteps(start, complete);
    }
    const Metrics next =
        reached(pass, Stage::backward, trellisStep + 1, trellisStep + 1 < window.last, mistake, complete);
    return inSteps(next, complete);
}

Column Replay::ratioColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const auto a = inputs<Metrics>(pass, Stage::forward, trellisStep, complete);
    const auto b = inputs<Metrics>(pass, Stage::backward, trellisStep, complete);
    const auto g = inputs<Branches>(pass, Stage::branch, trellisStep, complete);
    const auto ratio = [&](const auto& rule, auto kind) {
        using Value = decltype(kind);
        return wordOf(trellis::logLikelihoodRatio(rule, fromWords<Value>(a), fromWords<Value>(b), fromWords<Value>(g)));
    };
    const std::int16_t word =
        withRule(itsModel.generics.C_ALGORITHM_TYPE, mistake, itsCorrections.data() + itsCorrections.size() / 2, ratio);
    return inSteps(std::array<std::int16_t, 1>{word}, complete);
}

int Replay::extrinsicValue(int ratio, int twice, Mistake mistake) const
{
    int value = ratio - 2 * twice;
    if (itsModel.generics.C_ALGORITHM_TYPE == 1 && mistake != Mistake::unscaled) {
        value = 3 * value / 4;  // rule 14
    }
    return narrowed(value, mistake) & stepMask;
}

Column Replay::extrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const int ratio = input({pass, signalsOf(Stage::ratio).first, trellisStep}, complete);
    const int twice = twiceIntrinsic(pass, trellisStep, complete);
    return inSteps(std::array<int, 1>{extrinsicValue(ratio, twice, mistake)}, complete);
}

}  // namespace morvik::comparison
