// SimulationCall: what the simulation calls of the two C headers share.
#ifndef MORVIK_SRC_SIMULATIONCALL_H
#define MORVIK_SRC_SIMULATIONCALL_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "DecoderState.h"
#include "lanes/LaneDecoder.h"

namespace simulation_call {

using State = veltra_ip_morvik_v1_0_state;

enum Status : std::int32_t { success = 0, refused = 1, decodeFailed = 2, exceptionRaised = 99 };

/// Writes the line of a refusal.
Status refuse(const char* reason);

/// Runs a part of a call that may throw: exhausted memory becomes the line and the status of an exception.
template <class Part>
auto guarded(Part part) -> decltype(part())
{
    try {
        return part();
    } catch (...) {
        refuse("Unhandled exception has occurred");
        return exceptionRaised;
    }
}

/// What is wrong with the arguments of a call, or null; `outputFault` is what is wrong with where its results go.
template <class Input>
const char* checkArguments(const State* state,
                           const char* outputFault,
                           const lanes::Streams<Input>& streams,
                           std::int32_t dinSize,
                           std::uint32_t iterations)
{
    if (state == nullptr) {
        return "Simulate called with null state structure";
    }
    if (outputFault != nullptr) {
        return outputFault;
    }
    if (dinSize < 1) {
        return "din_size must be a positive integer";
    }
    if (streams.systematic == nullptr) {
        return "rsc1_sys must not be a null pointer";
    }
    if (streams.parity1 == nullptr) {
        return "rsc1_par must not be a null pointer";
    }
    if (streams.parity2 == nullptr) {
        return "rsc2_par must not be a null pointer";
    }
    if (iterations < 1 || iterations > 15) {
        return "Number of iterations must be in the range 1 to 15";
    }
    return nullptr;
}

/// What is wrong with an output record of either header, or null.
template <class Outputs>
const char* outputFault(const Outputs* outputs)
{
    if (outputs == nullptr) {
        return "Simulate called with null output structure";
    }
    return outputs->dout == nullptr ? "Simulate called with null pointer for dout" : nullptr;
}

/// The tag's bits that the core carries. The first tag of a state's life that loses bits is reported.
std::uint32_t truncateTag(State& state, std::uint32_t tag);

/// A block through the components: joins the three streams, position by position, into aligned soft
/// values, reporting the first of a state's life that has to be clipped, and decodes them. Memory exhausted while
/// they are joined leaves it as an exception.
template <class Input>
Status decodeByComponents(State& state,
                          const lanes::Streams<Input>& streams,
                          std::int32_t dinSize,
                          std::uint32_t iterations,
                          std::vector<unsigned char>& hard);

/// The same, but adds up the decisions that differ from `sent` after each of as many full iterations as there
/// are counts.
template <class Input>
Status countByComponents(State& state,
                         const lanes::Streams<Input>& streams,
                         std::int32_t dinSize,
                         const std::vector<unsigned char>& sent,
                         std::vector<unsigned long long>& bitErrors);

/// K of a block of dinSize positions, which are as many as the tail has at least.
inline unsigned blockSizeOf(std::int32_t dinSize)
{
    return static_cast<unsigned>(dinSize) - lanes::tailPositions;
}

/// Whether the lanes decode the state's next block, of dinSize positions, or the components have to. Exhausted memory
/// throws std::bad_alloc.
bool lanesTake(const State& state, std::int32_t dinSize);

/// Takes as many of the blocks into the lanes as they like, with the same report; returns how many. Tags
/// of the blocks before the reported one, when there are any, are reported before it. The lanes must take them.
template <class Input>
unsigned loadLanes(
    State& state, const lanes::Streams<Input>* blocks, unsigned count, std::int32_t dinSize, const std::uint32_t* tags);

}  // namespace simulation_call

#endif
