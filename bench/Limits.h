// Limits: what the probe shows to be possible on this machine, in this run.
#ifndef MORVIK_BENCH_LIMITS_H
#define MORVIK_BENCH_LIMITS_H

#include <string>
#include <vector>

#include "Work.h"

namespace morvik::bench {

class Limits {
public:
    struct Limit {
        std::string instructionSet;
        unsigned lanes;  ///< of a vector
        double cycles;   ///< for a step of the forward recursion in 16 lanes
    };

    /// Runs the probe at every width of every instruction set of this machine.
    Limits();

    const std::vector<Limit>& all() const
    {
        return itsLimits;
    }

    /// Cycles of a step in 16 lanes for the vectors that this work is done on; 0 where it takes no lanes.
    double cyclesPerStep(const Work& work) const;

private:
    std::vector<Limit> itsLimits;
};

}  // namespace morvik::bench

#endif
