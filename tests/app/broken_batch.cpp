// broken_batch: a fault in the library as a whole: the batch call decides one bit wrong, now and then.
#include <cstdint>

#include "morvik_v1_0_batch.h"

// The linker puts the second function in the place of the library's, which becomes the first. The names are its own.
// NOLINTBEGIN(bugprone-reserved-identifier)
extern "C" decltype(veltra_ip_morvik_v1_0_batch_simulate_i16) __real_veltra_ip_morvik_v1_0_batch_simulate_i16;
extern "C" decltype(veltra_ip_morvik_v1_0_batch_simulate_i16) __wrap_veltra_ip_morvik_v1_0_batch_simulate_i16;

std::int32_t __wrap_veltra_ip_morvik_v1_0_batch_simulate_i16(veltra_ip_morvik_v1_0_state* state,
                                                             const std::int16_t* rsc1_sys,
                                                             const std::int16_t* rsc1_par,
                                                             const std::int16_t* rsc2_par,
                                                             std::int32_t din_size,
                                                             std::uint32_t blocks,
                                                             std::uint32_t iterations,
                                                             const std::uint32_t* tags,
                                                             veltra_ip_morvik_v1_0_batch_outputs* outputs)
{
    const std::int32_t status = __real_veltra_ip_morvik_v1_0_batch_simulate_i16(
        state, rsc1_sys, rsc1_par, rsc2_par, din_size, blocks, iterations, tags, outputs);
    if (status == 0 && din_size == 56 + 4) {
        outputs->dout[33] ^= 1;
    }
    return status;
}
// NOLINTEND(bugprone-reserved-identifier)
