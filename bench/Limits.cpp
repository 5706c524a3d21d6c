// Limits: the limit of this machine, as measured by the probe in this run.
#include "Limits.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>

#include "Measure.h"
#include "Probe.h"
#include "lanes/InstructionSets.h"
#include "rules/Cut.h"
#include "rules/Trellis.h"

// Each compilation of Probe.cpp defines one of these.
#define MORVIK_INSTRUCTION_SET(name, flags, isAvailable) \
    namespace morvik::lanes::probe_##name                \
    {                                                    \
        extern const bench::ProbeSet probeSet;           \
    }
#include "lanes/InstructionSets.def"

namespace morvik::bench {

namespace {

const ProbeSet* const probeSets[] = {
#define MORVIK_INSTRUCTION_SET(name, flags, isAvailable) &lanes::probe_##name::probeSet,
#include "lanes/InstructionSets.def"
};

double cyclesOf(const Probe& probe)
{
    constexpr unsigned rounds = 4000;
    probe.run(rounds / 10);
    const Stopwatch stopwatch;
    probe.run(rounds);
    return stopwatch.stop(double{rounds} * Probe::steps).cycles * 16 / probe.lanes;
}

const lanes::InstructionSet* instructionSet(const std::string& name)
{
    for (const lanes::InstructionSet* set : lanes::availableInstructionSets()) {
        if (set->name == name) {
            return set;
        }
    }
    return nullptr;
}

/// Lanes of the vectors used by the work; those of a single segment hold its states.
unsigned vectorLanes(const Work& work, const lanes::InstructionSet& set)
{
    const unsigned segments = rules::Cut(work.blockSize, static_cast<unsigned>(work.units)).segments();
    const unsigned blocks = work.call == Work::Call::batch ? work.blocks : 1;
    return std::max(lanes::kernelFor(set, segments, blocks).vectorLanes, rules::stateCount);
}

}  // namespace

/// The probes alternate, so that a short disturbance of the machine spoils few samples of each.
Limits::Limits()
{
    constexpr unsigned repetitions = 9;
    std::vector<const Probe*> probes;
    for (const ProbeSet* set : probeSets) {
        for (unsigned i = 0; instructionSet(set->name) != nullptr && i < set->count; ++i) {
            probes.push_back(&set->probes[i]);
            itsLimits.push_back({set->name, set->probes[i].lanes, 0});
        }
    }
    std::vector<std::vector<double>> cycles(probes.size());
    for (unsigned repetition = 0; repetition < repetitions; ++repetition) {
        for (std::size_t i = 0; i < probes.size(); ++i) {
            cycles[i].push_back(cyclesOf(*probes[i]));
        }
    }
    for (std::size_t i = 0; i < probes.size(); ++i) {
        itsLimits[i].cycles = median(cycles[i]);
    }
}

double Limits::cyclesPerStep(const Work& work) const
{
    const lanes::InstructionSet* const set = instructionSet(work.instructionSet);
    if (set == nullptr || work.sizes != Work::Sizes::equal) {
        return 0;
    }
    for (const Limit& limit : itsLimits) {
        if (limit.instructionSet == set->name && limit.lanes == vectorLanes(work, *set)) {
            return limit.cycles;
        }
    }
    return 0;
}

}  // namespace morvik::bench
