// DumpFile: the lines of a dump, and what is wrong in them.
#include "DumpFile.h"

#include <charconv>
#include <system_error>

#include "Values.h"
#include "simulation/Shown.h"

namespace morvik::comparison {

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

}  // namespace morvik::comparison
