// Situations: counts what cases meet in the arithmetic of a unit: clips, wraps, ties, corrections.
#ifndef MORVIK_HARDWARE_UNITS_SITUATIONS_H
#define MORVIK_HARDWARE_UNITS_SITUATIONS_H

#include <cstdint>
#include <string>
#include <vector>

#include "Ports.h"

namespace morvik::units {

/// How often cases met a situation in each of its places: a state, a branch metric, a decision.
struct Situation {
    std::string name;
    std::string place;  ///< what its places are
    std::vector<std::uint64_t> counts;

    std::uint64_t total() const;

    /// The count of the place that met it least.
    std::uint64_t fewest() const;
};

class Situations {
public:
    Situations(Number unit, int algorithm);

    /// Counts a case: allowed inputs, and what the unit makes of them. Addresses come in the order of their steps.
    void add(const std::vector<std::int32_t>& inputs, const std::vector<std::int32_t>& outputs);

    /// All that the unit can meet, also those that no case has met.
    const std::vector<Situation>& all() const
    {
        return itsAll;
    }

private:
    void countAddress(const std::vector<std::int32_t>& inputs, std::int32_t address);

    Number itsUnit;
    int itsAlgorithm;
    std::vector<Situation> itsAll;
    std::int32_t itsLastAddress = 0;
};

}  // namespace morvik::units

#endif
