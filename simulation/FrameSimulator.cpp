// FrameSimulator: makes and decodes frames and counts their wrong bits, in one thread.
#include "FrameSimulator.h"

#include <algorithm>
#include <cstring>
#include <stdexcept>
#include <utility>

#include "base/Thousandths.h"
#include "rules/Tail.h"

namespace morvik::simulation {

namespace {

/// Frames to decode at once: few enough that their soft values and bits stay in the L2 cache, and at least as many as
/// the encoder and the decoder take at once.
std::uint32_t framesAtOnce(unsigned blockSize)
{
    return std::max(1024 / blockSize, 1U) * 64;
}

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

void expectSuccess(std::int32_t status)
{
    if (status != 0) {
        throw std::runtime_error("the decoder has refused a block");
    }
}

}  // namespace

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
    const Point& point = itsPlan.points[result.batch.point];
    const std::uint32_t count = std::min(framesAtOnce(point.blockSize), result.batch.count - done);
    itsSource->make(result.batch.first + done, count, itsFrames);
    const std::size_t counted = result.wrongBits.size();
    result.wrongBits.resize(counted + count * itsPlan.countsOf(point));
    if (itsPlan.eachIteration) {
        countWrongBitsOfEachIteration(point, count, &result.wrongBits[counted]);
    } else {
        countWrongBits(point, count, &result.wrongBits[counted]);
    }
    result.clipped.insert(result.clipped.end(), itsFrames.clipped.begin(), itsFrames.clipped.end());
    return true;
}

const morvik::link::Frames& FrameSimulator::frames() const
{
    return itsFrames;
}

void FrameSimulator::prepareFor(std::size_t point)
{
    if (itsPoint == point) {
        return;
    }
    const Point& next = itsPlan.points[point];
    if (!itsPoint || next.numPu != itsPlan.points[*itsPoint].numPu ||
        next.algorithm != itsPlan.points[*itsPoint].algorithm) {
        makeDecoder(next);
    }
    itsSource.emplace(next.blockSize, next.milliDecibels, base::fromThousandths(next.milliScale), itsPlan.seed);
    itsPoint = point;
}

void FrameSimulator::makeDecoder(const Point& point)
{
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = static_cast<std::int32_t>(point.numPu);
    generics.C_ALGORITHM_TYPE = static_cast<std::int32_t>(point.algorithm);
    itsDecoder.reset(veltra_ip_morvik_v1_0_create_state(generics));
    const bool isMade =
        itsDecoder && (itsInstructionSet.empty() ||
                       veltra_ip_morvik_v1_0_set_instruction_set(itsDecoder.get(), itsInstructionSet.c_str()) == 0);
    if (!isMade) {
        throw std::runtime_error("the decoder cannot be made");
    }
}

void FrameSimulator::countWrongBits(const Point& point, std::uint32_t count, std::uint32_t* wrongBits)
{
    itsDecided.resize(std::size_t{count} * point.blockSize);
    veltra_ip_morvik_v1_0_batch_outputs outputs = {};
    outputs.dout = itsDecided.data();
    outputs.dout_alloc = itsDecided.size();
    expectSuccess(
        veltra_ip_morvik_v1_0_batch_simulate_i8(itsDecoder.get(),
                                                itsFrames.streams[0].data(),
                                                itsFrames.streams[1].data(),
                                                itsFrames.streams[2].data(),
                                                static_cast<std::int32_t>(point.blockSize + rules::tailPositions),
                                                count,
                                                point.iterations,
                                                nullptr,
                                                &outputs));
    const std::uint8_t* sent = itsFrames.sent.data();
    const std::uint8_t* decided = itsDecided.data();
    for (std::uint32_t frame = 0; frame < count; ++frame) {
        wrongBits[frame] = differences(sent, decided, point.blockSize);
        sent += point.blockSize;
        decided += point.blockSize;
    }
}

void FrameSimulator::countWrongBitsOfEachIteration(const Point& point, std::uint32_t count, std::uint32_t* wrongBits)
{
    expectSuccess(
        veltra_ip_morvik_v1_0_batch_count_errors_i8(itsDecoder.get(),
                                                    itsFrames.streams[0].data(),
                                                    itsFrames.streams[1].data(),
                                                    itsFrames.streams[2].data(),
                                                    static_cast<std::int32_t>(point.blockSize + rules::tailPositions),
                                                    count,
                                                    point.iterations,
                                                    itsFrames.sent.data(),
                                                    wrongBits,
                                                    std::size_t{count} * point.iterations));
}

}  // namespace morvik::simulation
