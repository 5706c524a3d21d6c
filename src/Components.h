// Components: creates the six components of a state from its generics.
#ifndef MORVIK_SRC_COMPONENTS_H
#define MORVIK_SRC_COMPONENTS_H

#include "DecoderState.h"

namespace morvik::components {

using State = veltra_ip_morvik_v1_0_state;

/// Creates a state's components from its generics. Returns null, or what failed. Throws std::bad_alloc.
const char* create(State& state);

/// Deletes a state's components and nulls their pointers.
void release(State& state);

}  // namespace morvik::components

#endif
