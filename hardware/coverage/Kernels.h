// Kernels: which situations the recursions and ratios of a pass meet.
#ifndef MORVIK_HARDWARE_COVERAGE_KERNELS_H
#define MORVIK_HARDWARE_COVERAGE_KERNELS_H

#include "Meetings.h"

namespace morvik::coverage {

/// Runs the kernels of a pass once more, and hands over what their decisions and borders meet.
void findInKernels(const comparison::Model& model, unsigned pass, Taker& taker);

}  // namespace morvik::coverage

#endif
