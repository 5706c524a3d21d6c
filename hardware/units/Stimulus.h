// Stimulus: cases for a unit: every one where there are few, else those at the edges of its arithmetic and random ones.
#ifndef MORVIK_HARDWARE_UNITS_STIMULUS_H
#define MORVIK_HARDWARE_UNITS_STIMULUS_H

#include <cstdint>
#include <functional>
#include <vector>

#include "Ports.h"
#include "hardware/tables/Table.h"

namespace morvik::units {

struct StimulusSettings {
    int algorithm = 0;
    std::uint64_t seed = 1;
    unsigned randomCases = 0;          ///< none for a unit of which every case is given
    std::vector<unsigned> blockSizes;  ///< of addresses
};

/// What the cases of a unit are.
struct Extent {
    bool isExhaustive = false;
    std::uint64_t directed = 0;  ///< all others are random
    std::uint64_t random = 0;
};

/// Calls take(inputs) for each case, directed ones first.
Extent stimulate(Number unit,
                 const StimulusSettings& settings,
                 const std::function<void(const std::vector<std::int32_t>&)>& take);

/// The table of a unit: inputs, then outputs, without pending corrections where the algorithm has none.
tables::Table tableOf(Number unit, int algorithm);

/// A row of the table.
tables::Row rowOf(Number unit,
                  int algorithm,
                  const std::vector<std::int32_t>& inputs,
                  const std::vector<std::int32_t>& outputs);

/// The inputs of a row of the table.
std::vector<std::int32_t> inputsOf(Number unit, int algorithm, const tables::Row& row);

}  // namespace morvik::units

#endif
