// RowKernelSets: the compilations of the row kernels, and those that this machine can run.
#include "RowKernels.h"

namespace morvik::link {

// Each compilation of RowKernels.cpp defines one of these.
#if defined(MORVIK_LINK_X86_KERNELS)
namespace avx512 {
extern const RowKernels kernels;
}
namespace avx2 {
extern const RowKernels kernels;
}
#endif
namespace generic {
extern const RowKernels kernels;
}

std::vector<const RowKernels*> rowKernelSets()
{
    std::vector<const RowKernels*> sets;
#if defined(MORVIK_LINK_X86_KERNELS)
    __builtin_cpu_init();
    if (__builtin_cpu_supports("avx512bw") && __builtin_cpu_supports("avx512vl")) {
        sets.push_back(&avx512::kernels);
    }
    if (__builtin_cpu_supports("avx2")) {
        sets.push_back(&avx2::kernels);
    }
#endif
    sets.push_back(&generic::kernels);
    return sets;
}

const RowKernels& rowKernels()
{
    static const RowKernels& best = *rowKernelSets().front();
    return best;
}

}  // namespace morvik::link
