// Components: the six components of a state, made from its generics.
#ifndef MORVIK_SRC_COMPONENTS_H
#define MORVIK_SRC_COMPONENTS_H

#include "DecoderState.h"

namespace morvik::components {

using State = veltra_ip_morvik_v1_0_state;

/// Makes a state's components from its generics; null, or what failed. Exhausted memory throws std::bad_alloc.
const char* create(State& state);

/// Releases a state's components and forgets them.
void release(State& state);

}  // namespace morvik::components

#endif
