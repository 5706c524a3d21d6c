// Replay: single operations of the core, repeated on the values of a dump.
#include "Replay.h"

#include <cstddef>
#include <memory>

#include "Decisions.h"
#include "rules/Algorithms.h"
#include "rules/Formats.h"
#include "rules/SoftValues.h"
#include "rules/Starts.h"
#include "src/TCalculationEngineModBase.h"
#include "src/TNumberFormat.h"

namespace morvik::comparison {

namespace {

constexpr int eighth = 1 << rules::stateAlignment;  // in aligned words of the state format
constexpr int eighthMask = -eighth;

std::vector<unsigned char> correctionTable()
{
    const std::unique_ptr<TNumberFormat> format(TNumberFormat::create("Fix_12_3"));
    return TCalculationEngineModBase::createLUT(16, *format);
}

/// The low bits of a value, sign-extended.
int cutTo(int value, int bits)
{
    const auto above = static_cast<std::uint32_t>(32 - int{rules::stateAlignment} - bits);
    return rules::shiftRight(rules::shiftLeftWrap(value, above), above);
}

int clippedTo(int value, int bits)
{
    const int end = eighth << (bits - 1);
    return rules::clip(value, -end, end - eighth);
}

/// A branch metric or extrinsic value, an aligned word, narrowed to eight bits (rules 5 and 14).
int narrowed(int value, Mistake mistake)
{
    switch (mistake.kind) {
    case Mistake::unclipped:
        return rules::wrap16(value);
    case Mistake::clippedTo:
        return clippedTo(value, mistake.number);
    case Mistake::clippedSymmetric:
        return rules::clip(value, -rules::branchLargest, rules::branchLargest);
    case Mistake::wrappedTo:
        return cutTo(value, mistake.number);
    default:
        return rules::clip(value, rules::branchSmallest, rules::branchLargest);
    }
}

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

/// Calls use(rule, value) with the decision rule and a value of its type.
template <class Use>
auto withRule(int algorithm, Mistake mistake, const unsigned char* middle, Use use)
{
    using Word = std::int16_t;
    const Corrections<Word> corrections{middle, shiftOf(mistake)};
    if (algorithm != 2 || mistake == Mistake::uncorrected) {
        return mistake == Mistake::unwrapped ? use(rules::DecideMax<Held>(), Held())
                                             : use(rules::DecideMax<Word>(), Word());
    }
    if (mistake == Mistake::correctedAtOnce) {
        return use(rules::DecideMaxStar<Word, Corrections<Word>>(corrections), Word());
    }
    return mistake == Mistake::unwrapped
               ? use(rules::DecideMaxHash<Held, Corrections<Held>>(Corrections<Held>{middle}), Held())
               : use(rules::DecideMaxHash<Word, Corrections<Word>>(corrections), Word());
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

template <class Words>
Words shifted(Words words, unsigned bits)
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

template <class Words>
Column inEighths(const Words& words, bool complete)
{
    Column column;
    for (std::size_t i = 0; i < words.size(); ++i) {
        column.values[i] = static_cast<std::int16_t>(rules::shiftRight(words[i], rules::stateAlignment));
    }
    column.complete = complete;
    return column;
}

}  // namespace

Replay::Replay(const Model& model, const Values& dump)
    : itsModel(model), itsDump(dump), itsCorrections(correctionTable())
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
    case Stage::extrinsic:
        break;
    }
    return extrinsicColumn(pass, trellisStep, mistake);
}

