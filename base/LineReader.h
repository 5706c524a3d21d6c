// LineReader: a text read line by line, whatever it is and however long, with the places for messages.
#ifndef MORVIK_BASE_LINEREADER_H
#define MORVIK_BASE_LINEREADER_H

#include <cstddef>
#include <istream>
#include <string>
#include <string_view>
#include <vector>

namespace morvik::base {

/// Reads lines that end in \n, \r\n or the end of the text. Memory does not grow with the input. A byte order mark
/// before the first line, which spreadsheets write, is no part of it. What is wrong is thrown as an Error that opens
/// with the place, NAME:LINE.
class LineReader {
public:
    /// Longest lines, in characters: more than a row of numbers or a line of bits needs, and more than a value of any
    /// width does.
    static constexpr std::size_t shortLines = 8192;
    static constexpr std::size_t longLines = std::size_t{1} << 20;

    /// Most blank lines at the end.
    static constexpr std::size_t mostBlank = 10000;

    /// `input` outlives the reader; `name` is what messages call it. No line may have more than `longest` characters.
    LineReader(std::istream& input, std::string name, std::size_t longest);

    /// Goes to the next line; false at the end. Throws when the input cannot be read, is no text, or the line is too
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

    /// NAME:LINE, of a text without lines that of the first.
    std::string place() const;

    /// Throws when blank lines, of which the first has the given number, go on for ever.
    void expectAnEnd(std::size_t first) const;

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
