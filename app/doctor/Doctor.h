// Doctor: the subcommand that diagnoses why blocks decode badly.
#ifndef MORVIK_APP_DOCTOR_DOCTOR_H
#define MORVIK_APP_DOCTOR_DOCTOR_H

#include "Command.h"

namespace morvik {

/// Adds `doctor` to the command line.
Command addDoctor(CLI::App& app);

}  // namespace morvik

#endif
