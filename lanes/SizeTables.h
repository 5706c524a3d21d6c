// SizeTables: what a kernel has to know of a block size.
#ifndef MORVIK_LANES_SIZETABLES_H
#define MORVIK_LANES_SIZETABLES_H

#include <cstdint>
#include <vector>

#include "Kernels.h"
#include "LaneOrder.h"
#include "Layout.h"
#include "rules/Cut.h"

namespace morvik::lanes {

constexpr unsigned mostLanes = 64;

/// The block of a lane's segment, and the segment's first position in it.
struct LaneStart {
    unsigned block;
    unsigned position;
};

/// Everything in a workspace that follows from the kernel and the cut of a block size.
class SizeTables {
public:
    /// Requires a block size of the standard and at most 32 segments. Throws std::bad_alloc.
    SizeTables(const Kernel& kernel, const rules::Cut& cut);

    const LaneOrder& order() const
    {
        return itsOrder;
    }

    const LaneStart& laneStart(unsigned lane) const
    {
        return itsLaneStart[lane];
    }

    /// Makes a workspace use the tables.
    void enter(Workspace& workspace) const;

private:
    /// Permutations (Workspace.h) under construction.
    struct SlicePermutations {
        unsigned count = 0;  ///< slices
        std::uint32_t* sources = nullptr;
        std::uint8_t* controls = nullptr;

        Permutations finished() const
        {
            return {sources, controls};
        }
    };

    class PermutationWriter;

    void layOut(const Kernel& kernel, unsigned steps, Layout& layout);
    void writeInterleaver(PermutationWriter& writer, const rules::Cut& cut) const;

    const LaneOrder itsOrder;
    LaneStart itsLaneStart[mostLanes] = {};
    std::vector<unsigned> itsWindowStart;
    Layout::Storage itsStorage;
    SlicePermutations itsInterleaver[2];
    SlicePermutations itsBefore;
    SlicePermutations itsAfter;
    std::int16_t* itsFirstLanes = nullptr;
    std::int16_t* itsLastLanes = nullptr;
};

}  // namespace morvik::lanes

#endif
