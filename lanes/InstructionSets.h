// InstructionSets: the compilations of the lanes, and those that this machine can run.
#ifndef MORVIK_LANES_INSTRUCTIONSETS_H
#define MORVIK_LANES_INSTRUCTIONSETS_H

#include <vector>

#include "Kernels.h"

namespace morvik::lanes {

/// Returns those that this machine can run, best first. The last one runs everywhere.
std::vector<const InstructionSet*> availableInstructionSets();

/// Returns the best one available.
const InstructionSet& bestInstructionSet();

/// Returns the narrowest kernel that holds `blocks` blocks of `segments` segments, or else the widest one.
const Kernel& kernelFor(const InstructionSet& instructionSet, unsigned segments, unsigned blocks);

}  // namespace morvik::lanes

#endif
