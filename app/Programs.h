// Programs: the arguments of `morvik` and `morvik-mpi`, for their mains, manual pages and completions.
#ifndef MORVIK_APP_PROGRAMS_H
#define MORVIK_APP_PROGRAMS_H

#include <CLI/CLI.hpp>
#include <memory>
#include <string>
#include <vector>

#include "Command.h"
#include "ber/Ber.h"

namespace morvik {

struct Program {
    Program(const std::string& name, const std::string& description);

    std::unique_ptr<CLI::App> arguments;
    std::vector<Command> commands;
};

Program morvikProgram();

/// `makeWorkers`: see BerMeans.
Program morvikMpiProgram(const decltype(BerMeans::makeWorkers)& makeWorkers);

}  // namespace morvik

#endif
