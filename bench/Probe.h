// Probe: the plain forward recursion, as fast as an instruction set runs it.
#ifndef MORVIK_BENCH_PROBE_H
#define MORVIK_BENCH_PROBE_H

namespace morvik::bench {

/// The loop at one vector width, in lanes.
struct Probe {
    unsigned lanes;
    /// Runs `rounds` times over `steps` steps.
    void (*run)(unsigned rounds);

    /// Few enough that branch and forward metrics of the widest vectors stay in the L1 cache.
    static constexpr unsigned steps = 32;
};

/// The probes of an instruction set.
struct ProbeSet {
    const char* name;
    const Probe* probes;
    unsigned count;
};

}  // namespace morvik::bench

#endif
