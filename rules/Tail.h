// Tail: the termination of the trellis: how many steps and positions it has, and in which order its values come.
//
// The numbered rules are those of docs/arithmetic.md.
#ifndef MORVIK_RULES_TAIL_H
#define MORVIK_RULES_TAIL_H

namespace morvik::rules {

/// Steps that lead a constituent encoder back to state 0: one for each delay element. A trellis of K bits has K + 3
/// steps.
constexpr unsigned tailSteps = 3;

/// Positions of a block that carry its tail, behind K others.
constexpr unsigned tailPositions = 4;

/// Values of the tail, of both encoders.
constexpr unsigned tailValues = 3 * tailPositions;

/// The place of one of them, 0 to 11: x z x z x z of the first encoder and then of the second (rule 12).
/// Place i is in stream i mod 3 of position K + i / 3.
constexpr unsigned tailPlace(unsigned constituent, unsigned step, bool isParity)
{
    return 2 * (tailSteps * constituent + step) + (isParity ? 1 : 0);
}

}  // namespace morvik::rules

#endif
