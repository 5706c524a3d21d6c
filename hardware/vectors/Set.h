// Set: a folder of vectors, made and checked.
#ifndef MORVIK_HARDWARE_VECTORS_SET_H
#define MORVIK_HARDWARE_VECTORS_SET_H

#include <cstdint>
#include <optional>
#include <string>

#include "Manifest.h"

namespace morvik::vectors {

/// Makes a set in a folder that is not there, is empty, or holds an earlier set, which goes when the new one is
/// complete. Other files stay. Throws base::Error. The manifest, whose settings, version and command are given,
/// is written last, and returned.
Manifest makeSet(const std::string& folder, Manifest manifest);

/// The values that were compared with the model's, over all formats.
struct Compared {
    std::uint64_t tags = 0;
    std::uint64_t decisions = 0;
    std::uint64_t ratios = 0;
    std::uint64_t internal = 0;
};

/// What the check of a set finds.
struct CheckedSet {
    Manifest manifest;
    std::optional<std::string> difference;  ///< the first one, in words
    Compared compared;
};

/// Reads every format of a set and decodes its blocks again. Throws base::Error when a file is not as it was
/// written, and when the set has less or more than its manifest tells.
CheckedSet checkSet(const std::string& folder);

}  // namespace morvik::vectors

#endif
