// Coverage: the subcommand that tells which situations of the arithmetic sets and simulations have met.
#ifndef MORVIK_APP_COVERAGE_COVERAGE_H
#define MORVIK_APP_COVERAGE_COVERAGE_H

#include "Command.h"

namespace morvik {

Command addCoverage(CLI::App& app);

}  // namespace morvik

#endif
