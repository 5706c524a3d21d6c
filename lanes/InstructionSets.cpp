// InstructionSets: the compilations of the lanes, and which of them this machine can run.
#include "InstructionSets.h"

// MORVIK_LANES_ONLY_GENERIC leaves the others out, for builds that compare compilers.
#if (defined(__x86_64__) || defined(__i386__)) && !defined(MORVIK_LANES_ONLY_GENERIC)
#define MORVIK_LANES_X86
#endif

// One compilation of Kernels.cpp defines each.
namespace lanes_generic {
extern const lanes::InstructionSet instructionSet;
}
#if defined(MORVIK_LANES_X86)
namespace lanes_ssse3 {
extern const lanes::InstructionSet instructionSet;
}
namespace lanes_avx2 {
extern const lanes::InstructionSet instructionSet;
}
namespace lanes_avx512 {
extern const lanes::InstructionSet instructionSet;
}
#endif

namespace lanes {

std::vector<const InstructionSet*> availableInstructionSets()
{
    std::vector<const InstructionSet*> sets;
#if defined(MORVIK_LANES_X86)
    __builtin_cpu_init();
    if (__builtin_cpu_supports("avx512bw") && __builtin_cpu_supports("avx512vl")) {
        sets.push_back(&lanes_avx512::instructionSet);
    }
    if (__builtin_cpu_supports("avx2")) {
        sets.push_back(&lanes_avx2::instructionSet);
    }
    if (__builtin_cpu_supports("ssse3")) {
        sets.push_back(&lanes_ssse3::instructionSet);
    }
#endif
    sets.push_back(&lanes_generic::instructionSet);
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
