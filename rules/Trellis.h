// Trellis: the constituent code of 3GPP TS 36.212, clause 5.1.3.2.1, and the steps over it.
//
// Everything is templated on a value type: a 16-bit word in the engine's kernels, or a vector of such words. A value
// type offers addWrap, subWrap, maxWrap and select. Decisions are a policy (TrellisDecision.h):
//   Metric               the result of a decision and the operand of the next
//   metric(value)        a metric from a plain value, nothing pending
//   add, subtract        a metric plus or minus a plain value
//   decide(c1, c2)       the decision between two candidates
//   stored(metric)       the value stored in a column
//   settled(metric)      the value after the last decision, pending corrections included
#ifndef MORVIK_RULES_TRELLIS_H
#define MORVIK_RULES_TRELLIS_H

#include <array>
#include <type_traits>
#include <utility>

#include "rules/Arithmetic.h"

namespace morvik::rules {

constexpr unsigned stateCount = 8;

/// The next state of each state on information bit 1. The feedback polynomial is 1 + D^2 + D^3; the
/// first delay element is the state's most significant bit.
constexpr unsigned successorOfOne[stateCount] = {4, 0, 1, 5, 6, 2, 3, 7};

/// The state after `bit`. Bit 0 complements the input of the first delay element.
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

/// The index of the branch metric of a state's outgoing branches, added for bit 1 and subtracted for bit 0. The
/// parity bit, from the feed-forward polynomial 1 + D + D^3, is the same for both states of a pair.
constexpr unsigned branch(unsigned state)
{
    return state / 2;
}

template <class Step, unsigned... index>
MORVIK_INLINE constexpr void unrolled([[maybe_unused]] Step step, std::integer_sequence<unsigned, index...>)
{
    (step(std::integral_constant<unsigned, index>{}), ...);
}

/// Calls step(0) to step(count - 1) with constant indices, so that columns stay in registers.
template <unsigned count, class Step>
MORVIK_INLINE constexpr void forEach([[maybe_unused]] Step step)
{
    unrolled(step, std::make_integer_sequence<unsigned, count>{});
}

template <class Value>
using BranchMetrics = std::array<Value, 4>;

template <class Decision>
using Column = std::array<typename Decision::Metric, stateCount>;

/// The four branch metrics of a step before clipping: 2 i +- p +- q (rule 5).
template <class Wide>
MORVIK_INLINE constexpr BranchMetrics<Wide> branchSums(Wide twiceIntrinsic, Wide parity0, Wide parity1)
{
    return {twiceIntrinsic + parity0 + parity1,
            twiceIntrinsic - parity0 + parity1,
            twiceIntrinsic - parity0 - parity1,
            twiceIntrinsic + parity0 - parity1};
}

/// Clips branch sums to the branch format's limits; the tail's are not clipped (rules 5 and 12).
template <class Wide>
MORVIK_INLINE constexpr void clipBranches(BranchMetrics<Wide>& sums, int lo, int hi)
{
    for (Wide& metric : sums) {
        metric = clip(metric, lo, hi);
    }
}

/// Returns the column after a step; each state decides between its two predecessors, the one on bit 1
/// first (rule 6).
template <class Decision, class Value>
MORVIK_INLINE constexpr Column<Decision> forwardStep(const Decision& rule,
                                                     const Column<Decision>& a,
                                                     const BranchMetrics<Value>& g)
{
    Column<Decision> next{};
    forEach<stateCount>([&](auto state) MORVIK_INLINE_LAMBDA {
        constexpr unsigned one = predecessor(state, 1);
        constexpr unsigned zero = predecessor(state, 0);
        constexpr unsigned pair = branch(one);  // the same for both
        next[state] = rule.decide(rule.add(a[one], g[pair]), rule.subtract(a[zero], g[pair]));
    });
    return next;
}

/// The metrics of the branches that leave the two states of a pair, the even state's first, including the backward
/// metric of the next state.
template <class Decision>
struct Candidates {
    typename Decision::Metric one[2];   ///< on bit 1
    typename Decision::Metric zero[2];  ///< on bit 0
};

template <unsigned pair, class Decision, class Value>
MORVIK_INLINE constexpr Candidates<Decision> candidates(const Decision& rule, const Column<Decision>& b, Value g)
{
    constexpr unsigned even = 2 * pair;
    constexpr unsigned odd = 2 * pair + 1;
    return {{rule.add(b[successor(even, 1)], g), rule.add(b[successor(odd, 1)], g)},
            {rule.subtract(b[successor(even, 0)], g), rule.subtract(b[successor(odd, 0)], g)}};
}

/// Returns the column before a step; each state decides between its two successors, the one on bit 1
/// first (rule 6). The states of a pair share their successors, so the pair is computed together;
/// use(pair, candidates) receives its candidates.
template <class Decision, class Value, class Use>
MORVIK_INLINE constexpr Column<Decision> backwardStep(const Decision& rule,
                                                      const Column<Decision>& b,
                                                      const BranchMetrics<Value>& g,
                                                      Use use)
{
    Column<Decision> previous{};
    forEach<stateCount / 2>([&](auto pair) MORVIK_INLINE_LAMBDA {
        const Candidates<Decision> c = candidates<pair>(rule, b, g[pair]);
        use(pair, c);
        previous[2 * pair] = rule.decide(c.one[0], c.zero[0]);
        previous[2 * pair + 1] = rule.decide(c.one[1], c.zero[1]);
    });
    return previous;
}

template <class Decision, class Value>
MORVIK_INLINE constexpr Column<Decision> backwardStep(const Decision& rule,
                                                      const Column<Decision>& b,
                                                      const BranchMetrics<Value>& g)
{
    return backwardStep(rule, b, g, [](auto, const Candidates<Decision>&) {});
}

/// The best metric of all branches with `bit`, by a decision tree: first between the states of a pair,
/// which share a branch metric, the odd one as first candidate, then between pairs, then between
/// halves (rule 8).
template <unsigned bit, class Decision, class Value>
MORVIK_INLINE constexpr Value bestPath(const Decision& rule,
                                       const std::array<Value, stateCount>& a,
                                       const std::array<Value, stateCount>& b,
                                       const BranchMetrics<Value>& g)
{
    std::array<typename Decision::Metric, 4> pair{};
    forEach<4>([&](auto i) MORVIK_INLINE_LAMBDA {
        constexpr unsigned odd = 2 * i + 1;
        constexpr unsigned even = 2 * i;
        constexpr unsigned afterOdd = successor(odd, bit);
        constexpr unsigned afterEven = successor(even, bit);
        const auto best =
            rule.decide(rule.metric(addWrap(a[odd], b[afterOdd])), rule.metric(addWrap(a[even], b[afterEven])));
        pair[i] = bit != 0 ? rule.add(best, g[i]) : rule.subtract(best, g[i]);
    });
    // In this order with every compiler, for rules that keep what they meet.
    const auto lower = rule.decide(pair[0], pair[1]);
    const auto upper = rule.decide(pair[2], pair[3]);
    return rule.settled(rule.decide(lower, upper));
}

/// The log-likelihood ratio of a step; positive favours bit 1. Wraps like the metrics (rule 8).
template <class Decision, class Value>
MORVIK_INLINE constexpr Value logLikelihoodRatio(const Decision& rule,
                                                 const std::array<Value, stateCount>& a,
                                                 const std::array<Value, stateCount>& b,
                                                 const BranchMetrics<Value>& g)
{
    return subWrap(bestPath<1>(rule, a, b, g), bestPath<0>(rule, a, b, g));
}

/// Systematic and parity values of the three tail steps.
template <class Wide>
struct Tail {
    Wide x[3];
    Wide p[3];
    Wide q[3];
};

/// The backward metrics before the tail, in closed form: one path leads from each state back to state 0
/// (rule 12). Neither clipped nor wrapped.
template <class Wide>
constexpr std::array<Wide, stateCount> tailColumn(const Tail<Wide>& t)
{
    const Wide e2 = t.x[2] + t.p[2] + t.q[2];
    const Wide e1 = t.x[1] + t.p[1] + t.q[1];
    const Wide f1 = t.x[1] - t.p[1] + t.q[1];
    const auto [g0, g1, g2, g3] = branchSums(t.x[0], t.p[0], t.q[0]);
    return {-e2 - e1 - g0,
            -e2 - e1 + g0,
            -e2 + e1 + g1,
            -e2 + e1 - g1,
            e2 + f1 - g2,
            e2 + f1 + g2,
            e2 - f1 + g3,
            e2 - f1 - g3};
}

}  // namespace morvik::rules

#endif
