// Compare: the subcommand that finds where a hardware simulation departs from the model.
#ifndef MORVIK_APP_COMPARE_COMPARE_H
#define MORVIK_APP_COMPARE_COMPARE_H

#include "Command.h"

namespace morvik {

/// Adds `compare` to the command line.
Command addCompare(CLI::App& app);

}  // namespace morvik

#endif
