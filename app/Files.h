// Files: the files and standard streams that a command reads and writes, and what can go wrong with them.
#ifndef MORVIK_APP_FILES_H
#define MORVIK_APP_FILES_H

#include <cstddef>
#include <fstream>
#include <istream>
#include <stdexcept>
#include <string>

#include "base/OutputFile.h"

namespace morvik {

using base::standardStream;

/// Something is wrong with a file. The text opens with the place, FILE or FILE:LINE.
class FileError : public std::runtime_error {
public:
    FileError(const std::string& file, const std::string& what);
    FileError(const std::string& file, std::size_t line, const std::string& what);
};

/// "cannot be ACTION: " and the operating system's reason for the failure just seen.
std::string cannotBe(const std::string& action);

/// A file open for reading, or standard input.
class InputFile {
public:
    /// Throws FileError when the file cannot be opened.
    explicit InputFile(const std::string& path);

    std::istream& stream();

    /// The path, or <stdin>.
    const std::string& name() const;

private:
    std::string itsName;
    std::ifstream itsFile;
    std::istream& itsStream;
};

}  // namespace morvik

#endif
