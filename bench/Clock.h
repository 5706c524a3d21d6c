// Clock: processor time of this thread, and its cycles per second.
#ifndef MORVIK_BENCH_CLOCK_H
#define MORVIK_BENCH_CLOCK_H

#include <cstdint>
#include <ctime>

namespace morvik::bench {

/// Processor time used by this thread, in seconds.
inline double processorTime()
{
    std::timespec time = {};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) + 1e-9 * static_cast<double>(time.tv_nsec);
}

/// Cycles per second, measured by a chain of dependent additions, one cycle each. They add registers, because some
/// processors execute the addition of a constant in register renaming, at no cost.
inline double cyclesPerSecond()
{
    constexpr unsigned rounds = 40000;
    constexpr unsigned additions = 100;
    const double start = processorTime();
    std::uintptr_t chain = 1;
    for (unsigned i = 0; i < rounds; ++i) {
        asm volatile(".rept 100\n\tadd %0, %0\n\t.endr" : "+r"(chain)::"cc");
    }
    return double{rounds} * additions / (processorTime() - start);
}

/// The cost of one call.
struct Sample {
    double seconds;
    double cycles;
};

/// Measures some calls; the clock frequency is measured just before and just after them.
class Stopwatch {
public:
    Stopwatch() : itsClock(cyclesPerSecond()), itsStart(processorTime()) {}

    Sample stop(double calls) const
    {
        const double seconds = (processorTime() - itsStart) / calls;
        return {seconds, seconds * (itsClock + cyclesPerSecond()) / 2};
    }

private:
    double itsClock;
    double itsStart;
};

}  // namespace morvik::bench

#endif
