// LaneDecoder: decodes several blocks of one size at once, one lane for each segment.
#include "LaneDecoder.h"

#include <algorithm>

#include "InstructionSets.h"
#include "Unaligned.h"
#include "rules/BlockSizes.h"
#include "rules/Schedule.h"
#include "rules/Trellis.h"

namespace morvik::lanes {

namespace {

constexpr unsigned states = rules::stateCount;

bool fillSlices(const Kernel& kernel, const std::int32_t* const* arrays, unsigned steps, std::int16_t* slices)
{
    return kernel.fillFromWords(arrays, steps, slices);
}

bool fillSlices(const Kernel& kernel, const std::int16_t* const* arrays, unsigned steps, std::int16_t* slices)
{
    return kernel.fillFromHalfWords(arrays, steps, slices);
}

bool fillSlices(const Kernel& kernel, const std::int8_t* const* arrays, unsigned steps, std::int16_t* slices)
{
    return kernel.fillFromBytes(arrays, steps, slices);
}

}  // namespace

LaneDecoder::LaneDecoder(const InstructionSet& instructionSet, Algorithm algorithm, const CorrectionTable& corrections)
    : itsInstructionSet(instructionSet),
      itsAlgorithm(algorithm),
      itsCorrections(corrections),
      itsWork(instructionSet.kernelCount)
{
}

void LaneDecoder::setCut(const Cut& cut)
{
    itsCut = cut;
    itsBlocks = 0;
}

unsigned LaneDecoder::steps() const
{
    return itsCut.segmentLength();
}

unsigned LaneDecoder::blocksTaken(unsigned blocks) const
{
    return std::min(blocks, kernelFor(itsInstructionSet, itsCut.segments(), blocks).lanes / itsCut.segments());
}

/// Sets up a kernel's work for the current cut.
void LaneDecoder::prepareWork(const Kernel& kernel, Work& work) const
{
    const auto size = static_cast<std::size_t>(rules::findBlockSize(itsCut.K()) - rules::blockSizes.data());
    work.allTables.resize(rules::blockSizes.size());
    std::unique_ptr<const SizeTables>& tables = work.allTables[size];
    if (tables == nullptr) {
        tables = std::make_unique<const SizeTables>(kernel, itsCut);
    }
    if (work.tables != tables.get()) {
        work.tables = nullptr;
        Layout::place(work.storage, [&](Layout& layout) { layOut(kernel, layout, work.space); });
        tables->enter(work.space);
        work.tables = tables.get();
    }
}

void LaneDecoder::layOut(const Kernel& kernel, Layout& layout, Workspace& space) const
{
    const std::size_t lanes = kernel.lanes;
    const std::size_t values = steps() * lanes;
    space.steps = steps();
    space.windows = itsCut.rows();
    space.corrections = itsCorrections.data();
    for (Constituent& constituent : space.constituent) {
        constituent.systematic = layout.take<std::int16_t>(values);
        constituent.parity = layout.take<std::int16_t>(values);
        constituent.joint = layout.take<std::int16_t>(values);
        constituent.alphaStart = layout.take<std::int16_t>(states * lanes);
        constituent.betaStart = layout.take<std::int16_t>(std::size_t{space.windows} * states * lanes);
        constituent.alphaReached = layout.take<std::int16_t>(states * lanes);
        constituent.betaReached = layout.take<std::int16_t>(states * lanes);
    }
    space.slots = layout.take<std::int16_t>(std::size_t{longestWindow} * kernel.slotBytes / 2);
    space.forward = layout.take<std::int16_t>(kernel.forwardBytes / 2);
    space.ratios = layout.take<std::int16_t>(values);
}

template <class Input>
bool LaneDecoder::load(const Streams<Input>* blocks, unsigned count)
{
    const Kernel& kernel = kernelFor(itsInstructionSet, itsCut.segments(), count);
    Work& work = itsWork[static_cast<std::size_t>(&kernel - itsInstructionSet.kernels)];
    prepareWork(kernel, work);
    itsTails.resize(blocksTaken(count));
    itsKernel = &kernel;
    itsCurrent = &work;
    itsBlocks = blocksTaken(count);
    Constituent* const constituents = work.space.constituent;
    bool within = fillStream(blocks, &Streams<Input>::systematic, 0, constituents[0].systematic);
    within = fillStream(blocks, &Streams<Input>::parity1, 1, constituents[0].parity) && within;
    return fillStream(blocks, &Streams<Input>::parity2, 2, constituents[1].parity) && within;
}

template bool LaneDecoder::load(const Streams<std::int32_t>*, unsigned);
template bool LaneDecoder::load(const Streams<std::int16_t>*, unsigned);
template bool LaneDecoder::load(const Streams<std::int8_t>*, unsigned);

template <class Input>
bool LaneDecoder::fillStream(const Streams<Input>* blocks,
                             const Input* Streams<Input>::*stream,
                             unsigned s,
                             std::int16_t* slices)
{
    const Input* lanes[mostLanes] = {};
    for (unsigned lane = 0; lane < itsKernel->lanes; ++lane) {
        const LaneStart& start = itsCurrent->tables->laneStart(lane);
        lanes[lane] = blocks[presentBlock(start.block)].*stream + start.position;
    }
    bool within = fillSlices(*itsKernel, lanes, steps(), slices);
    for (unsigned block = 0; block < itsBlocks; ++block) {
        for (unsigned position = 0; position < tailPositions; ++position) {
            const auto value = int{valueAt(blocks[block].*stream, std::size_t{itsCut.K()} + position)};
            itsTails[block][3 * position + s] = value;
            within = within && value >= branchMin && value <= branchMax;
        }
    }
    return within;
}

/// Lanes without a block repeat the last one, to keep their metrics within bounds.
unsigned LaneDecoder::presentBlock(unsigned block) const
{
    return std::min(block, itsBlocks - 1);
}

void LaneDecoder::decode(unsigned from, unsigned to)
{
    if (from == 0) {
        prepareStarts(0);
        prepareStarts(1);
    }
    itsKernel->decode(itsCurrent->space, itsAlgorithm, from, to);
    itsLastDecoder = rules::constituentOf(to - 1);
}

/// Sets the start columns of the first passes: the state is known only at a block's ends (rules 10, 19, 20).
void LaneDecoder::prepareStarts(unsigned d)
{
    const Workspace& space = itsCurrent->space;
    const std::size_t lanes = itsKernel->lanes;
    std::int16_t* const alpha = space.constituent[d].alphaStart;
    std::int16_t* const beta = space.constituent[d].betaStart;
    std::int16_t* const lastBeta = beta + std::size_t{space.windows - 1} * states * lanes;
    std::fill_n(alpha, states * lanes, std::int16_t{0});
    std::fill(beta, lastBeta + states * lanes, std::int16_t{0});
    std::fill_n(space.constituent[d].alphaReached, states * lanes, std::int16_t{0});
    std::fill_n(space.constituent[d].betaReached, states * lanes, std::int16_t{0});
    const LaneOrder& order = itsCurrent->tables->order();
    for (unsigned block = 0; block < itsKernel->lanes / itsCut.segments(); ++block) {
        const unsigned first = order.lane(block, 0);
        const unsigned last = order.lane(block, itsCut.segments() - 1);
        const TailValues& values = itsTails[presentBlock(block)];
        rules::Tail<int> tail{};
        for (unsigned step = 0; step < rules::tailSteps; ++step) {
            tail.x[step] = values[rules::tailPlace(d, step, false)];
            tail.p[step] = values[rules::tailPlace(d, step, true)];
        }
        const auto metrics = rules::tailColumn(tail);
        for (unsigned state = 0; state < states; ++state) {
            alpha[state * lanes + first] = state == 0 ? 0 : unlikely;
            lastBeta[state * lanes + last] = static_cast<std::int16_t>(metrics[state] & borderMask);
        }
    }
}

template <class Output>
void LaneDecoder::spread(void (*spreadSlices)(const std::int16_t*, unsigned, Output* const*),
                         const std::int16_t* slices,
                         Output* const* blocks) const
{
    Output scratch[mostSteps];  // for other lanes
    Output* lanes[mostLanes] = {};
    for (unsigned lane = 0; lane < itsKernel->lanes; ++lane) {
        const LaneStart& start = itsCurrent->tables->laneStart(lane);
        Output* const block = start.block < itsBlocks ? blocks[start.block] : nullptr;
        lanes[lane] = block != nullptr ? block + start.position : scratch;
    }
    spreadSlices(slices, steps(), lanes);
}

void LaneDecoder::decisions(std::uint8_t* const* blocks)
{
    spread(itsKernel->spreadDecisions, itsCurrent->space.ratios, blocks);
}

void LaneDecoder::ratios(std::int16_t* const* blocks)
{
    spread(itsKernel->spreadWords, itsCurrent->space.ratios, blocks);
}

void LaneDecoder::joint(std::int16_t* const* blocks)
{
    spread(itsKernel->spreadWords, itsCurrent->space.constituent[itsLastDecoder].joint, blocks);
}

LoadedBlock LaneDecoder::loadedBlock(unsigned block) const
{
    const Constituent* const constituents = itsCurrent->space.constituent;
    const std::int16_t* const slices[3] = {constituents[0].systematic, constituents[0].parity, constituents[1].parity};
    LoadedBlock streams;
    for (unsigned s = 0; s < 3; ++s) {
        std::vector<std::int16_t>& values = streams[s];
        values.reserve(itsCut.K() + tailPositions);
        values.resize(itsCut.K());
        std::int16_t* blocks[mostLanes] = {};
        blocks[block] = values.data();
        spread(itsKernel->spreadWords, slices[s], blocks);
        for (std::int16_t& aligned : values) {
            aligned = static_cast<std::int16_t>(rules::integerOf(aligned, rules::stateAlignment));
        }
        for (unsigned position = 0; position < tailPositions; ++position) {
            values.push_back(static_cast<std::int16_t>(itsTails[block][3 * position + s]));
        }
    }
    return streams;
}

}  // namespace morvik::lanes
