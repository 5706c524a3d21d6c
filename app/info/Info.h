// Info: the subcommand that shows how the core handles a block size.
#ifndef MORVIK_APP_INFO_INFO_H
#define MORVIK_APP_INFO_INFO_H

#include "Command.h"

namespace morvik {

/// Adds `info` to the command line.
Command addInfo(CLI::App& app);

}  // namespace morvik

#endif
