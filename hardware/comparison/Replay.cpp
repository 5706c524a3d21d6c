// Replay: single operations of the core, repeated on the values of a dump: soft values and branch metrics.
#include "Replay.h"

#include <cstddef>

#include "AlignedWords.h"
#include "rules/Algorithms.h"
#include "rules/SoftValues.h"
#include "rules/Trellis.h"

namespace morvik::comparison {

namespace {

/// A branch metric or extrinsic value, an aligned word, narrowed to eight bits (rules 5 and 14).
int narrowedBy(int value, Mistake mistake)
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

/// Twice the intrinsic value as it counts under the mistake.
int counted(int twice, Mistake mistake)
{
    if (mistake == Mistake::intrinsicTimes) {
        return mistake.number < 0 ? twice / (1 << -mistake.number) : twice * (1 << mistake.number);
    }
    return mistake == Mistake::intrinsicMissing ? 0 : twice;
}

/// The address under an error; nothing if the error leaves it open.
std::optional<unsigned> erroneous(const rules::Cut& cut, unsigned address, AddressError error)
{
    const rules::Window window = cut.windowAt(address);
    const unsigned start = error.range == AddressError::block     ? 0
                           : error.range == AddressError::segment ? window.segment * cut.segmentLength()
                                                                  : window.first;
    const unsigned end = error.range == AddressError::block     ? cut.K()
                         : error.range == AddressError::segment ? start + cut.segmentLength()
                                                                : window.last + 1;
    const auto within = [end](unsigned step) {
        return step < end ? std::optional(step) : std::nullopt;
    };
    const unsigned bit = 1U << (error.number & 31U);
    const unsigned low = start + ((address - start) & ~bit);
    const unsigned high = start + ((address - start) | bit);
    switch (error.kind) {
    case AddressError::none:
        break;
    case AddressError::before:
        return address > start ? std::optional(address - 1) : std::nullopt;
    case AddressError::behind:
        return within(address + 1);
    case AddressError::stuckLow:
        return low;
    case AddressError::stuckHigh:
        return within(high);
    case AddressError::held:
        return error.number;
    }
    return address;
}

}  // namespace

Replay::Replay(const Model& model, const Values& dump) : itsModel(model), itsDump(dump) {}

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

std::int16_t Replay::input(const Place& place, Sources& sources) const
{
    const bool inDump = itsDump.has(place);
    sources.complete = sources.complete && inDump;
    return rules::wrap16((inDump ? itsDump : itsModel.values).at(place) * eighth);
}

template <class Aligned>
Aligned Replay::inputs(unsigned pass, Stage stage, unsigned trellisStep, Sources& sources) const
{
    Aligned words{};
    for (unsigned i = 0; i < words.size(); ++i) {
        words[i] = input({pass, signalsOf(stage).first + i, trellisStep}, sources);
    }
    return words;
}

Replay::Metrics Replay::metrics(unsigned pass, Stage stage, unsigned trellisStep, Sources& sources) const
{
    return inputs<Metrics>(pass, stage, trellisStep, sources);
}

Replay::Branches Replay::branches(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const
{
    return inputs<Branches>(
        pass, Stage::branch, addressed(trellisStep, mistake, Mistake::branchMisread, sources), sources);
}

const Code& Replay::codeUsed(unsigned pass, Mistake mistake) const
{
    const unsigned code = codeOf(pass);
    return itsModel.codes[mistake == Mistake::otherCodeFirst ? 1 - code : code];
}

unsigned Replay::addressed(unsigned trellisStep, Mistake mistake, Mistake::Kind misread, Sources& sources) const
{
    if (mistake != misread || trellisStep >= itsModel.cut.K()) {
        return trellisStep;
    }
    const auto step = erroneous(itsModel.cut, trellisStep, mistake.address);
    sources.open = sources.open || !step;
    return step.value_or(trellisStep);
}

unsigned Replay::aprioriStep(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const
{
    const unsigned K = itsModel.cut.K();
    const auto& order = codeUsed(pass, mistake).order;
    switch (mistake.kind) {
    case Mistake::aprioriUnpermuted:
        return trellisStep;
    case Mistake::aprioriInverse:
        return itsModel.codes[1 - codeOf(pass)].order[trellisStep];
    case Mistake::aprioriBefore:
        return order[(trellisStep + K - 1) % K];
    case Mistake::aprioriBehind:
        return order[(trellisStep + 1) % K];
    case Mistake::aprioriMisreadByBit: {
        const bool isNatural = codeOf(pass) == 0;
        const unsigned bit = isNatural ? trellisStep : order[trellisStep];
        const unsigned read = addressed(bit, mistake, Mistake::aprioriMisreadByBit, sources);
        return isNatural ? order[read] : read;
    }
    default:
        return addressed(order[trellisStep], mistake, Mistake::aprioriMisread, sources);
    }
}

int Replay::aprioriValue(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const
{
    const unsigned back = mistake == Mistake::aprioriOfPassBefore ? 2 : 1;
    if (trellisStep >= itsModel.cut.K() || pass < back || mistake == Mistake::aprioriMissing) {
        return 0;
    }
    if (mistake == Mistake::aprioriStuck) {
        return mistake.number * eighth;
    }
    const unsigned from = aprioriStep(pass, trellisStep, mistake, sources);
    const int value = input({pass - back, signalsOf(Stage::extrinsic).first, from}, sources);
    return mistake == Mistake::aprioriWhole ? 2 * value : mistake == Mistake::aprioriQuartered ? value / 2 : value;
}

int Replay::systematicValue(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const
{
    if (mistake == Mistake::systematicMissing) {
        return 0;
    }
    if (trellisStep >= itsModel.cut.K()) {
        return tailValues(pass, mistake)[std::size_t{2} * (trellisStep - itsModel.cut.K())];
    }
    const Code& code =
        mistake == Mistake::systematicUnpermuted ? itsModel.codes[1 - codeOf(pass)] : codeUsed(pass, mistake);
    return code.systematic[addressed(trellisStep, mistake, Mistake::systematicMisread, sources)];
}

int Replay::twiceIntrinsicFromInputs(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const
{
    const int mask = mistake == Mistake::aprioriMask ? -(1 << mistake.number) : eighthMask;
    const int apriori = aprioriValue(pass, trellisStep, mistake, sources);
    const int sum = rules::twiceIntrinsicValue(apriori, systematicValue(pass, trellisStep, mistake, sources), mask);
    return mistake == Mistake::intrinsicWrapped   ? cutTo(sum, mistake.number)
           : mistake == Mistake::intrinsicClipped ? clippedTo(sum, mistake.number)
           : mistake == Mistake::intrinsicCut     ? sum & ~eighth
                                                  : sum;
}

Replay::TwiceIntrinsic Replay::twiceIntrinsic(unsigned pass,
                                              unsigned trellisStep,
                                              Mistake mistake,
                                              Sources& sources) const
{
    // A dump lacks the bit below an eighth. If the hardware's intrinsic value does not follow from the inputs, this bit
    // may differ from theirs; values computed from it then decide.
    const int kept = input({pass, signalsOf(Stage::intrinsic).first, trellisStep}, sources);
    // The register is right under all mistakes in what is computed from it but one.
    const Mistake inRegister = mistake == Mistake::otherCodeFirst ? mistake : Mistake();
    Sources ofInputs;
    const int computed = twiceIntrinsicFromInputs(pass, trellisStep, inRegister, ofInputs);
    const bool isComputed = ((computed / 2) & eighthMask) == kept;
    const int likely = isComputed ? computed : 2 * kept;
    const int other = likely ^ eighth;
    const bool isOther = !givesWhatFollows(pass, trellisStep, likely, inRegister) &&
                         givesWhatFollows(pass, trellisStep, other, inRegister);
    return {isOther ? other : likely, isOther && isComputed, isComputed && ofInputs.complete};
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
Column Replay::fromTwiceIntrinsic(
    unsigned pass, Stage stage, unsigned trellisStep, Mistake mistake, Compute compute) const
{
    Sources sources;
    const unsigned from = addressed(trellisStep, mistake, Mistake::intrinsicMisread, sources);
    const TwiceIntrinsic twice =
        changesIntrinsic(mistake) ? TwiceIntrinsic{twiceIntrinsicFromInputs(pass, from, mistake, sources), false, true}
                                  : twiceIntrinsic(pass, from, mistake, sources);
    sources.inferred = twice.isInferred;
    const auto likely = compute(twice.value, sources);
    const Column column = inEighths(likely, sources);
    if (twice.isSure || isInDump(pass, stage, trellisStep, column)) {
        return column;
    }
    const auto unlikely = compute(twice.value ^ eighth, sources);
    const Column other = inEighths(unlikely, sources);
    return isInDump(pass, stage, trellisStep, other) ? other : column;
}

bool Replay::givesWhatFollows(unsigned pass, unsigned trellisStep, int twice, Mistake mistake) const
{
    if (trellisStep >= itsModel.cut.K()) {
        return true;
    }
    Sources sources;
    const Branches kept = branches(pass, trellisStep, {}, sources);
    const int ratio = input({pass, signalsOf(Stage::ratio).first, trellisStep}, sources);
    const int extrinsic = input({pass, signalsOf(Stage::extrinsic).first, trellisStep}, sources);
    return sources.complete && branchMetrics(pass, trellisStep, twice, mistake, sources) == kept &&
           extrinsicValue(ratio, twice, {}) == extrinsic;
}

Column Replay::intrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    Sources sources;
    const int twice = counted(twiceIntrinsicFromInputs(pass, trellisStep, mistake, sources), mistake);
    return inEighths(std::array<int, 1>{twice / 2}, sources);
}

Replay::Branches Replay::branchMetrics(
    unsigned pass, unsigned trellisStep, int twice, Mistake mistake, Sources& sources) const
{
    const Code& code =
        mistake == Mistake::parityOfOtherCode ? itsModel.codes[1 - codeOf(pass)] : codeUsed(pass, mistake);
    int parity = code.parity[addressed(trellisStep, mistake, Mistake::parityMisread, sources)];
    if (mistake == Mistake::parityNegated) {
        parity = -parity;
    } else if (mistake == Mistake::parityMissing) {
        parity = 0;
    }
    twice = mistake == Mistake::doubledWrapped   ? cutTo(twice, mistake.number)
            : mistake == Mistake::doubledClipped ? clippedTo(twice, mistake.number)
                                                 : counted(twice, mistake);
    Branches metrics{};
    auto sums = rules::branchSums(twice, parity, 0);
    if (mistake == Mistake::negationWrapped) {
        sums[1] = sums[2] = twice + cutTo(-parity, int{rules::inputBits});
    }
    for (std::size_t i = 0; i < sums.size(); ++i) {
        metrics[i] = rules::wrap16(narrowedBy(sums[i], mistake));
    }
    return metrics;
}

Column Replay::branchColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    return fromTwiceIntrinsic(pass, Stage::branch, trellisStep, mistake, [&](int twice, Sources& sources) {
        return branchMetrics(pass, trellisStep, twice, mistake, sources);
    });
}

Replay::Branches Replay::branchesOfRatio(unsigned pass, unsigned trellisStep, Mistake mistake, Sources& sources) const
{
    if (mistake == Mistake::branchMissing) {
        return {};
    }
    if (changesIntrinsic(mistake) || mistake == Mistake::intrinsicMissing) {
        const int twice = twiceIntrinsicFromInputs(pass, trellisStep, mistake, sources);
        return branchMetrics(pass, trellisStep, twice, mistake, sources);
    }
    return branches(pass, trellisStep, mistake, sources);
}

int Replay::wideExtrinsicValue(int ratio, int twice, Mistake mistake) const
{
    const bool isScaled = rules::extrinsicScale(itsModel.generics.C_ALGORITHM_TYPE) != 1;
    const int factor = mistake == Mistake::scaledBy ? mistake.number
                       : isScaled                   ? factorUnits * rules::scaleNumerator / (1 << rules::scaleBits)
                                                    : factorUnits;
    const int difference = ratio - 2 * counted(twice, mistake);
    const int value = mistake == Mistake::clippedBeforeScale   ? clippedTo(difference, mistake.number)
                      : mistake == Mistake::wrappedBeforeScale ? cutTo(difference, mistake.number)
                                                               : difference;
    return factor * value / factorUnits;
}

int Replay::extrinsicValue(int ratio, int twice, Mistake mistake) const
{
    return narrowedBy(wideExtrinsicValue(ratio, twice, mistake), mistake) & eighthMask;
}

unsigned Replay::roundingClass(unsigned pass, Stage stage, unsigned trellisStep) const
{
    Sources sources;
    if (stage == Stage::intrinsic && pass > 0 && trellisStep < itsModel.cut.K()) {
        const int half = aprioriValue(pass, trellisStep, {}, sources) / 2;
        const int sum = twiceIntrinsicFromInputs(pass, trellisStep, {}, sources);
        const bool loses = ((half | sum / 2) & ~eighthMask) != 0;
        return !loses ? 0
                      : 1U + ((half & ~eighthMask) != 0 ? 1U : 0U) + ((sum / 2 & ~eighthMask) != 0 ? 2U : 0U) +
                            (half < 0 ? 4U : 0U) + (sum < 0 ? 8U : 0U);
    }
    if (stage == Stage::extrinsic) {
        const int ratio = input({pass, signalsOf(Stage::ratio).first, trellisStep}, sources);
        const int value = wideExtrinsicValue(ratio, twiceIntrinsic(pass, trellisStep, {}, sources).value, {});
        const auto lost = static_cast<unsigned>(value & ~eighthMask);
        const bool isClipped = value < rules::branchSmallest || value > rules::branchLargest;
        return lost == 0 || isClipped ? 0 : lost + (value < 0 ? static_cast<unsigned>(eighth) : 0U);
    }
    return 0;
}

Column Replay::extrinsicColumn(unsigned pass, unsigned trellisStep, Mistake mistake) const
{
    return fromTwiceIntrinsic(pass, Stage::extrinsic, trellisStep, mistake, [&](int twice, Sources& sources) {
        const unsigned from = addressed(trellisStep, mistake, Mistake::ratioMisread, sources);
        const int ratio = input({pass, signalsOf(Stage::ratio).first, from}, sources);
        return std::array<int, 1>{extrinsicValue(ratio, twice, mistake)};
    });
}

}  // namespace morvik::comparison
