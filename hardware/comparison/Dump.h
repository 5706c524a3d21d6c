// Dump: the values written by a simulation of hardware.
#ifndef MORVIK_HARDWARE_COMPARISON_DUMP_H
#define MORVIK_HARDWARE_COMPARISON_DUMP_H

#include <array>
#include <cstdint>
#include <istream>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "NameMap.h"
#include "PlaceHistory.h"
#include "Values.h"

namespace morvik::comparison {

/// Where the values of a value change dump come from, indexed by place.
struct Waveform {
    explicit Waveform(std::size_t places) : times(places, 0), variables(places, 0) {}

    std::vector<std::uint64_t> times;
    std::vector<unsigned> variables;
    std::map<unsigned, std::string> names;  ///< of variables, with their scopes
    std::string unit;                       ///< of times; empty if the dump gives none
    std::vector<std::string> notes;         ///< choices made by the map
};

/// The steps from a segment to the next, and from the first segment of a unit to that of the next.
struct Strides {
    unsigned segment = 0;
    unsigned unit = 0;
};

/// Values and the lines they come from.
struct Dump {
    Dump(unsigned passes, unsigned steps, Strides between = {})
        : values(passes, steps), lines(std::size_t{passes} * signalCount * steps, 0), strides(between)
    {
    }

    /// The place of an element of a packed value; nothing if the block has no such segment.
    std::optional<Place> placeOf(const StepPlace& place, const Element& element) const
    {
        const std::uint64_t step = place.step + std::uint64_t{element.segments} * strides.segment +
                                   std::uint64_t{element.units} * strides.unit;
        return step < values.steps() ? std::optional(Place{place.pass, element.signal, static_cast<unsigned>(step)})
                                     : std::nullopt;
    }

    std::uint32_t& lineOf(const Place& place)
    {
        return lines[values.index(place)];
    }

    std::uint32_t lineOf(const Place& place) const
    {
        return lines[values.index(place)];
    }

    Values values;
    std::vector<std::uint32_t> lines;
    Strides strides;
    std::optional<Waveform> waveform;
    std::array<bool, signalCount> given = {};  ///< signals that have a column, a row or a variable
};

/// Receives the dumps of many blocks.
class DumpSink {
public:
    DumpSink() = default;
    DumpSink(const DumpSink&) = delete;
    DumpSink& operator=(const DumpSink&) = delete;
    virtual ~DumpSink() = default;

    /// The dump of a block, numbered from 0. Valid until the next call. Throws base::Error if there is none.
    virtual Dump& dumpOf(std::uint64_t block) = 0;
};

/// What a dump may have without an end in sight.
struct DumpLimits {
    /// Times in a row of a value change dump at which no further place gets a value: a simulation runs on before and
    /// after the block, but not for ever.
    std::uint64_t idleTimes = 100000000;
};

/// Reads CSV: a header with columns half_iteration, step, signal and value in any order or, instead of the last two, a
/// column for each signal. The map may rename them; other columns are ignored. A value with digits of x, z, u or w is
/// unknown, an empty one absent. Throws base::Error, prefixed with the location.
void readCsv(std::istream& input, const std::string& name, const NameMap& map, Dump& dump);

/// Reads a value change dump. In each scope with signals, half_iteration and step (in the scope or an enclosing one)
/// give the place of the signals' values, sampled at the end of each time at which the scope has changed. A value is
/// unknown if it is so at all times at which half_iteration and step name it; x at other times means nothing. Throws
/// base::Error, prefixed with the location.
void readVcd(std::istream& input, const std::string& name, const NameMap& map, Dump& dump);

/// The same with other limits.
void readVcdWithin(
    const DumpLimits& limits, std::istream& input, const std::string& name, const NameMap& map, Dump& dump);

/// The same for dumps of many blocks: a column or variable "block" has the number of the block.
void readCsvBlocks(std::istream& input, const std::string& name, const NameMap& map, DumpSink& sink);
void readVcdBlocks(std::istream& input, const std::string& name, const NameMap& map, DumpSink& sink);

/// Copies a branch metric of the dump to its twin if the dump lacks that. Throws base::Error if the map does so and the
/// dump has both.
void completeTwins(const std::string& name, const NameMap& map, Dump& dump);

}  // namespace morvik::comparison

#endif
