// Pass: one soft-in/soft-out pass of a constituent decoder, for all lanes of a row at once.
#ifndef MORVIK_LANES_PASS_H
#define MORVIK_LANES_PASS_H

#include <cstddef>

#include "Bounds.h"
#include "Permute.h"
#include "Rules.h"
#include "Words.h"
#include "Workspace.h"
#include "rules/Trellis.h"

namespace MORVIK_LANES {

/// A pass over rows of `vectors` vectors of `count` lanes. The windows of a segment are worked on in turn, each of
/// them in every lane: the forward recursion leaves its metrics in slots, one for each step; the backward recursion
/// takes them up and goes on to ratios and joint values. `scaled` says whether extrinsic values are taken times 0.75.
///
/// The backward recursion starts anew in each window, so that `abreast` windows of equal length can go side by
/// side in one wider vector, where a vector of `count` lanes would leave a part of the machine idle.
template <template <unsigned> class RuleOf, unsigned count, unsigned vectors, unsigned abreast, bool scaled>
class Pass {
    static constexpr unsigned states = rules::stateCount;
    static constexpr unsigned row = vectors * count;
    static constexpr unsigned wide = abreast * count;
    using Value = Steps<count>;
    using WideValue = Steps<wide>;
    using Lanes = Permutation<count>;
    using Rule = RuleOf<count>;
    using WideRule = RuleOf<wide>;
    using Decision = typename Rule::Decision;
    using WideDecision = typename WideRule::Decision;
    using Column = rules::Column<Decision>;
    using WideColumn = rules::Column<WideDecision>;

    /// The metrics of a slot: eight forward metrics, two branch metrics (the others are their doubles: LTE
    /// has no second parity stream, rule 5) and the joint value.
    static constexpr unsigned slotBranches = states * wide;
    static constexpr unsigned slotJoint = slotBranches + 2 * wide;
    static constexpr unsigned slotWords = slotJoint + wide;

public:
    /// What the workspace must have room for: a step of a window, and the forward recursion between two.
    static constexpr unsigned slotBytes = 2 * slotWords;
    static constexpr unsigned forwardBytes = vectors * static_cast<unsigned>(sizeof(Column));

    MORVIK_INLINE Pass(const lanes::Workspace& workspace, unsigned d, const std::int16_t* joint)
        : w(workspace),
          itsRows(workspace.constituent[d]),
          itsSteps(w.steps),
          itsSource(joint),
          itsInterleaver(itsRows.interleaver),
          itsParity(itsRows.parity),
          itsSystematic(itsRows.systematic),
          itsJoint(itsRows.joint),
          itsRatios(w.ratios),
          itsSlots(w.slots),
          itsRule(workspace.corrections),
          itsWideRule(workspace.corrections)
    {
    }

    /// `first`: this is the decoder's first pass of the block. `last`: ratios are kept.
    template <bool last>
    MORVIK_INLINE void run(bool first) const
    {
        // The last row starts from what the first row reached: in this pass, when there is a row between
        // them in which the hardware can hand it on (rule 20), else in the pass before.
        const bool handedWithin = !first && w.windows > 2;
        hand(itsRows.alphaReached, w.before, itsRows.alphaStart, w.firstLanes);
        if (!handedWithin) {
            handBack();
        }
        for (unsigned v = 0; v < vectors; ++v) {
            saveForward(v, load(itsRows.alphaStart + v * count));
        }
        Windows windows = windowsFrom(0, 0, 0, slotWords);
        runForward(windows);
        while (windows.length != 0) {
            if (windows.r[0] == 2 && windows.v == 0 && handedWithin) {
                handBack();
            }
            const Windows next = following(windows);
            runWindows<last>(windows, next);
            windows = next;
        }
        for (unsigned v = 0; v < vectors; ++v) {
            storeBorder(restoreForward(v), itsRows.alphaReached + v * count);
        }
    }

private:
    /// Windows of one vector's lanes that go abreast; the last ones are all the same one where no other is as
    /// long. Their slots follow each other upwards and downwards in turn: the forward recursion of a window fills
    /// the slots that the backward recursion of the one before frees.
    struct Windows {
        unsigned r[abreast];
        unsigned v;
        unsigned length;  ///< 0 when there are no such windows
        unsigned from[abreast];
        std::ptrdiff_t slot;
        std::ptrdiff_t direction;

        MORVIK_INLINE std::ptrdiff_t slotOf(unsigned step) const
        {
            return slot + direction * static_cast<std::ptrdiff_t>(step);
        }
    };

