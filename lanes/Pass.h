// Pass: one soft-in/soft-out pass of a constituent decoder, in all lanes at once.
#ifndef MORVIK_LANES_PASS_H
#define MORVIK_LANES_PASS_H

#include <cstddef>

#include "Bounds.h"
#include "Extrinsics.h"
#include "Machine.h"
#include "PairedStates.h"
#include "Rules.h"
#include "Words.h"
#include "Workspace.h"
#include "rules/Trellis.h"

namespace morvik::lanes::MORVIK_LANES {

/// Runs a pass over slices of `vectors` vectors of `count` lanes. All lanes work on the same window of their segments.
/// The forward recursion stores its metrics in slots, one for each step; the backward recursion reads them and computes
/// ratios and joint values.
///
/// The backward recursion starts afresh in each window, so `abreast` windows of equal length can run side by side in a
/// wider vector where a vector of `count` lanes would leave part of the machine idle.
template <template <unsigned> class RuleOf, unsigned count, unsigned vectors, unsigned abreast, Extrinsic extrinsic>
class Pass {
    static constexpr unsigned states = rules::stateCount;
    static constexpr unsigned lanesOfSlice = vectors * count;
    static constexpr unsigned wide = abreast * count;
    using Value = Eighths<count>;
    using WideValue = Eighths<wide>;
    using Permutation = Machine::Permutation<count>;
    using WideRule = RuleOf<wide>;
    using Decision = typename RuleOf<count>::Decision;
    using WideDecision = typename WideRule::Decision;
    using Column = rules::Column<Decision>;
    using WideColumn = rules::Column<WideDecision>;

    /// Whether the forward recursion has two states in a vector.
    static constexpr bool paired = Machine::pairsStates(count, WideRule::corrects);
    using Paired = PairedStates<RuleOf, count>;
    using ForwardRule = RuleOf<paired ? 2 * count : count>;

    /// Whether branch metrics are lifted (Rules.h), which Windows::lift keeps for one window.
    static constexpr bool lifts = Machine::liftsBranches && !WideRule::corrects && !paired && abreast == 1;

    /// The layout of a slot: eight forward metrics, the kept branch metrics and the joint value, each with its windows
    /// side by side. Those of a recursion with two states in a vector have one window after the other, the metrics in
    /// their places.
    static constexpr unsigned slotBranches = states * wide;
    static constexpr unsigned slotJoint = slotBranches + 2 * wide;
    static constexpr unsigned slotWords = slotJoint + (paired && abreast == 1 ? 2 * wide : wide);

public:
    /// Memory needed in the workspace: for a step of a window, and for the forward recursion between two windows.
    static constexpr unsigned slotBytes = 2 * slotWords;
    static constexpr unsigned forwardBytes = vectors * static_cast<unsigned>(sizeof(Column));

    MORVIK_INLINE Pass(const Workspace& workspace, const HalfIteration& half)
        : w(workspace),
          itsConstituent(workspace.constituent[half.d]),
          itsSteps(w.steps),
          itsSource(half.joint),
          itsInterleaver(itsConstituent.interleaver),
          itsParity(itsConstituent.parity),
          itsSystematic(itsConstituent.systematic),
          itsJoint(itsConstituent.joint),
          itsRatios(half.isLast ? w.ratios : nullptr),
          itsSlots(w.slots),
          itsRule(workspace.corrections),
          itsWideRule(workspace.corrections)
    {
    }

    /// `isFirst` is that of the half-iteration.
    MORVIK_INLINE void run(bool isFirst) const
    {
        // The last window starts from the column that the next segment's first window reached: in this pass if there is
        // a window in between, during which the hardware hands it on (rule 20), else in the pass before. So the last
        // window must not run beside the first one if there are others.
        const bool handedWithin = !isFirst && w.windows > 2;
        hand(itsConstituent.alphaReached, w.before, itsConstituent.alphaStart, w.firstLanes);
        if (!handedWithin) {
            handBack();
        }
        for (unsigned v = 0; v < vectors; ++v) {
            saveForward(v, columnAt(itsConstituent.alphaStart + v * count));
        }
        Windows windows = windowsFrom(0, 0, 0, slotWords);
        runForward(windows);
        while (windows.length != 0) {
            Windows next = following(windows);
            runWindows(windows, next);
            if (handedWithin && windows.r[0] == 0 && next.r[0] != 0) {
                handBack();
            }
            windows = next;
        }
        for (unsigned v = 0; v < vectors; ++v) {
            storeBorder(restoreForward(v), itsConstituent.alphaReached + v * count);
        }
    }

private:
    /// Windows of one vector's lanes that run side by side; the last one is repeated if no other has its length. Slots
    /// are used in alternating direction: the forward recursion of a window fills the slots that the backward recursion
    /// of the previous one frees.
    struct Windows {
        unsigned r[abreast];
        unsigned v;
        unsigned length;  ///< 0 if there are none
        unsigned from[abreast];
        std::ptrdiff_t slot;
        std::ptrdiff_t direction;
        Value lift;  ///< of all steps; known after the forward recursion

