// CommandLine: what happens between the arguments of a program and its exit status.
#ifndef MORVIK_APP_COMMANDLINE_H
#define MORVIK_APP_COMMANDLINE_H

#include <CLI/CLI.hpp>
#include <vector>

#include "Command.h"

namespace morvik {

/// Runs the subcommand that the arguments name, or prints what they ask for, or in one line what is wrong with them.
/// Returns the exit status.
int runCommandLine(CLI::App& app, const std::vector<Command>& commands, int argc, const char* const* argv);

}  // namespace morvik

#endif
