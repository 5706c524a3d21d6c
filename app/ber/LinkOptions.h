// LinkOptions: the arguments of `morvik ber` that say what is sent, and how.
#ifndef MORVIK_APP_BER_LINKOPTIONS_H
#define MORVIK_APP_BER_LINKOPTIONS_H

#include <CLI/CLI.hpp>
#include <string>

#include "LinkFormats.h"

namespace morvik {

/// Adds the options, which set `options`.
void addLinkOptions(CLI::App& command, LinkOptions& options);

/// The options as a command repeats them, each after a blank.
std::string commandOf(const LinkOptions& options);

}  // namespace morvik

#endif
