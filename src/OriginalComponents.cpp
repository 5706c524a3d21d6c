// OriginalComponents: a state's components as create_state made them, and whether they have changed since.
#include "OriginalComponents.h"

#include <algorithm>
#include <cstring>
#include <type_traits>
#include <typeinfo>
#include <utility>

#include "Components.h"
#include "TCalculationEngineMod.h"
#include "TCalculationEngineModHash.h"
#include "TInterleaver3GPPLTE.h"
#include "rules/Tail.h"

namespace {

using State = OriginalComponents::State;

/// The bits of a value of any type, so that NaN equals itself.
template <class Value>
std::uint64_t bitsOf(Value value)
{
    if constexpr (std::is_pointer_v<Value>) {
        return reinterpret_cast<std::uintptr_t>(value);
    } else {
        static_assert(std::is_scalar_v<Value> && sizeof(Value) <= sizeof(std::uint64_t));
        std::uint64_t bits = 0;
        std::memcpy(&bits, &value, sizeof(Value));
        return bits;
    }
}

template <class Use, class... Values>
void useBits(Use& use, Values... values)
{
    (use(bitsOf(values)), ...);
}

template <class Use>
void useFormat(const TNumberFormat& format, Use& use)
{
    useBits(use,
            &format,
            format.itsNBits,
            format.itsBinPt,
            format.itsShift,
            format.itsScale,
            format.itsMin,
            format.itsMax,
            format.itsMinQ,
            format.itsMaxQ,
            format.itsMask);
}

/// Calls use(bits) for each value that affects decoding, for components of the types that create_state makes.
template <class Use>
void useValues(const State& state, Use use)
{
    const auto& decoder = static_cast<const TDecoder3GPU&>(*state.decoder);
    useBits(use,
            state.decoder,
            state.interleaver,
            decoder.itsInterleaver,
            decoder.itsEngine,
            decoder.itsExtrinsicScale,
            decoder.itsNumPU,
            decoder.itsThreadsPerPU,
            decoder.is3GPP2);
    const auto& engine = static_cast<const TCalculationEngineModBase&>(*state.engine);
    useBits(use,
            state.engine,
            engine.itsUseSSE2,
            engine.itsInputFormat,
            engine.itsStateFormat,
            engine.itsBranchFormat,
            engine.itsAlphaAlgorithmType,
            engine.itsBetaAlgorithmType,
            engine.itsLLRAlgorithmType,
            engine.itsAlphaLUT,
            engine.itsBetaLUT,
            engine.itsLLRLUT);
    for (const TNumberFormat* format : {state.state_format, state.input_format, state.branch_format}) {
        useFormat(*format, use);
    }
}

std::vector<std::uint64_t> valuesOf(const State& state)
{
    std::vector<std::uint64_t> values;
    useValues(state, [&](std::uint64_t bits) { values.push_back(bits); });
    return values;
}

bool haveTheirTypes(const State& state)
{
    const std::type_info& engine = typeid(*state.engine);
    return typeid(*state.decoder) == typeid(TDecoder3GPU) &&
           typeid(*state.interleaver) == typeid(TInterleaver3GPPLTE) &&
           (engine == typeid(TCalculationEngineMod) || engine == typeid(TCalculationEngineModHash));
}

/// Differences of this many eighths or more have no correction (rule 9).
constexpr int correctedEighths = 64;

/// The non-zero range of the engine's three correction tables.
std::vector<unsigned char> correctionsOf(const State& state)
{
    const unsigned char* const anchor = static_cast<const TCalculationEngineModBase&>(*state.engine).itsAlphaLUT;
    const int reach = correctedEighths << state.state_format->itsShift;
    return anchor == nullptr ? std::vector<unsigned char>()
                             : std::vector<unsigned char>(anchor - reach, anchor + reach);
}

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

OriginalComponents::OriginalComponents(const State& state)
    : itsDecoder(static_cast<TDecoder3GPU&>(*state.decoder)),
      itsGenerics(state.generics),
      itsValues(valuesOf(state)),
      itsCorrections(correctionsOf(state))
{
}

bool OriginalComponents::areIn(const State& state) const
{
    if (!haveTheirTypes(state)) {
        return false;
    }
    const std::uint64_t* value = itsValues.data();
    std::uint64_t different = 0;
    useValues(state, [&](std::uint64_t bits) { different |= bits ^ *value++; });
    if (different != 0) {
        return false;
    }
    const auto& engine = static_cast<const TCalculationEngineModBase&>(*state.engine);
    return itsCorrections.empty() ||
           std::memcmp(engine.itsAlphaLUT - itsCorrections.size() / 2, itsCorrections.data(), itsCorrections.size()) ==
               0;
}

void OriginalComponents::dropTablesOfOtherSizes(unsigned K)
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

bool OriginalComponents::haveOwnTables(unsigned K)
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
        made.allocate(K + morvik::rules::tailSteps);
        interleaver.calcInterleaver(interleaver.itsPi, K);
        interleaver.calcDeinterleaver(interleaver.itsPiInv, K);
    }
    return (pi.empty() || pi == interleaver.itsPi) && (piInv.empty() || piInv == interleaver.itsPiInv) &&
           (segments.empty() || (itsDecoder.itsNT == made.itsNT && areEqual(segments, made.itsAlphaSegment) &&
                                 areEqual(itsDecoder.itsBetaSegment, made.itsBetaSegment)));
}

TDecoder3GPU& OriginalComponents::twin()
{
    if (itsTwin == nullptr) {
        std::unique_ptr<State, Release> made(new State{});
        made->generics = itsGenerics;
        morvik::components::create(*made);
        itsTwin = std::move(made);
    }
    return static_cast<TDecoder3GPU&>(*itsTwin->decoder);
}

void OriginalComponents::Release::operator()(State* state) const
{
    morvik::components::release(*state);
    delete state;
}
