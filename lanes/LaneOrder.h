// LaneOrder: maps lanes to the segments of blocks.
#ifndef MORVIK_LANES_LANEORDER_H
#define MORVIK_LANES_LANEORDER_H

#include <algorithm>

namespace morvik::lanes {

/// Blocks of `segments` segments, a power of two, share the lanes of a slice, in groups of `groupLanes`. A block that
/// fits in a group takes adjacent lanes, in order. A larger one takes q whole groups and deals its segments to them in
/// turn: a group holds the segments equal modulo q, a vector of several groups those equal modulo the number of the
/// block's vectors. At any step, the interleaver then takes the values of a group from one group, and those of a vector
/// from one vector: over the segments u of a step it is a quadratic permutation polynomial, c + a u + d u^2 with odd a
/// and even d, whose value modulo a power of two depends only on u modulo that power.
class LaneOrder {
public:
    LaneOrder(unsigned segments, unsigned groupLanes, unsigned vectorLanes)
        : itsSegments(segments),
          itsGroupLanes(groupLanes),
          itsGroups(std::max(segments / groupLanes, 1U)),
          itsVectors(std::max(segments / vectorLanes, 1U))
    {
    }

    unsigned lane(unsigned block, unsigned segment) const
    {
        const unsigned residue = segment % itsGroups;
        const unsigned group = residue % itsVectors * (itsGroups / itsVectors) + residue / itsVectors;
        return block * itsSegments + group * itsGroupLanes + segment / itsGroups;
    }

    unsigned block(unsigned lane) const
    {
        return lane / itsSegments;
    }

    unsigned segment(unsigned lane) const
    {
        const unsigned within = lane % itsSegments;
        const unsigned group = within / itsGroupLanes;
        const unsigned groupsOfVector = itsGroups / itsVectors;
        const unsigned residue = group % groupsOfVector * itsVectors + group / groupsOfVector;
        return within % itsGroupLanes * itsGroups + residue;
    }

private:
    unsigned itsSegments;
    unsigned itsGroupLanes;
    unsigned itsGroups;   ///< of a block; 1 if it takes a part of one
    unsigned itsVectors;  ///< of a block; 1 if it takes a part of one
};

}  // namespace morvik::lanes

#endif
