// SelfTest: the subcommand that checks that library and processor produce the promised bits.
#ifndef MORVIK_APP_SELFTEST_SELFTEST_H
#define MORVIK_APP_SELFTEST_SELFTEST_H

#include "Command.h"

namespace morvik {

/// Adds `selftest` to the command line.
Command addSelfTest(CLI::App& app);

}  // namespace morvik

#endif
