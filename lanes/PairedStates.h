// PairedStates: the forward recursion over half as many lanes as a vector has, with two states in each vector.
#ifndef MORVIK_LANES_PAIREDSTATES_H
#define MORVIK_LANES_PAIREDSTATES_H

#include <array>
#include <utility>

#include "Rules.h"
#include "Words.h"
#include "rules/Trellis.h"
#include "rules/TrellisDecision.h"

namespace morvik::lanes::MORVIK_LANES {

/// A column of `count` lanes, in four vectors of two states each. A state's place, counted in halves of vectors, is its
/// number with the three bits rotated left, once for each step since the window began. A step shifts the bits of a
/// state by one the other way, so most decisions find their candidates in place: of three steps, one swaps the halves
/// of four vectors, and one exchanges halves between vectors.
template <template <unsigned> class RuleOf, unsigned count>
class PairedStates {
    static constexpr unsigned states = rules::stateCount;
    static constexpr unsigned pairs = states / 2;
    using Value = Eighths<2 * count>;
    using Rule = RuleOf<2 * count>;
    using Decision = typename Rule::Decision;
    using Metric = typename Decision::Metric;
    using Column = rules::Column<typename RuleOf<count>::Decision>;

public:
    /// Steps after which all states are back in their places.
    static constexpr unsigned turn = 3;

    /// The place of a state's metric after `steps` steps.
    static constexpr unsigned place(unsigned state, unsigned steps)
    {
        return (state << steps % turn | state >> (turn - steps % turn)) % states;
    }

    explicit MORVIK_INLINE PairedStates(const Column& a)
    {
        rules::forEach<pairs>([&](auto i) MORVIK_INLINE_LAMBDA { itsPairs[i] = joined(a[2 * i], a[2 * i + 1]); });
    }

    /// Returns the column, after `steps` steps.
    MORVIK_INLINE Column column(unsigned steps) const
    {
        switch (steps % turn) {
        case 0:
            return columnAfter<0>();
        case 1:
            return columnAfter<1>();
        default:
            return columnAfter<2>();
        }
    }

    /// Stores the metrics by their places.
    MORVIK_INLINE void store(std::int16_t* metrics) const
    {
        rules::forEach<pairs>(
            [&](auto i) MORVIK_INLINE_LAMBDA { Decision::stored(itsPairs[i]).store(metrics + 2 * i * count); });
    }

    /// Takes the step after `steps` others. `g` holds the branch metrics 0 and 1; 3 repeats 0, and 2 repeats 1.
    template <unsigned steps>
    MORVIK_INLINE void step(const Decision& rule, Value g)
    {
        std::array<Metric, pairs> next{};
        rules::forEach<pairs>([&](auto i) MORVIK_INLINE_LAMBDA {
            constexpr unsigned x = stateAt(2 * i, steps + 1);
            constexpr unsigned y = stateAt(2 * i + 1, steps + 1);
            constexpr unsigned oneToX = rules::predecessor(x, 1);
            constexpr unsigned oneToY = rules::predecessor(y, 1);
            const Value branches = halves<metric(oneToX), metric(oneToY)>(g, g);
            next[i] = rule.decide(
                rule.add(ofStates<oneToX, oneToY, steps>(), branches),
                rule.subtract(ofStates<rules::predecessor(x, 0), rules::predecessor(y, 0), steps>(), branches));
        });
        itsPairs = next;
    }

private:
    template <unsigned steps>
    MORVIK_INLINE Column columnAfter() const
    {
        Column a{};
        rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA {
            constexpr unsigned at = place(state, steps);
            a[state] = half<at % 2>(itsPairs[at / 2]);
        });
        return a;
    }

    static constexpr unsigned stateAt(unsigned at, unsigned steps)
    {
        return place(at, turn - steps % turn);
    }

    /// The half of `g` with the metric of the branches that leave a state.
    static constexpr unsigned metric(unsigned state)
    {
        return rules::branch(state) % 3 == 0 ? 0 : 1;
    }

    template <unsigned x, unsigned y, unsigned steps>
    MORVIK_INLINE Metric ofStates() const
    {
        constexpr unsigned first = place(x, steps);
        constexpr unsigned second = place(y, steps);
        return halves<first % 2, second % 2>(itsPairs[first / 2], itsPairs[second / 2]);
    }

    template <unsigned i, unsigned j>
    static MORVIK_INLINE Value halves(Value a, Value b)
    {
        return Machine::halves<i, j>(a, b);
    }

    template <unsigned i, unsigned j>
    static MORVIK_INLINE rules::PendingMetric<Value> halves(const rules::PendingMetric<Value>& a,
                                                            const rules::PendingMetric<Value>& b)
    {
        return {halves<i, j>(a.value, b.value), halves<i, j>(a.pending, b.pending)};
    }

    static MORVIK_INLINE Value joined(Eighths<count> a, Eighths<count> b)
    {
        return join(a, b);
    }

    static MORVIK_INLINE rules::PendingMetric<Value> joined(const rules::PendingMetric<Eighths<count>>& a,
                                                            const rules::PendingMetric<Eighths<count>>& b)
    {
        return {join(a.value, b.value), join(a.pending, b.pending)};
    }

    template <unsigned i>
    static MORVIK_INLINE Eighths<count> half(Value m)
    {
        return part<count, i>(m);
    }

    template <unsigned i>
    static MORVIK_INLINE rules::PendingMetric<Eighths<count>> half(const rules::PendingMetric<Value>& m)
    {
        return {part<count, i>(m.value), part<count, i>(m.pending)};
    }

    std::array<Metric, pairs> itsPairs{};
};

}  // namespace morvik::lanes::MORVIK_LANES

#endif
