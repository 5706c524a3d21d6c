// Set: makes and checks a folder of vectors.
#ifndef MORVIK_HARDWARE_VECTORS_SET_H
#define MORVIK_HARDWARE_VECTORS_SET_H

#include <cstdint>
#include <optional>
#include <string>

#include "Manifest.h"
#include "hardware/coverage/Counts.h"

namespace morvik::vectors {

/// Makes a set in a folder that does not exist, is empty, or holds an earlier set, which is removed once the new one is
/// complete. Other files stay. The manifest, given with settings, version and command, is written last and returned.
/// Adds the situations of the arithmetic that the blocks meet to `counts`, unless null. Throws base::Error.
Manifest makeSet(const std::string& folder, Manifest manifest, coverage::Counts* counts = nullptr);

/// How many values were compared with the model's, over all formats.
struct Compared {
    std::uint64_t tags = 0;
    std::uint64_t decisions = 0;
    std::uint64_t ratios = 0;
    std::uint64_t internal = 0;
    std::uint64_t crcs = 0;
};

/// The result of checking a set.
struct CheckedSet {
    Manifest manifest;
    std::optional<std::string> difference;  ///< the first one, in words
    Compared compared;
};

/// Reads every format of a set and decodes its blocks again. Throws base::Error if a file has changed since it was
/// written, or if the set has less or more than its manifest says.
CheckedSet checkSet(const std::string& folder);

/// Which situations of the arithmetic the blocks of a set meet. Throws base::Error if it cannot be read.
coverage::Counts situationsOf(const std::string& folder);

}  // namespace morvik::vectors

#endif
