// DumpFile: the lines of a dump, and errors in them.
#include "DumpFile.h"

#include "Dump.h"
#include "Values.h"
#include "base/Error.h"
#include "base/Numbers.h"
#include "base/Shown.h"

namespace morvik::comparison {

DumpFile::DumpFile(std::istream& input, const std::string& name) : LineReader(input, name, longLines) {}

void DumpFile::failAsAWhole(const std::string& what) const
{
    throw base::Error(name() + ": " + what);
}

void DumpFile::expectNoneLacking(const std::set<std::string, std::less<>>& names, const NameMap& map) const
{
    if (!names.empty()) {
        const std::string& first = *names.begin();
        failAsAWhole("has no signal " + base::shown(first) + ", which the map calls " + map.meaningOf(first));
    }
}

bool DumpFile::nextFilled()
{
    constexpr unsigned most = 1000000;
    const std::size_t first = number() + 1;
    while (next()) {
        if (text().find_first_not_of(" \t") != std::string_view::npos) {
            return true;
        }
        if (number() - first >= most) {
            fail("more than " + std::to_string(most) + " blank lines");
        }
    }
    return false;
}

std::int64_t DumpFile::integer(const std::string& what, std::string_view text) const
{
    const auto value = base::parseNumber<std::int64_t>(text);
    if (!value) {
        fail(what + ' ' + base::shown(text) + " is not allowed, expected an integer");
    }
    return *value;
}

unsigned DumpFile::count(
    const std::string& what, std::int64_t number, unsigned first, unsigned count, const std::string& whose) const
{
    if (number < first || number - first >= count) {
        fail(what + ' ' + base::shown(std::to_string(number)) + whose + " is not allowed, expected an integer from " +
             std::to_string(first) + " to " + std::to_string(first + count - 1) +
             (first == 0 && number == count ? "; use a map if they count from 1" : ""));
    }
    return static_cast<unsigned>(number - first);
}

StepPlace DumpFile::placeOf(const NamedPlace& named,
                            const NameMap& map,
                            const Values& values,
                            const std::string& whose) const
{
    return {count("half-iteration", named.pass, map.firstPass, values.passes(), whose),
            count("step", named.step, map.firstStep, values.steps(), whose)};
}

Dump& DumpFile::dumpOf(std::string_view number, const NameMap& map, DumpSink& sink) const
{
    const auto block = base::parseNumber<std::uint64_t>(number);
    if (!block || *block < map.firstBlock) {
        fail("block " + base::shown(number) + " is not allowed, expected an integer from " +
             std::to_string(map.firstBlock));
    }
    try {
        return sink.dumpOf(*block - map.firstBlock);
    } catch (const base::Error& error) {
        fail("block " + std::to_string(*block) + ' ' + error.what());
    }
}

std::int16_t DumpFile::packedValue(std::string_view name, std::string_view digits) const
{
    auto value = base::parseNumber<std::int64_t>(digits, 2).value_or(0);
    value -= digits[0] == '1' ? std::int64_t{1} << digits.size() : 0;
    if (value < Values::smallest || value > Values::largest) {
        fail(std::string(name) + ' ' + base::shown(digits) + " is not allowed, expected -2048 to 2047 eighths");
    }
    return static_cast<std::int16_t>(value);
}

std::int16_t DumpFile::value(std::string_view name, unsigned signal, std::string_view text, const NameMap& map) const
{
    const auto value = map.number(text, signal);
    if (!value || *value < Values::smallest || *value > Values::largest) {
        fail(std::string(name) + ' ' + base::shown(text) + " is not allowed, expected " + map.expectedNumber(signal));
    }
    return static_cast<std::int16_t>(*value);
}

void completeTwins(const std::string& name, const NameMap& map, Dump& dump)
{
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        const unsigned twin = twinOf(signal);
        if (dump.given[signal] && dump.given[twin] && !map.standIns[signal].empty()) {
            throw base::Error(name + ": has " + passSignals[signal].name + ", for which " +
                              base::shown(map.standIns[signal]) + " stands in the map");
        }
        if (!dump.given[signal] && dump.given[twin]) {
            dump.values.copyFromTwin(signal);
        }
    }
}

}  // namespace morvik::comparison
