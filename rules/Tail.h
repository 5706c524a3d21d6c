// Tail: the trellis termination: its steps and positions, and the order of its values.
//
// The numbered rules are those of docs/arithmetic.md.
#ifndef MORVIK_RULES_TAIL_H
#define MORVIK_RULES_TAIL_H

namespace morvik::rules {

/// Steps that return a constituent encoder to state 0, one for each delay element. The trellis of a block of K bits has
/// K + 3 steps.
constexpr unsigned tailSteps = 3;

/// Positions of a block that carry its tail, after the K others.
constexpr unsigned tailPositions = 4;

/// Tail values of both encoders.
constexpr unsigned tailValues = 3 * tailPositions;

/// The place of a tail value, 0 to 11: x z x z x z of the first encoder, then of the second (rule 12).
/// Place i is in stream i mod 3 of position K + i / 3.
constexpr unsigned tailPlace(unsigned constituent, unsigned step, bool isParity)
{
    return 2 * (tailSteps * constituent + step) + (isParity ? 1 : 0);
}

}  // namespace morvik::rules

#endif