std::int16_t Replay::input(const Place& place, bool& complete) const
{
    const bool inDump = itsDump.has(place);
    complete = complete && inDump;
    return rules::wrap16((inDump ? itsDump : itsModel.values).at(place) * eighth);
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
    const unsigned K = itsModel.cut.K();
    const auto& order = itsModel.codes[code].order;
    switch (mistake.kind) {
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
    const bool isTail = trellisStep >= itsModel.cut.K();
    int apriori = 0;
    const unsigned back = mistake == Mistake::aprioriOfPassBefore ? 2 : 1;
    if (!isTail && pass >= back && mistake != Mistake::aprioriMissing) {
        const unsigned from = aprioriStep(d, trellisStep, mistake);
        apriori = input({pass - back, signalsOf(Stage::extrinsic).first, from}, complete);
    }
    const bool unpermuted = mistake == Mistake::systematicUnpermuted && !isTail;
    const int systematic = (unpermuted ? itsModel.codes[1 - d] : code).systematic[trellisStep];
    const int sum = rules::twiceIntrinsicValue(apriori, systematic, eighthMask);
    return mistake == Mistake::intrinsicWrapped   ? cutTo(sum, int{rules::inputBits})
           : mistake == Mistake::intrinsicClipped ? clippedTo(sum, int{rules::inputBits})
                                                  : sum;
}

Replay::TwiceIntrinsic Replay::twiceIntrinsic(unsigned pass, unsigned trellisStep, bool& complete) const
{
    // A dump lacks the bit below an eighth. If the hardware's intrinsic value does not follow from the inputs, this bit
    // may differ from theirs; values computed from it then decide.
    const int kept = input({pass, signalsOf(Stage::intrinsic).first, trellisStep}, complete);
    bool hasInputs = true;
    const int computed = twiceIntrinsicFromInputs(pass, trellisStep, {}, hasInputs);
    const bool isComputed = ((computed / 2) & eighthMask) == kept;
    const int likely = isComputed ? computed : 2 * kept;
    const int other = likely ^ eighth;
    const bool isOther = !givesWhatFollows(pass, trellisStep, likely) && givesWhatFollows(pass, trellisStep, other);
    return {isOther ? other : likely, isComputed && hasInputs};
}

bool Replay::isInDump(unsigned pass, Stage stage, unsigned trellisStep, const Column& column) const
{
    const auto [first, count] = signalsOf(stage);
    for (unsigned i = 0; i < count; ++i) {
        const Place place = {pass, first + i, trellisStep};
        if (itsDump.has(place) && itsDump.at(place) != column.values[i]) {
            return false;
        }
    }
    return true;
}

template <class Compute>
Column Replay::fromTwiceIntrinsic(unsigned pass, Stage stage, unsigned trellisStep, Compute compute) const
{
    bool complete = true;
    const TwiceIntrinsic twice = twiceIntrinsic(pass, trellisStep, complete);
    const auto likely = compute(twice.value, complete);
    const Column column = inEighths(likely, complete);
    if (twice.isSure || isInDump(pass, stage, trellisStep, column)) {
        return column;
    }
    const auto unlikely = compute(twice.value ^ eighth, complete);
    const Column other = inEighths(unlikely, complete);
    return isInDump(pass, stage, trellisStep, other) ? other : column;
}

bool Replay::givesWhatFollows(unsigned pass, unsigned trellisStep, int twice) const
{
    if (trellisStep >= itsModel.cut.K()) {
        return true;
    }
    bool complete = true;
    const auto branches = inputs<Branches>(pass, Stage::branch, trellisStep, complete);
    const int ratio = input({pass, signalsOf(Stage::ratio).first, trellisStep}, complete);
    const int extrinsic = input({pass, signalsOf(Stage::extrinsic).first, trellisStep}, complete);
    return complete && branchMetrics(pass, trellisStep, twice, {}) == branches &&
           extrinsicValue(ratio, twice, {}) == extrinsic;
}

Column Replay::intrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const int twice = twiceIntrinsicFromInputs(pass, trellisStep, mistake, complete);
    return inEighths(std::array<int, 1>{twice / 2}, complete);
}

Replay::Branches Replay::branchMetrics(unsigned pass, unsigned trellisStep, int twice, Mistake mistake) const
{
    const unsigned d = codeOf(pass);
    int parity = itsModel.codes[mistake == Mistake::parityOfOtherCode ? 1 - d : d].parity[trellisStep];
    if (mistake == Mistake::parityNegated) {
        parity = -parity;
    }
    if (mistake == Mistake::doubledWrapped) {
        twice = cutTo(twice, int{rules::inputBits});
    } else if (mistake == Mistake::doubledClipped) {
        twice = clippedTo(twice, int{rules::inputBits});
    }
    Branches metrics{};
    auto sums = rules::branchSums(twice, parity, 0);
    if (mistake == Mistake::negationWrapped) {
        sums[1] = sums[2] = twice + cutTo(-parity, int{rules::inputBits});
    }
    for (std::size_t i = 0; i < sums.size(); ++i) {
        metrics[i] = rules::wrap16(narrowed(sums[i], mistake));
    }
    return metrics;
}

Column Replay::branchColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    return fromTwiceIntrinsic(pass, Stage::branch, trellisStep, [&](int twice, bool&) {
        return branchMetrics(pass, trellisStep, twice, mistake);
    });
}

