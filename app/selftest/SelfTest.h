// SelfTest: the subcommand that proves that library and processor give the promised bits.
#ifndef MORVIK_APP_SELFTEST_SELFTEST_H
#define MORVIK_APP_SELFTEST_SELFTEST_H

#include "Command.h"

namespace morvik {

/// Adds `selftest` to the command line.
Command addSelfTest(CLI::App& app);

}  // namespace morvik

#endif
