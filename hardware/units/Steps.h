// Steps: the steps of rules/Trellis.h on integers in eighths.
#ifndef MORVIK_HARDWARE_UNITS_STEPS_H
#define MORVIK_HARDWARE_UNITS_STEPS_H

#include <cstddef>
#include <cstdint>
#include <type_traits>

#include "Units.h"
#include "hardware/testbench/Corrections.h"
#include "hardware/testbench/WatchedDecision.h"
#include "rules/Formats.h"
#include "rules/TrellisDecision.h"

namespace morvik::units {

/// The aligned word of an integer in eighths (rule 1).
constexpr rules::Value aligned(std::int32_t eighths)
{
    return rules::wrap16(rules::shiftLeftWrap(eighths, rules::stateAlignment));
}

/// The integer in eighths of an aligned word, which has none of the bits below.
constexpr std::int32_t eighthsOf(rules::Value word)
{
    return rules::integerOf(word, rules::stateAlignment);
}

/// Calls use(rule) with the decision rule of an algorithm type.
template <class Use>
auto withRule(int algorithm, Use use)
{
    return algorithm == tableAlgorithm ? use(rules::DecideMaxHash<rules::Value, CorrectionTable>(CorrectionTable()))
                                       : use(rules::DecideMax<rules::Value>());
}

constexpr rules::Value valueOf(rules::Value metric)
{
    return metric;
}

constexpr void take(rules::Value& metric, rules::Value value, rules::Value /*pending*/)
{
    metric = value;
}

using PendingMetric = rules::PendingMetric<rules::Value>;

constexpr rules::Value valueOf(const PendingMetric& metric)
{
    return metric.value;
}

constexpr void take(PendingMetric& metric, rules::Value value, rules::Value pending)
{
    metric = {value, pending};
}

/// Takes a column through advance(rule, column): a step of a recursion.
template <class Advance>
Column advanced(int algorithm, const Column& from, Advance advance)
{
    return withRule(algorithm, [&](const auto& rule) {
        rules::Column<std::decay_t<decltype(rule)>> column{};
        for (std::size_t state = 0; state < column.size(); ++state) {
            take(column[state], aligned(from.metrics[state]), aligned(from.pending[state]));
        }
        column = advance(rule, column);
        Column reached;
        for (std::size_t state = 0; state < column.size(); ++state) {
            reached.metrics[state] = eighthsOf(valueOf(column[state]));
            reached.pending[state] = eighthsOf(pendingOf(column[state]));
        }
        return reached;
    });
}

/// The words of a row, by a function that makes one of a number.
template <std::size_t count>
std::array<rules::Value, count> wordsOf(const std::array<std::int32_t, count>& row,
                                        rules::Value (*wordOf)(std::int32_t) = aligned)
{
    std::array<rules::Value, count> words{};
    for (std::size_t i = 0; i < count; ++i) {
        words[i] = wordOf(row[i]);
    }
    return words;
}

}  // namespace morvik::units

#endif