Replay::Metrics Replay::reached(
    unsigned pass, Stage stage, unsigned from, bool hasEarlier, Mistake mistake, bool& complete) const
{
    const bool isForward = stage == Stage::forward;
    const unsigned shift = shiftOf(mistake);
    const auto metrics = shifted(inputs<Metrics>(pass, stage, from, complete), shift);
    const auto branches = shifted(inputs<Branches>(pass, Stage::branch, from, complete), shift);
    const int algorithm = itsModel.generics.C_ALGORITHM_TYPE;
    Metrics earlierMetrics{};
    Branches earlierBranches{};
    hasEarlier = hasEarlier && algorithm == 2;
    if (hasEarlier) {
        const unsigned earlier = isForward ? from - 1 : from + 1;
        earlierMetrics = shifted(inputs<Metrics>(pass, stage, earlier, complete), shift);
        earlierBranches = shifted(inputs<Branches>(pass, Stage::branch, earlier, complete), shift);
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
            words[state] = static_cast<std::int16_t>(wordOf(rule.stored(next[state])) >> shift);
        }
        return words;
    };
    return withRule(algorithm, mistake, itsCorrections.data() + itsCorrections.size() / 2, advance);
}

namespace {

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

}  // namespace

std::optional<unsigned> Replay::borderPass(unsigned pass, bool ofThisPass, Mistake mistake)
{
    if (rules::isFirstPass(pass)) {
        return std::nullopt;
    }
    const unsigned right = ofThisPass ? pass : rules::passBefore(pass);
    switch (mistake.kind) {
    case Mistake::borderOfThisPass:
        return pass;
    case Mistake::borderOfLastPass:
        return rules::passBefore(pass);
    case Mistake::borderOfOtherCode:
        return pass - 1;
    case Mistake::borderLate:
        return rules::isFirstPass(right) ? std::nullopt : std::optional(rules::passBefore(right));
    case Mistake::borderOfFirstPass:
        return firstPassOf(pass);
    default:
        return right;
    }
}

Replay::Metrics Replay::forwardStart(unsigned pass, unsigned segment, Mistake mistake, bool& complete) const
{
    if (segment == 0 && mistake != Mistake::borderUnknown) {
        Metrics known;
        for (unsigned state = 0; state < known.size(); ++state) {
            known[state] = rules::knownMetric<std::int16_t>(state, INT16_MIN);
        }
        return known;
    }
    const auto from = borderPass(pass, false, mistake);
    if (!from || segment == 0) {
        return {};
    }
    const unsigned length = itsModel.cut.segmentLength();
    return border(reached(*from, Stage::forward, segment * length - 1, length > 1, mistake, complete), mistake);
}

Column Replay::forwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const rules::Cut& cut = itsModel.cut;
    if (cut.startsSegment(trellisStep)) {
        const Metrics start = forwardStart(pass, trellisStep / cut.segmentLength(), mistake, complete);
        return inEighths(registered(start, mistake), complete);
    }
    const bool hasEarlier = !cut.startsSegment(trellisStep - 1);
    const Metrics next = reached(pass, Stage::forward, trellisStep - 1, hasEarlier, mistake, complete);
    return inEighths(registered(next, mistake), complete);
}

Replay::Metrics Replay::tail(unsigned pass, Mistake mistake) const
{
    const Code& code = itsModel.codes[codeOf(pass)];
    rules::Tail<int> steps{};
    for (unsigned i = 0; i < rules::tailSteps; ++i) {
        steps.x[i] = code.systematic[itsModel.cut.K() + i];
        steps.p[i] = code.parity[itsModel.cut.K() + i];
        if (mistake == Mistake::tailClipped) {
            const int sum = narrowed(steps.x[i] + steps.p[i], {});
            const int difference = narrowed(steps.x[i] - steps.p[i], {});
            steps.x[i] = (sum + difference) / 2;  // these have the clipped sum and difference
            steps.p[i] = (sum - difference) / 2;
        }
    }
    Metrics column{};
    const auto metrics = rules::tailColumn(steps);
    for (std::size_t state = 0; state < column.size(); ++state) {
        column[state] = rules::wrap16(metrics[state]);
    }
    return column;
}

Replay::Metrics Replay::backwardStart(unsigned pass, const rules::Window& window, Mistake mistake, bool& complete) const
{
    const rules::Cut& cut = itsModel.cut;
    if (cut.startsAtTail(window)) {
        return border(tail(pass, mistake), mistake);
    }
    const auto left = borderPass(pass, cut.startsFromThisPass(window), mistake);
    if (!left) {
        return {};
    }
    const unsigned from = window.last + 1;
    const bool hasEarlier = from < cut.windowAt(from).last;
    return border(reached(*left, Stage::backward, from, hasEarlier, mistake, complete), mistake);
}

