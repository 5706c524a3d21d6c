// Rules: the two decision rules of the hardware's algorithm types, over lanes.
#ifndef MORVIK_LANES_RULES_H
#define MORVIK_LANES_RULES_H

#include "Machine.h"
#include "Words.h"
#include "rules/Trellis.h"
#include "rules/TrellisDecision.h"

namespace morvik::lanes::MORVIK_LANES {

template <unsigned count>
using StateMetrics = std::array<Eighths<count>, rules::stateCount>;

template <unsigned count>
using BranchMetrics = rules::BranchMetrics<Eighths<count>>;

/// What a recursion keeps of a step's branch metrics: 0 and 1, or what they come to when lifted. The other two repeat
/// them: 2 is 1, and 3 is 0.
template <unsigned count>
using KeptBranches = std::array<Eighths<count>, 2>;

template <unsigned count>
MORVIK_INLINE BranchMetrics<count> plainBranches(const KeptBranches<count>& kept)
{
    return {kept[0], kept[1], kept[1], kept[0]};
}

/// What is added to a metric on bit 1 and on bit 0 if the step's branch metric 0 is added on every branch. That lifts
/// all metrics alike, which changes neither a decision nor a ratio, and leaves nothing to add on bit 0 to those whose
/// branch metric is 0 or 3: twelve additions in a step of a recursion instead of sixteen.
template <unsigned count>
struct LiftedBranch {
    Eighths<count> one;
    Eighths<count> zero;
};

/// Twice branch metric 0, and the sum of 0 and 1: what is added on bit 1.
template <unsigned count>
MORVIK_INLINE KeptBranches<count> lifted(const BranchMetrics<count>& g)
{
    return {g[0] + g[0], g[0] + g[1]};
}

template <unsigned count>
MORVIK_INLINE rules::BranchMetrics<LiftedBranch<count>> liftedBranches(const KeptBranches<count>& kept)
{
    const LiftedBranch<count> outer = {kept[0], {}};
    const LiftedBranch<count> inner = {kept[1], kept[0] - kept[1]};
    return {outer, inner, inner, outer};
}

/// The greater candidate, with branch metrics as they are or lifted.
template <unsigned count>
struct DecideGreatest : rules::DecideMax<Eighths<count>> {
    using Plain = rules::DecideMax<Eighths<count>>;
    using Plain::add;
    using Plain::subtract;

    static MORVIK_INLINE Eighths<count> add(Eighths<count> m, const LiftedBranch<count>& g)
    {
        return m + g.one;
    }

    /// On bit 0.
    static MORVIK_INLINE Eighths<count> subtract(Eighths<count> m, const LiftedBranch<count>& g)
    {
        return m + g.zero;
    }
};

/// "MOD": max-log-MAP.
template <unsigned countOfLanes>
struct Greatest {
    static constexpr unsigned count = countOfLanes;
    using Decision = DecideGreatest<count>;
    static constexpr bool corrects = false;

    explicit MORVIK_INLINE Greatest(const std::uint8_t*) {}

    MORVIK_INLINE Decision decision() const
    {
        return {};
    }

    /// Moves b a step back and returns the step's ratio; a[state] is a forward metric before it. The maximum depends
    /// neither on the order of comparison nor on when the branch metric is added, so the candidates of the backward
    /// recursion are reused, pair by pair.
    template <class Stored, class Branch>
    MORVIK_INLINE Eighths<count> stepBack(const Stored& a,
                                          rules::Column<Decision>& b,
                                          const rules::BranchMetrics<Branch>& g) const
    {
        Eighths<count> one{};
        Eighths<count> zero{};
        b = rules::backwardStep(decision(), b, g, [&](auto pair, const auto& c) MORVIK_INLINE_LAMBDA {
            const Eighths<count> even = a[2 * pair];
            const Eighths<count> odd = a[2 * pair + 1];
            const Eighths<count> bestOne = max(even + c.one[0], odd + c.one[1]);
            const Eighths<count> bestZero = max(even + c.zero[0], odd + c.zero[1]);
            one = pair == 0 ? bestOne : max(one, bestOne);
            zero = pair == 0 ? bestZero : max(zero, bestZero);
        });
        return one - zero;
    }
};

/// "MOD#": max-log-MAP with a correction one stage late.
template <unsigned countOfLanes>
struct Corrected {
    static constexpr unsigned count = countOfLanes;
    using Corrections = Machine::Corrections<count>;
    using Decision = rules::DecideMaxHash<Eighths<count>, Corrections>;
    static constexpr bool corrects = true;
    Corrections corrections;

    explicit MORVIK_INLINE Corrected(const std::uint8_t* table) : corrections(table) {}

    MORVIK_INLINE Decision decision() const
    {
        return Decision(corrections);
    }

    /// Moves b a step back and returns the step's ratio, as above. The states of a pair share their branch metric,
    /// which changes neither their difference nor the winner, so the candidates of the backward recursion are reused
    /// here, too.
    template <class Stored>
    MORVIK_INLINE Eighths<count> stepBack(const Stored& a,
                                          rules::Column<Decision>& b,
                                          const BranchMetrics<count>& g) const
    {
        const Decision rule = decision();
        Best one;
        Best zero;
        b = rules::backwardStep(rule, b, g, [&](auto pair, const auto& c) MORVIK_INLINE_LAMBDA {
            const Eighths<count> even = a[2 * pair];
            const Eighths<count> odd = a[2 * pair + 1];
            one.template take<pair>(rule, rule.decide(odd + c.one[1].value, even + c.one[0].value));
            zero.template take<pair>(rule, rule.decide(odd + c.zero[1].value, even + c.zero[0].value));
        });
        return rule.settled(one.half[0]) - rule.settled(zero.half[0]);
    }

private:
    using Metric = typename Decision::Metric;

    /// The decisions between pairs, each as soon as both are there, so that few values are alive.
    struct Best {
        Metric half[2] = {};

        template <unsigned pair>
        MORVIK_INLINE void take(const Decision& rule, const Metric& best)
        {
            if constexpr (pair % 2 == 0) {
                half[pair / 2] = best;
            } else {
                half[pair / 2] = rule.decide(half[pair / 2], best);
            }
            if constexpr (pair == 3) {
                half[0] = rule.decide(half[0], half[1]);
            }
        }
    };
};

}  // namespace morvik::lanes::MORVIK_LANES

#endif
