// DumpFile: the lines of a dump, and what is wrong in them.
#include "DumpFile.h"

#include <algorithm>
#include <charconv>
#include <system_error>
#include <utility>

#include "Values.h"
#include "simulation/Error.h"
#include "simulation/Shown.h"

namespace morvik::comparison {

DumpFile::DumpFile(std::istream& input, std::string name) : itsInput(input), itsName(std::move(name)) {}

bool DumpFile::next()
{
    if (!std::getline(itsInput, itsLine)) {
        itsLine.clear();
        if (itsInput.bad()) {
            throw simulation::fileError(itsName, "read");
        }
        return false;
    }
    ++itsNumber;
    if (!itsLine.empty() && itsLine.back() == '\r') {
        itsLine.pop_back();
    }
    return true;
}

std::string_view DumpFile::line() const
{
    return itsLine;
}

std::uint32_t DumpFile::number() const
{
    return itsNumber;
}

void DumpFile::fail(const std::string& what) const
{
    throw simulation::Error(itsName + ':' + std::to_string(std::max(itsNumber, 1U)) + ": " + what);
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

}  // namespace morvik::comparison
