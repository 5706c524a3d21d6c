// OwnFile: a file that one process at a time has for itself.
#ifndef MORVIK_BASE_OWNFILE_H
#define MORVIK_BASE_OWNFILE_H

#include <string>

#include "Descriptor.h"

namespace morvik::base {

/// Has a file, from before it is there until it is removed or the process ends. The file itself is what is locked, so
/// that there is no other that a killed process could leave. A new one is empty until it is written, and goes with the
/// object if it never is.
class OwnFile {
public:
    /// If another process has the file, isTaken() tells. If it cannot be opened, writing will tell. Throws Error where
    /// there is something else than a regular file: a link would lead to somebody else's.
    explicit OwnFile(std::string fileName);
    OwnFile(const OwnFile&) = delete;
    OwnFile& operator=(const OwnFile&) = delete;
    ~OwnFile();

    /// Whether it is another process's.
    bool isTaken() const;

    /// Whether there was no such file, or nothing in it.
    bool isNew() const;

    /// Replaces the content, atomically. Throws Error.
    void write(const std::string& content);

    /// Throws Error.
    void remove();

private:
    std::string itsName;
    Descriptor itsFile;
    bool itsIsTaken = false;
};

}  // namespace morvik::base

#endif
