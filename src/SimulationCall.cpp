// SimulationCall: what the simulation calls of the two C headers share.
#include "SimulationCall.h"

#include <array>

#include "LanePath.h"
#include "Messages.h"
#include "lanes/Unaligned.h"
#include "rules/Arithmetic.h"

namespace simulation_call {

namespace {

constexpr unsigned streamCount = 3;
constexpr const char* streamNames[streamCount] = {"RSC1 systematic", "RSC1 parity", "RSC2 parity"};

/// A caller's value as the input format holds it: the integer of its low bits, 24 for the hardware's
/// format, clipped (rule 4). `excess` is what was clipped.
std::int32_t inputInteger(std::int32_t value, const TNumberFormat& input, std::int32_t& excess)
{
    const std::int32_t low = arithmetic::shiftRight(arithmetic::shiftLeftWrap(value, input.itsShift), input.itsShift);
    const std::int32_t kept = arithmetic::clip(low, input.itsMinQ, input.itsMaxQ);
    excess = low - kept;
    return kept;
}

/// Reports that a value has been clipped, once in a state's life.
void reportSaturation(State& state, unsigned stream, std::int32_t position, bool positively)
{
    if (state.saturation_reported) {
        return;
    }
    messages::writeWarning("WARNING:decoder:",
                           streamNames[stream],
                           " value in position ",
                           position,
                           positively ? " saturated positively" : " saturated negatively",
                           ", further saturation will not be reported");
    state.saturation_reported = true;
}

template <class Input>
std::array<const Input*, streamCount> inOrder(const lanes::Streams<Input>& streams)
{
    return {streams.systematic, streams.parity1, streams.parity2};
}

/// Calls use(stream, position, kept integer) for every value of a block, position by position, and reports
/// the first that is clipped.
template <class Input, class Use>
void convert(State& state, const lanes::Streams<Input>& block, std::int32_t dinSize, Use use)
{
    const auto streams = inOrder(block);
    for (std::int32_t i = 0; i < dinSize; ++i) {
        for (unsigned s = 0; s < streamCount; ++s) {
            std::int32_t excess = 0;
            const auto value = std::int32_t{lanes::valueAt(streams[s], static_cast<std::size_t>(i))};
            const std::int32_t kept = inputInteger(value, *state.input_format, excess);
            if (excess != 0) {
                reportSaturation(state, s, i, excess > 0);
            }
            use(s, i, kept);
        }
    }
}

/// Calls decode(soft values) of a block for the components, and says how it ended.
template <class Input, class Decode>
Status withSoftValues(State& state, const lanes::Streams<Input>& streams, std::int32_t dinSize, Decode decode)
{
    std::vector<short> soft;
    soft.reserve(3 * static_cast<std::size_t>(dinSize));
    convert(state, streams, dinSize, [&](unsigned, std::int32_t, std::int32_t kept) {
        soft.push_back(state.state_format->place(kept));
    });
    return guarded([&] {
        if (state.lane_path != nullptr) {
            state.lane_path->catchUp(state);
        }
        return decode(soft) ? success : decodeFailed;
    });
}

}  // namespace

Status refuse(const char* reason)
{
    messages::writeError("ERROR:decoder:", reason);
    return refused;
}

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

template <class Input>
Status decodeByComponents(State& state,
                          const lanes::Streams<Input>& streams,
                          std::int32_t dinSize,
                          std::uint32_t iterations,
                          std::vector<unsigned char>& hard)
{
    return withSoftValues(state, streams, dinSize, [&](const std::vector<short>& soft) {
        return state.decoder->decode(soft, hard, iterations);
    });
}

template <class Input>
Status countByComponents(State& state,
                         const lanes::Streams<Input>& streams,
                         std::int32_t dinSize,
                         const std::vector<unsigned char>& sent,
                         std::vector<unsigned long long>& bitErrors)
{
    return withSoftValues(state, streams, dinSize, [&](const std::vector<short>& soft) {
        std::vector<unsigned long long> blockErrors;
        return state.decoder->decode(soft, sent, bitErrors, blockErrors);
    });
}

bool lanesTake(const State& state, std::int32_t dinSize)
{
    return state.lane_path != nullptr && !state.by_components && dinSize > std::int32_t{lanes::tailPositions} &&
           state.lane_path->takes(state, blockSizeOf(dinSize));
}

template <class Input>
unsigned loadLanes(
    State& state, const lanes::Streams<Input>* blocks, unsigned count, std::int32_t dinSize, const std::uint32_t* tags)
{
    LanePath& path = *state.lane_path;
    const unsigned taken = path.blocksTaken(count);
    if (path.load(blocks, count)) {
        return taken;
    }
    const auto size = static_cast<std::size_t>(dinSize);
    std::vector<std::int16_t> clipped(3 * size * taken);
    std::vector<lanes::Streams<std::int16_t>> again;
    for (unsigned b = 0; b < taken; ++b) {
        std::int16_t* const to = clipped.data() + 3 * size * b;
        convert(state, blocks[b], dinSize, [&](unsigned stream, std::int32_t position, std::int32_t kept) {
            to[stream * size + static_cast<std::size_t>(position)] = static_cast<std::int16_t>(kept);
        });
        again.push_back({to, to + size, to + 2 * size});
        if (tags != nullptr) {
            truncateTag(state, lanes::valueAt(tags, b));
        }
    }
    path.load(again.data(), taken);
    return taken;
}

template Status decodeByComponents(
    State&, const lanes::Streams<std::int32_t>&, std::int32_t, std::uint32_t, std::vector<unsigned char>&);
template Status decodeByComponents(
    State&, const lanes::Streams<std::int16_t>&, std::int32_t, std::uint32_t, std::vector<unsigned char>&);
template Status decodeByComponents(
    State&, const lanes::Streams<std::int8_t>&, std::int32_t, std::uint32_t, std::vector<unsigned char>&);
template Status countByComponents(State&,
                                  const lanes::Streams<std::int32_t>&,
                                  std::int32_t,
                                  const std::vector<unsigned char>&,
                                  std::vector<unsigned long long>&);
template Status countByComponents(State&,
                                  const lanes::Streams<std::int16_t>&,
                                  std::int32_t,
                                  const std::vector<unsigned char>&,
                                  std::vector<unsigned long long>&);
template Status countByComponents(State&,
                                  const lanes::Streams<std::int8_t>&,
                                  std::int32_t,
                                  const std::vector<unsigned char>&,
                                  std::vector<unsigned long long>&);
template unsigned loadLanes(State&, const lanes::Streams<std::int32_t>*, unsigned, std::int32_t, const std::uint32_t*);
template unsigned loadLanes(State&, const lanes::Streams<std::int16_t>*, unsigned, std::int32_t, const std::uint32_t*);
template unsigned loadLanes(State&, const lanes::Streams<std::int8_t>*, unsigned, std::int32_t, const std::uint32_t*);

}  // namespace simulation_call
