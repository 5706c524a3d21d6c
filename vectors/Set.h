// Set: a folder of vectors, made and checked.
#ifndef MORVIK_VECTORS_SET_H
#define MORVIK_VECTORS_SET_H

#include <optional>
#include <string>

#include "Manifest.h"

namespace morvik::vectors {

/// Makes a set in a folder that is not there, is empty, or holds an earlier set, which goes. Throws simulation::Error.
/// The manifest, whose settings, version and command are given, is written last, and returned.
Manifest makeSet(const std::string& folder, Manifest manifest);

/// What the check of a set finds.
struct CheckedSet {
    Manifest manifest;
    std::optional<std::string> difference;  ///< the first one, in words
};

/// Reads every format of a set and decodes its blocks again. Throws simulation::Error when a file is not as it was
/// written.
CheckedSet checkSet(const std::string& folder);

}  // namespace morvik::vectors

#endif
