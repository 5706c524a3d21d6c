// TransportOptions: the options of subcommands that encode and decode transport blocks.
#ifndef MORVIK_APP_TRANSPORTOPTIONS_H
#define MORVIK_APP_TRANSPORTOPTIONS_H

#include <CLI/CLI.hpp>
#include <cstdint>
#include <functional>
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

constexpr char versionsOption[] = "--redundancy-versions";

/// Adds it, with its singular as another name. `take` parses the text.
CLI::Option* addVersionsOption(CLI::App& command,
                               const std::function<void(const std::string&)>& take,
                               const std::string& description);

/// Adds --coded-bits, --modulation, --redundancy-versions and --soft-buffer-size, which all need `transport`.
void addTransportOptions(CLI::App& command, CLI::Option& transport, TransportOptions& options);

/// Adds --scale, which needs `transport`.
void addScaleOption(CLI::App& command, CLI::Option& transport, float& scale);

/// The code for transport blocks of `bits` bits. Throws base::Error as checkFit() does.
link::TransportBlockCode transportBlockCode(std::uint32_t bits,
                                            const TransportOptions& options,
                                            const std::string& block);

}  // namespace morvik

#endif
