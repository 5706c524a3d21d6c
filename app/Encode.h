// Encode: the subcommand that turns bits into code words, or into coded bits of transport blocks.
#ifndef MORVIK_APP_ENCODE_H
#define MORVIK_APP_ENCODE_H

#include "Command.h"

namespace morvik {

/// Adds `encode` to the command line.
Command addEncode(CLI::App& app);

}  // namespace morvik

#endif
