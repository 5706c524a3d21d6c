// Steps: the steps of rules/Trellis.h on integers in eighths, over any value type that stands for a word.
#ifndef MORVIK_HARDWARE_UNITS_STEPS_H
#define MORVIK_HARDWARE_UNITS_STEPS_H

#include <cstddef>
#include <cstdint>
#include <type_traits>

#include "Units.h"
#include "hardware/comparison/Decisions.h"
#include "hardware/testbench/Corrections.h"
#include "rules/Formats.h"

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
template <class Word, class Use>
auto withRule(int algorithm, Use use)
{
    using Table = comparison::Corrections<Word>;
    return algorithm == tableAlgorithm ? use(rules::DecideMaxHash<Word, Table>(Table{corrections()}))
                                       : use(rules::DecideMax<Word>());
}

template <class Word>
void take(Word& metric, Word value, Word /*pending*/)
{
    metric = value;
}

template <class Word>
void take(rules::PendingMetric<Word>& metric, Word value, Word pending)
{
    metric = {value, pending};
}

template <class Word>
Word pendingOf(const Word& /*metric*/)
{
    return Word{};
}

template <class Word>
Word pendingOf(const rules::PendingMetric<Word>& metric)
{
    return metric.pending;
}

/// Takes a column through advance(rule, column): a step of a recursion. wordOf(eighths) makes a word of a metric.
template <class Word, class WordOf, class Advance>
Column advanced(int algorithm, const Column& from, WordOf word, Advance advance)
{
    using comparison::wordOf;
    return withRule<Word>(algorithm, [&](const auto& rule) {
        rules::Column<std::decay_t<decltype(rule)>> column{};
        for (std::size_t state = 0; state < column.size(); ++state) {
            take(column[state], word(from.metrics[state]), word(from.pending[state]));
        }
        column = advance(rule, column);
        Column reached;
        for (std::size_t state = 0; state < column.size(); ++state) {
            reached.metrics[state] = eighthsOf(wordOf(rule.stored(column[state])));
            reached.pending[state] = eighthsOf(wordOf(pendingOf(column[state])));
        }
        return reached;
    });
}

template <class Word, std::size_t count, class WordOf>
std::array<Word, count> wordsOf(const std::array<std::int32_t, count>& eighths, WordOf word)
{
    std::array<Word, count> words{};
    for (std::size_t i = 0; i < count; ++i) {
        words[i] = word(eighths[i]);
    }
    return words;
}

}  // namespace morvik::units

#endif
