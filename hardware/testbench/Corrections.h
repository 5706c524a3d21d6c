// Corrections: the correction table of algorithm type 2.
#ifndef MORVIK_HARDWARE_TESTBENCH_CORRECTIONS_H
#define MORVIK_HARDWARE_TESTBENCH_CORRECTIONS_H

#include <cstdint>

namespace morvik {

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
