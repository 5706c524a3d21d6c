// CountsJson: counts of situations of the arithmetic as JSON.
#ifndef MORVIK_APP_COVERAGE_COUNTSJSON_H
#define MORVIK_APP_COVERAGE_COUNTSJSON_H

#include <nlohmann/json.hpp>

#include "hardware/coverage/Counts.h"

namespace morvik {

/// The cores, how many situations are missing, and each situation with its count.
nlohmann::ordered_json countsJson(const coverage::Counts& counts);

}  // namespace morvik

#endif
