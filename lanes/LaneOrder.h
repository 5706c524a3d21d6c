// LaneOrder: which segment of which block stands in which lane of a row.
#ifndef MORVIK_LANES_LANEORDER_H
#define MORVIK_LANES_LANEORDER_H

namespace lanes {

/// Blocks of `segments` segments, a power of two, share rows whose lanes form groups of `groupLanes`. A block of
/// no more segments than that takes as many neighbouring lanes, in order. A larger one takes whole groups and
/// deals its segments out to them in turn: a group holds the segments that are equal modulo the number q of the
/// block's groups. So whatever the step, the interleaver takes the values of a group from one group: over the
/// segments u of a step it is a quadratic permutation polynomial, c + a u + d u^2 with an odd a and an even d,
/// and what such a polynomial gives modulo q depends on u modulo q alone.
class LaneOrder {
public:
    LaneOrder(unsigned segments, unsigned groupLanes)
        : itsSegments(segments), itsGroupLanes(groupLanes), itsGroups(segments > groupLanes ? segments / groupLanes : 1)
    {
    }

    unsigned lane(unsigned block, unsigned segment) const
    {
        return block * itsSegments + segment % itsGroups * itsGroupLanes + segment / itsGroups;
    }

    unsigned block(unsigned lane) const
    {
        return lane / itsSegments;
    }

    unsigned segment(unsigned lane) const
    {
        const unsigned within = lane % itsSegments;
        return within % itsGroupLanes * itsGroups + within / itsGroupLanes;
    }

private:
    unsigned itsSegments;
    unsigned itsGroupLanes;
    unsigned itsGroups;  ///< of a block
};

}  // namespace lanes

#endif
