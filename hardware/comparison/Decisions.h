// Decisions: value types for the trellis steps of rules/Trellis.h, by each algorithm and with mistakes that hardware
// may have. Functions have the names of what the core does; some of a mistake's do something else in its place.
#ifndef MORVIK_HARDWARE_COMPARISON_DECISIONS_H
#define MORVIK_HARDWARE_COMPARISON_DECISIONS_H

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdlib>

#include "rules/Trellis.h"
#include "rules/TrellisDecision.h"

namespace morvik::comparison {

/// A metric of hardware that saturates where the core wraps.
struct Held {
    std::int16_t value = 0;
};

constexpr Held held(int value)
{
    return {static_cast<std::int16_t>(rules::clip(value, -32768, 32752))};  // -2048 and 2047 eighths
}

constexpr Held addWrap(Held a, Held b)
{
    return held(a.value + b.value);
}

constexpr Held subWrap(Held a, Held b)
{
    return held(a.value - b.value);
}

constexpr Held select(Held difference, Held c1, Held c2)
{
    return difference.value < 0 ? c2 : c1;
}

constexpr Held maxWrap(Held c1, Held c2)
{
    return c1.value < c2.value ? c2 : c1;
}

/// A metric that wraps, of hardware that compares metrics as plain numbers.
struct Plain {
    std::int16_t value = 0;
    bool isLess = false;  ///< of a difference: whether the first number is less than the second
};

constexpr Plain addWrap(Plain a, Plain b)
{
    return {rules::addWrap(a.value, b.value)};
}

constexpr Plain subWrap(Plain a, Plain b)
{
    return {rules::subWrap(a.value, b.value), a.value < b.value};
}

constexpr Plain select(Plain difference, Plain c1, Plain c2)
{
    return difference.isLess ? c2 : c1;
}

constexpr Plain maxWrap(Plain c1, Plain c2)
{
    return select(subWrap(c1, c2), c1, c2);
}

/// A metric in a tree of decisions, one of which takes the lesser candidate.
struct Leaf {
    std::int16_t value = 0;
    unsigned states = 0;    ///< those whose branches it comes from, a bit for each
    unsigned reversed = 0;  ///< those between which the lesser is taken; 0 where no metric has states: always
};

constexpr Leaf joined(std::int16_t value, Leaf a, Leaf b)
{
    return {value, a.states | b.states, a.reversed | b.reversed};
}

constexpr Leaf addWrap(Leaf a, Leaf b)
{
    return joined(rules::addWrap(a.value, b.value), a, b);
}

constexpr Leaf subWrap(Leaf a, Leaf b)
{
    return joined(rules::subWrap(a.value, b.value), a, b);
}

constexpr Leaf select(Leaf difference, Leaf c1, Leaf c2)
{
    const bool isReversed = difference.states == difference.reversed;
    return (difference.value < 0) != isReversed ? c2 : c1;
}

constexpr Leaf maxWrap(Leaf c1, Leaf c2)
{
    return joined(select(subWrap(c1, c2), c1, c2).value, c1, c2);
}

/// Convert between a value type and aligned words.
template <class Value>
Value fromWord(std::int16_t word)
{
    return Value{word};
}

constexpr std::int16_t wordOf(std::int16_t value)
{
    return value;
}

constexpr std::int16_t wordOf(Held value)
{
    return value.value;
}

constexpr std::int16_t wordOf(Plain value)
{
    return value.value;
}

constexpr std::int16_t wordOf(Leaf value)
{
    return value.value;
}

/// The table of TCalculationEngineModBase::createLUT, called with a decision difference. Words of narrower registers
/// are shifted up by the bits that they lack. Hardware that does not invert a negative difference takes its magnitude.
template <class Value>
struct Corrections {
    const unsigned char* middle;
    unsigned shift = 0;
    bool inverts = true;

    Value operator()(Value difference) const
    {
        const int word = wordOf(difference) >> shift;
        const int index = inverts ? word : std::min(std::abs(word), INT16_MAX);
        return fromWord<Value>(static_cast<std::int16_t>(middle[index] << shift));
    }
};

template <class Value, std::size_t count>
std::array<Value, count> fromWords(const std::array<std::int16_t, count>& words)
{
    std::array<Value, count> values{};
    for (std::size_t i = 0; i < count; ++i) {
        values[i] = fromWord<Value>(words[i]);
    }
    return values;
}

}  // namespace morvik::comparison

#endif
