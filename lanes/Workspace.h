// Workspace: what the lanes work on, as plain data.
//
// Values are kept step by step, one for each lane of a vector; a row, the lanes that work at a time, may be
// several vectors, whose values follow each other. A lane is a segment of a block, and several blocks of one
// size share a row (LaneOrder.h).
// All soft values and metrics are whole steps. Arrays of rows are aligned to 64 bytes.
#ifndef MORVIK_LANES_WORKSPACE_H
#define MORVIK_LANES_WORKSPACE_H

#include <cstdint>

namespace lanes {

/// Where the vectors of rows come from; the form is the kernel's own (Permute.h).
struct Permutations {
    const std::uint32_t* sources;
    const std::uint8_t* controls;
};

/// The rows that one constituent decoder works on, in its own order.
struct ConstituentRows {
    std::int16_t* systematic;  ///< [vector][step][lane]
    std::int16_t* parity;      ///< [vector][step][lane]
    /// [vector][step][lane] What the decoder hands to the other one: half of the extrinsic value, which is how
    /// an a-priori value enters, with the systematic value added; twice the other's intrinsic value.
    std::int16_t* joint;
    Permutations interleaver;  ///< [vector][step + ahead] the other decoder's values that enter a step
    std::int16_t* alphaStart;  ///< [state][lane] start columns of the segments
    std::int16_t* betaStart;   ///< [window][state][lane] start columns of the windows
    /// [state][lane] the columns that the last pass reached at the ends of segments, and at the beginnings.
    /// A segment's are the start of its neighbour.
    std::int16_t* alphaReached;
    std::int16_t* betaReached;
};

/// A row's source is fetched so many steps ahead of its use.
constexpr unsigned fetchAhead = 8;

struct Workspace {
    unsigned steps;               ///< of a segment
    unsigned windows;             ///< of a segment
    const unsigned* windowStart;  ///< [window + 1] the first step of each window, then `steps`
    ConstituentRows constituent[2];
    const std::uint8_t* corrections;  ///< [16] the correction table, in steps, by a quarter of the magnitude
    Permutations before;              ///< [vector] each segment from the segment before it
    Permutations after;               ///< [vector] each segment from the segment after it
    const std::int16_t* firstLanes;   ///< [lane] all ones for each block's first segment, else 0
    const std::int16_t* lastLanes;    ///< [lane] all ones for each block's last segment, else 0
    std::int16_t* slots;              ///< forward and branch metrics and joint values of one window
    std::int16_t* forward;            ///< [vector][metric] the forward recursion between two windows
    std::int16_t* ratios;             ///< [vector][step][lane] log-likelihood ratios of the last pass
};

}  // namespace lanes

#endif
