// SizeTables: what a kernel has to know of a block size.
#include "SizeTables.h"

#include "rules/Interleaver.h"

namespace morvik::lanes {

/// Writes permutations in which each segment of a slice takes its value from a segment of one other slice.
class SizeTables::PermutationWriter {
public:
    PermutationWriter(const Kernel& kernel, unsigned segments, const LaneOrder& order)
        : itsKernel(kernel), itsSegments(segments)
    {
        for (unsigned lane = 0; lane < itsKernel.lanes; ++lane) {
            itsSegment[lane] = order.segment(lane);
            itsFirstLane[lane] = order.lane(order.block(lane), 0);
        }
        for (unsigned segment = 0; segment < segments; ++segment) {
            itsLane[segment] = order.lane(0, segment);
        }
    }

    /// Lets each segment of the slice of `step` take its value from segment sourceOf(segment) of that of `sourceStep`.
    template <class SourceOf>
    void write(const SlicePermutations& permutations, unsigned step, unsigned sourceStep, SourceOf sourceOf)
    {
        for (unsigned segment = 0; segment < itsSegments; ++segment) {
            itsSourceLane[segment] = itsLane[sourceOf(segment)];
        }
        const unsigned vectorLanes = itsKernel.vectorLanes;
        for (unsigned v = 0; v < itsKernel.lanes / vectorLanes; ++v) {
            const std::size_t at = std::size_t{v} * permutations.count + step;
            std::uint8_t withinGroup[mostLanes] = {};
            for (unsigned lane = 0; lane < vectorLanes; ++lane) {
                withinGroup[lane] =
                    static_cast<std::uint8_t>(sourceLane(v * vectorLanes + lane) % itsKernel.groupLanes);
            }
            itsKernel.prepare(withinGroup, permutations.controls + at * itsKernel.permutationBytes);
            for (unsigned i = 0; i < itsKernel.sources; ++i) {
                const unsigned lane = sourceLane(v * vectorLanes + i * itsKernel.groupLanes);
                const unsigned group = lane - lane % itsKernel.groupLanes;
                permutations.sources[at * itsKernel.sources + i] =
                    (group / vectorLanes * permutations.count + sourceStep) * vectorLanes + group % vectorLanes;
            }
        }
    }

private:
    unsigned sourceLane(unsigned lane) const
    {
        return itsFirstLane[lane] + itsSourceLane[itsSegment[lane]];
    }

    const Kernel& itsKernel;
    const unsigned itsSegments;
    unsigned itsSegment[mostLanes] = {};     ///< [lane]
    unsigned itsFirstLane[mostLanes] = {};   ///< [lane] of its block
    unsigned itsLane[mostLanes] = {};        ///< [segment] of the first block
    unsigned itsSourceLane[mostLanes] = {};  ///< [segment] of the first block
};

SizeTables::SizeTables(const Kernel& kernel, const rules::Cut& cut)
    : itsOrder(cut.segments(), kernel.groupLanes, kernel.vectorLanes)
{
    const unsigned segments = cut.segments();
    for (unsigned row = 0; row <= cut.rows(); ++row) {
        itsWindowStart.push_back(cut.windowStart(row));
    }
    Layout::place(itsStorage, [&](Layout& layout) { layOut(kernel, cut.segmentLength(), layout); });
    for (unsigned lane = 0; lane < kernel.lanes; ++lane) {
        const unsigned segment = itsOrder.segment(lane);
        itsLaneStart[lane] = {itsOrder.block(lane), segment * cut.segmentLength()};
        itsFirstLanes[lane] = segment == 0 ? -1 : 0;
        itsLastLanes[lane] = segment == segments - 1 ? -1 : 0;
    }
    PermutationWriter writer(kernel, segments, itsOrder);
    writer.write(itsBefore, 0, 0, [&](unsigned segment) { return (segment + segments - 1) % segments; });
    writer.write(itsAfter, 0, 0, [&](unsigned segment) { return (segment + 1) % segments; });
    writeInterleaver(writer, cut);
}

void SizeTables::layOut(const Kernel& kernel, unsigned steps, Layout& layout)
{
    // Sources beyond the last step are prefetched alone, and stay 0.
    const auto take = [&](unsigned slices) {
        const std::size_t vectors = std::size_t{slices} * (kernel.lanes / kernel.vectorLanes);
        return SlicePermutations{slices,
                                 layout.take<std::uint32_t>((vectors + fetchAhead) * kernel.sources),
                                 layout.take<std::uint8_t>(vectors * kernel.permutationBytes)};
    };
    itsInterleaver[0] = take(steps);
    itsInterleaver[1] = take(steps);
    itsBefore = take(1);
    itsAfter = take(1);
    itsFirstLanes = layout.take<std::int16_t>(kernel.lanes);
    itsLastLanes = layout.take<std::int16_t>(kernel.lanes);
}

/// The interleaver is contention-free: the values of one step of all segments come from one step of all segments in the
/// other order.
void SizeTables::writeInterleaver(PermutationWriter& writer, const rules::Cut& cut) const
{
    const unsigned steps = cut.segmentLength();
    std::vector<unsigned> from[2] = {std::vector<unsigned>(cut.K()), std::vector<unsigned>(cut.K())};
    rules::InterleaverAddress address(*rules::findBlockSize(cut.K()));
    for (unsigned i = 0; i < cut.K(); ++i) {
        from[1][i] = address.next();
        from[0][from[1][i]] = i;
    }
    for (const unsigned d : {0U, 1U}) {
        for (unsigned k = 0; k < steps; ++k) {
            writer.write(itsInterleaver[d], k, from[d][k] % steps, [&](unsigned segment) {
                return from[d][k + segment * steps] / steps;
            });
        }
    }
}

void SizeTables::enter(Workspace& workspace) const
{
    workspace.windowStart = itsWindowStart.data();
    workspace.constituent[0].interleaver = itsInterleaver[0].finished();
    workspace.constituent[1].interleaver = itsInterleaver[1].finished();
    workspace.before = itsBefore.finished();
    workspace.after = itsAfter.finished();
    workspace.firstLanes = itsFirstLanes;
    workspace.lastLanes = itsLastLanes;
}

}  // namespace morvik::lanes
