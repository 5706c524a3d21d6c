// LineReader: a text read line by line, with the place for messages.
#ifndef MORVIK_APP_LINEREADER_H
#define MORVIK_APP_LINEREADER_H

#include <cstddef>
#include <istream>
#include <string>
#include <string_view>

#include "base/Lines.h"

namespace morvik {

/// Reads lines that end in \n, \r\n or the end of the text. Memory does not grow with the input. A byte order mark
/// before the first one does not count.
class LineReader {
public:
    /// Longest line in characters, more than any row or line of bits needs.
    static constexpr std::size_t longest = 8192;

    /// Most blank lines at the end.
    static constexpr std::size_t mostBlank = 10000;

    /// `input` outlives the reader; `name` is what messages call it.
    LineReader(std::istream& input, std::string name);

    /// Goes to the next line; false at the end. Throws FileError when the input cannot be read, is no text, or a line
    /// is too long.
    bool next();

    /// The line without its end. Valid until the next call of next().
    std::string_view text() const;

    /// The line's number, from 1; at the end, the number that one more line would have.
    std::size_t number() const;

    /// Throws a FileError when blank lines, of which the first has the given number, go on for ever.
    void expectAnEnd(std::size_t first) const;

    /// Throws a FileError about this line.
    [[noreturn]] void fail(const std::string& what) const;

    /// Throws a FileError about the given line.
    [[noreturn]] void failAt(std::size_t line, const std::string& what) const;

private:
    base::Lines itsLines;
    std::string itsName;
    std::size_t itsNumber = 0;
};

}  // namespace morvik

#endif
