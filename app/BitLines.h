// BitLines: reads blocks of bits, a line of 0 and 1 for each.
#ifndef MORVIK_APP_BITLINES_H
#define MORVIK_APP_BITLINES_H

#include <cstddef>
#include <cstdint>
#include <istream>
#include <string>
#include <string_view>
#include <vector>

#include "base/LineReader.h"

namespace morvik {

/// A bit 1 for each '1'.
std::vector<std::uint8_t> bitsOf(std::string_view line);

/// A line of 0 and 1, with its end.
std::string lineOf(const std::vector<std::uint8_t>& bits);

/// Throws an Error unless all characters of the line are 0 or 1.
void expectBits(const base::LineReader& lines);

/// Blank lines are allowed at the end only. Throws base::Error, naming the line.
class BitLines {
public:
    /// `input` must outlive the reader; messages call it `name`. Lines have at most `longest` bits.
    BitLines(std::istream& input, const std::string& name, std::size_t longest = base::LineReader::shortLines);

    /// Reads the next line; false at the end.
    bool next();

    /// The line's characters, each 0 or 1.
    std::string_view text() const
    {
        return itsLines.text();
    }

    /// The line's number, from 1.
    std::size_t number() const
    {
        return itsLines.number();
    }

    /// Throws an Error about this line.
    [[noreturn]] void fail(const std::string& what) const
    {
        itsLines.fail(what);
    }

    /// Throws an Error about the given line.
    [[noreturn]] void failAt(std::size_t line, const std::string& what) const
    {
        itsLines.failAt(line, what);
    }

private:
    base::LineReader itsLines;
};

}  // namespace morvik

#endif
