// LineFile: a file that is read line by line, with the places for messages.
#include "LineFile.h"

#include <algorithm>
#include <fstream>
#include <utility>

#include "simulation/Error.h"
#include "simulation/FileKind.h"

namespace morvik {

LineFile::LineFile(const std::string& fileName)
    : itsFile(std::make_unique<std::ifstream>(fileName, std::ios::binary)),
      itsLines(*itsFile, longest),
      itsName(fileName)
{
    if (!*itsFile) {
        throw simulation::fileError(fileName, "opened");
    }
}

LineFile::LineFile(std::istream& input, std::string name) : itsLines(input, longest), itsName(std::move(name)) {}

bool LineFile::next()
{
    const base::Lines::Found found = itsLines.next();
    itsLine = itsLines.text();
    if (found == base::Lines::Found::unreadable) {
        throw simulation::fileError(itsName, "read");
    }
    const char* const reason = itsNumber == 0 ? simulation::whyNoText(itsLine) : nullptr;
    if (reason != nullptr) {
        throw simulation::Error(itsName + ": " + reason);
    }
    if (found == base::Lines::Found::end) {
        return false;
    }
    ++itsNumber;
    if (found == base::Lines::Found::tooLong) {
        fail("line is too long, allowed are " + std::to_string(longest) + " characters");
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
