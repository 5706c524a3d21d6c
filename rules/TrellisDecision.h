// TrellisDecision: the three ways to decide between two candidates at a trellis state (rule 7).
//
// The order of the candidates, given in Trellis.h, matters for ties and for the table's index. A table is
// any callable that maps a decision difference to its correction, aligned like the metrics.
#ifndef MORVIK_RULES_TRELLISDECISION_H
#define MORVIK_RULES_TRELLISDECISION_H

#include "rules/Arithmetic.h"

namespace morvik::rules {

/// Decisions with nothing pending: a metric is a plain value.
template <class Value>
struct PlainMetrics {
    using Metric = Value;

    MORVIK_INLINE static constexpr Metric metric(Value value)
    {
        return value;
    }

    MORVIK_INLINE static constexpr Metric add(Metric m, Value g)
    {
        return addWrap(m, g);
    }

    MORVIK_INLINE static constexpr Metric subtract(Metric m, Value g)
    {
        return subWrap(m, g);
    }

    MORVIK_INLINE static constexpr Value stored(Metric m)
    {
        return m;
    }

    MORVIK_INLINE static constexpr Value settled(Metric m)
    {
        return m;
    }
};

/// "MOD": the greater candidate, max-log-MAP.
template <class Value>
struct DecideMax : PlainMetrics<Value> {
    MORVIK_INLINE static constexpr Value decide(Value c1, Value c2)
    {
        return maxWrap(c1, c2);
    }
};

/// "MOD*": the greater candidate plus the correction for the difference.
template <class Value, class Table>
struct DecideMaxStar : PlainMetrics<Value> {
    Table table;

    explicit constexpr DecideMaxStar(Table corrections) : table(corrections) {}

    MORVIK_INLINE constexpr Value decide(Value c1, Value c2) const
    {
        return addWrap(maxWrap(c1, c2), table(subWrap(c1, c2)));
    }
};

/// A metric with the correction of its last decision still pending.
template <class Value>
struct PendingMetric {
    Value value;
    Value pending;
};

/// "MOD#": adds the correction of a decision one stage late. Candidates are compared without pending
/// corrections; the winner's is then added. This takes the table out of the hardware's critical loop.
template <class Value, class Table>
struct DecideMaxHash {
    using Metric = PendingMetric<Value>;

    Table table;

    explicit constexpr DecideMaxHash(Table corrections) : table(corrections) {}

    MORVIK_INLINE static constexpr Metric metric(Value value)
    {
        return {value, Value{}};
    }

    MORVIK_INLINE static constexpr Metric add(Metric m, Value g)
    {
        return {addWrap(m.value, g), m.pending};
    }

    MORVIK_INLINE static constexpr Metric subtract(Metric m, Value g)
    {
        return {subWrap(m.value, g), m.pending};
    }

    MORVIK_INLINE constexpr Metric decide(Metric c1, Metric c2) const
    {
        const Value difference = subWrap(c1.value, c2.value);
        return {select(difference, settled(c1), settled(c2)), table(difference)};
    }

    /// The same where nothing is pending.
    MORVIK_INLINE constexpr Metric decide(Value c1, Value c2) const
    {
        return {maxWrap(c1, c2), table(subWrap(c1, c2))};
    }

    MORVIK_INLINE static constexpr Value stored(Metric m)
    {
        return m.value;
    }

    MORVIK_INLINE static constexpr Value settled(Metric m)
    {
        return addWrap(m.value, m.pending);
    }
};

}  // namespace morvik::rules

#endif
