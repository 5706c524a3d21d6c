// OwnFile: a file that one process at a time owns.
#ifndef MORVIK_BASE_OWNFILE_H
#define MORVIK_BASE_OWNFILE_H

#include <string>

#include "System.h"

namespace morvik::base {

/// Owns a file exclusively, from before it exists until it is removed or the process ends. The lock is on the file
/// itself, or vanishes with the process: a killed one leaves no lock file behind. A new file is empty until written;
/// the destructor removes it if it never was.
class OwnFile {
public:
    /// If another process owns the file, isTaken() is true. If it cannot be opened, write() fails. Throws Error if the
    /// name is of anything but a regular file: a link could lead to somebody else's.
    explicit OwnFile(std::string fileName);
    OwnFile(const OwnFile&) = delete;
    OwnFile& operator=(const OwnFile&) = delete;

    /// Whether another process owns the file.
    bool isTaken() const;

    /// Whether the file did not exist or is empty.
    bool isNew() const;

    /// Replaces the content atomically. Throws Error.
    void write(const std::string& content);

    /// Throws Error.
    void remove();

private:
    std::string itsName;
    system::Ownership itsOwnership;
};

}  // namespace morvik::base

#endif
