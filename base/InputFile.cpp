// InputFile: opens files for reading.
#include "InputFile.h"

#include <iostream>

#include "Error.h"
#include "Path.h"

namespace morvik::base {

std::ifstream openFile(const std::string& name)
{
    std::ifstream file(pathOf(name), std::ios::binary);
    if (!file) {
        throw fileError(name, "opened");
    }
    return file;
}

InputFile::InputFile(const std::string& name)
    : itsIsStandardInput(name == standardStream),
      itsName(itsIsStandardInput ? "<stdin>" : name),
      itsFile(itsIsStandardInput ? std::ifstream() : openFile(name))
{
}

std::istream& InputFile::stream()
{
    return itsIsStandardInput ? std::cin : itsFile;
}

}  // namespace morvik::base
