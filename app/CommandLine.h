// CommandLine: takes a program from its arguments to its exit status.
#ifndef MORVIK_APP_COMMANDLINE_H
#define MORVIK_APP_COMMANDLINE_H

#include <CLI/CLI.hpp>
#include <vector>

#include "Command.h"

namespace morvik {

/// Runs the subcommand that the arguments name, prints the help or version they ask for, or reports bad usage in one
/// line. Returns the exit status.
int runCommandLine(CLI::App& app, const std::vector<Command>& commands, int argc, const char* const* argv);

}  // namespace morvik

#endif
