// DumpFile: the lines of a dump, and what is wrong in them.
#ifndef MORVIK_HARDWARE_COMPARISON_DUMPFILE_H
#define MORVIK_HARDWARE_COMPARISON_DUMPFILE_H

#include <cstdint>
#include <functional>
#include <set>
#include <string>
#include <string_view>

#include "NameMap.h"
#include "base/LineReader.h"

namespace morvik::comparison {

class DumpFile : public base::LineReader {
public:
    /// `input` outlives the file; `name` is what messages call it.
    DumpFile(std::istream& input, const std::string& name);

    /// What is wrong with the dump as a whole.
    [[noreturn]] void failAsAWhole(const std::string& what) const;

    /// The names are those of signals in the map that the dump lacks: throws if there is one.
    void expectNoneLacking(const std::set<std::string, std::less<>>& names, const NameMap& map) const;

    /// Goes to the next line that has more than blanks; false at the end.
    bool nextFilled();

    /// A number that counts from `first`, brought to 0 to `count` - 1.
    unsigned count(const std::string& what, std::string_view text, unsigned first, unsigned count) const;

    /// A value of the signal, as the map says it is written; the dump calls it `name`.
    std::int16_t value(std::string_view name, unsigned signal, std::string_view text, const NameMap& map) const;
};

}  // namespace morvik::comparison

#endif
