// FrameSimulator: makes and decodes frames and counts their wrong bits, in one thread.
#include "FrameSimulator.h"

#include <algorithm>
#include <utility>

#include "BlockSimulator.h"
#include "TransportSimulator.h"

namespace morvik::simulation {

FrameSimulator::FrameSimulator(const Plan& plan, std::string instructionSet)
    : itsPlan(plan), itsInstructionSet(std::move(instructionSet))
{
}

BatchResult FrameSimulator::begin(const FrameBatch& batch) const
{
    BatchResult result;
    result.batch = batch;
    result.wrongBits.reserve(batch.count * itsPlan.countsOf(itsPlan.points[batch.point]));
    result.clipped.reserve(batch.count);
    return result;
}

bool FrameSimulator::proceed(BatchResult& result)
{
    const auto done = static_cast<std::uint32_t>(result.clipped.size());
    if (done == result.batch.count) {
        return false;
    }
    prepareFor(result.batch.point);
    const std::uint32_t count = std::min(itsSimulator->framesAtOnce(), result.batch.count - done);
    itsSimulator->simulate(result.batch.first + done, count, result);
    return true;
}

std::vector<ReceivedBlock> FrameSimulator::receivedBlocks() const
{
    return itsSimulator->receivedBlocks();
}

void FrameSimulator::prepareFor(std::size_t point)
{
    if (itsPoint == point) {
        return;
    }
    const Point& next = itsPlan.points[point];
    itsSimulator.reset();
    if (!itsPoint || next.numPu != itsPlan.points[*itsPoint].numPu ||
        next.algorithm != itsPlan.points[*itsPoint].algorithm) {
        itsCore.emplace(next.numPu, next.algorithm, itsInstructionSet);
    }
    if (next.link.hasTransportBlocks()) {
        itsSimulator = std::make_unique<TransportSimulator>(itsPlan, next, *itsCore, itsInstructionSet);
    } else {
        itsSimulator = std::make_unique<BlockSimulator>(itsPlan, next, *itsCore);
    }
    itsPoint = point;
}

}  // namespace morvik::simulation
