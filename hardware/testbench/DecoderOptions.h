// DecoderOptions: how to decode.
#ifndef MORVIK_HARDWARE_TESTBENCH_DECODEROPTIONS_H
#define MORVIK_HARDWARE_TESTBENCH_DECODEROPTIONS_H

#include <cstdint>

#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik {

/// How to decode. The defaults are those of all subcommands: the library's own core.
struct DecoderOptions {
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    std::uint32_t iterations = 8;
};

}  // namespace morvik

#endif
