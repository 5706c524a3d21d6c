// UnitVectors: stimulus and expected values for single units of the core, which `morvik vectors --unit` writes.
#ifndef MORVIK_APP_UNITVECTORS_H
#define MORVIK_APP_UNITVECTORS_H

#include <CLI/CLI.hpp>
#include <cstdint>
#include <string>
#include <vector>

#include "hardware/units/Ports.h"

namespace morvik {

struct UnitVectors {
    std::vector<units::Number> units;  ///< in the order of a pass
    unsigned randomCases = 1000;
    std::string folder;
    int algorithm = 0;
    std::uint64_t seed = 1;
    std::vector<std::string> formats;
    std::vector<unsigned> blockSizes;  ///< of addresses; all if there are none
};

/// Adds --unit and --cases.
void addUnitOptions(CLI::App& command, UnitVectors& vectors);

/// Writes the tables of the units and their descriptions, and prints what the cases meet. Throws base::Error, also for
/// other options of the command that units have no use for. Returns the exit status.
int makeUnitVectors(const CLI::App& command, UnitVectors vectors);

/// Computes the tables of all units that the folder describes again, and prints what differs. Throws base::Error for
/// files that are damaged. Returns the exit status.
int checkUnitVectors(const std::string& folder);

}  // namespace morvik

#endif
