// Corrections: the correction table of algorithm type 2.
#ifndef MORVIK_HARDWARE_TESTBENCH_CORRECTIONS_H
#define MORVIK_HARDWARE_TESTBENCH_CORRECTIONS_H

namespace morvik {

/// The entry for a decision difference of 0; those for all others, -32768 to 32767, surround it (rule 9).
const unsigned char* corrections();

}  // namespace morvik

#endif
