// Workspace: the working memory of the lanes, as plain data.
//
// A lane works on a segment of a block; several blocks of one size may share the lanes (LaneOrder.h). A slice holds one
// trellis step: a value for each lane, in one or more vectors. An array of slices holds all steps of the first vector,
// then those of the next, and is aligned to 64 bytes. Soft values and metrics are in eighths.
#ifndef MORVIK_LANES_WORKSPACE_H
#define MORVIK_LANES_WORKSPACE_H

#include <cstdint>

namespace morvik::lanes {

/// The sources of the vectors of slices, in a machine-specific form (Machine.h).
struct Permutations {
    const std::uint32_t* sources;
    const std::uint8_t* controls;
};

/// The slices and columns of one constituent decoder, in its own order.
struct Constituent {
    std::int16_t* systematic;  ///< [vector][step][lane]
    std::int16_t* parity;      ///< [vector][step][lane]
    /// [vector][step][lane] The input of the other decoder, twice its intrinsic value: half of the extrinsic value, its
    /// a-priori value, plus the systematic value.
    std::int16_t* joint;
    Permutations interleaver;  ///< [vector][step + ahead] the other decoder's values used in a step
    std::int16_t* alphaStart;  ///< [state][lane] start columns of the segments
    std::int16_t* betaStart;   ///< [window][state][lane] start columns of the windows
    /// [state][lane] the columns that the last pass reached at the ends of segments, and at their beginnings: the start
    /// columns of their neighbours.
    std::int16_t* alphaReached;
    std::int16_t* betaReached;
};

/// How many steps ahead the source of a slice is prefetched.
constexpr unsigned fetchAhead = 8;

struct Workspace {
    unsigned steps;               ///< per segment
    unsigned windows;             ///< per segment
    const unsigned* windowStart;  ///< [window + 1] the first step of each window, then `steps`
    Constituent constituent[2];
    const std::uint8_t* corrections;  ///< [correctionEntries] corrections of decision differences (Bounds.h)
    Permutations before;              ///< [vector] each segment from the segment before it
    Permutations after;               ///< [vector] each segment from the segment after it
    const std::int16_t* firstLanes;   ///< [lane] all ones for each block's first segment, else 0
    const std::int16_t* lastLanes;    ///< [lane] all ones for each block's last segment, else 0
    std::int16_t* slots;              ///< forward and branch metrics and joint values of one window
    std::int16_t* forward;            ///< [vector][metric] the forward recursion between two windows
    std::int16_t* ratios;             ///< [vector][step][lane] log-likelihood ratios of the last pass
};

/// A pass of a decode.
struct HalfIteration {
    unsigned d;                 ///< the constituent decoder
    const std::int16_t* joint;  ///< [vector][step][lane] what the other decoder passes on
    bool isFirst;               ///< whether it is the decoder's first pass over the block
    bool isLast;                ///< whether its ratios are kept
};

}  // namespace morvik::lanes

#endif
