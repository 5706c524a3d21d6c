// LineReader: a text read line by line, with the place for messages.
#include "LineReader.h"

#include <utility>

#include "Files.h"
#include "simulation/FileKind.h"

namespace morvik {

LineReader::LineReader(std::istream& input, std::string name) : itsLines(input, longest), itsName(std::move(name)) {}

bool LineReader::next()
{
    ++itsNumber;
    const base::Lines::Found found = itsLines.next();
    if (found == base::Lines::Found::unreadable) {
        fail(cannotBe("read"));
    }
    const char* const reason = itsNumber == 1 ? simulation::whyNoText(itsLines.text()) : nullptr;
    if (reason != nullptr) {
        throw FileError(itsName, reason);
    }
    if (found == base::Lines::Found::tooLong) {
        fail("line is too long, allowed are " + std::to_string(longest) + " characters");
    }
    return found == base::Lines::Found::line;
}

std::string_view LineReader::text() const
{
    return itsLines.text();
}

std::size_t LineReader::number() const
{
    return itsNumber;
}

void LineReader::expectAnEnd(std::size_t first) const
{
    if (itsNumber - first >= mostBlank) {
        failAt(first, "blank lines without an end, allowed are " + std::to_string(mostBlank));
    }
}

void LineReader::fail(const std::string& what) const
{
    failAt(itsNumber, what);
}

void LineReader::failAt(std::size_t line, const std::string& what) const
{
    throw FileError(itsName, line, what);
}

}  // namespace morvik
