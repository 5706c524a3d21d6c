// InputFile: opens files for reading.
#ifndef MORVIK_BASE_INPUTFILE_H
#define MORVIK_BASE_INPUTFILE_H

#include <fstream>
#include <istream>
#include <string>

#include "OutputFile.h"

namespace morvik::base {

/// Opens a file for reading. Throws Error.
std::ifstream openFile(const std::string& name);

/// A file open for reading, or standard input.
class InputFile {
public:
    /// Opens the file, or standard input for standardStream. Throws Error.
    explicit InputFile(const std::string& name);

    std::istream& stream();

    /// The file's name, or <stdin>.
    const std::string& name() const
    {
        return itsName;
    }

private:
    bool itsIsStandardInput;
    std::string itsName;
    std::ifstream itsFile;
};

}  // namespace morvik::base

#endif
