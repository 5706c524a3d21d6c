// Clock: processor time of this thread, in cycles.
#ifndef MORVIK_BENCH_CLOCK_H
#define MORVIK_BENCH_CLOCK_H

#include <cstdint>
#include <ctime>

namespace bench {

/// Processor time that this thread has used, in seconds.
inline double processorTime()
{
    std::timespec time = {};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) + 1e-9 * static_cast<double>(time.tv_nsec);
}

/// Cycles a second, by a chain of additions that each wait for the one before: one cycle for each.
inline double cyclesPerSecond()
{
    constexpr unsigned rounds = 40000;
    constexpr unsigned additions = 100;
    const double start = processorTime();
    std::uintptr_t chain = 1;
    for (unsigned i = 0; i < rounds; ++i) {
        asm volatile(".rept 100\n\tadd $1, %0\n\t.endr" : "+r"(chain));
    }
    return double{rounds} * additions / (processorTime() - start);
}

}  // namespace bench

#endif
