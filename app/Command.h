// Command: the interface between main and a subcommand.
#ifndef MORVIK_APP_COMMAND_H
#define MORVIK_APP_COMMAND_H

#include <CLI/CLI.hpp>
#include <functional>

namespace morvik {

/// Exit statuses that all subcommands share.
enum ExitStatus { success = 0, differencesFound = 1, badInputOrUsage = 2 };

/// A subcommand: its arguments, and what runs if the command line names it.
///
/// `run` returns the exit status. main reports what it throws in one line, with the status for bad input.
struct Command {
    CLI::App* arguments;
    std::function<int()> run;
};

}  // namespace morvik

#endif
