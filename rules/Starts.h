// Starts: the start columns of recursions, and the bits kept of border columns.
//
// The numbered rules are those of docs/arithmetic.md.
#ifndef MORVIK_RULES_STARTS_H
#define MORVIK_RULES_STARTS_H

#include "rules/Arithmetic.h"

namespace morvik::rules {

/// A state's metric where the encoder is known to be in state 0: 0 for state 0, half the most negative metric for the
/// others (rule 10).
template <class Number>
constexpr Number knownMetric(unsigned state, Number mostNegative)
{
    return state == 0 ? Number{0} : static_cast<Number>(mostNegative / 2);
}

/// Every state's metric where the state is unknown (rule 10).
constexpr Value unknownMetric = 0;

/// The metric bits kept at the border between two segments or windows: all but the seven low ones (rule 11).
constexpr Value borderMask = wrap16(0xFF80);

}  // namespace morvik::rules

#endif
