// Info: the subcommand that tells what the core makes of a block size.
#ifndef MORVIK_APP_INFO_INFO_H
#define MORVIK_APP_INFO_INFO_H

#include "Command.h"

namespace morvik {

/// Adds `info` to the command line.
Command addInfo(CLI::App& app);

}  // namespace morvik

#endif