    MORVIK_INLINE Windows windowsFrom(unsigned r, unsigned v, std::ptrdiff_t slot, std::ptrdiff_t direction) const
    {
        Windows windows = {{}, v, 0, {}, slot, direction};
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

    /// The windows after these in the order of work.
    MORVIK_INLINE Windows following(const Windows& windows) const
    {
        const std::ptrdiff_t slot = windows.slotOf(windows.length - 1);
        if (windows.v + 1 < vectors) {
            return windowsFrom(windows.r[0], windows.v + 1, slot, -windows.direction);
        }
        return windowsFrom(windows.r[abreast - 1] + 1, 0, slot, -windows.direction);
    }

    MORVIK_INLINE void runForward(const Windows& windows) const
    {
        const Column start = restoreForward(windows.v);
        Column a = start;
        for (unsigned j = 0; j < abreast; ++j) {
            if (j > 0 && windows.r[j] == windows.r[j - 1]) {
                a = start;
            }
            forward(windows, j, a);
            a = broughtBack<Decision>(a);
        }
        saveForward(windows.v, a);
    }

    /// The backward recursion of windows, together with the forward recursion of the next ones: two
    /// independent chains keep the processor's units busy where its registers suffice for both.
    template <bool last>
    MORVIK_INLINE void runWindows(const Windows& windows, const Windows& next) const
    {
        WideColumn b = loadStart(windows);
        if constexpr (overlapped) {
            if (next.length != 0) {
                Column a = restoreForward(next.v);
                both<last>(windows, b, next, a);
                saveForward(next.v, broughtBack<Decision>(a));
            }
            backward<last>(windows, windows.length - next.length, b);
        } else {
            backward<last>(windows, windows.length, b);
            if (next.length != 0) {
                runForward(next);
            }
        }
        storeReached(windows, b);
    }

#if defined(__AVX512VL__) && defined(__x86_64__)
    static constexpr bool overlapped = Rule::fewRegisters && abreast == 1;
#else
    static constexpr bool overlapped = false;
#endif

    MORVIK_INLINE void forward(const Windows& windows, unsigned j, Column& a) const
    {
        std::int16_t* slot = itsSlots + windows.slot + j * count;
        for (std::size_t i = 0; i < windows.length; ++i) {
            forwardStep(at(windows, j, i), slot, a);
            slot += windows.direction;
        }
    }

    /// The first `steps` steps of the windows.
    template <bool last>
    MORVIK_INLINE void backward(const Windows& windows, unsigned steps, WideColumn& b) const
    {
        const std::int16_t* slot = itsSlots + windows.slotOf(steps);
        for (std::size_t i = steps; i-- > 0;) {
            slot -= windows.direction;
            backwardStep<last>(windows, i, slot, b);
        }
    }

    /// As many backward steps of the windows as the next one, which is no longer, has forward steps.
    template <bool last>
    MORVIK_INLINE void both(const Windows& windows, WideColumn& b, const Windows& next, Column& a) const
    {
        const std::int16_t* slot = itsSlots + windows.slotOf(windows.length);
        std::int16_t* nextSlot = itsSlots + next.slot;
        for (std::size_t i = 0; i < next.length; ++i) {
            slot -= windows.direction;
            backwardStep<last>(windows, windows.length - 1 - i, slot, b);
            forwardStep(at(next, 0, i), nextSlot, a);
            nextSlot += next.direction;
        }
    }

    /// Step `i` of all vectors' steps, into the window's lanes of a slot.
    MORVIK_INLINE void forwardStep(std::size_t i, std::int16_t* slot, Column& a) const
    {
        const std::uint32_t* const sources = itsInterleaver.sources + i * Lanes::sources;
        __builtin_prefetch(itsSource + sources[lanes::fetchAhead * Lanes::sources]);
        const Value joint = Lanes::load(itsSource, sources, itsInterleaver.controls + i * Lanes::bytes);
        StepsBranches<count> g = rules::branchSums(joint, Value::load(itsParity + i * count), Value{});
        rules::clipBranches(g, lanes::branchMin, lanes::branchMax);
        rules::forEach<states>([&](auto state)
                                   MORVIK_INLINE_LAMBDA { Decision::stored(a[state]).store(slot + state * wide); });
        g[0].store(slot + slotBranches);
        g[1].store(slot + slotBranches + wide);
        joint.store(slot + slotJoint);
        a = rules::forwardStep(itsRule.decision(), a, g);
    }

    template <bool last>
    MORVIK_INLINE void backwardStep(const Windows& windows,
                                    std::size_t i,
                                    const std::int16_t* slot,
                                    WideColumn& b) const
    {
        const WideValue g0 = WideValue::load(slot + slotBranches);
        const WideValue g1 = WideValue::load(slot + slotBranches + wide);
        const WideValue ratio = itsWideRule.stepBack({slot}, b, {g0, g1, g1, g0});
        if constexpr (last) {
            storeStep(windows, i, ratio, itsRatios);
        }
        const WideValue joint = WideValue::load(slot + slotJoint);
        storeStep(windows, i, nextJoint(ratio, joint, loadStep(windows, i, itsSystematic)), itsJoint);
    }

    /// The extrinsic value x = ratio - 2 joint is scaled, rounded down to a step and clipped (rule 14), and
    /// enters the other decoder halved, again rounded down (rule 13): all roundings fall into one.
    static MORVIK_INLINE WideValue nextJoint(WideValue ratio, WideValue joint, WideValue systematic)
    {
        const WideValue x = ratio - (joint + joint);
        const WideValue half = scaled ? threeEighths(x) : x >> 1;
        return clip(half, lanes::branchMin / 2, lanes::branchMax / 2) + systematic;
    }

    /// Step `i` of window `j` among the steps of all vectors.
    MORVIK_INLINE std::size_t at(const Windows& windows, unsigned j, std::size_t i) const
    {
        return std::size_t{windows.v} * itsSteps + windows.from[j] + i;
    }

    MORVIK_INLINE WideValue loadStep(const Windows& windows, std::size_t i, const std::int16_t* rows) const
    {
        const Value first = Value::load(rows + at(windows, 0, i) * count);
        if constexpr (abreast == 1) {
            return first;
        } else {
            return join(first, Value::load(rows + at(windows, 1, i) * count));
        }
    }

    MORVIK_INLINE void storeStep(const Windows& windows, std::size_t i, WideValue value, std::int16_t* rows) const
    {
        rules::forEach<abreast>(
            [&](auto j) MORVIK_INLINE_LAMBDA { part<count, j>(value).store(rows + at(windows, j, i) * count); });
    }

    static MORVIK_INLINE Column load(const std::int16_t* column)
    {
        Column m{};
        rules::forEach<states>(
            [&](auto state) MORVIK_INLINE_LAMBDA { m[state] = Decision::metric(Value::load(column + state * row)); });
        return m;
    }

    MORVIK_INLINE WideColumn loadStart(const Windows& windows) const
    {
        WideColumn m{};
        rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA {
            const std::int16_t* const metrics = itsRows.betaStart + state * row + windows.v * count;
            const Value first = Value::load(metrics + windows.r[0] * states * row);
            if constexpr (abreast == 1) {
                m[state] = WideDecision::metric(first);
            } else {
                m[state] = WideDecision::metric(join(first, Value::load(metrics + windows.r[1] * states * row)));
            }
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

    /// A column with state 0 near 0, by a shift that border columns do not notice (Bounds.h).
    template <class AnyDecision>
    static MORVIK_INLINE rules::Column<AnyDecision> broughtBack(rules::Column<AnyDecision> m)
    {
        const auto level = AnyDecision::stored(m[0]);
        const auto kept = level & level.of(lanes::borderMask);
        rules::forEach<states>([&](auto state)
                                   MORVIK_INLINE_LAMBDA { m[state] = AnyDecision::subtract(m[state], kept); });
        return m;
    }

    /// Stores a border column (rule 11).
    static MORVIK_INLINE void storeBorder(const Column& m, std::int16_t* column)
    {
        rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA {
            (Decision::stored(m[state]) & Value::of(lanes::borderMask)).store(column + state * row);
        });
    }

    /// The column that a window reached is where the window before it starts next time; the first one's
    /// belongs to the segment before, to its last window.
    MORVIK_INLINE void storeReached(const Windows& windows, const WideColumn& b) const
    {
        const WideColumn m = broughtBack<WideDecision>(b);
        rules::forEach<abreast>([&](auto j) MORVIK_INLINE_LAMBDA {
            const unsigned r = windows.r[j];
            std::int16_t* const column = r == 0 ? itsRows.betaReached : itsRows.betaStart + (r - 1) * states * row;
            Column reached{};
            rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA {
                reached[state] = Decision::metric(part<count, j>(WideDecision::stored(m[state])));
            });
            storeBorder(reached, column + windows.v * count);
        });
    }

    MORVIK_INLINE void handBack() const
    {
        hand(itsRows.betaReached, w.after, itsRows.betaStart + (w.windows - 1) * states * row, w.lastLanes);
    }

    /// Columns move to a neighbouring segment's lane, but for the segments at a block's border, which keep theirs.
    MORVIK_INLINE void hand(const std::int16_t* columns,
                            const lanes::Permutations& from,
                            std::int16_t* to,
                            const std::int16_t* keep) const
    {
        for (unsigned state = 0; state < states; ++state) {
            for (unsigned v = 0; v < vectors; ++v) {
                const Value moved = Lanes::load(
                    columns + state * row, from.sources + v * Lanes::sources, from.controls + v * Lanes::bytes);
                std::int16_t* start = to + state * row + v * count;
                blend(Value::load(keep + v * count), moved, Value::load(start)).store(start);
            }
        }
    }

    const lanes::Workspace& w;
    const lanes::ConstituentRows& itsRows;

    // What every step uses, at hand: stores of values might change what is behind a reference.
    const unsigned itsSteps;
    const std::int16_t* const itsSource;  ///< joint values of the other decoder
    const lanes::Permutations itsInterleaver;
    const std::int16_t* const itsParity;
    const std::int16_t* const itsSystematic;
    std::int16_t* const itsJoint;
    std::int16_t* const itsRatios;
    std::int16_t* const itsSlots;
    const Rule itsRule;
    const WideRule itsWideRule;
};

template <template <unsigned> class RuleOf, unsigned count, unsigned vectors, unsigned abreast, bool scaled, bool last>
MORVIK_INLINE_CALLS void runPass(const lanes::Workspace& workspace, unsigned d, const std::int16_t* joint, bool first)
{
    Pass<RuleOf, count, vectors, abreast, scaled>(workspace, d, joint).template run<last>(first);
}

}  // namespace MORVIK_LANES

#endif
