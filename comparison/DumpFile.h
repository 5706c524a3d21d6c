// DumpFile: the lines of a dump, and what is wrong in them.
#ifndef MORVIK_COMPARISON_DUMPFILE_H
#define MORVIK_COMPARISON_DUMPFILE_H

#include <cstdint>
#include <istream>
#include <string>
#include <string_view>

#include "NameMap.h"

namespace morvik::comparison {

/// What is wrong is thrown as a simulation::Error that opens with the place, NAME:LINE.
class DumpFile {
public:
    /// `input` outlives the file; `name` is what messages call it.
    DumpFile(std::istream& input, std::string name);

    /// Goes to the next line; false at the end.
    bool next();

    /// Without its end.
    std::string_view line() const;

    /// The line's number, from 1; at the end, that of the last line.
    std::uint32_t number() const;

    [[noreturn]] void fail(const std::string& what) const;

    /// A number that counts from `first`, brought to 0 to `count` - 1.
    unsigned count(const std::string& what, std::string_view text, unsigned first, unsigned count) const;

    /// A value of the signal, as the map says it is written; the dump calls it `name`.
    std::int16_t value(std::string_view name, unsigned signal, std::string_view text, const NameMap& map) const;

private:
    std::istream& itsInput;
    std::string itsName;
    std::string itsLine;
    std::uint32_t itsNumber = 0;
};

}  // namespace morvik::comparison

#endif
