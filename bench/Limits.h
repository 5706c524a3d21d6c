// Limits: the limit of this machine, as measured by the probe in this run.
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
        double cycles;   ///< per step of the forward recursion in 16 lanes
    };

    /// Runs the probe at every width of every instruction set of this machine.
    Limits();

    const std::vector<Limit>& all() const
    {
        return itsLimits;
    }

    /// Cycles per step in 16 lanes for the vectors used by this work; 0 if it does not use lanes.
    double cyclesPerStep(const Work& work) const;

private:
    std::vector<Limit> itsLimits;
};

}  // namespace morvik::bench

#endif
