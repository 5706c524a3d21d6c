// SimulationCall: the journey of a call's blocks: checked, sent on one of the two paths, delivered.
#ifndef MORVIK_SRC_SIMULATIONCALL_H
#define MORVIK_SRC_SIMULATIONCALL_H

#include <cstddef>
#include <cstdint>

#include "Batch.h"
#include "DecoderState.h"
#include "Status.h"
#include "morvik_v1_0_batch.h"

namespace simulation_call {

/// What was sent, and where the counts of wrong decisions go.
struct ErrorCounts {
    const std::uint8_t* sent;
    std::uint32_t* errors;
    std::size_t room;
};

/// Decodes a batch, and delivers decisions, ratios and tags, or counts errors: all calls of the C headers come here.
/// The components' soft values are built before the decoder is called: memory exhausted at that moment leaves these
/// functions as an exception. All else is a status.
Status simulate(veltra_ip_morvik_v1_0_state* state, const Batch& batch, veltra_ip_morvik_v1_0_batch_outputs* outputs);
Status countErrors(veltra_ip_morvik_v1_0_state* state, const Batch& batch, const ErrorCounts& counts);

}  // namespace simulation_call

#endif
