// Counts the situations of a block plainly: from the second model's values, candidate by candidate, by their names.
#ifndef MORVIK_TESTS_HARDWARE_COVERAGE_PLAINSITUATIONS_H
#define MORVIK_TESTS_HARDWARE_COVERAGE_PLAINSITUATIONS_H

#include <cstdint>
#include <map>
#include <string>

#include "support/Blocks.h"

namespace morvik::plain {

using NamedCounts = std::map<std::string, std::uint64_t>;

NamedCounts plainSituations(const blocks::Block& block, unsigned units, unsigned algorithm, unsigned iterations);

}  // namespace morvik::plain

#endif
