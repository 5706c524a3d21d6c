// Units: the operations of the core as pure functions, one for each unit of the hardware.
#include "Units.h"

#include "Steps.h"
#include "rules/Algorithms.h"
#include "rules/BlockSizes.h"
#include "rules/Interleaver.h"
#include "rules/SoftValues.h"
#include "rules/Starts.h"

namespace morvik::units {

namespace {

using rules::Value;

/// Clears the bits below an eighth (rule 13).
constexpr Value eighthMask = aligned(-1);

/// An aligned word of 32 bits, which does not wrap.
constexpr std::int32_t wide(std::int32_t eighths)
{
    return rules::shiftLeftWrap(eighths, rules::stateAlignment);
}

Metrics masked(const std::array<Value, rules::stateCount>& words)
{
    Metrics metrics{};
    for (std::size_t state = 0; state < metrics.size(); ++state) {
        metrics[state] = eighthsOf(rules::maskBits(words[state], rules::borderMask));
    }
    return metrics;
}

}  // namespace

std::int32_t twiceIntrinsic(std::int32_t apriori, std::int32_t systematic)
{
    return rules::shiftRight(rules::twiceIntrinsicValue(wide(apriori), wide(systematic), eighthMask),
                             rules::stateAlignment);
}

Branches branchMetrics(std::int32_t twiceIntrinsic, std::int32_t parity)
{
    auto sums = rules::branchSums<std::int32_t>(wide(twiceIntrinsic), wide(parity), 0);
    rules::clipBranches(sums, rules::branchSmallest, rules::branchLargest);
    for (std::int32_t& metric : sums) {
        metric = eighthsOf(rules::wrap16(metric));
    }
    return sums;
}

Column forward(int algorithm, const Column& before, const Branches& g)
{
    return advanced(algorithm, before, [&](const auto& rule, const auto& column) {
        return rules::forwardStep(rule, column, wordsOf(g));
    });
}

Column backward(int algorithm, const Column& behind, const Branches& g)
{
    return advanced(algorithm, behind, [&](const auto& rule, const auto& column) {
        return rules::backwardStep(rule, column, wordsOf(g));
    });
}

std::int32_t ratio(int algorithm, const Metrics& alpha, const Metrics& beta, const Branches& g)
{
    return withRule(algorithm, [&](const auto& rule) {
        return eighthsOf(rules::logLikelihoodRatio(rule, wordsOf(alpha), wordsOf(beta), wordsOf(g)));
    });
}

std::int32_t extrinsic(int algorithm, std::int32_t ratio, std::int32_t twiceIntrinsic)
{
    const double scale = rules::extrinsicScale(algorithm);
    // Halves of an eighth are exact in the word of an intrinsic value, so that rounding changes nothing here.
    const Value intrinsic = rules::wrap16(wide(twiceIntrinsic) / 2);
    const Value value =
        rules::extrinsicValue(aligned(ratio), intrinsic, scale, rules::branchSmallest, rules::branchLargest);
    return eighthsOf(rules::maskBits(value, rules::extrinsicMask(scale, eighthMask)));
}

std::uint32_t address(std::uint32_t K, std::uint32_t step)
{
    rules::InterleaverAddress addresses(*rules::findBlockSize(K));
    std::uint32_t position = addresses.next();
    for (std::uint32_t i = 0; i < step; ++i) {
        position = addresses.next();
    }
    return position;
}

Metrics tail(const TailValues& systematic, const TailValues& parity)
{
    rules::Tail<std::int32_t> values{};
    for (std::size_t step = 0; step < systematic.size(); ++step) {
        values.x[step] = wide(systematic[step]);
        values.p[step] = wide(parity[step]);
    }
    const auto sums = rules::tailColumn(values);
    return masked(wordsOf(sums, rules::wrap16));
}

Metrics border(const Metrics& column)
{
    return masked(wordsOf(column));
}

}  // namespace morvik::units
