// Merge: the subcommand that merges the results of several runs.
#ifndef MORVIK_APP_BER_MERGE_H
#define MORVIK_APP_BER_MERGE_H

#include "Command.h"

namespace morvik {

/// Adds `merge` to the command line.
Command addMerge(CLI::App& app);

}  // namespace morvik

#endif
