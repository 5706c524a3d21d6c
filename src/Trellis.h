// Trellis: the constituent code of 3GPP TS 36.212, clause 5.1.3.2.1, and the steps over it.
//
// Everything here is written once, over a value type: a 16-bit word in the kernels of the engine,
// or a vector of such words; a value type offers addWrap, subWrap, maxWrap and select. How a decision
// is made is a policy (TrellisDecision.h):
//   Metric               what a decision yields and the next one takes
//   metric(value)        a metric from a plain value, nothing pending
//   add, subtract        a metric plus or minus a plain value
//   decide(c1, c2)       the decision between two candidates
//   stored(metric)       the value kept in a column
//   settled(metric)      the value of a last decision, nothing left pending
#ifndef MORVIK_TRELLIS_H
#define MORVIK_TRELLIS_H

#include <array>

#include "Arithmetic.h"

namespace trellis {

using arithmetic::addWrap;
using arithmetic::subWrap;

constexpr unsigned stateCount = 8;

/// Where the encoder goes from each state on information bit 1: the feedback polynomial is
/// 1 + D^2 + D^3, and the first delay element is the state's most significant bit.
constexpr unsigned successorOfOne[stateCount] = {4, 0, 1, 5, 6, 2, 3, 7};

/// The state after `bit`. The other bit complements what enters the first delay element.
constexpr unsigned successor(unsigned state, unsigned bit)
{
    return bit != 0 ? successorOfOne[state] : successorOfOne[state] ^ 4U;
}

/// The state from which `bit` leads to `state`.
constexpr unsigned predecessor(unsigned state, unsigned bit)
{
    unsigned from = 0;
    while (successor(from, bit) != state) {
        ++from;
    }
    return from;
}

/// The branch metric of a state's two outgoing branches, counted + for bit 1 and - for bit 0: the
/// parity bit, from the feed-forward polynomial 1 + D + D^3, is the same for both states of a pair.
constexpr unsigned branch(unsigned state)
{
    return state / 2;
}

template <class Value>
using BranchMetrics = std::array<Value, 4>;

template <class Decision>
using Column = std::array<typename Decision::Metric, stateCount>;

/// The four branch metrics of a step before they are clipped: 2 i +- p +- q (rule 5).
template <class Wide>
constexpr BranchMetrics<Wide> branchSums(Wide intrinsic, Wide parity0, Wide parity1)
{
    const Wide i2 = intrinsic + intrinsic;
    return {i2 + parity0 + parity1, i2 - parity0 + parity1, i2 - parity0 - parity1, i2 + parity0 - parity1};
}

/// Forward: the column after a step, each state decided between its two predecessors, the one on bit 1
/// first (rule 6).
template <class Decision, class Value>
constexpr Column<Decision> forwardStep(const Decision& rule, const Column<Decision>& a, const BranchMetrics<Value>& g)
{
    Column<Decision> next{};
    for (unsigned state = 0; state < stateCount; ++state) {
        const unsigned one = predecessor(state, 1);
        const unsigned zero = predecessor(state, 0);
        const Value metric = g[branch(one)];  // the two are a pair
        next[state] = rule.decide(rule.add(a[one], metric), rule.subtract(a[zero], metric));
    }
    return next;
}

/// Backward: the column before a step, each state decided between its two successors, the one on bit 1
/// first (rule 6).
template <class Decision, class Value>
constexpr Column<Decision> backwardStep(const Decision& rule, const Column<Decision>& b, const BranchMetrics<Value>& g)
{
    Column<Decision> previous{};
    for (unsigned state = 0; state < stateCount; ++state) {
        const Value metric = g[branch(state)];
        previous[state] =
            rule.decide(rule.add(b[successor(state, 1)], metric), rule.subtract(b[successor(state, 0)], metric));
    }
    return previous;
}

/// The best metric of all branches with `bit`, as a tree of decisions: the two states of a pair
/// share a branch metric, so they are decided first, the odd one being the first candidate, then
/// pairs, then halves (rule 8).
template <class Decision, class Value>
constexpr Value bestPath(const Decision& rule,
                         unsigned bit,
                         const std::array<Value, stateCount>& a,
                         const std::array<Value, stateCount>& b,
                         const BranchMetrics<Value>& g)
{
    std::array<typename Decision::Metric, 4> pair{};
    for (unsigned i = 0; i < 4; ++i) {
        const unsigned odd = 2 * i + 1;
        const unsigned even = 2 * i;
        const auto best = rule.decide(rule.metric(addWrap(a[odd], b[successor(odd, bit)])),
                                      rule.metric(addWrap(a[even], b[successor(even, bit)])));
        pair[i] = bit != 0 ? rule.add(best, g[i]) : rule.subtract(best, g[i]);
    }
    return rule.settled(rule.decide(rule.decide(pair[0], pair[1]), rule.decide(pair[2], pair[3])));
}

/// The log-likelihood ratio of a step; positive favours bit 1. It wraps like the metrics (rule 8).
template <class Decision, class Value>
constexpr Value logLikelihoodRatio(const Decision& rule,
                                   const std::array<Value, stateCount>& a,
                                   const std::array<Value, stateCount>& b,
                                   const BranchMetrics<Value>& g)
{
    return subWrap(bestPath(rule, 1, a, b, g), bestPath(rule, 0, a, b, g));
}

}  // namespace trellis

#endif
