// Schedule: which constituent decoder runs in which half-iteration, and what it starts from.
//
// The numbered rules are those of docs/arithmetic.md. Half-iterations count from 0.
#ifndef MORVIK_RULES_SCHEDULE_H
#define MORVIK_RULES_SCHEDULE_H

namespace morvik::rules {

constexpr unsigned halfIterations(unsigned iterations)
{
    return 2 * iterations;
}

/// The iterations that the first h half-iterations complete.
constexpr unsigned completeIterations(unsigned h)
{
    return h / 2;
}

/// The constituent decoder of half-iteration h: 0 works in natural order, 1 in interleaved order. The last
/// half-iteration of a decode is odd, so every decode ends in natural order (rule 15).
constexpr unsigned constituentOf(unsigned h)
{
    return h % 2 == 0 ? 1 : 0;
}

/// Whether h is its constituent decoder's first pass, which has no border columns yet (rules 19 and 20).
constexpr bool isFirstPass(unsigned h)
{
    return h < 2;
}

/// The same constituent decoder's pass before h, which must not be a first pass (rules 19 and 20).
constexpr unsigned passBefore(unsigned h)
{
    return h - 2;
}

}  // namespace morvik::rules

#endif
