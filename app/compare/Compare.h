// Compare: the subcommand that finds where a simulation of hardware leaves the model.
#ifndef MORVIK_APP_COMPARE_COMPARE_H
#define MORVIK_APP_COMPARE_COMPARE_H

#include "Command.h"

namespace morvik {

/// Adds `compare` to the command line.
Command addCompare(CLI::App& app);

}  // namespace morvik

#endif
