// LineReader: a text read line by line, with the place for messages.
#include "LineReader.h"

#include <utility>

#include "Files.h"

namespace morvik {

LineReader::LineReader(std::istream& input, std::string name)
    : itsInput(input), itsName(std::move(name)), itsBuffer(longest + 2)  // \r, and the null that getline() adds
{
}

bool LineReader::next()
{
    ++itsNumber;
    itsInput.getline(itsBuffer.data(), static_cast<std::streamsize>(itsBuffer.size()));
    if (itsInput.bad()) {
        fail(cannotBe("read"));
    }
    auto length = static_cast<std::size_t>(itsInput.gcount());
    if (itsInput.eof()) {
        if (length == 0) {
            return false;
        }
    } else if (itsInput.good()) {
        --length;  // gcount() includes the \n
    }
    itsText = std::string_view(itsBuffer.data(), length);
    if (!itsText.empty() && itsText.back() == '\r') {
        itsText.remove_suffix(1);
    }
    if (itsInput.fail() || itsText.size() > longest) {
        fail("line is too long, allowed are " + std::to_string(longest) + " characters");
    }
    return true;
}

std::string_view LineReader::text() const
{
    return itsText;
}

std::size_t LineReader::number() const
{
    return itsNumber;
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
