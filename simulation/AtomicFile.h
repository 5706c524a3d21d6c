// AtomicFile: files that are there as a whole, in their old or their new content, whenever the machine stops.
#ifndef MORVIK_SIMULATION_ATOMICFILE_H
#define MORVIK_SIMULATION_ATOMICFILE_H

#include <string>

#include "Descriptor.h"

namespace simulation {

/// Replaces the content of a file, or makes it: written beside it, flushed to the disk, and given its name. When that
/// fails, the old content stays and nothing else is left. A symbolic link is followed. Throws Error.
void writeAtomically(const std::string& fileName, const std::string& content);

/// The same, for a file that other processes may want to take: if `isLocked`, the new file is this process's before it
/// has the name, and for as long as what is returned lives.
Descriptor writeLocked(const std::string& fileName, const std::string& content, bool isLocked);

/// Throws Error unless writeAtomically can be expected to work.
void checkWritable(const std::string& fileName);

/// Whether what is written to one file would take the other's place. Throws Error if a link leads nowhere.
bool isSamePlace(const std::string& a, const std::string& b);

}  // namespace simulation

#endif
