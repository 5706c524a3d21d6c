// WatchedDecision: a decision rule of the trellis that tells of wraps, ties and corrections.
#ifndef MORVIK_HARDWARE_TESTBENCH_WATCHEDDECISION_H
#define MORVIK_HARDWARE_TESTBENCH_WATCHEDDECISION_H

#include <cstdint>
#include <type_traits>

#include "rules/Trellis.h"
#include "rules/TrellisDecision.h"

namespace morvik {

/// Where a 16-bit result leaves its range.
enum class Wrap : std::uint8_t { none, above, below };

constexpr Wrap wrapOf(std::int32_t exact)
{
    return exact > INT16_MAX ? Wrap::above : exact < INT16_MIN ? Wrap::below : Wrap::none;
}

constexpr std::int16_t pendingOf(std::int16_t)
{
    return 0;
}

constexpr std::int16_t pendingOf(const rules::PendingMetric<std::int16_t>& metric)
{
    return metric.pending;
}

/// Whether a rule corrects its decisions.
template <class Rule>
constexpr bool hasTable = !std::is_same_v<typename Rule::Metric, std::int16_t>;

/// Decides as Rule does, and calls see(number, c1, c2) after each decision, or only after those in which something can
/// be seen without a table: equal candidates, one that has wrapped, a difference that wraps. Decisions of a recursion
/// are numbered as they come; those of a ratio's tree, which begins with four, from 4 to 7 and towards the root, 1.
template <class Rule, class See, bool seesAll = hasTable<Rule>>
class WatchedDecision {
public:
    struct Metric {
        typename Rule::Metric itself;
        std::uint8_t node = 0;
        Wrap wrap = Wrap::none;  ///< where a branch metric was added or subtracted
        bool isSum = false;      ///< of bit 1, whose branch metric is added

        std::int32_t value() const
        {
            return Rule::stored(itself);
        }

        std::int32_t pending() const
        {
            return pendingOf(itself);
        }
    };

    WatchedDecision(const Rule& rule, bool isTree, See see) : itsRule(rule), itsIsTree(isTree), itsSee(see) {}

    /// Numbers the next decision 0, or as the first one of a tree.
    void restart()
    {
        constexpr std::uint8_t firstOfTree = 4;
        itsNext = itsIsTree ? firstOfTree : 0;
    }

    MORVIK_INLINE Metric metric(std::int16_t value) const
    {
        return {itsRule.metric(value)};
    }

    MORVIK_INLINE Metric add(const Metric& m, std::int16_t g) const
    {
        return {itsRule.add(m.itself, g), m.node, wrapOf(m.value() + g), true};
    }

    MORVIK_INLINE Metric subtract(const Metric& m, std::int16_t g) const
    {
        return {itsRule.subtract(m.itself, g), m.node, wrapOf(m.value() - g), false};
    }

    MORVIK_INLINE Metric decide(const Metric& c1, const Metric& c2) const
    {
        const std::int32_t difference = c1.value() - c2.value();
        const std::uint8_t number = c1.node == 0 ? itsNext++ : c1.node / 2;
        if (seesAll || difference == 0 || wrapOf(difference) != Wrap::none || c1.wrap != Wrap::none ||
            c2.wrap != Wrap::none) {
            itsSee(number, c1, c2);
        }
        return {itsRule.decide(c1.itself, c2.itself), itsIsTree ? number : std::uint8_t{0}};
    }

    MORVIK_INLINE std::int16_t stored(const Metric& m) const
    {
        return itsRule.stored(m.itself);
    }

    MORVIK_INLINE std::int16_t settled(const Metric& m) const
    {
        return itsRule.settled(m.itself);
    }

private:
    Rule itsRule;
    bool itsIsTree;
    See itsSee;
    mutable std::uint8_t itsNext = 0;
};

}  // namespace morvik

#endif
