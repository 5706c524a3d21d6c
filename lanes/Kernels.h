// Kernels: what each instruction set's compilation of the lanes offers to the rest of the library.
#ifndef MORVIK_LANES_KERNELS_H
#define MORVIK_LANES_KERNELS_H

#include <cstdint>

#include "Workspace.h"

namespace morvik::lanes {

/// How decisions are made and extrinsic values scaled: the hardware's algorithm types, in their order.
enum class Algorithm { greatest, greatestScaled, corrected };

/// A decoder for slices of so many lanes.
struct Kernel {
    unsigned lanes;             ///< of a slice
    unsigned vectorLanes;       ///< of a vector
    unsigned groupLanes;        ///< of a group, whose lanes come from one group of a source slice (Machine.h)
    unsigned sources;           ///< groups that a vector's permutation names
    unsigned permutationBytes;  ///< that prepare writes for a vector
    unsigned slotBytes;         ///< of one step of a window
    unsigned forwardBytes;      ///< of the forward recursion's state

    /// Makes the control by which lane l of a vector is taken from lane source[l] of its source group.
    void (*prepare)(const std::uint8_t* source, std::uint8_t* control);

    /// Fills slices from an array of `steps` values for each lane. False when a value is beyond the input format:
    /// then the low 24 bits of each of the caller's words have to be looked at.
    bool (*fillFromWords)(const std::int32_t* const* arrays, unsigned steps, std::int16_t* slices);
    bool (*fillFromHalfWords)(const std::int16_t* const* arrays, unsigned steps, std::int16_t* slices);
    bool (*fillFromBytes)(const std::int8_t* const* arrays, unsigned steps, std::int16_t* slices);

    /// Runs passes `from` to `to` - 1. Before pass 0, the systematic values of decoder 0, all parity values and start
    /// columns must be in place. Leaves the ratios of the last pass, in its order.
    void (*decode)(const Workspace& workspace, Algorithm algorithm, unsigned from, unsigned to);

    /// Spreads slices of ratios over an array for each lane, as decisions or as aligned words.
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
