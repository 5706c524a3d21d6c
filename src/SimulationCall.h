// SimulationCall: the journey of a call's blocks: checked, sent on one of the two paths, delivered.
#ifndef MORVIK_SRC_SIMULATIONCALL_H
#define MORVIK_SRC_SIMULATIONCALL_H

#include <cstddef>
#include <cstdint>

#include "Batch.h"
#include "DecoderState.h"
#include "Status.h"
#include "morvik_v1_0_batch.h"

namespace morvik::simulation_call {

/// What was sent, and where the counts of wrong decisions go.
struct ErrorCounts {
    const std::uint8_t* sent;
    std::uint32_t* errors;
    std::size_t room;
};

/// Every call of the C headers comes here. Exhausted memory becomes a status, but for that of the components' soft
/// values, which are built before the decoder is called: it leaves as an exception.
Status simulate(veltra_ip_morvik_v1_0_state* state, const Batch& batch, veltra_ip_morvik_v1_0_batch_outputs* outputs);
Status countErrors(veltra_ip_morvik_v1_0_state* state, const Batch& batch, const ErrorCounts& counts);

}  // namespace morvik::simulation_call

#endif