        MORVIK_INLINE std::ptrdiff_t slotOf(unsigned step) const
        {
            return slot + direction * static_cast<std::ptrdiff_t>(step);
        }
    };

    MORVIK_INLINE Windows windowsFrom(unsigned r, unsigned v, std::ptrdiff_t slot, std::ptrdiff_t direction) const
    {
        Windows windows = {{}, v, 0, {}, slot, direction, {}};
        windows.length = r == w.windows ? 0 : lengthOf(r);
        for (unsigned j = 0; j < abreast; ++j) {
            windows.r[j] = r;
            windows.from[j] = w.windowStart[r];
            if (r + 1 < w.windows && lengthOf(r + 1) == windows.length) {
                ++r;
            }
        }
        return windows;
    }

    MORVIK_INLINE unsigned lengthOf(unsigned r) const
    {
        return w.windowStart[r + 1] - w.windowStart[r];
    }

    /// Returns the next windows in processing order.
    MORVIK_INLINE Windows following(const Windows& windows) const
    {
        const std::ptrdiff_t slot = windows.slotOf(windows.length - 1);
        if (windows.v + 1 < vectors) {
            return windowsFrom(windows.r[0], windows.v + 1, slot, -windows.direction);
        }
        return windowsFrom(windows.r[abreast - 1] + 1, 0, slot, -windows.direction);
    }

    /// Runs the forward recursion of windows one after another; runFirst(a) does so for the first one.
    template <class RunFirst>
    MORVIK_INLINE void runForward(Windows& windows, RunFirst runFirst) const
    {
        Column a = restoreForward(windows.v);
        Column start = a;
        runFirst(a);
        a = broughtBack<Decision>(a);
        for (unsigned j = 1; j < abreast; ++j) {
            if (windows.r[j] == windows.r[j - 1]) {
                a = start;
            }
            start = a;
            runForward(windows, j, a);
            a = broughtBack<Decision>(a);
        }
        saveForward(windows.v, a);
    }

    MORVIK_INLINE void runForward(Windows& windows) const
    {
        runForward(windows, [&](Column& a) MORVIK_INLINE_LAMBDA { runForward(windows, 0, a); });
    }

    MORVIK_INLINE void runForward(Windows& windows, unsigned j, Column& a) const
    {
        if constexpr (paired) {
            forwardInPairs(windows, j, a);
        } else {
            forward(windows, j, a);
        }
    }

    /// Runs the backward recursion of windows, together with the forward recursion of the next one if registers
    /// suffice for both: two independent dependency chains keep the execution units busy.
    MORVIK_INLINE void runWindows(const Windows& windows, Windows& next) const
    {
        WideColumn b = startColumn(windows);
        if constexpr (overlapped) {
            if (next.length != 0) {
                runForward(next, [&](Column& a) MORVIK_INLINE_LAMBDA { both(windows, b, next, a); });
            }
            backward(windows, windows.length - next.length, b);
        } else {
            if constexpr (paired) {
                backwardOfPairs(windows, b);
            } else {
                backward(windows, windows.length, b);
            }
            if (next.length != 0) {
                runForward(next);
            }
        }
        storeReached(windows, lowered(b, windows));
    }

    static constexpr bool overlapped = Machine::holdsTwoRecursions && !WideRule::corrects && !paired;

    MORVIK_INLINE void forward(Windows& windows, unsigned j, Column& a) const
    {
        std::int16_t* slot = itsSlots + windows.slot + j * count;
        Value lift{};
        for (std::size_t i = 0; i < windows.length; ++i) {
            forwardStep(at(windows, j, i), slot, a, lift);
            slot += windows.direction;
        }
        windows.lift = lift;
        a = lowered(a, windows);
    }

