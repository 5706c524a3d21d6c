// InstructionSets: the compilations of the lanes, and which of them this machine can run.
#include "InstructionSets.h"

// One compilation of Kernels.cpp defines each.
#define MORVIK_INSTRUCTION_SET(name, flags, isAvailable)   \
    namespace lanes_##name                                 \
    {                                                      \
        extern const lanes::InstructionSet instructionSet; \
    }
#include "InstructionSets.def"

namespace lanes {

std::vector<const InstructionSet*> availableInstructionSets()
{
    std::vector<const InstructionSet*> sets;
#if defined(__x86_64__) || defined(__i386__)
    __builtin_cpu_init();
#endif
#define MORVIK_INSTRUCTION_SET(name, flags, isAvailable) \
    if (isAvailable) {                                   \
        sets.push_back(&lanes_##name::instructionSet);   \
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

}  // namespace lanes
