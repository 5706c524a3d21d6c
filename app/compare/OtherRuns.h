// OtherRuns: what the model would have to be given, so that it computes a dump that is not the one of its options.
#ifndef MORVIK_OTHERRUNS_H
#define MORVIK_OTHERRUNS_H

#include <cstdint>
#include <optional>
#include <string>

#include "comparison/Values.h"
#include "morvik_v1_0_bitacc_cmodel.h"
#include "testbench/SoftBlock.h"

namespace morvik {

/// What a dump has been compared with.
struct ComparedRun {
    std::string file;  ///< of blocks
    std::uint32_t number = 0;
    SoftBlock block;
    veltra_ip_morvik_v1_0_generics generics;
};

/// The other core, the other block of the file or the mistake in the block with which the model computes every value of
/// the dump, as "with --algorithm table"; nothing when there is none.
std::optional<std::string> findOtherRun(const ComparedRun& run, const comparison::Values& dump);

}  // namespace morvik

#endif
