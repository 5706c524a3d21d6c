// OtherRuns: finds other options or inputs with which the model reproduces a dump.
#ifndef MORVIK_APP_COMPARE_OTHERRUNS_H
#define MORVIK_APP_COMPARE_OTHERRUNS_H

#include <cstdint>
#include <string>
#include <vector>

#include "hardware/comparison/Values.h"
#include "hardware/testbench/SoftBlock.h"
#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik {

/// The run that a dump was compared with.
struct ComparedRun {
    std::string file;  ///< of blocks
    std::uint32_t number = 0;
    SoftBlock block;
    veltra_ip_morvik_v1_0_generics generics;
};

/// Finds the other cores, the other blocks of the file and the mistakes in the block with which the model computes
/// every value of the dump. Each is worded as in "with --algorithm table".
std::vector<std::string> findOtherRuns(const ComparedRun& run, const comparison::Values& dump);

}  // namespace morvik

#endif
