// Components: the six components of a state, made from its generics, and whether somebody has changed them since.
#include "Components.h"

#include <cstring>
#include <string>
#include <type_traits>
#include <typeinfo>

#include "TCalculationEngineMod.h"
#include "TCalculationEngineModHash.h"
#include "TDecoder3GPU.h"
#include "TInterleaver3GPPLTE.h"

namespace components {

namespace {

TNumberFormat* createFormat(int integerBits, int fractionBits)
{
    return TNumberFormat::create("Fix_" + std::to_string(integerBits + fractionBits) + "_" +
                                 std::to_string(fractionBits));
}

template <class Component>
void releaseOne(Component*& component)
{
    delete component;
    component = nullptr;
}

/// A value of any kind by its bits, so that one that is not a number equals itself.
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

/// Calls use(bits) for each value that decides how components of the types that `create` makes decode.
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

/// No difference of so many steps or more is corrected (rule 9).
constexpr int correctedSteps = 64;

/// The entries that correct, of all three tables of the engine.
std::vector<unsigned char> correctionsOf(const State& state)
{
    const unsigned char* const anchor = static_cast<const TCalculationEngineModBase&>(*state.engine).itsAlphaLUT;
    const int reach = correctedSteps << state.state_format->itsShift;
    return anchor == nullptr ? std::vector<unsigned char>()
                             : std::vector<unsigned char>(anchor - reach, anchor + reach);
}

}  // namespace

const char* create(State& state)
{
    const veltra_ip_morvik_v1_0_generics& generics = state.generics;
    state.state_format = createFormat(generics.C_STATE_INT_WIDTH, generics.C_STATE_FRAC_WIDTH);
    if (state.state_format == nullptr) {
        return "Could not set state number format";
    }
    state.branch_format = TNumberFormat::create("Fix_8_3");
    if (state.branch_format == nullptr) {
        return "Could not set branch number format";
    }
    state.input_format = createFormat(generics.C_INPUT_INT_WIDTH, generics.C_INPUT_FRAC_WIDTH);
    if (state.input_format == nullptr) {
        return "Could not set input number format";
    }
    state.interleaver = TInterleaver::create("3GPPLTE");
    if (state.interleaver == nullptr) {
        return "Could not create interleaver";
    }
    state.engine = TCalculationEngine::create(generics.C_ALGORITHM_TYPE == 2 ? "MOD#:16" : "MOD");
    if (state.engine == nullptr) {
        return "Could not create calculation engine";
    }
    state.engine->itsInputFormat = state.input_format;
    state.engine->itsStateFormat = state.state_format;
    state.engine->itsBranchFormat = state.branch_format;
    if (!state.engine->initialise()) {
        return "Could not initialise calculation engine";
    }
    state.decoder = TDecoder::create("3GPPPU:" + std::to_string(generics.C_NUM_PU));
    if (state.decoder == nullptr) {
        return "Could not create decoder";
    }
    state.decoder->itsInterleaver = state.interleaver;
    state.decoder->itsEngine = state.engine;
    state.decoder->itsExtrinsicScale = generics.C_ALGORITHM_TYPE == 1 ? 0.75 : 1.0;
    return nullptr;
}

void release(State& state)
{
    releaseOne(state.state_format);
    releaseOne(state.branch_format);
    releaseOne(state.input_format);
    releaseOne(state.engine);
    releaseOne(state.interleaver);
    releaseOne(state.decoder);
}

Snapshot::Snapshot(const State& state) : itsValues(valuesOf(state)), itsCorrections(correctionsOf(state)) {}

bool Snapshot::matches(const State& state) const
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

}  // namespace components
