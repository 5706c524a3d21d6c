// Files: the files and standard streams that a command reads and writes, and what can go wrong with them.
#include "Files.h"

#include <cerrno>
#include <iostream>
#include <system_error>

#include "base/OutputFile.h"

namespace morvik {

FileError::FileError(const std::string& file, const std::string& what) : std::runtime_error(file + ": " + what) {}

FileError::FileError(const std::string& file, std::size_t line, const std::string& what)
    : std::runtime_error(file + ':' + std::to_string(line) + ": " + what)
{
}

std::string cannotBe(const std::string& action)
{
    return "cannot be " + action + ": " + std::generic_category().message(errno);
}

InputFile::InputFile(const std::string& path)
    : itsName(path == base::standardStream ? "<stdin>" : path),
      itsStream(path == base::standardStream ? std::cin : itsFile)
{
    if (path != base::standardStream) {
        itsFile.open(path, std::ios::binary);
        if (!itsFile) {
            throw FileError(itsName, cannotBe("opened"));
        }
    }
}

std::istream& InputFile::stream()
{
    return itsStream;
}

const std::string& InputFile::name() const
{
    return itsName;
}

}  // namespace morvik
