// broken_kernel: all batches but those of the components are decoded to one wrong bit, which the benchmarks must
// notice.
#include <cstdint>
#include <cstring>

#include "morvik_v1_0_batch.h"

// Of each pair, the linker puts the second in the place of the library's function, which becomes the first. The names
// are its own.
// NOLINTBEGIN(bugprone-reserved-identifier)
extern "C" decltype(veltra_ip_morvik_v1_0_set_instruction_set) __real_veltra_ip_morvik_v1_0_set_instruction_set;
extern "C" decltype(veltra_ip_morvik_v1_0_set_instruction_set) __wrap_veltra_ip_morvik_v1_0_set_instruction_set;
extern "C" decltype(veltra_ip_morvik_v1_0_batch_simulate_i32) __real_veltra_ip_morvik_v1_0_batch_simulate_i32;
extern "C" decltype(veltra_ip_morvik_v1_0_batch_simulate_i32) __wrap_veltra_ip_morvik_v1_0_batch_simulate_i32;
extern "C" decltype(veltra_ip_morvik_v1_0_batch_simulate_i8) __real_veltra_ip_morvik_v1_0_batch_simulate_i8;
extern "C" decltype(veltra_ip_morvik_v1_0_batch_simulate_i8) __wrap_veltra_ip_morvik_v1_0_batch_simulate_i8;

namespace {

const veltra_ip_morvik_v1_0_state* soundState = nullptr;

void breakOneBit(std::int32_t status,
                 const veltra_ip_morvik_v1_0_state* state,
                 const veltra_ip_morvik_v1_0_batch_outputs& outputs)
{
    if (status == 0 && state != soundState) {
        outputs.dout[33] ^= 1;
    }
}

}  // namespace

std::int32_t __wrap_veltra_ip_morvik_v1_0_set_instruction_set(veltra_ip_morvik_v1_0_state* state, const char* name)
{
    if (std::strcmp(name, "component") == 0) {
        soundState = state;
    }
    return __real_veltra_ip_morvik_v1_0_set_instruction_set(state, name);
}

std::int32_t __wrap_veltra_ip_morvik_v1_0_batch_simulate_i32(veltra_ip_morvik_v1_0_state* state,
                                                             const std::int32_t* rsc1_sys,
                                                             const std::int32_t* rsc1_par,
                                                             const std::int32_t* rsc2_par,
                                                             std::int32_t din_size,
                                                             std::uint32_t blocks,
                                                             std::uint32_t iterations,
                                                             const std::uint32_t* tags,
                                                             veltra_ip_morvik_v1_0_batch_outputs* outputs)
{
    const std::int32_t status = __real_veltra_ip_morvik_v1_0_batch_simulate_i32(
        state, rsc1_sys, rsc1_par, rsc2_par, din_size, blocks, iterations, tags, outputs);
    breakOneBit(status, state, *outputs);
    return status;
}

std::int32_t __wrap_veltra_ip_morvik_v1_0_batch_simulate_i8(veltra_ip_morvik_v1_0_state* state,
                                                            const std::int8_t* rsc1_sys,
                                                            const std::int8_t* rsc1_par,
                                                            const std::int8_t* rsc2_par,
                                                            std::int32_t din_size,
                                                            std::uint32_t blocks,
                                                            std::uint32_t iterations,
                                                            const std::uint32_t* tags,
                                                            veltra_ip_morvik_v1_0_batch_outputs* outputs)
{
    const std::int32_t status = __real_veltra_ip_morvik_v1_0_batch_simulate_i8(
        state, rsc1_sys, rsc1_par, rsc2_par, din_size, blocks, iterations, tags, outputs);
    breakOneBit(status, state, *outputs);
    return status;
}
// NOLINTEND(bugprone-reserved-identifier)
