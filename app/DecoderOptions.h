// DecoderOptions: the options that every decoding subcommand shares.
#ifndef MORVIK_APP_DECODEROPTIONS_H
#define MORVIK_APP_DECODEROPTIONS_H

#include <CLI/CLI.hpp>
#include <cstdint>
#include <string>

#include "hardware/testbench/DecoderOptions.h"

namespace morvik {

/// "2 units, scaled, 8 iterations".
std::string coreText(const veltra_ip_morvik_v1_0_generics& generics, std::uint32_t iterations);

/// The line that tells people which core a result is of: "core: 2 units, scaled, 8 iterations".
std::string coreLine(const veltra_ip_morvik_v1_0_generics& generics, std::uint32_t iterations);

/// Adds --num-pu, --algorithm, --iterations and --tag-width, which fill in `options`.
void addDecoderOptions(CLI::App& command, DecoderOptions& options);

}  // namespace morvik

#endif
