// Dump: the values that a simulation of hardware wrote.
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
#include "Values.h"

namespace morvik::comparison {

/// Where the values of a value change dump come from, by their places.
struct Waveform {
    explicit Waveform(std::size_t places) : times(places, 0), variables(places, 0) {}

    std::vector<std::uint64_t> times;
    std::vector<unsigned> variables;
    std::map<unsigned, std::string> names;  ///< of variables, with the scopes that they are in
    std::string unit;                       ///< of times; empty when the dump does not tell
    std::vector<std::string> notes;         ///< what the map has chosen
};

/// Values and the lines they come from.
struct Dump {
    Dump(unsigned passes, unsigned steps) : values(passes, steps), lines(std::size_t{passes} * signalCount * steps, 0)
    {
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
    std::optional<Waveform> waveform;
    std::array<bool, signalCount> given = {};  ///< signals that have a column, a row or a variable
};

/// Reads CSV: a header with the columns half_iteration, step, signal and value in any order, or, for the last two, a
/// column for each signal; the map may call them otherwise, and other columns are left alone. A value with digits of x,
/// z, u or w is unknown; an empty one is none. What is wrong is thrown as a base::Error that opens with the
/// place.
void readCsv(std::istream& input, const std::string& name, const NameMap& map, Dump& dump);

/// Reads a value change dump. In each scope with signals, half_iteration and step (in the scope or one around it) tell
/// what the signals' values belong to, at the end of each time at which the scope has changed. A value is unknown where
/// it is so at all times at which half_iteration and step name it: x before, between and behind these times means
/// nothing. What is wrong is thrown as a base::Error that opens with the place.
void readVcd(std::istream& input, const std::string& name, const NameMap& map, Dump& dump);

/// Has a branch metric of the dump stand for its twin, when the dump lacks that. Throws a base::Error when the
/// map says that it does, and the dump has both.
void completeTwins(const std::string& name, const NameMap& map, Dump& dump);

}  // namespace morvik::comparison

#endif