Column Replay::backwardColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const rules::Window window = itsModel.cut.windowAt(trellisStep);
    if (trellisStep == window.last) {
        const Metrics start = backwardStart(pass, window, mistake, complete);
        return inEighths(registered(start, mistake), complete);
    }
    const Metrics next =
        reached(pass, Stage::backward, trellisStep + 1, trellisStep + 1 < window.last, mistake, complete);
    return inEighths(registered(next, mistake), complete);
}

Column Replay::ratioColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    bool complete = true;
    const unsigned shift = shiftOf(mistake);
    const auto a = shifted(inputs<Metrics>(pass, Stage::forward, trellisStep, complete), shift);
    const auto b = shifted(inputs<Metrics>(pass, Stage::backward, trellisStep, complete), shift);
    const auto g = shifted(inputs<Branches>(pass, Stage::branch, trellisStep, complete), shift);
    const auto ratio = [&](const auto& rule, auto kind) {
        using Value = decltype(kind);
        const auto forward = fromWords<Value>(a);
        const auto backward = fromWords<Value>(b);
        const auto branches = fromWords<Value>(g);
        if (mistake == Mistake::ratioHeld) {
            return held(wordOf(rules::bestPath<1>(rule, forward, backward, branches)) -
                        wordOf(rules::bestPath<0>(rule, forward, backward, branches)))
                .value;
        }
        return wordOf(rules::logLikelihoodRatio(rule, forward, backward, branches));
    };
    const std::int16_t word =
        withRule(itsModel.generics.C_ALGORITHM_TYPE, mistake, itsCorrections.data() + itsCorrections.size() / 2, ratio);
    const auto unshifted = static_cast<std::int16_t>(word >> shift);
    return inEighths(registered(std::array<std::int16_t, 1>{unshifted}, mistake), complete);
}

int Replay::wideExtrinsicValue(int ratio, int twice, Mistake mistake) const
{
    const int value = ratio - 2 * twice;
    const bool isScaled =
        rules::extrinsicScale(itsModel.generics.C_ALGORITHM_TYPE) != 1 && mistake != Mistake::unscaled;
    return isScaled ? rules::scaleNumerator * value / (1 << rules::scaleBits) : value;
}

int Replay::extrinsicValue(int ratio, int twice, Mistake mistake) const
{
    return narrowed(wideExtrinsicValue(ratio, twice, mistake), mistake) & eighthMask;
}

unsigned Replay::roundingClass(unsigned pass, Stage stage, unsigned trellisStep) const
{
    bool complete = true;
    if (stage == Stage::intrinsic && pass > 0 && trellisStep < itsModel.cut.K()) {
        const unsigned from = aprioriStep(codeOf(pass), trellisStep, {});
        const int half = input({pass - 1, signalsOf(Stage::extrinsic).first, from}, complete) / 2;
        const int sum = twiceIntrinsicFromInputs(pass, trellisStep, {}, complete);
        const bool loses = ((half | sum / 2) & ~eighthMask) != 0;
        return !loses ? 0
                      : 1U + ((half & ~eighthMask) != 0 ? 1U : 0U) + ((sum / 2 & ~eighthMask) != 0 ? 2U : 0U) +
                            (half < 0 ? 4U : 0U) + (sum < 0 ? 8U : 0U);
    }
    if (stage == Stage::extrinsic) {
        const int ratio = input({pass, signalsOf(Stage::ratio).first, trellisStep}, complete);
        const int value = wideExtrinsicValue(ratio, twiceIntrinsic(pass, trellisStep, complete).value, {});
        const auto lost = static_cast<unsigned>(value & ~eighthMask);
        const bool isClipped = value < rules::branchSmallest || value > rules::branchLargest;
        return lost == 0 || isClipped ? 0 : lost + (value < 0 ? static_cast<unsigned>(eighth) : 0U);
    }
    return 0;
}

Column Replay::extrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    return fromTwiceIntrinsic(pass, Stage::extrinsic, trellisStep, [&](int twice, bool& complete) {
        const int ratio = input({pass, signalsOf(Stage::ratio).first, trellisStep}, complete);
        return std::array<int, 1>{extrinsicValue(ratio, twice, mistake)};
    });
}

}  // namespace morvik::comparison
