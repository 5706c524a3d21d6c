// Probe: the plain forward recursion; compiled once for each instruction set, like lanes/Kernels.cpp.
#include "Probe.h"

#include <cstddef>
#include <iterator>
#include <utility>

#include "lanes/Machine.h"
#include "rules/Trellis.h"
#include "rules/TrellisDecision.h"

namespace morvik::lanes::MORVIK_LANES {
namespace {

constexpr std::size_t states = rules::stateCount;

template <unsigned count>
struct Loop {
    using Value = Eighths<count>;
    using Decision = rules::DecideMax<Value>;

    /// A slot for each step: its eight forward metrics and two branch metrics, each of which serves two pairs of
    /// states, because LTE has no second parity stream. They are adjacent, so that the loads of one step never alias
    /// stores of another in the low 12 address bits.
    static constexpr std::size_t slot = (states + 2) * count;
    alignas(64) static inline std::int16_t slots[bench::Probe::steps * slot];

    static __attribute__((flatten, noinline)) void run(unsigned rounds)
    {
        for (unsigned round = 0; round < rounds; ++round) {
            asm volatile("" ::"r"(slots) : "memory");  // as if other code read and wrote them
            rules::Column<Decision> a{};
            for (std::int16_t* to = slots; to != slots + bench::Probe::steps * slot; to += slot) {
                const Value g0 = Value::load(to + states * count);
                const Value g1 = Value::load(to + (states + 1) * count);
                rules::forEach<states>([&](auto state) MORVIK_INLINE_LAMBDA { a[state].store(to + state * count); });
                a = rules::forwardStep(Decision{}, a, rules::BranchMetrics<Value>{g0, g1, g1, g0});
            }
        }
        asm volatile("" ::"r"(slots) : "memory");
    }

    static constexpr bench::Probe probe = {count, run};
};

template <class OfLanes>
struct Probes;

template <unsigned... counts>
struct Probes<std::integer_sequence<unsigned, counts...>> {
    static constexpr bench::Probe probes[] = {Loop<counts>::probe...};
};

constexpr const auto& probes = Probes<Machine::VectorLanes>::probes;

}  // namespace

extern const bench::ProbeSet probeSet;
const bench::ProbeSet probeSet = {MORVIK_LANES_NAME, probes, static_cast<unsigned>(std::size(probes))};

}  // namespace morvik::lanes::MORVIK_LANES
