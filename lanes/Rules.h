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

/// The eight metrics of a slot, contiguous in memory.
template <unsigned count>
struct StoredColumn {
    const std::int16_t* metrics;

    MORVIK_INLINE Eighths<count> operator[](unsigned state) const
    {
        return Eighths<count>::load(metrics + state * count);
    }
};

/// "MOD": max-log-MAP.
template <unsigned countOfLanes>
struct Greatest {
    static constexpr unsigned count = countOfLanes;
    using Decision = rules::DecideMax<Eighths<count>>;
    static constexpr bool fewRegisters = true;

    explicit MORVIK_INLINE Greatest(const std::uint8_t*) {}

    MORVIK_INLINE Decision decision() const
    {
        return {};
    }

    /// Moves b a step back and returns the step's ratio. The maximum depends neither on the order of comparison nor on
    /// when the branch metric is added, so the candidates of the backward recursion are reused, pair by pair.
    MORVIK_INLINE Eighths<count> stepBack(const StoredColumn<count>& a,
                                          rules::Column<Decision>& b,
                                          const BranchMetrics<count>& g) const
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

/// Looks up the correction of a decision difference.
template <unsigned count>
struct Corrections {
    Machine::Table<count> table;

    MORVIK_INLINE Eighths<count> operator()(Eighths<count> difference) const
    {
        const Eighths<count> magnitude = max(difference, Eighths<count>::of(-1) - difference);  // -1 reads as 0
        return table.at(min(magnitude, Eighths<count>::of(4 * 15)) >> 2);
    }
};

/// "MOD#": max-log-MAP with a correction one stage late.
template <unsigned countOfLanes>
struct Corrected {
    static constexpr unsigned count = countOfLanes;
    using Decision = rules::DecideMaxHash<Eighths<count>, Corrections<count>>;
    static constexpr bool fewRegisters = false;
    Corrections<count> corrections;

    explicit MORVIK_INLINE Corrected(const std::uint8_t* table) : corrections{Machine::Table<count>(table)} {}

    MORVIK_INLINE Decision decision() const
    {
        return Decision(corrections);
    }

    MORVIK_INLINE Eighths<count> stepBack(const StoredColumn<count>& a,
                                          rules::Column<Decision>& b,
                                          const BranchMetrics<count>& g) const
    {
        StateMetrics<count> alpha{};
        StateMetrics<count> beta{};
        rules::forEach<rules::stateCount>([&](auto state) MORVIK_INLINE_LAMBDA {
            alpha[state] = a[state];
            beta[state] = Decision::stored(b[state]);
        });
        b = rules::backwardStep(decision(), b, g);
        return rules::logLikelihoodRatio(decision(), alpha, beta, g);
    }
};

}  // namespace morvik::lanes::MORVIK_LANES

#endif
