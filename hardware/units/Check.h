// Check: computes the tables of units in a folder again.
#ifndef MORVIK_HARDWARE_UNITS_CHECK_H
#define MORVIK_HARDWARE_UNITS_CHECK_H

#include <optional>
#include <string>
#include <vector>

#include "Description.h"

namespace morvik::units {

struct CheckedUnit {
    Description description;
    std::optional<std::string> difference;  ///< the first, if there is one
};

/// The units that a folder describes.
std::vector<Number> unitsIn(const std::string& folder);

/// All files of a unit, with their folder; the description is the first.
std::vector<std::string> filesOf(const std::string& folder, const Description& description);

/// Computes every case of the unit's tables again and compares. Throws base::Error if files are missing, damaged or
/// have changed, or have other cases than the description tells.
CheckedUnit checkUnit(const std::string& folder, Number unit);

}  // namespace morvik::units

#endif
