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
            decode(open);
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

/// Judges all frames, which have had one transmission, after each iteration.
void TransportSimulator::decodeEachIteration(const std::vector<unsigned>& frames, BatchResult& result)
{
    for (std::size_t kind = 0; kind < itsBatches.size(); ++kind) {
        judgeEachIteration(itsBatches.at(kind), itsJudgements.at(kind));
    }
    std::vector<BatchResult> results(itsPoint.iterations);
    for (unsigned i = 0; i < itsPoint.iterations; ++i) {
        begin(frames);
        for (std::size_t kind = 0; kind < itsBatches.size(); ++kind) {
            countAfter(i + 1, itsBatches.at(kind), itsJudgements.at(kind));
        }
        conclude(frames);
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

/// The decoder counts wrong bits after each iteration while it decodes, but gives decisions at its end only. They are
/// needed where a CRC may fit in spite of errors: these code blocks are decoded anew.
void TransportSimulator::judgeEachIteration(const link::CodeBlockBatch& batch, std::vector<Judgement>& judgements)
{
    const std::size_t blocks = batch.places.size();
    judgements.assign(blocks * itsPoint.iterations, {});
    if (blocks == 0) {
        return;
    }
    itsSent.resize(blocks * batch.K);
    for (std::size_t b = 0; b < blocks; ++b) {
        itsCheck.sentBits(batch.places[b].frame, batch.places[b].block, &itsSent[b * batch.K]);
    }
    itsWrongBits.resize(judgements.size());
    coreOf(batch).countErrors(batch.streams, batch.K, blocks, itsPoint.iterations, itsSent, itsWrongBits.data());
    for (unsigned i = 0; i < itsPoint.iterations; ++i) {
        itsAnew.clear();
        for (std::size_t b = 0; b < blocks; ++b) {
            const std::uint32_t wrong = itsWrongBits[b * itsPoint.iterations + i];
            judgements[b * itsPoint.iterations + i].verdict = {wrong, wrong == 0};
            if (itsCheck.canMiss(batch.places[b].block, wrong)) {
                itsAnew.push_back(b);
            }
        }
        judgeAnew(batch, i + 1, judgements);
    }
}

void TransportSimulator::judgeAnew(const link::CodeBlockBatch& batch,
                                   unsigned iterations,
                                   std::vector<Judgement>& judgements)
{
    if (itsAnew.empty()) {
        return;
    }
    const std::size_t length = batch.K + rules::tailPositions;
    for (std::size_t s = 0; s < batch.streams.size(); ++s) {
        std::vector<std::int8_t>& stream = itsOpen.streams.at(s);
        stream.resize(itsAnew.size() * length);
        for (std::size_t i = 0; i < itsAnew.size(); ++i) {
            std::copy_n(&batch.streams.at(s)[itsAnew[i] * length], length, &stream[i * length]);
        }
    }
    coreOf(batch).decode(itsOpen.streams, batch.K, itsAnew.size(), iterations, itsDecided);
    for (std::size_t i = 0; i < itsAnew.size(); ++i) {
        judgements[itsAnew[i] * itsPoint.iterations + iterations - 1] =
            judged(batch.places[itsAnew[i]], &itsDecided[i * batch.K]);
    }
}

/// Counts the decisions of that iteration or, with early stop, of an earlier one whose CRC fits.
void TransportSimulator::countAfter(unsigned iterations,
                                    const link::CodeBlockBatch& batch,
                                    const std::vector<Judgement>& judgements)
{
    for (std::size_t b = 0; b < batch.places.size(); ++b) {
        const Judgement* const own = &judgements[b * itsPoint.iterations];
        unsigned last = itsPoint.link.stopsEarly ? 1 : iterations;
        while (last < iterations && !own[last - 1].verdict.fits) {
            last += 1;
        }
        count(batch.places[b], own[last - 1], last);
    }
}

/// Forgets what is known of the frames' last transmission.
void TransportSimulator::begin(const std::vector<unsigned>& frames)
{
    for (const unsigned number : frames) {
        Frame& frame = itsFrames[number];
        frame.wrongBits = 0;
        frame.reception.codeBlockErrors = 0;
        frame.fits = true;
        frame.undetected.clear();
    }
}

/// Decodes the code blocks of a transmission's frames and checks their CRCs.
void TransportSimulator::decode(const std::vector<unsigned>& frames)
{
    begin(frames);
    for (const link::CodeBlockBatch& batch : itsBatches) {
        if (!batch.places.empty()) {
            itsPoint.link.stopsEarly ? decodeUntilItFits(batch) : decodeBatch(batch);
        }
    }
    conclude(frames);
}

/// Checks the CRCs of transport blocks whose code blocks have been counted.
void TransportSimulator::conclude(const std::vector<unsigned>& frames)
{
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

void TransportSimulator::decodeBatch(const link::CodeBlockBatch& batch)
{
    coreOf(batch).decode(batch.streams, batch.K, batch.places.size(), itsPoint.iterations, itsDecided);
    for (std::size_t i = 0; i < batch.places.size(); ++i) {
        count(batch.places[i], judged(batch.places[i], &itsDecided[i * batch.K]), itsPoint.iterations);
    }
}

/// Decodes with one iteration, then what does not fit with two, and so on.
void TransportSimulator::decodeUntilItFits(const link::CodeBlockBatch& batch)
{
    itsOpen = batch;
    const std::size_t length = batch.K + rules::tailPositions;
    for (unsigned i = 1; i <= itsPoint.iterations && !itsOpen.places.empty(); ++i) {
        coreOf(batch).decode(itsOpen.streams, batch.K, itsOpen.places.size(), i, itsDecided);
        std::size_t kept = 0;
        for (std::size_t b = 0; b < itsOpen.places.size(); ++b) {
            const Judgement judgement = judged(itsOpen.places[b], &itsDecided[b * batch.K]);
            if (judgement.verdict.fits || i == itsPoint.iterations) {
                count(itsOpen.places[b], judgement, i);
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

TransportSimulator::Judgement TransportSimulator::judged(const link::CodeBlockBatch::Place& place,
                                                         const std::uint8_t* decided)
{
    Judgement judgement = {itsCheck.check(place.frame, place.block, decided), {}};
    if (judgement.verdict.fits && judgement.verdict.wrongBits > 0) {
        judgement.undetected.assign(decided, decided + itsSource.code().blocks().size(place.block));
    }
    return judgement;
}

/// Adds the decisions on a code block to what is known of its frame.
void TransportSimulator::count(const link::CodeBlockBatch::Place& place,
                               const Judgement& judgement,
                               unsigned iterations)
{
    Frame& frame = itsFrames[place.frame];
    frame.wrongBits += judgement.verdict.wrongBits;
    frame.reception.codeBlockErrors += judgement.verdict.wrongBits > 0 ? 1 : 0;
    frame.reception.iterations += iterations;
    frame.fits = frame.fits && judgement.verdict.fits;
    if (!judgement.undetected.empty()) {
        frame.undetected.push_back({place.block, judgement.undetected});
    }
}

void TransportSimulator::append(BatchResult& result) const
{
    for (const Frame& frame : itsFrames) {
        result.wrongBits.push_back(frame.wrongBits);
        result.receptions.push_back(frame.reception);
    }
}

}  // namespace morvik::simulation
