// DecoderOptions: the options that every decoding subcommand shares.
#ifndef MORVIK_DECODEROPTIONS_H
#define MORVIK_DECODEROPTIONS_H

#include <CLI/CLI.hpp>
#include <cstdint>
#include <string>

#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik {

/// How to decode. As it is made, it is the one default of all subcommands: the library's own core.
struct DecoderOptions {
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    std::uint32_t iterations = 8;
};

/// "2 units, scaled, 8 iterations".
std::string coreText(const veltra_ip_morvik_v1_0_generics& generics, std::uint32_t iterations);

/// The line that tells people which core a result is of: "core: 2 units, scaled, 8 iterations".
std::string coreLine(const veltra_ip_morvik_v1_0_generics& generics, std::uint32_t iterations);

/// Adds --num-pu, --algorithm, --iterations and --tag-width, which fill in `options`.
void addDecoderOptions(CLI::App& command, DecoderOptions& options);

}  // namespace morvik

#endif
