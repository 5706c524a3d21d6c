// Pass: one soft-in/soft-out pass of a constituent decoder, for all lanes of a row at once.
#ifndef MORVIK_LANES_PASS_H
#define MORVIK_LANES_PASS_H

#include <cstddef>

#include "../src/Trellis.h"
#include "Bounds.h"
#include "Permute.h"
#include "Rules.h"
#include "Words.h"
#include "Workspace.h"

namespace MORVIK_LANES {

/// A pass over rows of `vectors` vectors. The windows of a segment are worked on in turn, each of them in
/// every lane: the forward recursion leaves its metrics in slots, one for each step; the backward recursion
/// takes them up and goes on to ratios and joint values. `scaled` says whether extrinsic values are taken
/// times 0.75.
template <class Rule, unsigned vectors, bool scaled>
class Pass {
    static constexpr unsigned count = Rule::count;
    static constexpr unsigned states = trellis::stateCount;
    static constexpr unsigned row = vectors * count;
    using Value = Steps<count>;
    using BranchMetrics = StepsBranches<count>;
    using Lanes = Permutation<count, vectors>;
    using Decision = typename Rule::Decision;
    using Column = trellis::Column<Decision>;

    /// The metrics of a slot: eight forward metrics, two branch metrics (the others are their doubles: LTE
    /// has no second parity stream, rule 5) and the joint value.
    static constexpr unsigned slotBranches = states * count;
    static constexpr unsigned slotJoint = slotBranches + 2 * count;
    static constexpr unsigned slotWords = slotJoint + count;

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
          itsRule(workspace.corrections)
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
        Window window = {0, 0, 0, w.windowStart[1], 0, slotWords};
        runForward(window);
        for (unsigned r = 0; r < w.windows; ++r) {
            if (r == 2 && handedWithin) {
                handBack();
            }
            for (unsigned v = 0; v < vectors; ++v) {
                const Window next = following(window);
                runWindows<last>(window, next);
                window = next;
            }
        }
        for (unsigned v = 0; v < vectors; ++v) {
            storeBorder(restoreForward(v), itsRows.alphaReached + v * count);
        }
    }

private:
    /// A window of one vector's lanes. Its slots follow each other upwards and downwards in turn: the
    /// forward recursion of a window fills the slots that the backward recursion of the one before frees.
    struct Window {
        unsigned r;
        unsigned v;
        unsigned from;  ///< first step
        unsigned to;    ///< after the last step; `from` when there is no such window
        std::ptrdiff_t slot;
        std::ptrdiff_t direction;

        MORVIK_INLINE unsigned length() const
        {
            return to - from;
        }

        MORVIK_INLINE std::ptrdiff_t slotOf(unsigned step) const
        {
            return slot + direction * (static_cast<std::ptrdiff_t>(step) - static_cast<std::ptrdiff_t>(from));
        }
    };

    /// The window after `window` in the order of work.
    MORVIK_INLINE Window following(const Window& window) const
    {
        const unsigned v = window.v + 1 == vectors ? 0 : window.v + 1;
        const unsigned r = v == 0 ? window.r + 1 : window.r;
        const std::ptrdiff_t slot = window.slotOf(window.to - 1);
        if (r == w.windows) {
            return {r, v, 0, 0, slot, -window.direction};
        }
        return {r, v, w.windowStart[r], w.windowStart[r + 1], slot, -window.direction};
    }

    MORVIK_INLINE void runForward(const Window& window) const
    {
        Column a = restoreForward(window.v);
        forward(window, a);
        saveForward(window.v, broughtBack(a));
    }

    /// The backward recursion of a window, together with the forward recursion of the next one: two
    /// independent chains keep the processor's units busy where its registers suffice for both.
    template <bool last>
    MORVIK_INLINE void runWindows(const Window& window, const Window& next) const
    {
        Column b = load(itsRows.betaStart + window.r * states * row + window.v * count);
        if constexpr (overlapped) {
            if (next.length() != 0) {
                Column a = restoreForward(next.v);
                both<last>(window, b, next, a);
                saveForward(next.v, broughtBack(a));
            }
            backward<last>(window, window.to - next.length(), b);
        } else {
            backward<last>(window, window.to, b);
            if (next.length() != 0) {
                runForward(next);
            }
        }
        storeReached(window, b);
    }

#if defined(__AVX512VL__) && defined(__x86_64__)
    static constexpr bool overlapped = Rule::fewRegisters;
#else
    static constexpr bool overlapped = false;
#endif

    MORVIK_INLINE void forward(const Window& window, Column& a) const
    {
        std::int16_t* slot = itsSlots + window.slot;
        for (unsigned k = window.from; k < window.to; ++k) {
            forwardStep(k, window.v, slot, a);
            slot += window.direction;
        }
    }

