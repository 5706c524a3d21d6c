// Shown: text of unknown content in messages.
#ifndef MORVIK_SIMULATION_SHOWN_H
#define MORVIK_SIMULATION_SHOWN_H

#include "base/Shown.h"

namespace morvik::simulation {

using base::shown;

}  // namespace morvik::simulation

#endif
