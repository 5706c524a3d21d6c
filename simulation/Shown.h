// Shown: text of unknown content in messages.
#ifndef MORVIK_SIMULATION_SHOWN_H
#define MORVIK_SIMULATION_SHOWN_H

#include "base/Shown.h"

namespace simulation {

using base::shown;

}  // namespace simulation

#endif
