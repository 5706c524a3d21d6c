// CsvDump: dumps as comma-separated values.
#include <algorithm>
#include <optional>
#include <string>
#include <vector>

#include "Dump.h"
#include "DumpFile.h"
#include "simulation/Shown.h"

namespace morvik::comparison {

namespace {

using simulation::shown;

std::string_view field(std::string_view row, std::size_t number)
{
    for (; number > 0; --number) {
        const std::size_t comma = row.find(',');
        row.remove_prefix(comma == std::string_view::npos ? row.size() : comma + 1);
    }
    row = row.substr(0, row.find(','));
    row.remove_prefix(std::min(row.find_first_not_of(' '), row.size()));
    return row.substr(0, row.find_last_not_of(' ') + 1);
}

std::size_t fieldsOf(std::string_view row)
{
    return static_cast<std::size_t>(std::count(row.begin(), row.end(), ',')) + 1;
}

std::optional<std::size_t> findColumn(std::string_view header, std::string_view name)
{
    const std::size_t count = fieldsOf(header);
    for (std::size_t i = 0; i < count; ++i) {
        if (field(header, i) == name) {
            return i;
        }
    }
    return std::nullopt;
}

/// Whether a simulator writes a value of unknown bits so: as x, or with digits of x, z, u or w, "xxx", "0x7x", "zz01",
/// "UUUU"; VHDL has - as well.
bool isUnknown(std::string_view text, NumberForm form)
{
    text.remove_prefix(text.substr(0, 2) == "0x" && form != NumberForm::binary ? 2 : 0);
    const bool any = text.find_first_of("xXzZuUwW") != std::string_view::npos ||
                     text.find_first_not_of('-') == std::string_view::npos;
    return any && !text.empty() && text.find_first_not_of("xXzZuUwW-0123456789abcdefABCDEF") == std::string_view::npos;
}

/// Reads rows of a value each, which name the signal, or rows with a column for each signal.
class CsvReader {
public:
    CsvReader(std::istream& input, const std::string& name, const NameMap& map, Dump& dump)
        : itsFile(input, name), itsMap(map), itsDump(dump)
    {
    }

    void read()
    {
        if (!itsFile.next()) {
            itsFile.fail("no header, expected the columns half_iteration, step, signal, value");
        }
        readHeader(withoutMark(itsFile.line()));
        while (itsFile.next()) {
            if (!itsFile.line().empty()) {
                readRow();
            }
        }
    }

private:
    struct SignalColumn {
        std::string name;
        unsigned signal;
        std::size_t column;
    };

    /// UTF-8 may open with a byte order mark, as spreadsheets write it.
    static std::string_view withoutMark(std::string_view line)
    {
        constexpr std::string_view mark = "\xEF\xBB\xBF";
        line.remove_prefix(line.substr(0, mark.size()) == mark ? mark.size() : 0);
        return line;
    }

    void readHeader(std::string_view header)
    {
        itsPass = needColumn(header, itsMap.passColumn);
        itsStep = needColumn(header, itsMap.stepColumn);
        itsFields = fieldsOf(header);
        itsSignal = findColumn(header, itsMap.signalColumn);
        if (itsSignal) {
            itsValue = needColumn(header, itsMap.valueColumn);
            return;
        }
        for (std::size_t i = 0; i < itsFields; ++i) {
            const std::string name(field(header, i));
            const auto signal = itsMap.signal(name);
            if (signal && *signal != NameMap::leftOut) {
                itsColumns.push_back({name, *signal, i});
                itsDump.given[*signal] = true;
            }
        }
        if (itsColumns.empty()) {
            needColumn(header, itsMap.signalColumn);
        }
    }

    std::size_t needColumn(std::string_view header, const std::string& name) const
    {
        const auto found = findColumn(header, name);
        if (!found) {
            itsFile.fail("no column " + shown(name) + " in the header " + shown(header));
        }
        return *found;
    }

    void readRow()
    {
        const std::string_view row = itsFile.line();
        if (fieldsOf(row) != itsFields) {
            itsFile.fail(std::to_string(fieldsOf(row)) + " fields, expected the " + std::to_string(itsFields) +
                         " of the header");
        }
        if (!itsSignal) {
            for (const SignalColumn& each : itsColumns) {
                take(each.name, each.signal, field(row, each.column));
            }
            return;
        }
        const std::string_view name = field(row, *itsSignal);
        const auto signal = itsMap.signal(name);
        if (!signal) {
            itsFile.fail("signal " + shown(name) + " is not known; a map tells which it is, or that it does not count");
        }
        if (*signal != NameMap::leftOut) {
            take(name, *signal, field(row, itsValue));
        }
    }

    /// A row of unknown values may be one of before the simulation counts.
    bool namesItsPlace(std::string_view row) const
    {
        return !isUnknown(field(row, itsPass), NumberForm::integer) &&
               !isUnknown(field(row, itsStep), NumberForm::integer);
    }

    void take(std::string_view name, unsigned signal, std::string_view text)
    {
        itsDump.given[signal] = true;
        const std::string_view row = itsFile.line();
        const bool unknown = isUnknown(text, itsMap.numbers);
        if (text.empty() || (unknown && !namesItsPlace(row))) {
            return;
        }
        const Place place = {
            itsFile.count("half-iteration", field(row, itsPass), itsMap.firstPass, itsDump.values.passes()),
            signal,
            itsFile.count("step", field(row, itsStep), itsMap.firstStep, itsDump.values.steps())};
        const std::int16_t value = unknown ? Values::unknown : itsFile.value(name, signal, text, itsMap);
        if (itsDump.values.at(place) != Values::missing) {
            itsFile.fail(std::string(name) + " of this half-iteration and step stands in line " +
                         std::to_string(itsDump.lineOf(place)) + ", too");
        }
        itsDump.values.set(place, value);
        itsDump.lineOf(place) = itsFile.number();
    }

    DumpFile itsFile;
    const NameMap& itsMap;
    Dump& itsDump;
    std::size_t itsPass = 0;
    std::size_t itsStep = 0;
    std::size_t itsFields = 0;
    std::optional<std::size_t> itsSignal;  // nothing when each signal has a column
    std::size_t itsValue = 0;
    std::vector<SignalColumn> itsColumns;
};

}  // namespace

void readCsv(std::istream& input, const std::string& name, const NameMap& map, Dump& dump)
{
    CsvReader(input, name, map, dump).read();
    completeTwins(name, map, dump);
}

}  // namespace morvik::comparison
