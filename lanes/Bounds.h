// Bounds: the bounds on metric differences, and the simplifications that they allow.
//
// All metrics are in eighths. The hardware's registers wrap at 4096, so wrapped and plain comparisons agree while true
// differences stay within -2048 ... 2047. Branch metrics are clipped to -128 ... 127, and any state can be reached from
// any other in three steps, the last of them over a branch pair that shares its metric. This bounds each step
// (lane_bounds_test computes the bounds):
//
//   between two states of a column             within 786; 1228 in the three steps after a known start,
//                                              1287 in the tail's column, 670 in a kept border column
//   between two candidates of a recursion      within 1484
//   between two branches in a ratio's tree     within 1340, near the ends of a block 1898
//   a ratio                                    within 944
//
// They include the corrections of MOD#, at most 6 for each decision. So plain maxima suffice everywhere.
//
// In the 64 steps of a window a metric grows by at most 64 (128 + 6). A column that starts within 1300 of 0 stays
// within 9900, and the sum of a forward and a backward metric within 20000. Lifted branch metrics (Rules.h) add at most
// 64 * 128 to a metric, and no more to the sum: the steps before lift its forward metric, those after its backward
// metric, and its own step the branch. So it stays within 28200, and no 16-bit word overflows within a window. Between
// windows, columns are normalised to about 0 by multiples of 8: a border column loses its three low bits (rule 11), and
// clearing them commutes with such a shift.
#ifndef MORVIK_LANES_BOUNDS_H
#define MORVIK_LANES_BOUNDS_H

#include "rules/Cut.h"
#include "rules/Formats.h"
#include "rules/Starts.h"

namespace morvik::lanes {

using rules::longestWindow;

/// The branch format's limits.
constexpr int branchMin = rules::smallestOf(rules::branchBits);
constexpr int branchMax = rules::largestOf(rules::branchBits);

/// The metric of every state but 0 in a known start column.
constexpr int unlikely = rules::knownMetric<int>(1, rules::smallestOf(rules::stateBits));

/// The bits of a metric that a border column keeps.
constexpr int borderMask = rules::integerOf(rules::borderMask, rules::stateAlignment);

/// Corrections of MOD# are kept for every fourth magnitude, the finest resolution of the hardware's table (rule 9). The
/// last entry is 0 and serves all greater magnitudes.
constexpr int correctionEntries = 8;
constexpr int correctionStepBits = 2;
constexpr int correctionStep = 1 << correctionStepBits;

/// The entry for a difference, in steps rounded down. The magnitude of a negative one is its inversion (rule 9).
constexpr int correctionEntry(int steps)
{
    return steps >= 0 ? steps : ~steps;
}

}  // namespace morvik::lanes

#endif
