// Vectors: the subcommand that generates stimulus and expected values for a test bench.
#ifndef MORVIK_APP_VECTORS_H
#define MORVIK_APP_VECTORS_H

#include "Command.h"

namespace morvik {

Command addVectors(CLI::App& app);

}  // namespace morvik

#endif
