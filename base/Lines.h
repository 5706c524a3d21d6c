// Lines: a text taken line by line, whatever it is and however long.
#ifndef MORVIK_BASE_LINES_H
#define MORVIK_BASE_LINES_H

#include <cstddef>
#include <istream>
#include <string_view>
#include <vector>

namespace morvik::base {

/// Takes lines that end in \n, \r\n or the end of the text. Memory does not grow with the input. A byte order mark
/// before the first line, which spreadsheets write, is no part of it.
class Lines {
public:
    enum class Found { line, end, tooLong, unreadable };

    /// `input` outlives the lines, of which none may have more than `longest` characters.
    Lines(std::istream& input, std::size_t longest);

    /// Goes to the next line. Nothing may be taken after anything else was found.
    Found next();

    /// The line without its end, as much of it as was read. Valid until the next call of next().
    std::string_view text() const
    {
        return itsText;
    }

private:
    std::istream& itsInput;
    std::size_t itsLongest;
    std::vector<char> itsBuffer;
    std::string_view itsText;
    bool itsIsFirst = true;
};

}  // namespace morvik::base

#endif