    /// The same with two states in a vector. Not inlined, since its addresses take most of the registers.
    MORVIK_INLINE_CALLS void forwardInPairs(const Windows& windows, unsigned j, Column& a) const
    {
        const Pass own(*this);  // no store can change it, so that its members stay in registers
        Paired pairs(a);
        std::int16_t* slot = itsSlots + windows.slot;
        const std::ptrdiff_t direction = windows.direction;
        const std::size_t first = at(windows, j, 0);
        for (std::size_t begin = 0; begin < windows.length; begin += Paired::turn) {
            rules::forEach<Paired::turn>([&](auto steps) MORVIK_INLINE_LAMBDA {
                if (begin + steps < windows.length) {
                    own.template pairedStep<steps>(first + begin + steps, slot, j, pairs);
                    slot += direction;
                }
            });
        }
        a = pairs.column(windows.length);
    }

    /// Runs the backward recursion over the first `steps` steps of the windows.
    MORVIK_INLINE void backward(const Windows& windows, unsigned steps, WideColumn& b) const
    {
        const std::int16_t* slot = itsSlots + windows.slotOf(steps);
        for (std::size_t i = steps; i-- > 0;) {
            slot -= windows.direction;
            backwardStep(windows, i, slot, b);
        }
    }

    /// The same over all steps, after a forward recursion with two states in a vector.
    MORVIK_INLINE void backwardOfPairs(const Windows& windows, WideColumn& b) const
    {
        const std::int16_t* slot = itsSlots + windows.slotOf(windows.length);
        for (std::size_t end = windows.length; end > 0;) {
            const std::size_t begin = (end - 1) / Paired::turn * Paired::turn;
            rules::forEach<Paired::turn>([&](auto steps) MORVIK_INLINE_LAMBDA {
                constexpr unsigned back = Paired::turn - 1 - steps;
                if (begin + back < end) {
                    slot -= windows.direction;
                    backwardStep<back>(windows, begin + back, slot, b);
                }
            });
            end = begin;
        }
    }

    /// Runs all forward steps of the next window, which is not longer, and as many backward steps of the windows.
    MORVIK_INLINE void both(const Windows& windows, WideColumn& b, Windows& next, Column& a) const
    {
        const std::int16_t* slot = itsSlots + windows.slotOf(windows.length);
        std::int16_t* nextSlot = itsSlots + next.slot;
        Value lift{};
        for (std::size_t i = 0; i < next.length; ++i) {
            slot -= windows.direction;
            backwardStep(windows, windows.length - 1 - i, slot, b);
            forwardStep(at(next, 0, i), nextSlot, a, lift);
            nextSlot += next.direction;
        }
        next.lift = lift;
        a = lowered(a, next);
    }

    /// Takes back what the branch metrics of the windows' steps have lifted the metrics by.
    template <class Metrics>
    static MORVIK_INLINE Metrics lowered(Metrics m, [[maybe_unused]] const Windows& windows)
    {
        if constexpr (lifts) {
            rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA { m[state] = m[state] - windows.lift; });
        }
        return m;
    }

    /// Branch metrics as they are kept.
    template <unsigned lanes>
    static MORVIK_INLINE auto branches(const KeptBranches<lanes>& kept)
    {
        if constexpr (lifts) {
            return liftedBranches<lanes>(kept);
        } else {
            return plainBranches<lanes>(kept);
        }
    }

    /// Runs step `i` of all vectors' steps. `slot` points to the window's lanes.
    MORVIK_INLINE void forwardStep(std::size_t i, std::int16_t* slot, Column& a, [[maybe_unused]] Value& lift) const
    {
        const Value joint = jointAt(i);
        const BranchMetrics<count> g = branchMetrics(joint, Value::load(itsParity + i * count));
        rules::forEach<states>([&](auto state)
                                   MORVIK_INLINE_LAMBDA { Decision::stored(a[state]).store(slot + state * wide); });
        const KeptBranches<count> kept = lifts ? lifted<count>(g) : KeptBranches<count>{g[0], g[1]};
        kept[0].store(slot + slotBranches);
        kept[1].store(slot + slotBranches + wide);
        joint.store(slot + slotJoint);
        a = rules::forwardStep(itsRule.decision(), a, branches<count>(kept));
        if constexpr (lifts) {
            lift = lift + g[0];
        }
    }

