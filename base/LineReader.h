// LineReader: reads any text line by line in bounded memory, with positions for messages.
#ifndef MORVIK_BASE_LINEREADER_H
#define MORVIK_BASE_LINEREADER_H

#include <cstddef>
#include <istream>
#include <string>
#include <string_view>
#include <vector>

namespace morvik::base {

/// Reads lines that end in \n, \r\n or the end of the text. Memory does not grow with the input. Skips a byte order
/// mark before the first line, which spreadsheets write. Throws Error, opening with the place NAME:LINE.
class LineReader {
public:
    /// Limits on the length of lines, in characters: shortLines is ample for a row of numbers or a line of bits,
    /// longLines for a value of any width.
    static constexpr std::size_t shortLines = 8192;
    static constexpr std::size_t longLines = std::size_t{1} << 20;

    /// Most blank lines allowed at the end.
    static constexpr std::size_t mostBlank = 10000;

    /// `input` must outlive the reader; messages call it `name`. Lines have at most `longest` characters.
    LineReader(std::istream& input, std::string name, std::size_t longest);

    /// Reads the next line; false at the end. Throws if the input cannot be read or is not text, or the line is too
    /// long.
    bool next();

    /// The line without its end. Valid until the next call of next().
    std::string_view text() const
    {
        return itsText;
    }

    /// The line's number, from 1; at the end, that of the last line.
    std::size_t number() const
    {
        return itsNumber;
    }

    const std::string& name() const
    {
        return itsName;
    }

    /// NAME:LINE; line 1 if the text has no lines.
    std::string place() const;

    /// Throws if the blank lines that begin at line `first` exceed mostBlank.
    void expectAnEnd(std::size_t first) const;

    /// Reads on to the end, after a blank line. Throws about that line if another one is not blank.
    void expectOnlyBlankLines();

    /// Throws an Error about this line.
    [[noreturn]] void fail(const std::string& what) const;

    /// Throws an Error about the given line.
    [[noreturn]] void failAt(std::size_t line, const std::string& what) const;

private:
    std::size_t readLine();

    std::istream& itsInput;
    std::string itsName;
    std::size_t itsLongest;
    std::vector<char> itsBuffer;
    std::string_view itsText;
    std::size_t itsNumber = 0;
};

}  // namespace morvik::base

#endif
