// Extrinsics: what goes into the recursions of a pass, and what comes out of its ratios.
#ifndef MORVIK_LANES_EXTRINSICS_H
#define MORVIK_LANES_EXTRINSICS_H

#include "Bounds.h"
#include "Machine.h"
#include "Rules.h"
#include "Words.h"
#include "rules/Trellis.h"

namespace morvik::lanes::MORVIK_LANES {

/// Whether extrinsic values are passed on unscaled, or times the scale of rules/Algorithms.h (rule 14).
enum class Extrinsic { whole, scaled };

/// LTE has no second parity stream (rule 5), so the last two branch metrics repeat the others: 2 is 1, and 3 is 0.
template <unsigned count>
MORVIK_INLINE BranchMetrics<count> branchMetrics(Eighths<count> joint, Eighths<count> parity)
{
    BranchMetrics<count> g = rules::branchSums(joint, parity, Eighths<count>{});
    rules::clipBranches(g, branchMin, branchMax);
    return g;
}

/// The extrinsic value ratio - 2 joint is scaled, rounded down and clipped (rule 14), then halved and rounded down
/// again in the other decoder (rule 13): one rounding suffices.
template <Extrinsic extrinsic, unsigned count>
MORVIK_INLINE Eighths<count> nextJoint(Eighths<count> ratio, Eighths<count> joint, Eighths<count> systematic)
{
    const Eighths<count> half =
        extrinsic == Extrinsic::scaled ? Machine::scaledHalf(ratio - (joint + joint)) : (ratio >> 1) - joint;
    return clip(half, branchMin / 2, branchMax / 2) + systematic;
}

}  // namespace morvik::lanes::MORVIK_LANES

#endif
