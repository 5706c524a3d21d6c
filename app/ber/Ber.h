// Ber: the subcommand that simulates error rates.
#ifndef MORVIK_APP_BER_BER_H
#define MORVIK_APP_BER_BER_H

#include <functional>
#include <memory>
#include <string>

#include "BerOptions.h"
#include "Command.h"
#include "simulation/Workers.h"

namespace morvik {

/// How the programs with this subcommand differ.
struct BerMeans {
    std::string command;  // the prefix of messages

    /// Creates the workers that simulate the frames of a run. The plan outlives them.
    std::function<std::unique_ptr<simulation::Workers>(const BerOptions& options, const simulation::Plan& plan)>
        makeWorkers;
    bool hasTerminal = false;  // whether standard output may be the user's terminal
};

/// Adds `ber` to the command line, simulating in threads of this process.
Command addBer(CLI::App& app);

/// Adds `ber` to the command line.
Command addBer(CLI::App& app, const BerMeans& means);

}  // namespace morvik

#endif
