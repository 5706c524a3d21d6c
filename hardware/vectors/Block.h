// Block: the core's input and output for one block.
#ifndef MORVIK_HARDWARE_VECTORS_BLOCK_H
#define MORVIK_HARDWARE_VECTORS_BLOCK_H

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "hardware/testbench/Passes.h"

namespace morvik::vectors {

/// Where a code block of a transport block comes from.
struct Origin {
    std::uint32_t format = 0;          ///< of Settings::transport
    std::uint32_t transportBlock = 0;  ///< counted from the first of its format
    std::uint32_t codeBlock = 0;
    std::uint32_t transmissions = 1;  ///< that are combined
};

struct Stimulus {
    std::string name;              ///< what the block is for
    std::optional<Origin> origin;  ///< if it comes out of rate recovery
    std::uint32_t K = 0;
    std::uint32_t tag = 0;
    std::array<std::vector<std::int8_t>, 3> streams;  ///< systematic and both parities, K + 4 values each
};

/// The core's values at a trellis step of a half-iteration.
struct InternalStep {
    std::uint32_t halfIteration = 0;
    std::uint32_t step = 0;                                 ///< from 0 to K + 2
    std::array<std::int16_t, passSignals.size()> values{};  ///< in eighths; 0 where the core computes nothing
};

struct Expected {
    std::uint32_t tag = 0;               ///< as the core carries it
    std::vector<std::uint8_t> bits;      ///< K decisions of 0 or 1
    std::vector<std::int16_t> ratios;    ///< in eighths, -2048 to 2047; empty if not requested
    std::vector<InternalStep> internal;  ///< K + 3 trellis steps of each half-iteration; empty if not requested
};

}  // namespace morvik::vectors

#endif
