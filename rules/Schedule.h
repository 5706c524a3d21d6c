// Schedule: which constituent decoder works in which half-iteration, and what it starts from.
//
// The numbered rules are those of docs/arithmetic.md. Half-iterations count from 0.
#ifndef MORVIK_RULES_SCHEDULE_H
#define MORVIK_RULES_SCHEDULE_H

namespace morvik::rules {

/// Half-iterations of so many iterations.
constexpr unsigned halfIterations(unsigned iterations)
{
    return 2 * iterations;
}

/// The constituent decoder that half-iteration h belongs to: 0 works in natural order, 1 in interleaved order. The last
/// half-iteration of a decode is odd, so that it ends in natural order (rule 15).
constexpr unsigned constituentOf(unsigned h)
{
    return h % 2 == 0 ? 1 : 0;
}

/// Whether it is the first pass of its constituent decoder, which knows of no border column (rules 19 and 20).
constexpr bool isFirstPass(unsigned h)
{
    return h < 2;
}

/// The last pass of the same constituent decoder before h, which is no first pass (rules 19 and 20).
constexpr unsigned passBefore(unsigned h)
{
    return h - 2;
}

}  // namespace morvik::rules

#endif