    /// The steps of the window before `to`.
    template <bool last>
    MORVIK_INLINE void backward(const Window& window, unsigned to, Column& b) const
    {
        const std::int16_t* slot = itsSlots + window.slotOf(to);
        for (unsigned k = to; k-- > window.from;) {
            slot -= window.direction;
            backwardStep<last>(k, window.v, slot, b);
        }
    }

    /// As many backward steps of the window as the next one, which is no longer, has forward steps.
    template <bool last>
    MORVIK_INLINE void both(const Window& window, Column& b, const Window& next, Column& a) const
    {
        const std::int16_t* slot = itsSlots + window.slotOf(window.to);
        std::int16_t* nextSlot = itsSlots + next.slot;
        for (unsigned i = 0; i < next.length(); ++i) {
            slot -= window.direction;
            backwardStep<last>(window.to - 1 - i, window.v, slot, b);
            forwardStep(next.from + i, next.v, nextSlot, a);
            nextSlot += next.direction;
        }
    }

    MORVIK_INLINE void forwardStep(unsigned k, unsigned v, std::int16_t* slot, Column& a) const
    {
        const unsigned i = v * itsSteps + k;
        const std::uint32_t* const sources = itsInterleaver.sources + i * Lanes::sources;
        __builtin_prefetch(itsSource + sources[lanes::fetchAhead * Lanes::sources]);
        const Value joint = Lanes::load(itsSource, sources, itsInterleaver.controls + i * Lanes::bytes);
        BranchMetrics g = trellis::branchSums(joint, Value::load(itsParity + at(k, v)), Value{});
        for (Value& metric : g) {
            metric = clip(metric, lanes::branchMin, lanes::branchMax);
        }
        trellis::forEach<states>([&](auto state)
                                     MORVIK_INLINE_LAMBDA { Decision::stored(a[state]).store(slot + state * count); });
        g[0].store(slot + slotBranches);
        g[1].store(slot + slotBranches + count);
        joint.store(slot + slotJoint);
        a = trellis::forwardStep(itsRule.decision(), a, g);
    }

    template <bool last>
    MORVIK_INLINE void backwardStep(unsigned k, unsigned v, const std::int16_t* slot, Column& b) const
    {
        const Value g0 = Value::load(slot + slotBranches);
        const Value g1 = Value::load(slot + slotBranches + count);
        const BranchMetrics g = {g0, g1, g1, g0};
        const Value ratio = itsRule.stepBack({slot}, b, g);
        if constexpr (last) {
            ratio.store(itsRatios + at(k, v));
        }
        const Value joint = Value::load(slot + slotJoint);
        nextJoint(ratio, joint, Value::load(itsSystematic + at(k, v))).store(itsJoint + at(k, v));
    }

    /// The extrinsic value x = ratio - 2 joint is scaled, rounded down to a step and clipped (rule 14), and
    /// enters the other decoder halved, again rounded down (rule 13): all roundings fall into one.
    static MORVIK_INLINE Value nextJoint(Value ratio, Value joint, Value systematic)
    {
        const Value x = ratio - (joint + joint);
        const Value half = scaled ? threeEighths(x) : x >> 1;
        return clip(half, lanes::branchMin / 2, lanes::branchMax / 2) + systematic;
    }

    MORVIK_INLINE unsigned at(unsigned k, unsigned v) const
    {
        return (v * itsSteps + k) * count;
    }

    MORVIK_INLINE Column load(const std::int16_t* column) const
    {
        Column m{};
        trellis::forEach<states>(
            [&](auto state) MORVIK_INLINE_LAMBDA { m[state] = Decision::metric(Value::load(column + state * row)); });
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
    static MORVIK_INLINE Column broughtBack(Column m)
    {
        const Value level = Decision::stored(m[0]) & Value::of(lanes::borderMask);
        trellis::forEach<states>([&](auto state)
                                     MORVIK_INLINE_LAMBDA { m[state] = Decision::subtract(m[state], level); });
        return m;
    }

    /// Stores a border column (rule 11).
    static MORVIK_INLINE void storeBorder(const Column& m, std::int16_t* column)
    {
        trellis::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA {
            (Decision::stored(m[state]) & Value::of(lanes::borderMask)).store(column + state * row);
        });
    }

    /// The column that a window reached is where the window before it starts next time; the first one's
    /// belongs to the segment before, to its last window.
    MORVIK_INLINE void storeReached(const Window& window, const Column& b) const
    {
        const Column m = broughtBack(b);
        if (window.r == 0) {
            storeBorder(m, itsRows.betaReached + window.v * count);
        } else {
            storeBorder(m, itsRows.betaStart + (window.r - 1) * states * row + window.v * count);
        }
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
};

template <class Rule, unsigned vectors, bool scaled, bool last>
MORVIK_INLINE_CALLS void runPass(const lanes::Workspace& workspace, unsigned d, const std::int16_t* joint, bool first)
{
    Pass<Rule, vectors, scaled>(workspace, d, joint).template run<last>(first);
}

}  // namespace MORVIK_LANES

#endif
