// InstructionSets: the compilations of the lanes, and those that this machine can run.
#include "InstructionSets.h"

namespace morvik::lanes {

// Each compilation of Kernels.cpp defines one of these.
#define MORVIK_INSTRUCTION_SET(name, flags, isAvailable) \
    namespace name {                                     \
    extern const InstructionSet instructionSet;          \
    }
#include "InstructionSets.def"

std::vector<const InstructionSet*> availableInstructionSets()
{
    std::vector<const InstructionSet*> sets;
#if defined(__x86_64__) || defined(__i386__)
    __builtin_cpu_init();
#endif
#define MORVIK_INSTRUCTION_SET(name, flags, isAvailable) \
    if (isAvailable) {                                   \
        sets.push_back(&name::instructionSet);           \
    }
#include "InstructionSets.def"
    return sets;
}

const InstructionSet& bestInstructionSet()
{
    return *availableInstructionSets().front();
}

const Kernel& kernelFor(const InstructionSet& instructionSet, unsigned segments, unsigned blocks)
{
    const Kernel* kernel = instructionSet.kernels;
    const Kernel* const widest = kernel + instructionSet.kernelCount - 1;
    while (kernel != widest && kernel->lanes / segments < blocks) {
        ++kernel;
    }
    return *kernel;
}

}  // namespace morvik::lanes
