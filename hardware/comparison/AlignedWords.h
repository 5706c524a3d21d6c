// AlignedWords: what Replay computes with: aligned words of the state format, and columns of a dump's eighths.
#ifndef MORVIK_HARDWARE_COMPARISON_ALIGNEDWORDS_H
#define MORVIK_HARDWARE_COMPARISON_ALIGNEDWORDS_H

#include <cstddef>
#include <cstdint>

#include "Replay.h"
#include "rules/Arithmetic.h"
#include "rules/Formats.h"

namespace morvik::comparison {

constexpr int eighth = 1 << rules::stateAlignment;
constexpr int eighthMask = -eighth;

/// The low bits of a value, sign-extended.
constexpr int cutTo(int value, int bits)
{
    const auto above = static_cast<std::uint32_t>(32 - int{rules::stateAlignment} - bits);
    return rules::shiftRight(rules::shiftLeftWrap(value, above), above);
}

constexpr int clippedTo(int value, int bits)
{
    const int end = eighth << (bits - 1);
    return rules::clip(value, -end, end - eighth);
}

template <class Words>
Column inEighths(const Words& words, const Sources& sources)
{
    Column column;
    for (std::size_t i = 0; i < words.size(); ++i) {
        column.values[i] = static_cast<std::int16_t>(rules::shiftRight(words[i], rules::stateAlignment));
    }
    column.sources = sources;
    return column;
}

}  // namespace morvik::comparison

#endif
