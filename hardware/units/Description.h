// Description: NAME.json, which tells what the tables of a unit have.
#ifndef MORVIK_HARDWARE_UNITS_DESCRIPTION_H
#define MORVIK_HARDWARE_UNITS_DESCRIPTION_H

#include <cstdint>
#include <string>
#include <vector>

#include "Situations.h"
#include "Stimulus.h"
#include "hardware/tables/Table.h"

namespace morvik::units {

/// The table of a unit in a format.
struct DescribedFormat {
    struct File {
        std::string name;  ///< without the folder
        std::string sha256;
    };

    std::string name;
    std::vector<File> files;
};

struct Description {
    std::string version;  ///< of morvik
    std::string command;  ///< which makes the files again
    Number unit = Number::intrinsic;
    int algorithm = 0;
    Extent extent;
    std::vector<Situation> situations;  ///< that the cases meet
    std::vector<DescribedFormat> formats;

    std::uint64_t cases() const
    {
        return extent.directed + extent.random;
    }
};

/// The name of a unit.
std::string nameOf(Number unit);

/// The name of the file.
std::string descriptionName(Number unit);

std::string textOf(const Description& description);

/// Parses a description. Throws base::Error, prefixed with the file's name, unless it is one of this unit that names
/// cases and formats, with the table, the files and the situations that the unit has.
Description parseDescription(const std::string& text, const std::string& fileName, Number unit);

}  // namespace morvik::units

#endif
