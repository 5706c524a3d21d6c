// Packing: batches and their results as bytes, the same on every machine.
#ifndef MORVIK_SIMULATION_PACKING_H
#define MORVIK_SIMULATION_PACKING_H

#include <string>
#include <string_view>

#include "Workers.h"

namespace morvik::simulation {

std::string packed(const FrameBatch& batch);

/// Frames without a wrong bit and without a clipped value take no room: most, where error rates are low.
std::string packed(const BatchResult& result);

/// What was packed. Throws std::runtime_error if nothing is packed so.
FrameBatch unpackedBatch(std::string_view bytes);
BatchResult unpackedResult(std::string_view bytes);

}  // namespace morvik::simulation

#endif
