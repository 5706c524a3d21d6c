// InstructionSets: the compilations of the lanes, and which of them this machine can run.
#ifndef MORVIK_LANES_INSTRUCTIONSETS_H
#define MORVIK_LANES_INSTRUCTIONSETS_H

#include <vector>

#include "Kernels.h"

namespace morvik::lanes {

/// Those that this machine can run, the best one first. The last one runs everywhere.
std::vector<const InstructionSet*> availableInstructionSets();

/// The best one.
const InstructionSet& bestInstructionSet();

/// The narrowest kernel that has room for all of `blocks` blocks of so many segments, or the widest one.
const Kernel& kernelFor(const InstructionSet& instructionSet, unsigned segments, unsigned blocks);

}  // namespace morvik::lanes

#endif
