// LanePath: the C interface's quick way through the lane-parallel decoder, beside the components.
#include "LanePath.h"

#include <algorithm>
#include <cstddef>
#include <typeinfo>
#include <utility>

#include "TCalculationEngineModBase.h"
#include "rules/Cut.h"

namespace {

constexpr unsigned tailSteps = 3;  // of a trellis, behind its K others

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

/// Whether somebody traces or presets values that the lanes do not have.
bool isWatched(const TDecoder& decoder)
{
    return decoder.itsDumpCount != 0 || decoder.itsTraceLevel != 0 || !decoder.itsExtrinsicIn.empty();
}

/// While it lives, a decoder works on the metric columns of another one. Exhausted memory may end it.
class LentColumns {
public:
    LentColumns(TDecoder& owner, TDecoder& user) : itsOwner(owner), itsUser(user)
    {
        exchange();
    }

    ~LentColumns()
    {
        exchange();
    }

    LentColumns(const LentColumns&) = delete;
    LentColumns& operator=(const LentColumns&) = delete;

private:
    void exchange()
    {
        std::swap(itsOwner.itsMetricBuffer, itsUser.itsMetricBuffer);
        std::swap(itsOwner.itsMetricBufferSize, itsUser.itsMetricBufferSize);
        std::swap(itsOwner.itsAlpha, itsUser.itsAlpha);
        std::swap(itsOwner.itsBeta, itsUser.itsBeta);
        std::swap(itsOwner.itsGamma, itsUser.itsGamma);
    }

    TDecoder& itsOwner;
    TDecoder& itsUser;
};

bool isNoTableOf(const std::vector<unsigned>& table, unsigned K)
{
    return table.size() != K;
}

bool isNoTableOf(const std::vector<TDecoder3GPU::ABSegment>& segments, unsigned K)
{
    return segments.empty() || segments.back().to != K;
}

bool areEqual(const std::vector<TDecoder3GPU::ABSegment>& a, const std::vector<TDecoder3GPU::ABSegment>& b)
{
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](const auto& one, const auto& other) {
        return one.from == other.from && one.to == other.to;
    });
}

}  // namespace

LanePath::LanePath(const State& state, const lanes::InstructionSet& instructionSet)
    : itsCreated(state),
      itsGenerics(state.generics),
      itsDecoder(static_cast<TDecoder3GPU&>(*state.decoder)),
      itsCorrections(correctionTable(*state.engine))
{
    setInstructionSet(instructionSet);
}

void LanePath::Release::operator()(State* state) const
{
    components::release(*state);
    delete state;
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
    itsLanes = std::make_unique<lanes::LaneDecoder>(
        instructionSet, static_cast<lanes::Algorithm>(itsGenerics.C_ALGORITHM_TYPE), itsCorrections);
}

bool LanePath::takes(const State& state, unsigned K)
{
    if (!knows(state) || isWatched(itsDecoder) || !state.interleaver->valid(K)) {
        return false;
    }
    forgetBlocksOfOthers(state);
    dropOtherTables(K);
    if (!keepsTheirTables(K)) {
        return false;
    }
    prepare(K);
    return true;
}

/// A decoder that a test bench has put in since, be it in the same place, has decoded nothing of what the lanes have.
void LanePath::forgetBlocksOfOthers(const State& state)
{
    if (state.decoder != &itsDecoder || typeid(*state.decoder) != typeid(TDecoder3GPU) ||
        state.decoder->itsDecodeCount == 0) {
        itsPast.clear();
        itsIterations = 0;
    }
}

/// The components would replace what decoder and interleaver keep of another size.
void LanePath::dropOtherTables(unsigned K)
{
    for (std::vector<unsigned>* table : {&itsDecoder.itsInterleaver->itsPi, &itsDecoder.itsInterleaver->itsPiInv}) {
        if (isNoTableOf(*table, K)) {
            table->clear();
        }
    }
    if (isNoTableOf(itsDecoder.itsAlphaSegment, K)) {
        itsDecoder.itsAlphaSegment.clear();
        itsDecoder.itsBetaSegment.clear();
    }
}

/// Whether the tables of this size, where there are any, are the components' own: they would use a test bench's.
bool LanePath::keepsTheirTables(unsigned K)
{
    const std::vector<unsigned>& pi = itsDecoder.itsInterleaver->itsPi;
    const std::vector<unsigned>& piInv = itsDecoder.itsInterleaver->itsPiInv;
    const auto& segments = itsDecoder.itsAlphaSegment;
    if (pi.empty() && piInv.empty() && segments.empty()) {
        return true;
    }
    TDecoder3GPU& made = twin();
    const TInterleaver& interleaver = *made.itsInterleaver;
    if (isNoTableOf(interleaver.itsPiInv, K) || isNoTableOf(made.itsAlphaSegment, K)) {
        made.allocate(K + tailSteps);
        interleaver.calcInterleaver(interleaver.itsPi, K);
        interleaver.calcDeinterleaver(interleaver.itsPiInv, K);
    }
    return (pi.empty() || pi == interleaver.itsPi) && (piInv.empty() || piInv == interleaver.itsPiInv) &&
           (segments.empty() || (itsDecoder.itsNT == made.itsNT && areEqual(segments, made.itsAlphaSegment) &&
                                 areEqual(itsDecoder.itsBetaSegment, made.itsBetaSegment)));
}

/// Makes everything ready for blocks of K bits.
void LanePath::prepare(unsigned K)
{
    const unsigned lastK = itsLanes->cut().K();
    if (K < lastK) {
        keepLast();
    }
    if (K != lastK) {
        itsLanes->setCut(morvik::rules::Cut(K, itsDecoder.itsNumPU, itsDecoder.itsThreadsPerPU));
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
        itsPast.push_back({itsLanes->loadedBlock(itsLoaded - 1), itsLanes->cut().K(), itsIterations});
        itsIterations = 0;
    }
}

TDecoder3GPU& LanePath::twin()
{
    if (itsTwin == nullptr) {
        std::unique_ptr<State, Release> made(new State{});
        made->generics = itsGenerics;
        components::create(*made);
        itsTwin = std::move(made);
    }
    return static_cast<TDecoder3GPU&>(*itsTwin->decoder);
}

void LanePath::catchUp(const State& state)
{
    forgetBlocksOfOthers(state);
    keepLast();
    if (!itsPast.empty()) {
        computeColumns();
        itsPast.clear();
    }
}

/// By components that nobody has changed, and that neither count nor trace for anybody.
void LanePath::computeColumns()
{
    TDecoder3GPU& made = twin();
    const unsigned shift = made.itsEngine->itsStateFormat->itsShift;
    const LentColumns columns(itsDecoder, made);
    for (const Past& past : itsPast) {
        std::vector<short> soft;
        std::vector<unsigned char> hard;
        for (std::size_t position = 0; position < past.input[0].size(); ++position) {
            for (const std::vector<std::int16_t>& stream : past.input) {
                soft.push_back(static_cast<short>(stream[position] * (1 << shift)));
            }
        }
        made.decode(soft, hard, past.iterations);
    }
    if (itsDecoder.itsAlphaSegment.empty()) {
        itsDecoder.itsNT = made.itsNT;
        itsDecoder.itsBetaSegment = made.itsBetaSegment;
        itsDecoder.itsAlphaSegment = made.itsAlphaSegment;
    }
}
