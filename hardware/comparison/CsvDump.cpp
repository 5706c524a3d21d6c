// CsvDump: dumps as comma-separated values.
#include <algorithm>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "Dump.h"
#include "DumpFile.h"
#include "base/Csv.h"
#include "base/Numbers.h"
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

/// The digits as binary ones, or nothing if the form has none or a character is no digit of it.
std::optional<std::string> binaryDigits(std::string_view text, NumberForm form)
{
    const bool isHexadecimal = text.substr(0, 2) == "0x" || text.substr(0, 2) == "0X";
    if (form == NumberForm::binary) {
        return text.find_first_not_of("01xXzZuUwW-") == std::string_view::npos ? std::optional(std::string(text))
                                                                               : std::nullopt;
    }
    if (form != NumberForm::hexadecimal && !isHexadecimal) {
        return std::nullopt;
    }
    std::string digits;
    for (const char character : text.substr(isHexadecimal ? 2 : 0)) {
        const auto digit = base::parseNumber<unsigned>(std::string_view(&character, 1), 16);
        if (!digit && !isUnknown(std::string_view(&character, 1), form)) {
            return std::nullopt;
        }
        for (unsigned bit = 4; bit-- > 0;) {
            digits += !digit ? 'x' : (*digit >> bit & 1U) != 0 ? '1' : '0';
        }
    }
    return digits;
}

/// Reads rows of one value that name the signal, or rows with a column for each signal.
class CsvReader {
public:
    CsvReader(std::istream& input, const std::string& name, const NameMap& map, DumpSink& sink, bool hasBlocks)
        : itsFile(input, name),
          itsMap(map),
          itsSink(sink),
          itsHasBlocks(hasBlocks),
          itsLacking(map.needed),
          itsTimings(map.timings.size())
    {
        itsDump = hasBlocks ? nullptr : &itsSink.dumpOf(0);
    }

    void read()
    {
        if (!itsRow.next()) {
            itsFile.fail("no header, expected the columns half_iteration, step, signal, value");
        }
        itsHeader = itsFile.text();
        itsNames.assign(itsRow.fields().begin(), itsRow.fields().end());
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
        Element element;
        std::size_t column;
    };

    /// The columns of a timing that a signal needs, and the places named so far.
    struct RowTiming {
        explicit RowTiming(unsigned delay) : history(delay) {}

        std::size_t pass = 0;
        std::size_t step = 0;
        std::optional<std::size_t> valid;
        PlaceHistory history;
    };

    void readHeader()
    {
        itsBlock = itsHasBlocks ? needColumn(itsMap.blockColumn) : 0;
        if (itsMap.timings.size() == 1) {
            timing(0);
        }
        itsSignal = find(itsMap.signalColumn);
        if (itsSignal || itsMap.namesRows) {
            itsSignal = needColumn(itsMap.signalColumn);
            itsValue = needColumn(itsMap.valueColumn);
            for (unsigned i = 0; i < itsTimings.size(); ++i) {
                if (itsMap.timings[i].delay > 0) {
                    timing(i);  // whose places are kept from the first row on
                }
            }
            return;
        }
        for (std::size_t i = 0; i < itsNames.size(); ++i) {
            const auto elements = elementsOf(itsNames[i]);
            for (const Element& each : elements.value_or(std::vector<Element>())) {
                addColumn(itsNames[i], each, i);
            }
        }
        if (itsColumns.empty()) {
            needColumn(itsMap.signalColumn);
        }
    }

    std::optional<std::vector<Element>> elementsOf(std::string_view name)
    {
        auto found = itsMap.find(name);
        if (!found) {
            return std::nullopt;
        }
        itsLacking.erase(found->name);
        return std::move(found->elements);
    }

    void addColumn(const std::string& name, const Element& element, std::size_t column)
    {
        for (const SignalColumn& each : itsColumns) {
            if (each.element.signal == element.signal && each.element.timing == element.timing &&
                each.column != column) {
                itsFile.fail("two columns are " + std::string(passSignals[element.signal].name) + ", " +
                             shown(each.name) + " and " + shown(name));
            }
        }
        itsColumns.push_back({name, element, column});
        timing(element.timing);
    }

    std::optional<std::size_t> find(const std::string& name) const
    {
        const auto found = std::find(itsNames.begin(), itsNames.end(), name);
        return found == itsNames.end() ? std::nullopt
                                       : std::optional(static_cast<std::size_t>(found - itsNames.begin()));
    }

    std::size_t needColumn(const std::string& name) const
    {
        const auto found = find(name);
        if (!found) {
            itsFile.fail("no column " + shown(name) + " in the header " + shown(itsHeader));
        }
        return *found;
    }

    RowTiming& timing(unsigned number)
    {
        std::optional<RowTiming>& known = itsTimings[number];
        if (!known) {
            const Timing& names = itsMap.timings[number];
            known.emplace(names.delay);
            known->pass = needColumn(names.pass);
            known->step = needColumn(names.step);
            known->valid = names.valid.empty() ? std::nullopt : std::optional(needColumn(names.valid));
        }
        return *known;
    }

    std::string_view field(std::size_t column) const
    {
        return itsRow.fields()[column];
    }

