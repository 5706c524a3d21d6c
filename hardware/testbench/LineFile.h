// LineFile: a file that is read line by line, with the places for messages.
#ifndef MORVIK_HARDWARE_TESTBENCH_LINEFILE_H
#define MORVIK_HARDWARE_TESTBENCH_LINEFILE_H

#include <cstddef>
#include <cstdint>
#include <istream>
#include <memory>
#include <string>

#include "base/Lines.h"

namespace morvik {

/// Lines end in \n or \r\n. What is wrong is thrown as a simulation::Error that opens with the place, NAME:LINE.
class LineFile {
public:
    /// Longest line in characters, more than a value of any width needs.
    static constexpr std::size_t longest = std::size_t{1} << 20;

    explicit LineFile(const std::string& fileName);

    /// `input` outlives the file; `name` is what messages call it.
    LineFile(std::istream& input, std::string name);

    /// Goes to the next line; false at the end.
    bool next();

    /// Without its end.
    const std::string& line() const
    {
        return itsLine;
    }

    /// The line's number, from 1; at the end, that of the last line.
    std::uint32_t number() const
    {
        return itsNumber;
    }

    const std::string& name() const
    {
        return itsName;
    }

    /// NAME:LINE, of a file without lines that of the first.
    std::string place() const;

    [[noreturn]] void fail(const std::string& what) const;

private:
    std::unique_ptr<std::istream> itsFile;  // that was opened here
    base::Lines itsLines;
    std::string itsName;
    std::string itsLine;
    std::uint32_t itsNumber = 0;
};

}  // namespace morvik

#endif
