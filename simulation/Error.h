// Error: what a simulation cannot go on with.
#ifndef MORVIK_SIMULATION_ERROR_H
#define MORVIK_SIMULATION_ERROR_H

#include "base/Error.h"

namespace morvik::simulation {

using base::Error;
using base::fileError;

}  // namespace morvik::simulation

#endif
