// CoreInputs: converts a caller's soft values and tags to the core's widths, and warns of what is cut off.
#ifndef MORVIK_SRC_COREINPUTS_H
#define MORVIK_SRC_COREINPUTS_H

#include <cstddef>
#include <cstdint>
#include <variant>

#include "Batch.h"
#include "DecoderState.h"
#include "lanes/Unaligned.h"
#include "rules/SoftValues.h"

namespace morvik::core_inputs {

using State = veltra_ip_morvik_v1_0_state;

/// Returns the tag bits that the core carries. Reports only the first tag of a state that loses bits.
std::uint32_t truncateTag(State& state, std::uint32_t tag);

/// Reports a clipped value; called once for each state.
void reportSaturation(State& state, unsigned stream, std::int32_t position, bool positively);

/// Calls use(stream, position, integer) for each soft value of a block, position by position. Reports only the state's
/// first clipped value.
template <class Use>
void forEachSoftValue(State& state, const simulation_call::Batch& batch, std::size_t block, Use use)
{
    const TNumberFormat& input = *state.input_format;
    const auto convert = [&](const auto& all) {
        const auto of = batch.streamsOf(all, block);
        const decltype(of.systematic) streams[] = {of.systematic, of.parity1, of.parity2};
        for (std::int32_t i = 0; i < batch.dinSize; ++i) {
            for (unsigned s = 0; s < 3; ++s) {
                const auto value = std::int32_t{morvik::lanes::valueAt(streams[s], static_cast<std::size_t>(i))};
                const auto [kept, excess] =
                    morvik::rules::inputInteger(value, input.itsShift, input.itsMinQ, input.itsMaxQ);
                if (!state.saturation_reported && excess != 0) {
                    reportSaturation(state, s, i, excess > 0);
                }
                use(s, i, kept);
            }
        }
    };
    std::visit(convert, batch.streams);
}

}  // namespace morvik::core_inputs

#endif
