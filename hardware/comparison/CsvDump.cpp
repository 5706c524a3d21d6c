// CsvDump: dumps as comma-separated values.
#include <algorithm>
#include <functional>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "Dump.h"
#include "DumpFile.h"
#include "base/Csv.h"
#include "base/Shown.h"

namespace morvik::comparison {

namespace {

using base::shown;

/// Whether the text is a simulator's value of unknown bits: x, or digits with x, z, u or w among them ("xxx", "0x7x",
/// "zz01", "UUUU"); VHDL has - as well.
bool isUnknown(std::string_view text, NumberForm form)
{
    text.remove_prefix(text.substr(0, 2) == "0x" && form != NumberForm::binary ? 2 : 0);
    const bool any = text.find_first_of("xXzZuUwW") != std::string_view::npos ||
                     text.find_first_not_of('-') == std::string_view::npos;
    return any && !text.empty() && text.find_first_not_of("xXzZuUwW-0123456789abcdefABCDEF") == std::string_view::npos;
}

/// Reads rows of one value that name the signal, or rows with a column for each signal.
class CsvReader {
public:
    CsvReader(std::istream& input, const std::string& name, const NameMap& map, Dump& dump)
        : itsFile(input, name), itsMap(map), itsDump(dump), itsLacking(map.needed)
    {
    }

    void read()
    {
        if (!itsMap.valid.empty()) {
            itsFile.failAsAWhole("is CSV, where every row counts; \"valid\" in a map is for VCD");
        }
        if (!itsRow.next()) {
            itsFile.fail("no header, expected the columns half_iteration, step, signal, value");
        }
        readHeader();
        while (itsFile.nextFilled()) {
            itsRow.takeLine();
            readRow();
        }
        itsFile.expectNoneLacking(itsLacking, itsMap);
    }

private:
    struct SignalColumn {
        std::string name;
        unsigned signal;
        std::size_t column;
    };

    void readHeader()
    {
        itsPass = needColumn(itsMap.passColumn);
        itsStep = needColumn(itsMap.stepColumn);
        itsFields = itsRow.fields().size();
        itsSignal = itsRow.find(itsMap.signalColumn);
        if (itsSignal || itsMap.namesRows) {
            itsSignal = needColumn(itsMap.signalColumn);
            itsValue = needColumn(itsMap.valueColumn);
            return;
        }
        for (std::size_t i = 0; i < itsFields; ++i) {
            const auto signal = signalOf(itsRow.fields()[i]);
            if (signal && *signal != NameMap::leftOut) {
                addColumn(std::string(itsRow.fields()[i]), *signal, i);
            }
        }
        if (itsColumns.empty()) {
            needColumn(itsMap.signalColumn);
        }
    }

    std::optional<unsigned> signalOf(std::string_view name)
    {
        const auto found = itsLacking.find(name);
        if (found != itsLacking.end()) {
            itsLacking.erase(found);
        }
        return itsMap.signal(name);
    }

    void addColumn(const std::string& name, unsigned signal, std::size_t column)
    {
        for (const SignalColumn& each : itsColumns) {
            if (each.signal == signal) {
                itsFile.fail("two columns are " + std::string(passSignals[signal].name) + ", " + shown(each.name) +
                             " and " + shown(name));
            }
        }
        itsColumns.push_back({name, signal, column});
        itsDump.given[signal] = true;
    }

    std::size_t needColumn(const std::string& name) const
    {
        const auto found = itsRow.find(name);
        if (!found) {
            itsFile.fail("no column " + shown(name) + " in the header " + shown(itsFile.text()));
        }
        return *found;
    }

    void readRow()
    {
        if (itsRow.fields().size() != itsFields) {
            itsFile.fail(std::to_string(itsRow.fields().size()) + " fields, expected the " + std::to_string(itsFields) +
                         " of the header");
        }
        if (!itsSignal) {
            for (const SignalColumn& each : itsColumns) {
                take(each.name, each.signal, itsRow.fields()[each.column]);
            }
            return;
        }
        const std::string_view name = itsRow.fields()[*itsSignal];
        const auto signal = signalOf(name);
        if (!signal) {
            itsFile.fail("signal " + shown(name) + " is not known; use a map to name it, or to ignore it");
        }
        if (*signal != NameMap::leftOut) {
            take(name, *signal, itsRow.fields()[itsValue]);
        }
    }

    /// Before the simulation's outputs are valid, rows may have unknown values and no known place.
    bool namesItsPlace() const
    {
        return !isUnknown(itsRow.fields()[itsPass], NumberForm::integer) &&
               !isUnknown(itsRow.fields()[itsStep], NumberForm::integer);
    }

    void take(std::string_view name, unsigned signal, std::string_view text)
    {
        itsDump.given[signal] = true;
        const bool unknown = isUnknown(text, itsMap.numbers);
        if (text.empty() || (unknown && !namesItsPlace())) {
            return;
        }
        const Place place = {
            itsFile.count("half-iteration", itsRow.fields()[itsPass], itsMap.firstPass, itsDump.values.passes()),
            signal,
            itsFile.count("step", itsRow.fields()[itsStep], itsMap.firstStep, itsDump.values.steps())};
        const std::int16_t value = unknown ? Values::unknown : itsFile.value(name, signal, text, itsMap);
        if (itsDump.values.at(place) != Values::missing) {
            itsFile.fail(std::string(name) + " of this half-iteration and step stands in line " +
                         std::to_string(itsDump.lineOf(place)) + ", too");
        }
        itsDump.values.set(place, value);
        itsDump.lineOf(place) = static_cast<std::uint32_t>(itsFile.number());
    }

    DumpFile itsFile;
    base::CsvReader itsRow{itsFile};
    const NameMap& itsMap;
    Dump& itsDump;
    std::set<std::string, std::less<>> itsLacking;  // names that the map needs and the dump lacks
    std::size_t itsPass = 0;
    std::size_t itsStep = 0;
    std::size_t itsFields = 0;
    std::optional<std::size_t> itsSignal;  // nothing if each signal has a column
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
