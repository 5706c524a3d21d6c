// TransportOptions: the options of subcommands that encode and decode transport blocks.
#ifndef MORVIK_APP_TRANSPORTOPTIONS_H
#define MORVIK_APP_TRANSPORTOPTIONS_H

#include <CLI/CLI.hpp>
#include <cstdint>
#include <string>
#include <vector>

#include "link/coding/TransportBlock.h"
#include "link/modulation/Modulation.h"

namespace morvik {

struct TransportOptions {
    std::uint32_t codedBits = 0;
    link::Modulation modulation = link::Modulation::qpsk;
    std::vector<unsigned> versions = {0};
    std::uint32_t softBufferSize = 0;  ///< 0: not limited
};

/// Adds --coded-bits, --modulation, --redundancy-version and --soft-buffer-size, which all need `transport`.
void addTransportOptions(CLI::App& command, CLI::Option& transport, TransportOptions& options);

/// The code for transport blocks of `bits` bits. Throws base::Error, naming the options that do not go together.
link::TransportBlockCode transportBlockCode(std::uint32_t bits, const TransportOptions& options);

}  // namespace morvik

#endif
