// CoreInputs: what the core takes in of a caller's soft values and tags, and the warnings of what it cuts off.
#ifndef MORVIK_SRC_COREINPUTS_H
#define MORVIK_SRC_COREINPUTS_H

#include <cstddef>
#include <cstdint>
#include <variant>

#include "Batch.h"
#include "DecoderState.h"
#include "lanes/Unaligned.h"
#include "rules/Arithmetic.h"

namespace core_inputs {

using State = veltra_ip_morvik_v1_0_state;

/// The tag's bits that the core carries. The first tag of a state's life that loses bits is reported.
std::uint32_t truncateTag(State& state, std::uint32_t tag);

/// Reports that a value has been clipped, which is done once in a state's life.
void reportSaturation(State& state, unsigned stream, std::int32_t position, bool positively);

/// A caller's value as the input format holds it: the integer of its low bits, 24 for the hardware's
/// format, clipped (rule 4). `excess` is what was clipped.
inline std::int32_t inputInteger(std::int32_t value, const TNumberFormat& input, std::int32_t& excess)
{
    const std::int32_t low = arithmetic::shiftRight(arithmetic::shiftLeftWrap(value, input.itsShift), input.itsShift);
    const std::int32_t kept = arithmetic::clip(low, input.itsMinQ, input.itsMaxQ);
    excess = low - kept;
    return kept;
}

/// Calls use(stream, position, integer) for each soft value of a block, position by position, and reports the first
/// of the state's life that is clipped.
template <class Use>
void forEachSoftValue(State& state, const simulation_call::Batch& batch, std::size_t block, Use use)
{
    const auto convert = [&](const auto& all) {
        const auto of = batch.streamsOf(all, block);
        const decltype(of.systematic) streams[] = {of.systematic, of.parity1, of.parity2};
        for (std::int32_t i = 0; i < batch.dinSize; ++i) {
            for (unsigned s = 0; s < 3; ++s) {
                std::int32_t excess = 0;
                const auto value = std::int32_t{lanes::valueAt(streams[s], static_cast<std::size_t>(i))};
                const std::int32_t kept = inputInteger(value, *state.input_format, excess);
                if (!state.saturation_reported && excess != 0) {
                    reportSaturation(state, s, i, excess > 0);
                }
                use(s, i, kept);
            }
        }
    };
    std::visit(convert, batch.streams);
}

}  // namespace core_inputs

#endif
