// LaneDecoder: decodes several blocks of one size at once, one lane for each segment.
#include "LaneDecoder.h"

#include <algorithm>
#include <utility>

#include "InstructionSets.h"
#include "Unaligned.h"
#include "rules/Interleaver.h"
#include "rules/Schedule.h"
#include "rules/Trellis.h"

namespace morvik::lanes {

namespace {

constexpr unsigned states = rules::stateCount;

/// Bump allocator; a null base only measures. Arrays begin on cache lines, staggered so that equal steps of different
/// arrays map to different cache sets.
class Layout {
public:
    static constexpr std::size_t line = 64;

    explicit Layout(unsigned char* base) : itsBase(base) {}

    template <class Element>
    Element* take(std::size_t count)
    {
        const std::size_t offset = itsSize;
        itsSize += (count * sizeof(Element) + line - 1) / line * line + stagger;
        return itsBase == nullptr ? nullptr : reinterpret_cast<Element*>(itsBase + offset);
    }

    std::size_t size() const
    {
        return itsSize;
    }

private:
    static constexpr std::size_t stagger = 5 * line;
    unsigned char* const itsBase;
    std::size_t itsSize = 0;
};

SlicePermutations takePermutations(const Kernel& kernel, Layout& layout, unsigned steps)
{
    const std::size_t vectors = std::size_t{steps} * (kernel.lanes / kernel.vectorLanes);
    return {steps,
            layout.take<std::uint32_t>((vectors + fetchAhead) * kernel.sources),
            layout.take<std::uint8_t>(vectors * kernel.permutationBytes)};
}

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
    std::vector<unsigned> windowStart;
    for (unsigned row = 0; row <= cut.rows(); ++row) {
        windowStart.push_back(cut.windowStart(row));
    }
    std::vector<unsigned> permutation(cut.K());
    std::vector<unsigned> inverse(cut.K());
    rules::InterleaverAddress address(*rules::findBlockSize(cut.K()));
    for (unsigned i = 0; i < cut.K(); ++i) {
        permutation[i] = address.next();
        inverse[permutation[i]] = i;
    }
    itsWindowStart = std::move(windowStart);
    itsPermutation = std::move(permutation);
    itsInverse = std::move(inverse);
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

void LaneDecoder::prepareWork(const Kernel& kernel, Work& work) const
{
    work.blockSize = 0;
    work.storage.resize(layOut(kernel, work, nullptr) + Layout::line);
    void* base = work.storage.data();
    std::size_t space = work.storage.size();
    layOut(kernel, work, static_cast<unsigned char*>(std::align(Layout::line, 1, base, space)));
    const LaneOrder order = laneOrder(kernel);
    for (unsigned lane = 0; lane < kernel.lanes; ++lane) {
        work.laneStart[lane] = {order.block(lane), order.segment(lane) * steps()};
        work.firstLanes[lane] = order.segment(lane) == 0 ? -1 : 0;
        work.lastLanes[lane] = order.segment(lane) == itsCut.segments() - 1 ? -1 : 0;
    }
    prepareInterleaver(kernel, work.interleaver[0], itsInverse);
    prepareInterleaver(kernel, work.interleaver[1], itsPermutation);
    preparePermutation(kernel, work.before, 0, 0, [&](unsigned segment) { return segment - 1; });
    preparePermutation(kernel, work.after, 0, 0, [&](unsigned segment) { return segment + 1; });
    work.blockSize = itsCut.K();
}

std::size_t LaneDecoder::layOut(const Kernel& kernel, Work& work, unsigned char* base) const
{
    const std::size_t lanes = kernel.lanes;
    const std::size_t values = steps() * lanes;
    const unsigned windows = itsCut.rows();
    Layout layout(base);
    Workspace& space = work.space;
    space.steps = steps();
    space.windows = windows;
    space.corrections = itsCorrections.data();
    for (const unsigned d : {0U, 1U}) {
        work.interleaver[d] = takePermutations(kernel, layout, steps());
        space.constituent[d] = {layout.take<std::int16_t>(values),
                                layout.take<std::int16_t>(values),
                                layout.take<std::int16_t>(values),
                                {work.interleaver[d].sources, work.interleaver[d].controls},
                                layout.take<std::int16_t>(states * lanes),
                                layout.take<std::int16_t>(std::size_t{windows} * states * lanes),
                                layout.take<std::int16_t>(states * lanes),
                                layout.take<std::int16_t>(states * lanes)};
    }
    work.before = takePermutations(kernel, layout, 1);
    work.after = takePermutations(kernel, layout, 1);
    space.before = {work.before.sources, work.before.controls};
    space.after = {work.after.sources, work.after.controls};
    space.firstLanes = work.firstLanes = layout.take<std::int16_t>(lanes);
    space.lastLanes = work.lastLanes = layout.take<std::int16_t>(lanes);
    space.slots = layout.take<std::int16_t>(std::size_t{longestWindow} * kernel.slotBytes / 2);
    space.forward = layout.take<std::int16_t>(kernel.forwardBytes / 2);
    space.ratios = layout.take<std::int16_t>(values);
    return layout.size();
}

/// The interleaver is contention-free: the values of one step of all segments come from one step of all segments in the
/// other order.
void LaneDecoder::prepareInterleaver(const Kernel& kernel,
                                     const SlicePermutations& permutations,
                                     const std::vector<unsigned>& from) const
{
    for (unsigned k = 0; k < steps(); ++k) {
        const unsigned sourceStep = from[k] % steps();
        preparePermutation(kernel, permutations, k, sourceStep, [&](unsigned segment) {
            return (from[k + segment * steps()] - sourceStep) / steps();
        });
    }
    const std::size_t vectors = kernel.lanes / kernel.vectorLanes;
    std::fill_n(permutations.sources + permutations.count * vectors * kernel.sources, fetchAhead * kernel.sources, 0U);
}

/// Prepares the slice of `step` to take its values from that of `sourceStep`, each segment from segment
/// sourceOf(segment) modulo the number of segments.
template <class SourceOf>
void LaneDecoder::preparePermutation(const Kernel& kernel,
                                     const SlicePermutations& permutations,
                                     unsigned step,
                                     unsigned sourceStep,
                                     SourceOf sourceOf) const
{
    const LaneOrder order = laneOrder(kernel);
    const auto sourceLane = [&](unsigned lane) {
        return order.lane(order.block(lane), sourceOf(order.segment(lane)) % itsCut.segments());
    };
    const unsigned vectorLanes = kernel.vectorLanes;
    for (unsigned v = 0; v < kernel.lanes / vectorLanes; ++v) {
        const std::size_t at = v * permutations.count + step;
        std::uint8_t withinGroup[mostLanes] = {};
        for (unsigned lane = 0; lane < vectorLanes; ++lane) {
            withinGroup[lane] = static_cast<std::uint8_t>(sourceLane(v * vectorLanes + lane) % kernel.groupLanes);
        }
        kernel.prepare(withinGroup, permutations.controls + at * kernel.permutationBytes);
        for (unsigned i = 0; i < kernel.sources; ++i) {
            const unsigned lane = sourceLane(v * vectorLanes + i * kernel.groupLanes);
            const unsigned group = lane - lane % kernel.groupLanes;
            permutations.sources[at * kernel.sources + i] =
                (group / vectorLanes * permutations.count + sourceStep) * vectorLanes + group % vectorLanes;
        }
    }
}

LaneOrder LaneDecoder::laneOrder(const Kernel& kernel) const
{
    return {itsCut.segments(), kernel.groupLanes, kernel.vectorLanes};
}

template <class Input>
bool LaneDecoder::load(const Streams<Input>* blocks, unsigned count)
{
    const Kernel& kernel = kernelFor(itsInstructionSet, itsCut.segments(), count);
    Work& work = itsWork[static_cast<std::size_t>(&kernel - itsInstructionSet.kernels)];
    if (work.blockSize != itsCut.K()) {
        prepareWork(kernel, work);
    }
    itsTails.resize(blocksTaken(count));
    itsKernel = &kernel;
    itsCurrent = &work;
    itsBlocks = blocksTaken(count);
    work.space.windowStart = itsWindowStart.data();  // of the current cut
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
        const LaneStart& start = itsCurrent->laneStart[lane];
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
    const LaneOrder order = laneOrder(*itsKernel);
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
                         Output* const* blocks)
{
    Output scratch[mostSteps];  // for lanes without a block
    Output* lanes[mostLanes] = {};
    for (unsigned lane = 0; lane < itsKernel->lanes; ++lane) {
        const LaneStart& start = itsCurrent->laneStart[lane];
        lanes[lane] = start.block < itsBlocks ? blocks[start.block] + start.position : scratch;
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
    const LaneOrder order = laneOrder(*itsKernel);
    const unsigned vectorLanes = itsKernel->vectorLanes;
    LoadedBlock streams;
    const Constituent* const constituents = itsCurrent->space.constituent;
    const std::int16_t* const sources[3] = {constituents[0].systematic, constituents[0].parity, constituents[1].parity};
    for (unsigned s = 0; s < 3; ++s) {
        std::vector<std::int16_t>& values = streams[s];
        values.reserve(itsCut.K() + tailPositions);
        for (unsigned segment = 0; segment < itsCut.segments(); ++segment) {
            const unsigned lane = order.lane(block, segment);
            for (unsigned k = 0; k < steps(); ++k) {
                values.push_back(sources[s][(lane / vectorLanes * steps() + k) * vectorLanes + lane % vectorLanes]);
            }
        }
        for (unsigned position = 0; position < tailPositions; ++position) {
            values.push_back(static_cast<std::int16_t>(itsTails[block][3 * position + s]));
        }
    }
    return streams;
}

}  // namespace morvik::lanes
