// SimulationCall: checks a call, decodes its blocks on one of the two paths and delivers the results.
#ifndef MORVIK_SRC_SIMULATIONCALL_H
#define MORVIK_SRC_SIMULATIONCALL_H

#include <cstddef>
#include <cstdint>

#include "Batch.h"
#include "DecoderState.h"
#include "Status.h"
#include "morvik_v1_0_batch.h"

namespace morvik::simulation_call {

/// The sent bits, and the output array for the counts of wrong decisions.
struct ErrorCounts {
    const std::uint8_t* sent;
    std::uint32_t* errors;
    std::size_t room;
};

/// All simulation calls of the C headers end up here. Exhausted memory becomes a status, except while the components'
/// soft values are built, before the decoder is called: it then throws.
Status simulate(veltra_ip_morvik_v1_0_state* state, const Batch& batch, veltra_ip_morvik_v1_0_batch_outputs* outputs);
Status countErrors(veltra_ip_morvik_v1_0_state* state, const Batch& batch, const ErrorCounts& counts);

}  // namespace morvik::simulation_call

#endif