    /// The same for window `j` of a slot, after `steps` steps of it.
    template <unsigned steps>
    MORVIK_INLINE void pairedStep(std::size_t i, std::int16_t* slot, unsigned j, Paired& pairs) const
    {
        const Value joint = jointAt(i);
        const BranchMetrics<count> sums = rules::branchSums(joint, Value::load(itsParity + i * count), Value{});
        const Eighths<2 * count> g = clip(join(sums[0], sums[1]), branchMin, branchMax);
        pairs.store(slot + j * states * count);
        g.store(slot + slotBranches + j * 2 * count);
        joint.store(slot + slotJoint + j * count);
        pairs.template step<steps>(itsRule.decision(), g);
    }

    MORVIK_INLINE Value jointAt(std::size_t i) const
    {
        const std::uint32_t* const sources = itsInterleaver.sources + i * Permutation::sources;
        __builtin_prefetch(itsSource + sources[fetchAhead * Permutation::sources]);
        return Permutation::gather(itsSource, sources, itsInterleaver.controls + i * Permutation::bytes);
    }

    /// The metrics of a slot, after `steps` steps of a window if they are in pairs.
    template <unsigned steps>
    struct Slot {
        const std::int16_t* words;

        /// The forward metric of a state.
        MORVIK_INLINE WideValue operator[](unsigned state) const
        {
            if constexpr (paired) {
                return ofWindows(words + Paired::place(state, steps) * count, states * count);
            } else {
                return WideValue::load(words + state * wide);
            }
        }

        MORVIK_INLINE WideValue branch(unsigned metric) const
        {
            if constexpr (paired) {
                return ofWindows(words + slotBranches + metric * count, 2 * count);
            } else {
                return WideValue::load(words + slotBranches + metric * wide);
            }
        }
    };

    /// Joins a value of each window, `distance` words from one to the next.
    static MORVIK_INLINE WideValue ofWindows(const std::int16_t* first, unsigned distance)
    {
        return joined<0, abreast>([&](unsigned j) MORVIK_INLINE_LAMBDA { return Value::load(first + j * distance); });
    }

    template <unsigned steps = 0>
    MORVIK_INLINE void backwardStep(const Windows& windows,
                                    std::size_t i,
                                    const std::int16_t* words,
                                    WideColumn& b) const
    {
        const Slot<steps> slot = {words};
        const WideValue ratio = itsWideRule.stepBack(slot, b, branches<wide>({slot.branch(0), slot.branch(1)}));
        if (itsRatios != nullptr) {
            storeValues(windows, i, ratio, itsRatios);
        }
        const WideValue joint = WideValue::load(words + slotJoint);
        storeValues(windows, i, nextJoint<extrinsic>(ratio, joint, valuesAt(windows, i, itsSystematic)), itsJoint);
    }

    /// Returns the index of step `i` of window `j` among the steps of all vectors.
    MORVIK_INLINE std::size_t at(const Windows& windows, unsigned j, std::size_t i) const
    {
        return std::size_t{windows.v} * itsSteps + windows.from[j] + i;
    }

    MORVIK_INLINE WideValue valuesAt(const Windows& windows, std::size_t i, const std::int16_t* slices) const
    {
        return joined<0, abreast>([&](unsigned j)
                                      MORVIK_INLINE_LAMBDA { return Value::load(slices + at(windows, j, i) * count); });
    }

    /// Joins valueOf(j) of windows `first` to first + many - 1.
    template <unsigned first, unsigned many, class ValueOf>
    static MORVIK_INLINE Eighths<many * count> joined(ValueOf valueOf)
    {
        if constexpr (many == 1) {
            return valueOf(first);
        } else {
            return join(joined<first, many / 2>(valueOf), joined<first + many / 2, many / 2>(valueOf));
        }
    }

    MORVIK_INLINE void storeValues(const Windows& windows, std::size_t i, WideValue value, std::int16_t* slices) const
    {
        rules::forEach<abreast>(
            [&](auto j) MORVIK_INLINE_LAMBDA { part<count, j>(value).store(slices + at(windows, j, i) * count); });
    }

