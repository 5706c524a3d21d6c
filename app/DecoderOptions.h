// DecoderOptions: the options shared by all decoding subcommands.
#ifndef MORVIK_APP_DECODEROPTIONS_H
#define MORVIK_APP_DECODEROPTIONS_H

#include <CLI/CLI.hpp>
#include <cstdint>
#include <string>

#include "hardware/testbench/DecoderOptions.h"

namespace morvik {

/// "2 units, scaled, 8 iterations".
std::string coreText(const veltra_ip_morvik_v1_0_generics& generics, std::uint32_t iterations);

/// The line that names the core behind a result: "core: 2 units, scaled, 8 iterations".
std::string coreLine(const veltra_ip_morvik_v1_0_generics& generics, std::uint32_t iterations);

/// Adds --num-pu, --algorithm, --iterations and --tag-width, which set `options`.
void addDecoderOptions(CLI::App& command, DecoderOptions& options);

}  // namespace morvik

#endif
