// Core: the model of the decoder as simulations call it.
#include "Core.h"

#include <stdexcept>

#include "rules/Tail.h"

namespace morvik::simulation {

namespace {

void expectSuccess(std::int32_t status)
{
    if (status != 0) {
        throw std::runtime_error("the decoder has refused a block");
    }
}

}  // namespace

Core::Core(unsigned numPu, unsigned algorithm, const std::string& instructionSet)
{
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = static_cast<std::int32_t>(numPu);
    generics.C_ALGORITHM_TYPE = static_cast<std::int32_t>(algorithm);
    itsState.reset(veltra_ip_morvik_v1_0_create_state(generics));
    const bool isMade = itsState && (instructionSet.empty() || veltra_ip_morvik_v1_0_set_instruction_set(
                                                                   itsState.get(), instructionSet.c_str()) == 0);
    if (!isMade) {
        throw std::runtime_error("the decoder cannot be made");
    }
}

void Core::decode(
    const Streams& streams, unsigned K, std::size_t count, unsigned iterations, std::vector<std::uint8_t>& decided)
{
    decided.resize(count * K);
    veltra_ip_morvik_v1_0_batch_outputs outputs = {};
    outputs.dout = decided.data();
    outputs.dout_alloc = decided.size();
    expectSuccess(veltra_ip_morvik_v1_0_batch_simulate_i8(itsState.get(),
                                                          streams[0].data(),
                                                          streams[1].data(),
                                                          streams[2].data(),
                                                          static_cast<std::int32_t>(K + rules::tailPositions),
                                                          static_cast<std::uint32_t>(count),
                                                          iterations,
                                                          nullptr,
                                                          &outputs));
}

void Core::countErrors(const Streams& streams,
                       unsigned K,
                       std::size_t count,
                       unsigned iterations,
                       const std::vector<std::uint8_t>& sent,
                       std::uint32_t* wrongBits)
{
    expectSuccess(veltra_ip_morvik_v1_0_batch_count_errors_i8(itsState.get(),
                                                              streams[0].data(),
                                                              streams[1].data(),
                                                              streams[2].data(),
                                                              static_cast<std::int32_t>(K + rules::tailPositions),
                                                              static_cast<std::uint32_t>(count),
                                                              iterations,
                                                              sent.data(),
                                                              wrongBits,
                                                              count * iterations));
}

}  // namespace morvik::simulation
