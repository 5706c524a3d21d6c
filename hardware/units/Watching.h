// Watching: a decision rule that tells what its operations meet, for the steps of rules/Trellis.h.
#ifndef MORVIK_HARDWARE_UNITS_WATCHING_H
#define MORVIK_HARDWARE_UNITS_WATCHING_H

#include <cstdint>
#include <vector>

#include "Steps.h"

namespace morvik::units {

/// A decision between two candidates.
struct Decision {
    rules::Value difference;  ///< of the candidates, as it wraps
    bool wraps;
    bool addsPending;  ///< a correction other than 0
};

/// What a calculation has met, in its order.
struct Watch {
    std::vector<Decision> decisions;
    bool sumWraps = false;

    void addSum(std::int32_t exact)
    {
        sumWraps = sumWraps || rules::wrap16(exact) != exact;
    }
};

/// Decides as the rule does.
template <class Rule>
struct Watching : Rule {
    using Value = rules::Value;
    using Metric = typename Rule::Metric;

    Watching(const Rule& rule, Watch& kept) : Rule(rule), watch(kept) {}

    Metric add(const Metric& m, Value g) const
    {
        watch.addSum(std::int32_t{valueOf(m)} + g);
        return Rule::add(m, g);
    }

    Metric subtract(const Metric& m, Value g) const
    {
        watch.addSum(std::int32_t{valueOf(m)} - g);
        return Rule::subtract(m, g);
    }

    template <class Candidate>
    auto decide(const Candidate& c1, const Candidate& c2) const
    {
        const Value first = valueOf(c1);
        const Value second = valueOf(c2);
        const Value difference = rules::subWrap(first, second);
        const Value pending = difference < 0 ? pendingOf(c2) : pendingOf(c1);
        watch.decisions.push_back({difference, difference != first - second, pending != 0});
        watch.addSum(std::int32_t{difference < 0 ? second : first} + pending);
        return Rule::decide(c1, c2);
    }

    Watch& watch;
};

}  // namespace morvik::units

#endif
