// StatePass: one soft-in/soft-out pass over a block of a single segment, which would leave all lanes but one idle.
#ifndef MORVIK_LANES_STATEPASS_H
#define MORVIK_LANES_STATEPASS_H

#include <cstddef>
#include <utility>

#include "Bounds.h"
#include "Extrinsics.h"
#include "Rules.h"
#include "Transpose.h"
#include "Words.h"
#include "Workspace.h"
#include "rules/Trellis.h"
#include "rules/TrellisDecision.h"

namespace morvik::lanes::MORVIK_LANES {

/// Runs a pass over slices of one lane. In its recursions, a vector holds the eight states of a column; all else runs
/// over eight steps at a time. A window takes eight steps or more. The segment has no neighbours, so that its borders
/// are the block's own, which never change.
template <template <unsigned> class RuleOf, Extrinsic extrinsic>
class StatePass {
    static constexpr unsigned states = rules::stateCount;
    static constexpr unsigned eight = Tile<1>::size;
    using Value = Eighths<states>;
    using Rule = RuleOf<states>;
    using Decision = typename Rule::Decision;
    using Metric = typename Decision::Metric;
    using States = std::make_integer_sequence<unsigned, states>;

    /// The arrays of a window, one after another, each with room for the longest: the columns before its steps, those
    /// after them, four branch metrics of each step, and the joint values.
    static constexpr unsigned slotsAfter = longestWindow * states;
    static constexpr unsigned slotsBranches = slotsAfter + longestWindow * states;
    static constexpr unsigned slotsJoint = slotsBranches + longestWindow * 4;
    static constexpr unsigned slotsWords = slotsJoint + longestWindow;

public:
    /// Memory needed in the workspace for a step of a window.
    static constexpr unsigned slotBytes = 2 * slotsWords / longestWindow;

    MORVIK_INLINE StatePass(const Workspace& workspace, const HalfIteration& half)
        : w(workspace),
          itsConstituent(workspace.constituent[half.d]),
          itsSource(half.joint),
          itsRatios(half.isLast ? w.ratios : nullptr),
          itsBefore(w.slots),
          itsAfter(w.slots + slotsAfter),
          itsBranches(w.slots + slotsBranches),
          itsSlotJoint(w.slots + slotsJoint),
          itsRule(workspace.corrections)
    {
    }

    MORVIK_INLINE void run() const
    {
        Metric a = Decision::metric(Value::load(itsConstituent.alphaStart));
        for (unsigned r = 0; r < w.windows; ++r) {
            const unsigned from = w.windowStart[r];
            const unsigned length = w.windowStart[r + 1] - from;
            std::int16_t* const start = itsConstituent.betaStart + r * states;
            Metric b = Decision::metric(Value::load(start));
            gather(from, length);
            branches(from, length);
            recursions(length, a, b);
            a = broughtBack(a);
            if (r > 0) {
                (Decision::stored(broughtBack(b)) & Value::of(borderMask)).store(start - states);
            }
            results(from, length);
        }
    }

private:
    MORVIK_INLINE void gather(unsigned from, unsigned length) const
    {
        const std::uint32_t* const sources = itsConstituent.interleaver.sources + from;
        for (std::size_t i = 0; i < length; ++i) {
            itsSlotJoint[i] = itsSource[sources[i]];
        }
    }

    MORVIK_INLINE BranchMetrics<eight> branchesOf(unsigned from, unsigned k) const
    {
        return branchMetrics(Value::loadAnywhere(itsSlotJoint + k),
                             Value::loadAnywhere(itsConstituent.parity + from + k));
    }

    /// Stores the branch metrics of each step side by side, in their order.
    MORVIK_INLINE void branches(unsigned from, unsigned length) const
    {
        byEight(length, [&](unsigned k) MORVIK_INLINE_LAMBDA {
            const BranchMetrics<eight> g = branchesOf(from, k);
            rules::forEach<eight / 2>([&](auto pair) MORVIK_INLINE_LAMBDA {
                constexpr int i = 2 * static_cast<int>(pair);
                constexpr int j = i + static_cast<int>(eight);
                const auto order = std::integer_sequence<int, i, j, j, i, i + 1, j + 1, j + 1, i + 1>{};
                lanesOf(g[0], g[1], order).storeAnywhere(itsBranches + (k + i) * 4);
            });
        });
    }

