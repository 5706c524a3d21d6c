// DecoderOptions: the options that every decoding subcommand shares.
#ifndef MORVIK_DECODEROPTIONS_H
#define MORVIK_DECODEROPTIONS_H

#include <CLI/CLI.hpp>
#include <cstdint>

#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik {

/// How to decode. The core's own defaults hold where an option is not given.
struct DecoderOptions {
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    std::uint32_t iterations = 8;
};

/// Adds --num-pu, --algorithm, --iterations and --tag-width, which fill in `options`.
void addDecoderOptions(CLI::App& command, DecoderOptions& options);

}  // namespace morvik

#endif
