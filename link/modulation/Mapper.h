// Mapper: maps coded bits to symbols: 3GPP TS 36.211, clauses 7.1.2 to 7.1.5; BPSK sends +1 for a 1.
#ifndef MORVIK_LINK_MODULATION_MAPPER_H
#define MORVIK_LINK_MODULATION_MAPPER_H

#include <cstddef>
#include <cstdint>

#include "Modulation.h"

namespace morvik::link {

/// Maps the first bits of a packed row to `count` symbols of mean energy 1: I and Q of each, or one number for BPSK.
void mapSymbols(Modulation modulation, const std::uint64_t* bits, std::size_t count, float* symbols);

}  // namespace morvik::link

#endif