    /// Both recursions of a window at once: their chains of decisions are independent.
    MORVIK_INLINE void recursions(unsigned length, Metric& a, Metric& b) const
    {
        for (std::size_t i = 0; i < length; ++i) {
            const std::size_t j = length - 1 - i;
            Decision::stored(a).store(itsBefore + i * states);
            Decision::stored(b).store(itsAfter + j * states);
            a = forwardStep(a, Value::twice(itsBranches + i * 4), States{});
            b = backwardStep(b, Value::twice(itsBranches + j * 4), States{});
        }
    }

    /// The states 0 to 3 and 4 to 7 are entered by branches with the metrics 0 to 3.
    template <unsigned... state>
    MORVIK_INLINE Metric forwardStep(const Metric& a, Value g, std::integer_sequence<unsigned, state...>) const
    {
        static_assert(((rules::branch(rules::predecessor(state, 1)) == state % 4) && ...));
        const Decision rule = itsRule.decision();
        return rule.decide(rule.add(permuted<rules::predecessor(state, 1)...>(a), g),
                           rule.subtract(permuted<rules::predecessor(state, 0)...>(a), g));
    }

    template <unsigned... state>
    MORVIK_INLINE Metric backwardStep(const Metric& b, Value g, std::integer_sequence<unsigned, state...>) const
    {
        const Decision rule = itsRule.decision();
        const Value left = permuted<rules::branch(state)...>(g);
        return rule.decide(rule.add(permuted<rules::successor(state, 1)...>(b), left),
                           rule.subtract(permuted<rules::successor(state, 0)...>(b), left));
    }

    MORVIK_INLINE void results(unsigned from, unsigned length) const
    {
        const Decision rule = itsRule.decision();
        byEight(length, [&](unsigned k) MORVIK_INLINE_LAMBDA {
            const Value ratio = rules::logLikelihoodRatio(
                rule, columns(itsBefore + k * states), columns(itsAfter + k * states), branchesOf(from, k));
            if (itsRatios != nullptr) {
                ratio.storeAnywhere(itsRatios + from + k);
            }
            nextJoint<extrinsic>(
                ratio, Value::loadAnywhere(itsSlotJoint + k), Value::loadAnywhere(itsConstituent.systematic + from + k))
                .storeAnywhere(itsConstituent.joint + from + k);
        });
    }

    /// Returns the metrics of each state in eight steps.
    static MORVIK_INLINE StateMetrics<eight> columns(const std::int16_t* slots)
    {
        Tile<1> tile;
        for (unsigned i = 0; i < eight; ++i) {
            tile[i] = Value::load(slots + i * states).v;
        }
        tile.transpose();
        StateMetrics<eight> metrics{};
        rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA { metrics[state] = {tile[state]}; });
        return metrics;
    }

    /// Normalises a column so that state 0 is near 0, which changes no border column (Bounds.h).
    static MORVIK_INLINE Metric broughtBack(const Metric& m)
    {
        const Value level = permuted<0, 0, 0, 0, 0, 0, 0, 0>(Decision::stored(m));
        return Decision::subtract(m, level & Value::of(borderMask));
    }

    template <unsigned... lane>
    static MORVIK_INLINE Value permuted(Value a)
    {
        return lanesOf(a, a, std::integer_sequence<int, static_cast<int>(lane)...>{});
    }

    template <unsigned... lane>
    static MORVIK_INLINE rules::PendingMetric<Value> permuted(const rules::PendingMetric<Value>& m)
    {
        return {permuted<lane...>(m.value), permuted<lane...>(m.pending)};
    }

    const Workspace& w;
    const Constituent& itsConstituent;
    const std::int16_t* const itsSource;  ///< joint values of the other decoder
    std::int16_t* const itsRatios;        ///< null if they are dropped
    std::int16_t* const itsBefore;
    std::int16_t* const itsAfter;
    std::int16_t* const itsBranches;
    std::int16_t* const itsSlotJoint;
    const Rule itsRule;
};

template <template <unsigned> class RuleOf, Extrinsic extrinsic>
MORVIK_INLINE_CALLS void runPass(const Workspace& workspace, const HalfIteration& half)
{
    StatePass<RuleOf, extrinsic>(workspace, half).run();
}

}  // namespace morvik::lanes::MORVIK_LANES

#endif