    static MORVIK_INLINE Column columnAt(const std::int16_t* column)
    {
        Column m{};
        rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA {
            m[state] = Decision::metric(Value::load(column + state * lanesOfSlice));
        });
        return m;
    }

    MORVIK_INLINE WideColumn startColumn(const Windows& windows) const
    {
        WideColumn m{};
        rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA {
            m[state] = WideDecision::metric(joined<0, abreast>([&](unsigned j) MORVIK_INLINE_LAMBDA {
                return Value::load(itsConstituent.betaStart + (windows.r[j] * states + state) * lanesOfSlice +
                                   windows.v * count);
            }));
        });
        return m;
    }

    MORVIK_INLINE void saveForward(unsigned v, const Column& a) const
    {
        std::memcpy(w.forward + v * sizeof a / 2, &a, sizeof a);
    }

    MORVIK_INLINE Column restoreForward(unsigned v) const
    {
        Column a{};
        std::memcpy(&a, w.forward + v * sizeof a / 2, sizeof a);
        return a;
    }

    /// Normalises a column so that state 0 is near 0, which changes no border column (Bounds.h).
    template <class AnyDecision>
    static MORVIK_INLINE rules::Column<AnyDecision> broughtBack(rules::Column<AnyDecision> m)
    {
        const auto level = AnyDecision::stored(m[0]);
        const auto kept = level & level.of(borderMask);
        rules::forEach<states>([&](auto state)
                                   MORVIK_INLINE_LAMBDA { m[state] = AnyDecision::subtract(m[state], kept); });
        return m;
    }

    /// Stores a border column (rule 11).
    static MORVIK_INLINE void storeBorder(const Column& m, std::int16_t* column)
    {
        rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA {
            (Decision::stored(m[state]) & Value::of(borderMask)).store(column + state * lanesOfSlice);
        });
    }

    /// Stores the column where a window ends, the next start of the window before it; for the first window, that is the
    /// last window of the segment before.
    MORVIK_INLINE void storeReached(const Windows& windows, const WideColumn& b) const
    {
        const WideColumn m = broughtBack<WideDecision>(b);
        rules::forEach<abreast>([&](auto j) MORVIK_INLINE_LAMBDA {
            const unsigned r = windows.r[j];
            std::int16_t* const column =
                r == 0 ? itsConstituent.betaReached : itsConstituent.betaStart + (r - 1) * states * lanesOfSlice;
            Column reached{};
            rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA {
                reached[state] = Decision::metric(part<count, j>(WideDecision::stored(m[state])));
            });
            storeBorder(reached, column + windows.v * count);
        });
    }

    MORVIK_INLINE void handBack() const
    {
        hand(itsConstituent.betaReached,
             w.after,
             itsConstituent.betaStart + (w.windows - 1) * states * lanesOfSlice,
             w.lastLanes);
    }

    /// Moves columns to a neighbouring segment's lane; segments at a block's border keep theirs.
    MORVIK_INLINE void hand(const std::int16_t* columns,
                            const Permutations& from,
                            std::int16_t* to,
                            const std::int16_t* keep) const
    {
        for (unsigned state = 0; state < states; ++state) {
            for (unsigned v = 0; v < vectors; ++v) {
                const Value moved = Permutation::gather(columns + state * lanesOfSlice,
                                                        from.sources + v * Permutation::sources,
                                                        from.controls + v * Permutation::bytes);
                std::int16_t* start = to + state * lanesOfSlice + v * count;
                blend(Value::load(keep + v * count), moved, Value::load(start)).store(start);
            }
        }
    }

    const Workspace& w;
    const Constituent& itsConstituent;

    // Copies, since the compiler would reload members behind a reference after every store.
    const unsigned itsSteps;
    const std::int16_t* const itsSource;  ///< joint values of the other decoder
    const Permutations itsInterleaver;
    const std::int16_t* const itsParity;
    const std::int16_t* const itsSystematic;
    std::int16_t* const itsJoint;
    std::int16_t* const itsRatios;  ///< null if they are dropped
    std::int16_t* const itsSlots;
    const ForwardRule itsRule;
    const WideRule itsWideRule;
};

template <template <unsigned> class RuleOf, unsigned count, unsigned vectors, unsigned abreast, Extrinsic extrinsic>
MORVIK_INLINE_CALLS void runPass(const Workspace& workspace, const HalfIteration& half)
{
    Pass<RuleOf, count, vectors, abreast, extrinsic>(workspace, half).run(half.isFirst);
}

}  // namespace morvik::lanes::MORVIK_LANES

#endif
