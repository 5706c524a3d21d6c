// CoreInputs: converts a caller's soft values and tags to the core's widths, and warns of what is cut off.
#include "CoreInputs.h"

#include "Messages.h"

namespace morvik::core_inputs {

namespace {

constexpr const char* streamNames[] = {"RSC1 systematic", "RSC1 parity", "RSC2 parity"};

}  // namespace

std::uint32_t truncateTag(State& state, std::uint32_t tag)
{
    const std::uint32_t kept = tag & state.tag_mask;
    if (kept != tag && !state.tag_truncation_reported) {
        messages::writeWarning("WARNING:decoder:Input block tag has been truncated to ",
                               state.generics.C_TAG_WIDTH,
                               " bits, further truncation will not be reported");
        state.tag_truncation_reported = true;
    }
    return kept;
}

void reportSaturation(State& state, unsigned stream, std::int32_t position, bool positively)
{
    messages::writeWarning("WARNING:decoder:",
                           streamNames[stream],
                           " value in position ",
                           position,
                           positively ? " saturated positively" : " saturated negatively",
                           ", further saturation will not be reported");
    state.saturation_reported = true;
}

}  // namespace morvik::core_inputs
