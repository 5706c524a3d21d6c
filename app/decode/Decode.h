// Decode: the subcommand that turns a file of soft values into decisions.
#ifndef MORVIK_APP_DECODE_DECODE_H
#define MORVIK_APP_DECODE_DECODE_H

#include "Command.h"

namespace morvik {

/// Adds `decode` to the command line.
Command addDecode(CLI::App& app);

}  // namespace morvik

#endif
