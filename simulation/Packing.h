// Packing: serialises batches and their results, the same on every machine.
#ifndef MORVIK_SIMULATION_PACKING_H
#define MORVIK_SIMULATION_PACKING_H

#include <string>
#include <string_view>

#include "Workers.h"

namespace morvik::simulation {

std::string packed(const FrameBatch& batch);

/// Code blocks without wrong bits or clipped values take no space: most of them, where error rates are low.
std::string packed(const BatchResult& result);

/// Inverses of packed(). Throw std::runtime_error if the bytes are malformed.
FrameBatch unpackedBatch(std::string_view bytes);
BatchResult unpackedResult(std::string_view bytes);

}  // namespace morvik::simulation

#endif
