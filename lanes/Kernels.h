// Kernels: the interface of each instruction set's compilation of the lanes.
#ifndef MORVIK_LANES_KERNELS_H
#define MORVIK_LANES_KERNELS_H

#include <cstdint>

#include "Workspace.h"

namespace morvik::lanes {

/// The hardware's algorithm types, in their order: the decisions and the scaling of extrinsic values.
enum class Algorithm { greatest, greatestScaled, corrected };

/// A decoder for slices of a given number of lanes.
struct Kernel {
    unsigned lanes;             ///< per slice
    unsigned vectorLanes;       ///< per vector
    unsigned groupLanes;        ///< per group; a group's lanes come from one group of a source slice (Machine.h)
    unsigned sources;           ///< source groups of a vector's permutation
    unsigned permutationBytes;  ///< written by prepare for a vector
    unsigned slotBytes;         ///< for one step of a window
    unsigned forwardBytes;      ///< for the forward recursion's state

    /// Prepares the control that takes lane l of a vector from lane source[l] of its source group.
    void (*prepare)(const std::uint8_t* source, std::uint8_t* control);

    /// Fills slices from an array of `steps` values for each lane. Returns false if a value is outside the input
    /// format; the low 24 bits of each of the caller's words must then be checked.
    bool (*fillFromWords)(const std::int32_t* const* arrays, unsigned steps, std::int16_t* slices);
    bool (*fillFromHalfWords)(const std::int16_t* const* arrays, unsigned steps, std::int16_t* slices);
    bool (*fillFromBytes)(const std::int8_t* const* arrays, unsigned steps, std::int16_t* slices);

    /// Runs passes `from` to `to` - 1. Before pass 0, the systematic values of decoder 0, all parity values and start
    /// columns must be set. Leaves the ratios of the last pass, in its order.
    void (*decode)(const Workspace& workspace, Algorithm algorithm, unsigned from, unsigned to);

    /// Writes slices of ratios to an array for each lane, as decisions or as aligned words.
    void (*spreadDecisions)(const std::int16_t* slices, unsigned steps, std::uint8_t* const* arrays);
    void (*spreadWords)(const std::int16_t* slices, unsigned steps, std::int16_t* const* arrays);
};

/// The kernels of an instruction set, ascending in lanes.
struct InstructionSet {
    const char* name;
    const Kernel* kernels;
    unsigned kernelCount;
};

}  // namespace morvik::lanes

#endif
