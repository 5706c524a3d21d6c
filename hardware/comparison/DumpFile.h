// DumpFile: the lines of a dump, and errors in them.
#ifndef MORVIK_HARDWARE_COMPARISON_DUMPFILE_H
#define MORVIK_HARDWARE_COMPARISON_DUMPFILE_H

#include <cstdint>
#include <functional>
#include <set>
#include <string>
#include <string_view>

#include "Dump.h"
#include "NameMap.h"
#include "base/LineReader.h"

namespace morvik::comparison {

class DumpFile : public base::LineReader {
public:
    /// `input` must outlive the file; `name` is its name in messages.
    DumpFile(std::istream& input, const std::string& name);

    /// Throws an error about the dump as a whole.
    [[noreturn]] void failAsAWhole(const std::string& what) const;

    /// `names` are the map's signals that the dump lacks: throws unless it is empty.
    void expectNoneLacking(const std::set<std::string, std::less<>>& names, const NameMap& map) const;

    /// Advances to the next line that is not blank; false at the end.
    bool nextFilled();

    std::int64_t integer(const std::string& what, std::string_view text) const;

    /// A number that counts from `first` as 0 to `count` - 1.
    unsigned count(const std::string& what,
                   std::int64_t number,
                   unsigned first,
                   unsigned count,
                   const std::string& whose = "") const;

    /// Checks a place that values of the dump belong to. `whose` is empty or " of " and their name.
    StepPlace placeOf(const NamedPlace& named,
                      const NameMap& map,
                      const Values& values,
                      const std::string& whose) const;

    /// The dump of the block with this number as text.
    Dump& dumpOf(std::string_view number, const NameMap& map, DumpSink& sink) const;

    /// Parses binary digits in two's complement; the dump calls the vector around them `name`.
    std::int16_t packedValue(std::string_view name, std::string_view digits) const;

    /// Parses a value of the signal in the form that the map gives; the dump calls the signal `name`.
    std::int16_t value(std::string_view name, unsigned signal, std::string_view text, const NameMap& map) const;
};

/// Receives a single dump.
class OneDump : public DumpSink {
public:
    explicit OneDump(Dump& dump) : itsDump(dump) {}

    Dump& dumpOf(std::uint64_t /*block*/) override
    {
        return itsDump;
    }

private:
    Dump& itsDump;
};

}  // namespace morvik::comparison

#endif
