// Trace: the subcommand that writes the internal values of selected passes.
#ifndef MORVIK_APP_TRACE_H
#define MORVIK_APP_TRACE_H

#include "Command.h"

namespace morvik {

/// Adds `trace` to the command line.
Command addTrace(CLI::App& app);

}  // namespace morvik

#endif
