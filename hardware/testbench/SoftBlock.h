// SoftBlock: the soft values of one code block.
#ifndef MORVIK_HARDWARE_TESTBENCH_SOFTBLOCK_H
#define MORVIK_HARDWARE_TESTBENCH_SOFTBLOCK_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "rules/Tail.h"

namespace morvik {

/// Positions of the largest block of 3GPP TS 36.212.
constexpr std::size_t maxPositions = 6144 + rules::tailPositions;

/// The streams d(0), d(1) and d(2) of 3GPP TS 36.212, clause 5.1.3.2: K + 4 values each, tail included.
struct SoftBlock {
    std::vector<std::int32_t> rsc1Sys;
    std::vector<std::int32_t> rsc1Par;
    std::vector<std::int32_t> rsc2Par;

    /// The number of positions.
    std::size_t size() const
    {
        return rsc1Sys.size();
    }
};

}  // namespace morvik

#endif
