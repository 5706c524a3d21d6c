// BlockSimulator: makes and decodes plain code blocks and counts their wrong bits.
#include "BlockSimulator.h"

#include <algorithm>
#include <cstring>

#include "base/Thousandths.h"
#include "rules/Tail.h"

namespace morvik::simulation {

namespace {

/// Counts the bits that differ, each a byte of 0 or 1. Block sizes are multiples of 8: words of eight bytes are added,
/// at most 31 of them, so that neither a byte nor the sum of all eight overflows.
std::uint32_t differences(const std::uint8_t* a, const std::uint8_t* b, unsigned bits)
{
    constexpr unsigned longest = 31 * 8;
    std::uint32_t count = 0;
    for (unsigned start = 0; start < bits; start += longest) {
        const unsigned end = std::min(start + longest, bits);
        std::uint64_t bytes = 0;
        for (unsigned i = start; i < end; i += 8) {
            std::uint64_t words[2];
            std::memcpy(&words[0], a + i, 8);
            std::memcpy(&words[1], b + i, 8);
            bytes += words[0] ^ words[1];
        }
        count += static_cast<std::uint32_t>(bytes * 0x0101010101010101 >> 56);
    }
    return count;
}

}  // namespace

BlockSimulator::BlockSimulator(const Plan& plan, const Point& point, Core& core)
    : itsPlan(plan), itsPoint(point), itsCore(core), itsSource(sourceOf(plan, point))
{
}

std::uint32_t BlockSimulator::framesAtOnce() const
{
    return blocksAtOnce(itsPoint.blockSize);
}

void BlockSimulator::simulate(std::uint64_t first, std::uint32_t count, BatchResult& result)
{
    std::visit([&](auto& source) { source.make(first, count, itsFrames); }, itsSource);
    const std::size_t counted = result.wrongBits.size();
    result.wrongBits.resize(counted + count * itsPlan.countsOf(itsPoint));
    if (itsPlan.eachIteration) {
        itsCore.countErrors(itsFrames.streams,
                            itsPoint.blockSize,
                            count,
                            itsPoint.iterations,
                            itsFrames.sent,
                            &result.wrongBits[counted]);
    } else {
        countWrongBits(count, &result.wrongBits[counted]);
    }
    result.clipped.insert(result.clipped.end(), itsFrames.clipped.begin(), itsFrames.clipped.end());
}

std::vector<ReceivedBlock> BlockSimulator::receivedBlocks() const
{
    ReceivedBlock block;
    const auto K = static_cast<std::ptrdiff_t>(itsPoint.blockSize);
    const std::size_t positions = std::size_t{itsPoint.blockSize} + rules::tailPositions;
    const auto length = static_cast<std::ptrdiff_t>(positions);
    for (unsigned s = 0; s < 3; ++s) {
        const auto first = itsFrames.streams[s].begin();
        block.streams[s].assign(first, first + length);
    }
    block.sent.assign(itsFrames.sent.begin(), itsFrames.sent.begin() + K);
    return {block};
}

BlockSimulator::Source BlockSimulator::sourceOf(const Plan& plan, const Point& point)
{
    const double scale = base::fromThousandths(point.milliScale);
    if (point.link.isPlainBpsk()) {
        return link::FrameSource(point.blockSize, point.milliDecibels, scale, plan.seed);
    }
    return link::ModulatedSource(point.blockSize,
                                 {point.link.modulation, point.link.fading, point.link.demapper, point.milliEsn0},
                                 scale,
                                 plan.seed);
}

void BlockSimulator::countWrongBits(std::uint32_t count, std::uint32_t* wrongBits)
{
    const unsigned K = itsPoint.blockSize;
    itsCore.decode(itsFrames.streams, K, count, itsPoint.iterations, itsDecided);
    const std::uint8_t* sent = itsFrames.sent.data();
    const std::uint8_t* decided = itsDecided.data();
    for (std::uint32_t frame = 0; frame < count; ++frame) {
        wrongBits[frame] = differences(sent, decided, K);
        sent += K;
        decided += K;
    }
}

}  // namespace morvik::simulation
