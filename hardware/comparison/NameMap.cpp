// NameMap: what a dump calls its signals and how it writes numbers.
#include "NameMap.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <utility>

#include "Values.h"
#include "base/Error.h"
#include "base/Json.h"
#include "base/Numbers.h"
#include "base/Shown.h"
#include "base/TextFile.h"

namespace morvik::comparison {

namespace {

using base::Json;
using base::shown;
using base::shownValue;

constexpr std::array<std::pair<const char*, NumberForm>, 6> numberForms = {{{"auto", NumberForm::automatic},
                                                                            {"integer", NumberForm::integer},
                                                                            {"unsigned", NumberForm::unsignedInteger},
                                                                            {"real", NumberForm::real},
                                                                            {"hex", NumberForm::hexadecimal},
                                                                            {"binary", NumberForm::binary}}};

/// A real number that is a multiple of an eighth.
std::optional<std::int64_t> eighths(std::string_view text)
{
    const double scaled = 8 * base::parseNumber<double>(text).value_or(NAN);
    if (!(std::abs(scaled) < 1e9) || scaled != std::floor(scaled)) {
        return std::nullopt;
    }
    return static_cast<std::int64_t>(scaled);
}

std::optional<std::int64_t> complement(std::optional<std::int64_t> digits, unsigned bits)
{
    if (!digits || *digits < 0 || *digits >> bits != 0) {
        return std::nullopt;
    }
    const bool isNegative = *digits >> (bits - 1) != 0;
    return isNegative ? *digits - (std::int64_t{1} << bits) : *digits;
}

/// Reads the members of the object; errors name the file.
class MapReader {
public:
    MapReader(const Json& object, std::string name) : itsObject(object), itsName(std::move(name)) {}

    NameMap read() const
    {
        NameMap map;
        for (const auto& [key, value] : itsObject.items()) {
            readMember(key, value, map);
        }
        return map;
    }

private:
    [[noreturn]] void fail(const std::string& what) const
    {
        throw base::Error(itsName + ": " + what);
    }

    void readMember(const std::string& key, const Json& value, NameMap& map) const
    {
        if (key == "signals") {
            readSignals(value, map);
        } else if (key == "columns") {
            readColumns(value, map);
        } else if (key == "numbers") {
            map.numbers = numberForm(value);
        } else if (key == "bits") {
            readBits(value, map);
        } else if (key == "first_half_iteration") {
            map.firstPass = count(key, value, 0, 1);
        } else if (key == "first_step") {
            map.firstStep = count(key, value, 0, 1);
        } else if (key == "valid") {
            map.valid = text(key, value);
            if (map.valid.empty()) {
                fail("\"valid\" is empty");
            }
        } else {
            fail(shown(key) +
                 " is not a key of a map, expected columns, signals, numbers, bits, first_half_iteration, first_step "
                 "or valid");
        }
    }

    std::string text(const std::string& key, const Json& value) const
    {
        if (!value.is_string()) {
            fail(shown(key) + " is no text");
        }
        return value.get<std::string>();
    }

    unsigned count(const std::string& key, const Json& value, unsigned first, unsigned last) const
    {
        if (!value.is_number_unsigned() || value.get<std::uint64_t>() < first || value.get<std::uint64_t>() > last) {
            fail(shown(key) + " is " + shownValue(value) + ", expected an integer from " + std::to_string(first) +
                 " to " + std::to_string(last));
        }
        return value.get<unsigned>();
    }

    NumberForm numberForm(const Json& value) const
    {
        for (const auto& [form, kind] : numberForms) {
            if (value == form) {
                return kind;
            }
        }
        fail("\"numbers\" is " + shownValue(value) + ", expected auto, integer, unsigned, real, hex or binary");
    }

    static std::optional<unsigned> signalOf(const Json& name)
    {
        const auto* const found =
            std::find_if(passSignals.begin(), passSignals.end(), [&](const Signal& each) { return name == each.name; });
        return found == passSignals.end() ? std::nullopt
                                          : std::optional<unsigned>(static_cast<unsigned>(found - passSignals.begin()));
    }

    void readBits(const Json& value, NameMap& map) const
    {
        constexpr unsigned fewest = 8;
        constexpr unsigned most = 32;
        if (!value.is_object()) {
            map.bits.fill(count("bits", value, fewest, most));
            return;
        }
        for (const auto& [name, bits] : value.items()) {
            const auto signal = signalOf(name);
            if (!signal) {
                fail("bits of " + shown(name) + ", expected " + signalNames());
            }
            map.bits[*signal] = count(name, bits, fewest, most);
        }
    }

