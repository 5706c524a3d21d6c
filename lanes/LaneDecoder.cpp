// LaneDecoder: decodes blocks of one size, one lane for each segment, several blocks at once.
#include "LaneDecoder.h"

#include <algorithm>
#include <utility>

#include "Bounds.h"
#include "InstructionSets.h"
#include "Unaligned.h"
#include "rules/Interleaver.h"
#include "rules/Schedule.h"
#include "rules/Trellis.h"

namespace lanes {

namespace {

constexpr unsigned states = rules::stateCount;

/// Hands out arrays from a stretch of memory, or adds up their size when there is none yet. Each begins
/// on a cache line, at an offset that keeps equal steps of different arrays in different sets of the cache.
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

RowPermutations takePermutations(const Kernel& kernel, Layout& layout, unsigned rows)
{
    const std::size_t vectors = std::size_t{rows} * (kernel.lanes / kernel.vectorLanes);
    return {rows,
            layout.take<std::uint32_t>((vectors + fetchAhead) * kernel.sources),
            layout.take<std::uint8_t>(vectors * kernel.permutationBytes)};
}

bool loadRows(const Kernel& kernel, const std::int32_t* const* arrays, unsigned steps, std::int16_t* rows)
{
    return kernel.loadWords(arrays, steps, rows);
}

bool loadRows(const Kernel& kernel, const std::int16_t* const* arrays, unsigned steps, std::int16_t* rows)
{
    return kernel.loadHalfWords(arrays, steps, rows);
}

bool loadRows(const Kernel& kernel, const std::int8_t* const* arrays, unsigned steps, std::int16_t* rows)
{
    return kernel.loadBytes(arrays, steps, rows);
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
    const std::size_t row = kernel.lanes;
    const std::size_t rows = steps() * row;
    const unsigned windows = itsCut.rows();
    Layout layout(base);
    Workspace& space = work.space;
    space.steps = steps();
    space.windows = windows;
    space.corrections = itsCorrections.data();
    for (const unsigned d : {0U, 1U}) {
        work.interleaver[d] = takePermutations(kernel, layout, steps());
        space.constituent[d] = {layout.take<std::int16_t>(rows),
                                layout.take<std::int16_t>(rows),
                                layout.take<std::int16_t>(rows),
                                {work.interleaver[d].sources, work.interleaver[d].controls},
                                layout.take<std::int16_t>(states * row),
                                layout.take<std::int16_t>(std::size_t{windows} * states * row),
                                layout.take<std::int16_t>(states * row),
                                layout.take<std::int16_t>(states * row)};
    }
    work.before = takePermutations(kernel, layout, 1);
    work.after = takePermutations(kernel, layout, 1);
    space.before = {work.before.sources, work.before.controls};
    space.after = {work.after.sources, work.after.controls};
    space.firstLanes = work.firstLanes = layout.take<std::int16_t>(row);
    space.lastLanes = work.lastLanes = layout.take<std::int16_t>(row);
    space.slots = layout.take<std::int16_t>(std::size_t{longestWindow} * kernel.slotBytes / 2);
    space.forward = layout.take<std::int16_t>(kernel.forwardBytes / 2);
    space.ratios = layout.take<std::int16_t>(rows);
    return layout.size();
}

/// The interleaver is contention-free: the positions that one step of all segments takes its values from
/// are one step of all segments in the other order, too.
void LaneDecoder::prepareInterleaver(const Kernel& kernel,
                                     const RowPermutations& rows,
                                     const std::vector<unsigned>& from) const
{
    for (unsigned k = 0; k < steps(); ++k) {
        const unsigned sourceRow = from[k] % steps();
        preparePermutation(kernel, rows, k, sourceRow, [&](unsigned segment) {
            return (from[k + segment * steps()] - sourceRow) / steps();
        });
    }
    const std::size_t vectors = kernel.lanes / kernel.vectorLanes;
    std::fill_n(rows.sources + rows.count * vectors * kernel.sources, fetchAhead * kernel.sources, 0U);
}

/// Row `row` takes its values from row `sourceRow`, each segment from segment sourceOf(segment), modulo the
/// number of segments.
template <class SourceOf>
void LaneDecoder::preparePermutation(
    const Kernel& kernel, const RowPermutations& rows, unsigned row, unsigned sourceRow, SourceOf sourceOf) const
{
    const LaneOrder order = laneOrder(kernel);
    const auto sourceLane = [&](unsigned lane) {
        return order.lane(order.block(lane), sourceOf(order.segment(lane)) % itsCut.segments());
    };
    const unsigned vectorLanes = kernel.vectorLanes;
    for (unsigned v = 0; v < kernel.lanes / vectorLanes; ++v) {
        const std::size_t at = v * rows.count + row;
        std::uint8_t withinGroup[mostLanes] = {};
        for (unsigned lane = 0; lane < vectorLanes; ++lane) {
            withinGroup[lane] = static_cast<std::uint8_t>(sourceLane(v * vectorLanes + lane) % kernel.groupLanes);
        }
        kernel.prepare(withinGroup, rows.controls + at * kernel.permutationBytes);
        for (unsigned i = 0; i < kernel.sources; ++i) {
            const unsigned lane = sourceLane(v * vectorLanes + i * kernel.groupLanes);
            const unsigned group = lane - lane % kernel.groupLanes;
            rows.sources[at * kernel.sources + i] =
                (group / vectorLanes * rows.count + sourceRow) * vectorLanes + group % vectorLanes;
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
    work.space.windowStart = itsWindowStart.data();  // of the cut as it is now
    ConstituentRows* const rows = work.space.constituent;
    bool within = loadStream(blocks, &Streams<Input>::systematic, 0, rows[0].systematic);
    within = loadStream(blocks, &Streams<Input>::parity1, 1, rows[0].parity) && within;
    return loadStream(blocks, &Streams<Input>::parity2, 2, rows[1].parity) && within;
}

template bool LaneDecoder::load(const Streams<std::int32_t>*, unsigned);
template bool LaneDecoder::load(const Streams<std::int16_t>*, unsigned);
template bool LaneDecoder::load(const Streams<std::int8_t>*, unsigned);

template <class Input>
bool LaneDecoder::loadStream(const Streams<Input>* blocks,
                             const Input* Streams<Input>::*stream,
                             unsigned s,
                             std::int16_t* rows)
{
    const Input* lanes[mostLanes] = {};
    for (unsigned lane = 0; lane < itsKernel->lanes; ++lane) {
        const LaneStart& start = itsCurrent->laneStart[lane];
        lanes[lane] = blocks[presentBlock(start.block)].*stream + start.position;
    }
    bool within = loadRows(*itsKernel, lanes, steps(), rows);
    for (unsigned block = 0; block < itsBlocks; ++block) {
        for (unsigned position = 0; position < tailPositions; ++position) {
            const auto value = int{valueAt(blocks[block].*stream, std::size_t{itsCut.K()} + position)};
            itsTails[block][3 * position + s] = value;
            within = within && value >= branchMin && value <= branchMax;
        }
    }
    return within;
}

/// Lanes without a block repeat the last one, so that their metrics stay within bounds, too.
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

/// Before the first passes the state is known at a block's ends alone (rules 10, 19, 20).
void LaneDecoder::prepareStarts(unsigned d)
{
    const Workspace& space = itsCurrent->space;
    const std::size_t row = itsKernel->lanes;
    std::int16_t* const alpha = space.constituent[d].alphaStart;
    std::int16_t* const beta = space.constituent[d].betaStart;
    std::int16_t* const lastBeta = beta + std::size_t{space.windows - 1} * states * row;
    std::fill_n(alpha, states * row, std::int16_t{0});
    std::fill(beta, lastBeta + states * row, std::int16_t{0});
    std::fill_n(space.constituent[d].alphaReached, states * row, std::int16_t{0});
    std::fill_n(space.constituent[d].betaReached, states * row, std::int16_t{0});
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
            alpha[state * row + first] = state == 0 ? 0 : unlikely;
            lastBeta[state * row + last] = static_cast<std::int16_t>(metrics[state] & borderMask);
        }
    }
}

template <class Output>
void LaneDecoder::spread(void (*store)(const std::int16_t*, unsigned, Output* const*),
                         const std::int16_t* rows,
                         Output* const* blocks)
{
    Output scratch[mostSteps];  // what the lanes without a block give
    Output* lanes[mostLanes] = {};
    for (unsigned lane = 0; lane < itsKernel->lanes; ++lane) {
        const LaneStart& start = itsCurrent->laneStart[lane];
        lanes[lane] = start.block < itsBlocks ? blocks[start.block] + start.position : scratch;
    }
    store(rows, steps(), lanes);
}

void LaneDecoder::decisions(std::uint8_t* const* blocks)
{
    spread(itsKernel->storeDecisions, itsCurrent->space.ratios, blocks);
}

void LaneDecoder::ratios(std::int16_t* const* blocks)
{
    spread(itsKernel->storeRatios, itsCurrent->space.ratios, blocks);
}

void LaneDecoder::joint(std::int16_t* const* blocks)
{
    spread(itsKernel->storeRatios, itsCurrent->space.constituent[itsLastDecoder].joint, blocks);
}

LoadedBlock LaneDecoder::loadedBlock(unsigned block) const
{
    const LaneOrder order = laneOrder(*itsKernel);
    const unsigned vectorLanes = itsKernel->vectorLanes;
    LoadedBlock streams;
    const ConstituentRows* const rows = itsCurrent->space.constituent;
    const std::int16_t* const sources[3] = {rows[0].systematic, rows[0].parity, rows[1].parity};
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

}  // namespace lanes
