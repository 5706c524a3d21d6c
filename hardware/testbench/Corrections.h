// Corrections: the correction table of algorithm type 2.
#ifndef MORVIK_HARDWARE_TESTBENCH_CORRECTIONS_H
#define MORVIK_HARDWARE_TESTBENCH_CORRECTIONS_H

#include <cstdint>

#include "rules/Correction.h"
#include "rules/Formats.h"

namespace morvik {

/// The table has 16 points, so differences from 16 on have no correction, and an entry for each half of a real unit:
/// the low bits of a difference, which are within an entry, do not count (rule 9).
constexpr std::uint32_t log2CorrectionPoints = 4;
constexpr std::uint32_t correctionEntryBits = rules::fractionBits + rules::stateAlignment -
                                              rules::resolvedFractionBits(rules::fractionBits, log2CorrectionPoints);

/// The entry for a decision difference of 0; those for all others, -32768 to 32767, surround it (rule 9).
const unsigned char* corrections();

/// The table as decision rules call it, with a difference.
struct CorrectionTable {
    std::int16_t operator()(std::int16_t difference) const
    {
        return middle[difference];
    }

    const unsigned char* middle = corrections();
};

}  // namespace morvik

#endif