    void readSignals(const Json& value, NameMap& map) const
    {
        if (!value.is_object()) {
            fail("\"signals\" is not an object");
        }
        for (const auto& [theirs, ours] : value.items()) {
            if (ours.is_array()) {
                readTwins(theirs, ours, map);
                continue;
            }
            const auto signal = signalOf(ours);
            if (!signal && !ours.is_null()) {
                fail("signal " + shown(theirs) + " is " + shownValue(ours) + ", expected " + signalNames() +
                     ", and null");
            }
            map.signals[theirs] = signal.value_or(NameMap::leftOut);
            if (signal) {
                map.needed.insert(theirs);
            }
        }
    }

    void readTwins(const std::string& theirs, const Json& ours, NameMap& map) const
    {
        const auto signal = ours.size() == 2 ? signalOf(ours[0]) : std::nullopt;
        if (!signal || twinOf(*signal) == *signal || signalOf(ours[1]) != twinOf(*signal)) {
            fail("signal " + shown(theirs) +
                 " is a list, expected two signals that are always equal: g0 and g3, or "
                 "g1 and g2");
        }
        map.signals[theirs] = *signal;
        map.needed.insert(theirs);
        map.standIns[twinOf(*signal)] = theirs;
    }

    void readColumns(const Json& value, NameMap& map) const
    {
        if (!value.is_object()) {
            fail("\"columns\" is not an object");
        }
        for (const auto& [key, theirs] : value.items()) {
            std::string* const column = key == "half_iteration" ? &map.passColumn
                                        : key == "step"         ? &map.stepColumn
                                        : key == "signal"       ? &map.signalColumn
                                        : key == "value"        ? &map.valueColumn
                                                                : nullptr;
            if (column == nullptr) {
                fail("column " + shown(key) + ", expected half_iteration, step, signal or value");
            }
            *column = text(key, theirs);
            map.namesRows = map.namesRows || key == "signal" || key == "value";
        }
    }

    const Json& itsObject;
    std::string itsName;
};

}  // namespace

NameMap::NameMap() : bits()
{
    bits.fill(passBits);
    for (unsigned i = 0; i < signalCount; ++i) {
        signals[passSignals[i].name] = i;
    }
}

std::optional<unsigned> NameMap::signal(std::string_view name) const
{
    const auto found = signals.find(name);
    return found == signals.end() ? std::nullopt : std::optional<unsigned>(found->second);
}

std::optional<std::int64_t> NameMap::number(std::string_view text, unsigned signal) const
{
    const unsigned width = bits[signal];
    const bool isHexadecimal = text.substr(0, 2) == "0x" || text.substr(0, 2) == "0X";
    if (text.size() > 1 && text[0] == '+' && text[1] != '-') {
        text.remove_prefix(1);  // parseNumber() rejects it
    }
    switch (numbers) {
    case NumberForm::integer:
        return base::parseNumber<std::int64_t>(text, 10);
    case NumberForm::unsignedInteger:
        return complement(base::parseNumber<std::int64_t>(text, 10), width);
    case NumberForm::real:
        return eighths(text);
    case NumberForm::hexadecimal:
        return complement(base::parseNumber<std::int64_t>(isHexadecimal ? text.substr(2) : text, 16), width);
    case NumberForm::binary:
        return complement(base::parseNumber<std::int64_t>(text, 2), width);
    default:
        break;
    }
    if (isHexadecimal) {
        return complement(base::parseNumber<std::int64_t>(text.substr(2), 16), width);
    }
    return text.find('.') == std::string_view::npos ? base::parseNumber<std::int64_t>(text, 10) : eighths(text);
}

std::string NameMap::expectedNumber(unsigned signal) const
{
    const std::string width = std::to_string(bits[signal]);
    switch (numbers) {
    case NumberForm::unsignedInteger:
        return "an unsigned integer of " + width + " bits";
    case NumberForm::real:
        return "a multiple of 1/8 from -256 to 255.875";
    case NumberForm::hexadecimal:
        return "a hexadecimal number of " + width + " bits";
    case NumberForm::binary:
        return "a binary number of " + width + " bits";
    case NumberForm::integer:
        return "an integer from -2048 to 2047";
    default:
        return "an integer from -2048 to 2047, or a multiple of 1/8 with a point from -256.0 to 255.875; use a map for "
               "other forms";
    }
}

NameMap readNameMap(std::istream& input, const std::string& name)
{
    constexpr std::size_t largest = std::size_t{1} << 20;  // more than a map needs for every net of a core
    const Json object = base::parseJson(base::readText(input, name, largest), name);
    if (!object.is_object()) {
        throw base::Error(name + ": not a map, expected a JSON object");
    }
    return MapReader(object, name).read();
}

}  // namespace morvik::comparison
