// LanePath: decodes blocks with the lane-parallel decoder, with the same results as the state's components.
#include "LanePath.h"

#include "CoreInputs.h"
#include "TCalculationEngineModBase.h"
#include "rules/Cut.h"
#include "rules/Schedule.h"

using morvik::simulation_call::Batch;
using morvik::simulation_call::Status;

namespace {

/// The engine's table at the magnitudes that the lanes tell apart.
morvik::lanes::CorrectionTable correctionTable(const TCalculationEngine& engine)
{
    morvik::lanes::CorrectionTable table = {};
    const auto* base = dynamic_cast<const TCalculationEngineModBase*>(&engine);
    if (base == nullptr || base->itsAlphaLUT == nullptr) {
        return table;
    }
    const unsigned shift = engine.itsStateFormat->itsShift;
    for (std::size_t i = 0; i < table.size(); ++i) {
        table[i] = static_cast<std::uint8_t>(base->itsAlphaLUT[morvik::lanes::correctionStep * i << shift] >> shift);
    }
    return table;
}

std::uint32_t differences(const std::uint8_t* decisions, const std::uint8_t* sent, std::size_t K)
{
    std::uint32_t differing = 0;
    for (std::size_t i = 0; i < K; ++i) {
        differing += (decisions[i] != 0) != (sent[i] != 0) ? 1U : 0U;
    }
    return differing;
}

/// Sets the addresses of consecutive blocks of K values each.
template <class Value>
void setPlaces(std::vector<Value*>& blocks, Value* first, std::size_t K)
{
    for (std::size_t b = 0; b < blocks.size(); ++b) {
        blocks[b] = first + b * K;
    }
}

}  // namespace

LanePath::LanePath(veltra_ip_morvik_v1_0_state& state,
                   OriginalComponents& originals,
                   MissedBlocks& missedBlocks,
                   const morvik::lanes::InstructionSet& instructionSet)
    : itsState(state),
      itsOriginals(originals),
      itsMissedBlocks(missedBlocks),
      itsCorrections(correctionTable(*state.engine))
{
    setInstructionSet(instructionSet);
}

const morvik::lanes::InstructionSet& LanePath::instructionSet() const
{
    return itsLanes->instructionSet();
}

void LanePath::setInstructionSet(const morvik::lanes::InstructionSet& instructionSet)
{
    handOverLastBlock();
    itsLanes = std::make_unique<morvik::lanes::LaneDecoder>(
        instructionSet,
        static_cast<morvik::lanes::Algorithm>(itsOriginals.generics().C_ALGORITHM_TYPE),
        itsCorrections);
}

unsigned LanePath::take(const Batch& batch, std::size_t first, unsigned most)
{
    prepare(batch.blockSize());
    const unsigned taken = itsLanes->blocksTaken(most);
    itsDecisions.resize(taken);
    itsRatios.resize(taken);
    const auto loadAll = [&](const auto& all) {
        return load(batch, all, first, taken);
    };
    if (!std::visit(loadAll, batch.streams)) {
        loadClipped(batch, first);
    }
    return itsTaken;
}

/// Sets up the lanes for blocks of K bits.
void LanePath::prepare(unsigned K)
{
    const unsigned lastK = itsLanes->cut().K();
    if (K < lastK) {
        handOverLastBlock();
    }
    if (K != lastK) {
        const TDecoder3GPU& decoder = itsOriginals.decoder();
        itsLanes->setCut(morvik::rules::Cut(K, decoder.itsNumPU, decoder.itsThreadsPerPU));
        itsIterations = 0;
    }
    itsMissedBlocks.overwrite(K);
}

/// Returns false if a value is outside the input format: the blocks must then be loaded clipped.
template <class Input>
bool LanePath::load(const Batch& batch, const morvik::lanes::Streams<Input>& all, std::size_t first, unsigned taken)
{
    auto& blocks = std::get<Blocks<Input>>(itsBlocks);
    blocks.resize(taken);
    for (unsigned b = 0; b < taken; ++b) {
        blocks[b] = batch.streamsOf(all, first + b);
    }
    itsIterations = 0;
    itsTaken = taken;
    return itsLanes->load(blocks.data(), taken);
}

/// Clips and loads blocks. Warns in the order of single calls: of a block's tag before the next block's values.
void LanePath::loadClipped(const Batch& batch, std::size_t first)
{
    const auto size = static_cast<std::size_t>(batch.dinSize);
    std::vector<std::int16_t> values(3 * size * itsTaken);
    auto& blocks = std::get<Blocks<std::int16_t>>(itsBlocks);
    blocks.resize(itsTaken);
    for (unsigned b = 0; b < itsTaken; ++b) {
        if (b > 0) {
            morvik::core_inputs::truncateTag(itsState, batch.tag(first + b - 1));
        }
        std::int16_t* const to = values.data() + 3 * size * b;
        const auto keep = [&](unsigned stream, std::int32_t position, std::int32_t integer) {
            to[stream * size + static_cast<std::size_t>(position)] = static_cast<std::int16_t>(integer);
        };
        morvik::core_inputs::forEachSoftValue(itsState, batch, first + b, keep);
        blocks[b] = {to, to + size, to + 2 * size};
    }
    itsLanes->load(blocks.data(), itsTaken);
}

Status LanePath::decode(unsigned iterations)
{
    itsLanes->decode(0, morvik::rules::halfIterations(iterations));
    count(iterations);
    return morvik::simulation_call::success;
}

Status LanePath::countErrors(unsigned iterations, const std::uint8_t* sent, std::uint32_t* errors)
{
    const std::size_t K = blockSize();
    std::vector<std::uint8_t> bits(itsTaken * K);
    for (unsigned t = 0; t < iterations; ++t) {
        itsLanes->decode(morvik::rules::halfIterations(t), morvik::rules::halfIterations(t + 1));
        decisions(bits.data());
        for (std::size_t b = 0; b < itsTaken; ++b) {
            morvik::lanes::setValueAt(errors, b * iterations + t, differences(&bits[b * K], sent + b * K, K));
        }
    }
    count(iterations);
    return morvik::simulation_call::success;
}

void LanePath::count(unsigned iterations)
{
    TDecoder3GPU& decoder = itsOriginals.decoder();
    itsIterations = iterations;
    decoder.itsDecodeCount += itsTaken;
    decoder.itsHalfIterationCount += std::uint64_t{morvik::rules::halfIterations(iterations)} * itsTaken;
}

std::size_t LanePath::blockSize() const
{
    return itsLanes->cut().K();
}

void LanePath::decisions(std::uint8_t* to)
{
    setPlaces(itsDecisions, to, blockSize());
    itsLanes->decisions(itsDecisions.data());
}

void LanePath::ratios(std::int16_t* to)
{
    setPlaces(itsRatios, to, blockSize());
    itsLanes->ratios(itsRatios.data());
}

void LanePath::handOverLastBlock()
{
    if (itsIterations != 0) {
        itsMissedBlocks.add(itsLanes->loadedBlock(itsTaken - 1), itsLanes->cut().K(), itsIterations);
        itsIterations = 0;
    }
}

void LanePath::forgetBlocks()
{
    itsIterations = 0;
}
