// LinkOptions: the arguments of `morvik ber` and `morvik vectors` that say what is sent, and how.
#ifndef MORVIK_APP_BER_LINKOPTIONS_H
#define MORVIK_APP_BER_LINKOPTIONS_H

#include <CLI/CLI.hpp>
#include <string>

#include "simulation/LinkFormats.h"

namespace morvik {

/// Adds the options of what is sent and how it is received up to the decoder, which set `options`.
void addLinkOptions(CLI::App& command, simulation::LinkOptions& options);

/// Adds --early-stop.
void addEarlyStop(CLI::App& command, simulation::LinkOptions& options);

/// The options as a command repeats them, each after a blank.
std::string commandOf(const simulation::LinkOptions& options);

}  // namespace morvik

#endif
