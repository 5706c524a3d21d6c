// SizeHint: explains how a test bench may have come to a block of an invalid size.
#ifndef MORVIK_HARDWARE_TESTBENCH_SIZEHINT_H
#define MORVIK_HARDWARE_TESTBENCH_SIZEHINT_H

#include <cstddef>
#include <cstdint>
#include <string>

#include "rules/BlockSizes.h"
#include "rules/Tail.h"

namespace morvik {

/// Ends the line of the library that refuses a block of so many positions.
inline std::string sizeHint(std::size_t positions)
{
    const std::string count = std::to_string(positions);
    if (rules::findBlockSize(static_cast<std::uint32_t>(positions)) != nullptr) {
        return ": " + count + " soft values in each stream, but a block of " + count + " bits has " +
               std::to_string(positions + rules::tailPositions) + ", the tail included";
    }
    return ": " + count + " soft values in each stream are not K + 4 for a block size K of 3GPP TS 36.212";
}

}  // namespace morvik

#endif
