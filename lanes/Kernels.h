// Kernels: what each instruction set's compilation of the lanes offers to the rest of the library.
#ifndef MORVIK_LANES_KERNELS_H
#define MORVIK_LANES_KERNELS_H

#include <cstdint>

#include "Workspace.h"

namespace lanes {

/// How decisions are made and extrinsic values scaled: the hardware's algorithm types, in their order.
enum class Algorithm { greatest, greatestScaled, corrected };

/// The lanes of one row width.
struct Kernel {
    unsigned lanes;             ///< of a row
    unsigned vectorLanes;       ///< of a vector
    unsigned groupLanes;        ///< of a group, whose lanes come from one group of a source row (Permute.h)
    unsigned sources;           ///< groups that a vector's permutation names
    unsigned permutationBytes;  ///< that prepare writes for a vector
    unsigned slotBytes;         ///< of one step of a window
    unsigned forwardBytes;      ///< of the forward recursion's state

    /// Makes the control by which lane l of a vector is taken from lane source[l] of its source group.
    void (*prepare)(const std::uint8_t* source, std::uint8_t* control);

    /// Fills rows from one array for each lane, which holds `steps` values; false when a value was beyond
    /// the input format: then the low 24 bits of the caller's words have to be looked at one by one.
    bool (*loadWords)(const std::int32_t* const* arrays, unsigned steps, std::int16_t* rows);
    bool (*loadHalfWords)(const std::int16_t* const* arrays, unsigned steps, std::int16_t* rows);
    bool (*loadBytes)(const std::int8_t* const* arrays, unsigned steps, std::int16_t* rows);

    /// Runs passes `from` to `to` - 1. Before pass 0, systematic rows of decoder 0, parity rows and start
    /// columns must be in place; leaves the ratios of the last pass, in its order.
    void (*decode)(const Workspace& workspace, Algorithm algorithm, unsigned from, unsigned to);

    /// Spreads rows of ratios over one array for each lane, as decisions or as aligned ratios.
    void (*storeDecisions)(const std::int16_t* rows, unsigned steps, std::uint8_t* const* arrays);
    void (*storeRatios)(const std::int16_t* rows, unsigned steps, std::int16_t* const* arrays);
};

/// The kernels of an instruction set, ascending in lanes.
struct InstructionSet {
    const char* name;
    const Kernel* kernels;
    unsigned kernelCount;
};

}  // namespace lanes

#endif