    void readRow()
    {
        if (itsRow.fields().size() != itsNames.size()) {
            itsFile.fail(std::to_string(itsRow.fields().size()) + " fields, expected the " +
                         std::to_string(itsNames.size()) + " of the header");
        }
        if (itsHasBlocks) {
            itsDump = &itsFile.dumpOf(field(itsBlock), itsMap, itsSink);
        }
        followPlaces();
        if (!itsSignal) {
            for (const SignalColumn& each : itsColumns) {
                take(each.name, each.element, field(each.column));
            }
            return;
        }
        const std::string_view name = field(*itsSignal);
        const auto elements = elementsOf(name);
        if (!elements) {
            itsFile.fail("signal " + shown(name) + " is not known; use a map to name it, or to ignore it");
        }
        for (const Element& each : *elements) {
            take(name, each, field(itsValue));
        }
    }

    /// Before the simulation's outputs are valid, rows may have unknown values and no known place.
    bool namesItsPlace(const RowTiming& of) const
    {
        return !isUnknown(field(of.pass), NumberForm::integer) && !isUnknown(field(of.step), NumberForm::integer);
    }

    NamedPlace namedPlace(const RowTiming& of) const
    {
        return {itsFile.integer("half-iteration", field(of.pass)), itsFile.integer("step", field(of.step))};
    }

    /// Keeps the places for values that come late. A row is a clock.
    void followPlaces()
    {
        for (std::size_t i = 0; i < itsTimings.size(); ++i) {
            if (!itsTimings[i] || itsMap.timings[i].delay == 0) {
                continue;
            }
            RowTiming& each = *itsTimings[i];
            const auto place = namesItsPlace(each) ? std::optional(namedPlace(each)) : std::nullopt;
            if (itsMap.timings[i].countsClocks) {
                each.history.begin(place);
            } else {
                each.history.follow(place);
            }
        }
    }

    /// Where the row's value of the element belongs, if it counts.
    std::optional<Place> placeOf(const Element& element, bool isUnknownValue)
    {
        const RowTiming& of = timing(element.timing);
        if (of.valid && field(*of.valid) != "1") {
            return std::nullopt;
        }
        std::optional<NamedPlace> named;
        if (itsMap.timings[element.timing].delay > 0) {
            named = of.history.delayed();
        } else if (!isUnknownValue || namesItsPlace(of)) {
            named = namedPlace(of);
        }
        return named ? itsDump->placeOf(itsFile.placeOf(*named, itsMap, itsDump->values, ""), element) : std::nullopt;
    }

    void take(std::string_view name, const Element& element, std::string_view text)
    {
        itsDump->given[element.signal] = true;
        if (text.empty()) {
            return;
        }
        const std::string part = element.bits > 0 ? partOf(name, element, text) : std::string();
        text = element.bits > 0 ? part : text;
        const bool unknown = isUnknown(text, element.bits > 0 ? NumberForm::binary : itsMap.numbers);
        const auto place = placeOf(element, unknown);
        if (!place) {
            return;
        }
        const std::int16_t value = unknown             ? Values::unknown
                                   : element.bits == 0 ? itsFile.value(name, element.signal, text, itsMap)
                                                       : itsFile.packedValue(name, text);
        if (itsDump->values.at(*place) != Values::missing) {
            itsFile.fail(std::string(name) + " of this half-iteration and step stands in line " +
                         std::to_string(itsDump->lineOf(*place)) + ", too");
        }
        itsDump->values.set(*place, value);
        itsDump->lineOf(*place) = static_cast<std::uint32_t>(itsFile.number());
    }

    /// The binary digits of an element of a packed value. Digits that the value lacks are 0.
    std::string partOf(std::string_view name, const Element& element, std::string_view text) const
    {
        auto digits = binaryDigits(text, itsMap.numbers);
        if (!digits) {
            itsFile.fail(
                std::string(name) + ' ' + shown(text) +
                " is not allowed, expected a packed value in hexadecimal digits, after 0x or with \"numbers\": "
                "\"hex\" in the map, or in binary ones");
        }
        const std::size_t end = std::size_t{element.lowest} + element.bits;
        digits->insert(0, end - std::min(end, digits->size()), '0');
        return digits->substr(digits->size() - end, element.bits);
    }

    DumpFile itsFile;
    base::CsvReader itsRow{itsFile};
    const NameMap& itsMap;
    DumpSink& itsSink;
    Dump* itsDump = nullptr;  // of the row's block
    bool itsHasBlocks;
    std::set<std::string, std::less<>> itsLacking;  // names that the map needs and the dump lacks
    std::string itsHeader;
    std::vector<std::string> itsNames;  // of columns
    std::vector<std::optional<RowTiming>> itsTimings;
    std::size_t itsBlock = 0;
    std::optional<std::size_t> itsSignal;  // nothing if each signal has a column
    std::size_t itsValue = 0;
    std::vector<SignalColumn> itsColumns;
};

}  // namespace

void readCsv(std::istream& input, const std::string& name, const NameMap& map, Dump& dump)
{
    OneDump sink(dump);
    CsvReader(input, name, map, sink, false).read();
    completeTwins(name, map, dump);
}

void readCsvBlocks(std::istream& input, const std::string& name, const NameMap& map, DumpSink& sink)
{
    CsvReader(input, name, map, sink, true).read();
}

}  // namespace morvik::comparison
