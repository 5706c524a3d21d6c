// DumpFile: the lines of a dump, and what is wrong in them.
#include "DumpFile.h"

#include <charconv>
#include <system_error>

#include "Dump.h"
#include "Values.h"
#include "simulation/Error.h"
#include "simulation/Shown.h"

namespace morvik::comparison {

void DumpFile::failAsAWhole(const std::string& what) const
{
    throw simulation::Error(name() + ": " + what);
}

void DumpFile::expectNoneLacking(const std::set<std::string, std::less<>>& names, const NameMap& map) const
{
    if (!names.empty()) {
        const std::string& first = *names.begin();
        failAsAWhole("has no signal " + simulation::shown(first) + ", which the map calls " +
                     passSignals[*map.signal(first)]);
    }
}

bool DumpFile::nextFilled()
{
    constexpr unsigned most = 1000000;
    const std::uint32_t first = number() + 1;
    while (next()) {
        if (line().find_first_not_of(" \t") != std::string::npos) {
            return true;
        }
        if (number() - first >= most) {
            fail("more than " + std::to_string(most) + " blank lines");
        }
    }
    return false;
}

unsigned DumpFile::count(const std::string& what, std::string_view text, unsigned first, unsigned count) const
{
    unsigned value = 0;
    const char* const end = text.data() + text.size();
    const auto result = std::from_chars(text.data(), end, value);
    if (result.ec != std::errc() || result.ptr != end || value < first || value - first >= count) {
        fail(what + ' ' + simulation::shown(text) + " is not allowed, allowed are the integers " +
             std::to_string(first) + " to " + std::to_string(first + count - 1) +
             (first == 0 && value == count ? "; a map tells when they count from 1" : ""));
    }
    return value - first;
}

std::int16_t DumpFile::value(std::string_view name, unsigned signal, std::string_view text, const NameMap& map) const
{
    const auto value = map.number(text, signal);
    if (!value || *value < Values::smallest || *value > Values::largest) {
        fail(std::string(name) + ' ' + simulation::shown(text) + " is not allowed, expected " +
             map.expectedNumber(signal));
    }
    return static_cast<std::int16_t>(*value);
}

void completeTwins(const std::string& name, const NameMap& map, Dump& dump)
{
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        const unsigned twin = twinOf(signal);
        if (dump.given[signal] && dump.given[twin] && !map.standIns[signal].empty()) {
            throw simulation::Error(name + ": has " + passSignals[signal] + ", for which " +
                                    simulation::shown(map.standIns[signal]) + " stands in the map");
        }
        if (!dump.given[signal] && dump.given[twin]) {
            dump.values.copyFromTwin(signal);
        }
    }
}

}  // namespace morvik::comparison
