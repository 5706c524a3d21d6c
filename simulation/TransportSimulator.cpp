// TransportSimulator: makes, decodes and checks transport blocks, with retransmissions.
#include "TransportSimulator.h"

#include <algorithm>
#include <numeric>

#include "base/Thousandths.h"
#include "rules/Tail.h"

namespace morvik::simulation {

namespace {

/// A scale that is asked for holds for all transmissions. One that suits follows the energy that adds up; where values
/// are added up in steps, the steps have to be those of the first transmission.
std::vector<double> scalesOf(const Point& point)
{
    std::vector<double> scales(point.link.versions.size(), base::fromThousandths(point.milliScale));
    if (!point.scaleOption && point.link.softBufferBits == 0) {
        for (unsigned t = 1; t < scales.size(); ++t) {
            scales[t] *= automaticScale(point, t) / automaticScale(point, 0);
        }
    }
    return scales;
}

}  // namespace

link::TransportSetting transportSettingOf(const Point& point)
{
    const LinkFormat& format = point.link;
    link::TransportSetting setting;
    setting.bits = format.transportBlockSize;
    setting.codedBits = format.codedBits;
    setting.symbols = {format.modulation, format.fading, format.demapper, point.milliEsn0};
    setting.versions = format.versions;
    setting.softBufferSize = format.softBufferSize == 0 ? link::unlimitedBuffer : format.softBufferSize;
    setting.softBufferBits = format.softBufferBits;
    setting.scales = scalesOf(point);
    return setting;
}

TransportSimulator::TransportSimulator(const Plan& plan,
                                       const Point& point,
                                       Core& core,
                                       const std::string& instructionSet)
    : itsPlan(plan),
      itsPoint(point),
      itsCore(core),
      itsSmallCore(point.numPu, point.algorithm, instructionSet),
      itsSource(transportSettingOf(point), plan.seed),
      itsCheck(itsSource)
{
}

std::uint32_t TransportSimulator::framesAtOnce() const
{
    return std::max(blocksAtOnce(itsPoint.blockSize) / itsSource.code().blocks().count, 1U);
}

void TransportSimulator::simulate(std::uint64_t first, std::uint32_t count, BatchResult& result)
{
    itsSource.begin(first, count);
    itsCheck.begin(count);
    itsFrames.assign(count, {});
    std::vector<std::uint32_t> clipped(count);
    std::vector<unsigned> open(count);
    std::iota(open.begin(), open.end(), 0U);
    if (itsPlan.eachIteration) {
        transmit(open, 0, clipped);
        decodeEachIteration(open, result);
    } else {
        for (unsigned t = 0; t < itsPoint.link.versions.size() && !open.empty(); ++t) {
            transmit(open, t, clipped);
            decode(open, itsPoint.iterations);
            open.erase(
                std::remove_if(open.begin(), open.end(), [this](unsigned frame) { return itsFrames[frame].fits; }),
                open.end());
        }
        append(result);
    }
    result.clipped.insert(result.clipped.end(), clipped.begin(), clipped.end());
}

std::vector<ReceivedBlock> TransportSimulator::receivedBlocks() const
{
    std::vector<ReceivedBlock> blocks;
    for (const link::CodeBlockBatch& batch : itsBatches) {
        const std::size_t positions = std::size_t{batch.K} + rules::tailPositions;
        const auto length = static_cast<std::ptrdiff_t>(positions);
        for (std::size_t i = 0; i < batch.places.size() && batch.places[i].frame == 0; ++i) {
            ReceivedBlock& block = blocks.emplace_back();
            for (unsigned s = 0; s < 3; ++s) {
                const auto start = batch.streams[s].begin() + static_cast<std::ptrdiff_t>(i) * length;
                block.streams[s].assign(start, start + length);
            }
            block.sent = itsCheck.sentBits(0, batch.places[i].block);
        }
    }
    return blocks;
}

void TransportSimulator::transmit(const std::vector<unsigned>& frames,
                                  unsigned transmission,
                                  std::vector<std::uint32_t>& clipped)
{
    itsSource.transmit(frames, transmission, itsBatches, clipped.data());
    for (const unsigned frame : frames) {
        itsFrames[frame].reception.transmissions += 1;
    }
}

/// Decodes all frames, which have had one transmission, with each number of iterations anew.
void TransportSimulator::decodeEachIteration(const std::vector<unsigned>& frames, BatchResult& result)
{
    std::vector<BatchResult> results(itsPoint.iterations);
    for (unsigned i = 0; i < itsPoint.iterations; ++i) {
        decode(frames, i + 1);
        append(results[i]);
        for (Frame& frame : itsFrames) {
            frame.reception.iterations = 0;
        }
    }
    for (const unsigned frame : frames) {
        for (const BatchResult& each : results) {
            result.wrongBits.push_back(each.wrongBits[frame]);
            result.receptions.push_back(each.receptions[frame]);
        }
    }
}

/// Decodes the code blocks of a transmission's frames and checks their CRCs.
void TransportSimulator::decode(const std::vector<unsigned>& frames, unsigned iterations)
{
    for (const unsigned number : frames) {
        Frame& frame = itsFrames[number];
        frame.wrongBits = 0;
        frame.reception.codeBlockErrors = 0;
        frame.fits = true;
        frame.undetected.clear();
    }
    for (const link::CodeBlockBatch& batch : itsBatches) {
        if (!batch.places.empty()) {
            itsPoint.link.stopsEarly ? decodeUntilItFits(batch, iterations) : decodeBatch(batch, iterations);
        }
    }
    for (const unsigned number : frames) {
        Frame& frame = itsFrames[number];
        // A code block that is alone has the transport block's CRC.
        frame.fits = frame.fits && (frame.undetected.empty() || itsSource.code().blocks().count == 1 ||
                                    itsCheck.fits(number, frame.undetected));
        frame.reception.undetected = frame.fits && frame.wrongBits > 0 ? 1 : 0;
    }
}

Core& TransportSimulator::coreOf(const link::CodeBlockBatch& batch)
{
    return batch.K == itsPoint.blockSize ? itsCore : itsSmallCore;
}

void TransportSimulator::decodeBatch(const link::CodeBlockBatch& batch, unsigned iterations)
{
    coreOf(batch).decode(batch.streams, batch.K, batch.places.size(), iterations, itsDecided);
    for (std::size_t i = 0; i < batch.places.size(); ++i) {
        judge(batch.places[i], &itsDecided[i * batch.K], iterations, true);
    }
}

/// Decodes with one iteration, then what does not fit with two, and so on.
void TransportSimulator::decodeUntilItFits(const link::CodeBlockBatch& batch, unsigned iterations)
{
    itsOpen = batch;
    const std::size_t length = batch.K + rules::tailPositions;
    for (unsigned i = 1; i <= iterations && !itsOpen.places.empty(); ++i) {
        coreOf(batch).decode(itsOpen.streams, batch.K, itsOpen.places.size(), i, itsDecided);
        std::size_t kept = 0;
        for (std::size_t b = 0; b < itsOpen.places.size(); ++b) {
            if (judge(itsOpen.places[b], &itsDecided[b * batch.K], i, i == iterations)) {
                continue;
            }
            if (kept < b) {
                itsOpen.places[kept] = itsOpen.places[b];
                for (auto& stream : itsOpen.streams) {
                    std::copy_n(&stream[b * length], length, &stream[kept * length]);
                }
            }
            kept += 1;
        }
        itsOpen.places.resize(kept);
    }
}

/// Counts the decisions on a code block if its CRC fits or if they are the last. Returns whether it has counted them.
bool TransportSimulator::judge(const link::CodeBlockBatch::Place& place,
                               const std::uint8_t* decided,
                               unsigned iterations,
                               bool isLast)
{
    const BlockVerdict verdict = itsCheck.check(place.frame, place.block, decided);
    if (!verdict.fits && !isLast) {
        return false;
    }
    Frame& frame = itsFrames[place.frame];
    frame.wrongBits += verdict.wrongBits;
    frame.reception.codeBlockErrors += verdict.wrongBits > 0 ? 1 : 0;
    frame.reception.iterations += iterations;
    frame.fits = frame.fits && verdict.fits;
    if (verdict.fits && verdict.wrongBits > 0) {
        frame.undetected.push_back({place.block, {decided, decided + itsSource.code().blocks().size(place.block)}});
    }
    return true;
}

void TransportSimulator::append(BatchResult& result) const
{
    for (const Frame& frame : itsFrames) {
        result.wrongBits.push_back(frame.wrongBits);
        result.receptions.push_back(frame.reception);
    }
}

}  // namespace morvik::simulation
