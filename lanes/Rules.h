// Rules: the two ways to decide that the hardware's algorithm types use, over lanes.
#ifndef MORVIK_LANES_RULES_H
#define MORVIK_LANES_RULES_H

#include "../src/Trellis.h"
#include "../src/TrellisDecision.h"
#include "Permute.h"
#include "Words.h"

namespace MORVIK_LANES {

template <unsigned count>
using StepsColumn = std::array<Steps<count>, trellis::stateCount>;

template <unsigned count>
using StepsBranches = trellis::BranchMetrics<Steps<count>>;

/// "MOD": max-log-MAP.
template <unsigned countOfLanes>
struct Greatest {
    static constexpr unsigned count = countOfLanes;
    using Decision = trellis::DecideMax<Steps<count>>;
    static constexpr bool fewRegisters = true;

    explicit MORVIK_INLINE Greatest(const std::uint8_t*) {}

    MORVIK_INLINE Decision decision() const
    {
        return {};
    }

    /// The greatest of all does not depend on the order of comparison, nor on when the branch metric is
    /// added: the candidates of the backward recursion serve once more.
    static MORVIK_INLINE Steps<count> ratio(const StepsColumn<count>& a,
                                            const StepsColumn<count>&,
                                            const StepsBranches<count>&,
                                            const trellis::Candidates<Decision>& c)
    {
        return greatest(a, c.one) - greatest(a, c.zero);
    }

private:
    static MORVIK_INLINE Steps<count> greatest(const StepsColumn<count>& a, const StepsColumn<count>& c)
    {
        return max(max(max(a[0] + c[0], a[1] + c[1]), max(a[2] + c[2], a[3] + c[3])),
                   max(max(a[4] + c[4], a[5] + c[5]), max(a[6] + c[6], a[7] + c[7])));
    }
};

/// The correction table, called with a decision difference.
template <unsigned count>
struct Corrections {
    Table<count> table;

    MORVIK_INLINE Steps<count> operator()(Steps<count> difference) const
    {
        const Steps<count> magnitude = max(difference, Steps<count>::of(-1) - difference);  // -1 reads like 0
        return table.at(min(magnitude, Steps<count>::of(4 * 15)) >> 2);
    }
};

/// "MOD#": max-log-MAP with a correction that comes one stage late.
template <unsigned countOfLanes>
struct Corrected {
    static constexpr unsigned count = countOfLanes;
    using Decision = trellis::DecideMaxHash<Steps<count>, Corrections<count>>;
    static constexpr bool fewRegisters = false;
    Corrections<count> corrections;

    explicit MORVIK_INLINE Corrected(const std::uint8_t* table) : corrections{Table<count>(table)} {}

    MORVIK_INLINE Decision decision() const
    {
        return Decision(corrections);
    }

    MORVIK_INLINE Steps<count> ratio(const StepsColumn<count>& a,
                                     const StepsColumn<count>& b,
                                     const StepsBranches<count>& g,
                                     const trellis::Candidates<Decision>&) const
    {
        return trellis::logLikelihoodRatio(decision(), a, b, g);
    }
};

}  // namespace MORVIK_LANES

#endif
