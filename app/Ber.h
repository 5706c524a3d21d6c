// Ber: the subcommand that simulates error rates.
#ifndef MORVIK_BER_H
#define MORVIK_BER_H

#include "Command.h"

namespace morvik {

/// Adds `ber` to the command line.
Command addBer(CLI::App& app);

}  // namespace morvik

#endif
