// LineFile: a file that is read line by line, with the places for messages.
#include "LineFile.h"

#include <algorithm>
#include <fstream>
#include <utility>

#include "simulation/Error.h"

namespace morvik {

LineFile::LineFile(const std::string& fileName)
    : itsFile(std::make_unique<std::ifstream>(fileName, std::ios::binary)), itsInput(*itsFile), itsName(fileName)
{
    if (!*itsFile) {
        throw simulation::fileError(fileName, "opened");
    }
}

LineFile::LineFile(std::istream& input, std::string name) : itsInput(input), itsName(std::move(name)) {}

bool LineFile::next()
{
    if (!std::getline(itsInput, itsLine)) {
        itsLine.clear();
        if (itsInput.bad()) {
            throw simulation::fileError(itsName, "read");
        }
        return false;
    }
    ++itsNumber;
    if (!itsLine.empty() && itsLine.back() == '\r') {
        itsLine.pop_back();
    }
    return true;
}

std::string LineFile::place() const
{
    return itsName + ':' + std::to_string(std::max(itsNumber, 1U));
}

void LineFile::fail(const std::string& what) const
{
    throw simulation::Error(place() + ": " + what);
}

}  // namespace morvik
