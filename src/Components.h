// Components: the six components of a state, made from its generics, and whether somebody has changed them since.
#ifndef MORVIK_SRC_COMPONENTS_H
#define MORVIK_SRC_COMPONENTS_H

#include <cstdint>
#include <vector>

#include "DecoderState.h"

namespace components {

using State = veltra_ip_morvik_v1_0_state;

/// Makes a state's components from its generics; null, or what failed. Exhausted memory throws std::bad_alloc.
const char* create(State& state);

/// Releases a state's components and forgets them.
void release(State& state);

/// What decides how a state's components decode, as it was when they were made. A test bench may have put in others
/// since, or changed what they hold.
///
/// The tables that decoder and interleaver keep for a block size are not looked at; of a correction table, the
/// entries of differences below 64 steps are, beyond which the hardware's has no corrections.
class Snapshot {
public:
    explicit Snapshot(const State& state);

    /// Whether the components are still those that were made, and hold the same. Cheap: it is asked for each block.
    bool matches(const State& state) const;

private:
    const std::vector<std::uint64_t> itsValues;
    const std::vector<unsigned char> itsCorrections;
};

}  // namespace components

#endif
