// LanePath: the C interface's quick way through the lane-parallel decoder, beside the components.
#include "LanePath.h"

#include <cstddef>
#include <utility>

#include "Segmentation.h"
#include "TCalculationEngineModBase.h"

namespace {

/// The engine's table, by quarters of a difference's magnitude in steps: its finest resolution (rule 9).
lanes::CorrectionTable correctionTable(const TCalculationEngine& engine)
{
    lanes::CorrectionTable table = {};
    const auto* base = dynamic_cast<const TCalculationEngineModBase*>(&engine);
    if (base == nullptr || base->itsAlphaLUT == nullptr) {
        return table;
    }
    const unsigned shift = engine.itsStateFormat->itsShift;
    for (std::size_t quarter = 0; quarter < table.size(); ++quarter) {
        table[quarter] = static_cast<std::uint8_t>(base->itsAlphaLUT[(4 * quarter) << shift] >> shift);
    }
    return table;
}

/// While it lives, decodes are neither traced nor counted: they have been before. Exhausted memory may end it.
class UncountedDecodes {
public:
    explicit UncountedDecodes(TDecoder& decoder)
        : itsDecoder(decoder),
          itsDecodes(decoder.itsDecodeCount),
          itsHalfIterations(decoder.itsHalfIterationCount),
          itsDumps(std::exchange(decoder.itsDumpCount, 0U))
    {
    }

    ~UncountedDecodes()
    {
        itsDecoder.itsDumpCount = itsDumps;
        itsDecoder.itsHalfIterationCount = itsHalfIterations;
        itsDecoder.itsDecodeCount = itsDecodes;
    }

    UncountedDecodes(const UncountedDecodes&) = delete;
    UncountedDecodes& operator=(const UncountedDecodes&) = delete;

private:
    TDecoder& itsDecoder;
    const std::uint64_t itsDecodes;
    const std::uint64_t itsHalfIterations;
    const std::uint32_t itsDumps;
};

}  // namespace

LanePath::LanePath(TDecoder3GPU& decoder, lanes::Algorithm algorithm, const lanes::InstructionSet& instructionSet)
    : itsDecoder(decoder), itsAlgorithm(algorithm)
{
    setInstructionSet(instructionSet);
}

const lanes::InstructionSet& LanePath::instructionSet() const
{
    return itsLanes->instructionSet();
}

void LanePath::setInstructionSet(const lanes::InstructionSet& instructionSet)
{
    if (itsLanes != nullptr) {
        keepLast();
    }
    itsLanes =
        std::make_unique<lanes::LaneDecoder>(instructionSet, itsAlgorithm, correctionTable(*itsDecoder.itsEngine));
}

void LanePath::prepare(unsigned K)
{
    const unsigned lastK = itsLanes->blockCut().blockSize;
    if (K < lastK) {
        keepLast();
    }
    if (K != lastK) {
        lanes::BlockCut cut;
        cut.blockSize = K;
        cut.segments = segmentation::segmentCount(K, std::uint64_t{itsDecoder.itsNumPU} * itsDecoder.itsThreadsPerPU);
        cut.windowStart = segmentation::windowStarts(K / cut.segments);
        itsDecoder.itsInterleaver->calcInterleaver(cut.permutation, K);
        itsLanes->setBlockCut(std::move(cut));
        itsIterations = 0;
    }
    while (!itsPast.empty() && itsPast.back().K <= K) {
        itsPast.pop_back();
    }
}

unsigned LanePath::blocksTaken(unsigned blocks) const
{
    return itsLanes->blocksTaken(blocks);
}

void LanePath::decode(unsigned iterations)
{
    itsLanes->decode(0, 2 * iterations);
    count(iterations);
}

void LanePath::count(unsigned iterations)
{
    itsIterations = iterations;
    itsDecoder.itsDecodeCount += itsLoaded;
    itsDecoder.itsHalfIterationCount += std::uint64_t{2} * iterations * itsLoaded;
}

void LanePath::decisions(std::uint8_t* const* blocks)
{
    itsLanes->decisions(blocks);
}

void LanePath::ratios(std::int16_t* const* blocks)
{
    itsLanes->ratios(blocks);
}

/// Of blocks of one size the last one's columns remain.
void LanePath::keepLast()
{
    if (itsIterations != 0) {
        itsPast.push_back({itsLanes->loadedBlock(itsLoaded - 1), itsLanes->blockCut().blockSize, itsIterations});
        itsIterations = 0;
    }
}

void LanePath::catchUp()
{
    keepLast();
    if (itsPast.empty()) {
        return;
    }
    const UncountedDecodes uncounted(itsDecoder);
    const unsigned shift = itsDecoder.itsEngine->itsStateFormat->itsShift;
    for (const Past& past : itsPast) {
        std::vector<short> soft;
        std::vector<unsigned char> hard;
        for (std::size_t position = 0; position < past.input[0].size(); ++position) {
            for (const std::vector<std::int16_t>& stream : past.input) {
                soft.push_back(static_cast<short>(stream[position] * (1 << shift)));
            }
        }
        itsDecoder.decode(soft, hard, past.iterations);
    }
    itsPast.clear();
}
