// LineReader: reads any text line by line in bounded memory, with positions for messages.
#include "LineReader.h"

#include <algorithm>
#include <utility>

#include "Error.h"
#include "FileKind.h"
#include "Text.h"

namespace morvik::base {

namespace {

constexpr std::size_t usualBuffer = 8192;

std::string lineName(const std::string& name, std::size_t line)
{
    return name + ':' + std::to_string(line);
}

}  // namespace

LineReader::LineReader(std::istream& input, std::string name, std::size_t longest)
    : itsInput(input), itsName(std::move(name)), itsLongest(longest), itsBuffer(usualBuffer)
{
}

bool LineReader::next()
{
    const std::size_t length = readLine();
    if (itsInput.bad()) {
        throw fileError(lineName(itsName, itsNumber + 1), "read");
    }
    itsText = std::string_view(itsBuffer.data(), length);
    if (itsNumber == 0) {
        itsText = withoutMark(itsText);
        if (const char* const reason = whyNoText(itsText)) {
            throw Error(itsName + ": " + reason);
        }
    }
    if (itsInput.eof() && length == 0) {
        return false;
    }
    ++itsNumber;
    if (!itsText.empty() && itsText.back() == '\r') {
        itsText.remove_suffix(1);
    }
    if (itsText.size() > itsLongest) {
        fail("line is longer than " + std::to_string(itsLongest) + " characters");
    }
    return true;
}

std::string LineReader::place() const
{
    return lineName(itsName, std::max<std::size_t>(itsNumber, 1));
}

void LineReader::expectAnEnd(std::size_t first) const
{
    if (itsNumber - first >= mostBlank) {
        failAt(first, "more than " + std::to_string(mostBlank) + " blank lines");
    }
}

void LineReader::expectOnlyBlankLines()
{
    const std::size_t first = itsNumber;
    while (next()) {
        if (!trimmed(itsText).empty()) {
            failAt(first, "blank line before the end");
        }
        expectAnEnd(first);
    }
}

void LineReader::fail(const std::string& what) const
{
    throw Error(place() + ": " + what);
}

void LineReader::failAt(std::size_t line, const std::string& what) const
{
    throw Error(lineName(itsName, line) + ": " + what);
}

/// Reads a line into the buffer and returns its length. Reads only as much of an overlong line as shows that it is.
std::size_t LineReader::readLine()
{
    const std::size_t most = byteOrderMark.size() + itsLongest + 1 + 1 + 1;  // \r, one excess character, final null
    for (std::size_t length = 0;;) {
        itsInput.getline(itsBuffer.data() + length, static_cast<std::streamsize>(itsBuffer.size() - length));
        length += static_cast<std::size_t>(itsInput.gcount());
        if (itsInput.good()) {
            return length - 1;  // gcount() includes the \n
        }
        const bool isFull = itsInput.fail() && length + 1 == itsBuffer.size() && !itsInput.eof() && !itsInput.bad();
        if (!isFull || itsBuffer.size() >= most) {
            return length;
        }
        itsInput.clear();
        itsBuffer.resize(std::min(2 * itsBuffer.size(), most));
    }
}

}  // namespace morvik::base
