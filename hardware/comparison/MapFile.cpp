// MapFile: reads a name map from JSON.
#include <algorithm>
#include <array>
#include <utility>

#include "NameMap.h"
#include "Values.h"
#include "base/Error.h"
#include "base/Json.h"
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

/// A signal's text, which may have words of a pattern, and the rest of the element.
using Meaning = std::pair<std::string, Element>;

std::optional<unsigned> signalOf(const Json& name)
{
    return name.is_string() ? signalCalled(name.get<std::string>()) : std::nullopt;
}

/// Reads the members of the object; errors name the file.
class MapReader {
public:
    MapReader(const Json& object, std::string name) : itsObject(object), itsName(std::move(name)) {}

    /// The names come last: what is not particular to them is that of the whole map.
    NameMap read()
    {
        for (const auto& [key, value] : itsObject.items()) {
            readMember(key, value);
        }
        if (itsObject.contains("signals")) {
            readSignals(itsObject["signals"]);
        }
        return std::move(itsMap);
    }

private:
    static constexpr unsigned mostTimings = 64;
    static constexpr unsigned mostLate = 4096;     ///< steps or clocks
    static constexpr unsigned mostTogether = 256;  ///< elements of a vector

    [[noreturn]] void fail(const std::string& what) const
    {
        throw base::Error(itsName + ": " + what);
    }

    void readMember(const std::string& key, const Json& value)
    {
        if (key == "columns") {
            readColumns(value);
        } else if (key == "numbers") {
            itsMap.numbers = numberForm(value);
        } else if (key == "bits") {
            readBits(value);
        } else if (key == "first_half_iteration") {
            itsMap.firstPass = count(key, value, 0, 1);
        } else if (key == "first_step") {
            itsMap.firstStep = count(key, value, 0, 1);
        } else if (key == "first_block") {
            itsMap.firstBlock = count(key, value, 0, 1);
        } else if (key == "valid") {
            itsMap.timings.front().valid = name(key, value);
        } else if (key == "clock") {
            itsMap.clock = name(key, value);
        } else if (key == "start") {
            itsMap.start = name(key, value);
        } else if (key != "signals") {
            fail(shown(key) +
                 " is not a key of a map, expected columns, signals, numbers, bits, first_half_iteration, first_step, "
                 "first_block, valid, clock or start");
        }
    }

    std::string text(const std::string& key, const Json& value) const
    {
        if (!value.is_string()) {
            fail(shown(key) + " is no text");
        }
        return value.get<std::string>();
    }

    std::string name(const std::string& key, const Json& value) const
    {
        std::string content = text(key, value);
        if (content.empty()) {
            fail('"' + key + "\" is empty");
        }
        return content;
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

    void readBits(const Json& value)
    {
        constexpr unsigned fewest = 8;
        constexpr unsigned most = 32;
        if (!value.is_object()) {
            itsMap.bits.fill(count("bits", value, fewest, most));
            return;
        }
        for (const auto& [signalName, bits] : value.items()) {
            const auto signal = signalCalled(signalName);
            if (!signal) {
                fail("bits of " + shown(signalName) + ", expected " + signalNames());
            }
            itsMap.bits[*signal] = count(signalName, bits, fewest, most);
        }
    }

    void readColumns(const Json& value)
    {
        if (!value.is_object()) {
            fail("\"columns\" is not an object");
        }
        for (const auto& [key, theirs] : value.items()) {
            std::string* const column = key == "half_iteration" ? &itsMap.timings.front().pass
                                        : key == "step"         ? &itsMap.timings.front().step
                                        : key == "signal"       ? &itsMap.signalColumn
                                        : key == "value"        ? &itsMap.valueColumn
                                        : key == "block"        ? &itsMap.blockColumn
                                                                : nullptr;
            if (column == nullptr) {
                fail("column " + shown(key) + ", expected half_iteration, step, signal, value or block");
            }
            *column = text(key, theirs);
            itsMap.namesRows = itsMap.namesRows || key == "signal" || key == "value";
        }
    }

    void readSignals(const Json& value)
    {
        if (!value.is_object()) {
            fail("\"signals\" is not an object");
        }
        for (const auto& [theirs, ours] : value.items()) {
            const std::vector<Meaning> meanings = meaningsOf(theirs, ours);
            if (NamePattern::isPattern(theirs)) {
                itsMap.patterns.push_back({NamePattern(theirs), meanings});
            } else {
                itsMap.signals[theirs] = elementsOf(theirs, meanings);
            }
            if (!meanings.empty()) {
                itsMap.needed.insert(theirs);
            }
        }
    }

    static bool isListOfNames(const Json& value)
    {
        return value.is_array() && (value.empty() || !value[0].is_object());
    }

    /// A signal, or the first of two that the name stands for.
    std::string signalOrTwins(const std::string& theirs, const Json& ours)
    {
        return ours.is_array() ? twins(theirs, ours) : signalText(theirs, ours);
    }

    std::string twins(const std::string& theirs, const Json& ours)
    {
        const auto signal = ours.size() == 2 ? signalOf(ours[0]) : std::nullopt;
        if (!signal || twinOf(*signal) == *signal || signalOf(ours[1]) != twinOf(*signal)) {
            fail("signal " + shown(theirs) +
                 " is a list, expected two signals that are always equal: g0 and g3, or "
                 "g1 and g2");
        }
        itsMap.standIns[twinOf(*signal)] = theirs;
        return passSignals[*signal].name;
    }

    std::vector<Element> elementsOf(const std::string& theirs, const std::vector<Meaning>& meanings) const
    {
        std::vector<Element> elements;
        for (const auto& [signal, element] : meanings) {
            elements.push_back(element);
            const auto known = signalCalled(signal);
            if (!known) {
                failAboutSignal(theirs, signal);
            }
            elements.back().signal = *known;
        }
        return elements;
    }

    [[noreturn]] void failAboutSignal(const std::string& theirs, const Json& value) const
    {
        fail("signal " + shown(theirs) + " is " + shownValue(value) + ", expected " + signalNames() + ", and null");
    }

    /// Refuses what can be no signal, whatever numbers stand for the words of the pattern.
    std::string signalText(const std::string& theirs, const Json& value) const
    {
        std::string signal = value.is_string() ? value.get<std::string>() : "";
        for (unsigned number = 0; number < signalsOf(Stage::forward).count; ++number) {
            if (signalCalled(withNumber(theirs, signal, number))) {
                return signal;
            }
        }
        failAboutSignal(theirs, value);
    }

    /// The signal with this number in the place of each word that the pattern has.
    static std::string withNumber(const std::string& pattern, const std::string& signal, unsigned number)
    {
        NamePattern::Numbers numbers;
        for (std::size_t open = pattern.find('{'); open != std::string::npos; open = pattern.find('{', open + 1)) {
            const std::size_t close = std::min(pattern.find('}', open), pattern.size());
            numbers[pattern.substr(open + 1, close - open - 1)] = std::to_string(number);
        }
        return NamePattern::filled(signal, numbers);
    }

    std::vector<Meaning> meaningsOf(const std::string& theirs, const Json& ours)
    {
        if (ours.is_null()) {
            return {};
        }
        if (ours.is_object()) {
            return objectMeanings(theirs, ours);
        }
        if (ours.is_array() && !isListOfNames(ours)) {
            std::vector<Meaning> all;
            for (const Json& each : ours) {
                if (!each.is_object()) {
                    failAboutSignal(theirs, each);
                }
                const std::vector<Meaning> more = objectMeanings(theirs, each);
                all.insert(all.end(), more.begin(), more.end());
            }
            return all;
        }
        return {{signalOrTwins(theirs, ours), {}}};
    }

    /// What is particular to a name: {"signal": ..., "step": ..., ...} or {"packed": ..., ...}.
    std::vector<Meaning> objectMeanings(const std::string& theirs, const Json& object)
    {
        static constexpr std::array<const char*, 11> keys = {"signal",
                                                             "packed",
                                                             "half_iteration",
                                                             "step",
                                                             "valid",
                                                             "delay_steps",
                                                             "delay_clocks",
                                                             "first",
                                                             "bits",
                                                             "segments",
                                                             "units"};
        for (const auto& [key, value] : object.items()) {
            if (std::find(keys.begin(), keys.end(), key) == keys.end()) {
                fail(
                    "signal " + shown(theirs) + " has the key " + shown(key) +
                    ", expected signal or packed, half_iteration, step, valid, delay_steps, delay_clocks, first, bits, "
                    "segments or units");
            }
        }
        if (object.contains("signal") == object.contains("packed")) {
            fail("signal " + shown(theirs) + " needs either \"signal\" or \"packed\"");
        }
        const unsigned timing = timingOf(theirs, object);
        std::vector<Meaning> meanings;
        if (object.contains("packed")) {
            meanings = packedMeanings(theirs, object);
        } else {
            meanings = {{signalOrTwins(theirs, object["signal"]), {}}};
        }
        for (Meaning& each : meanings) {
            each.second.timing = timing;
        }
        return meanings;
    }

    unsigned timingOf(const std::string& theirs, const Json& object)
    {
        Timing timing = itsMap.timings.front();
        const auto take = [&](const char* key, std::string& member) {
            if (object.contains(key)) {
                member = name(key, object[key]);
            }
        };
        take("half_iteration", timing.pass);
        take("step", timing.step);
        take("valid", timing.valid);
        timing.countsClocks = object.contains("delay_clocks");
        if (timing.countsClocks && object.contains("delay_steps")) {
            fail("signal " + shown(theirs) + " has delays in steps and in clocks");
        }
        for (const char* const key : {"delay_steps", "delay_clocks"}) {
            timing.delay = object.contains(key) ? count(key, object[key], 0, mostLate) : timing.delay;
        }
        const auto known = std::find(itsMap.timings.begin(), itsMap.timings.end(), timing);
        if (known != itsMap.timings.end()) {
            return static_cast<unsigned>(known - itsMap.timings.begin());
        }
        if (itsMap.timings.size() == mostTimings) {
            fail("more than " + std::to_string(mostTimings) + " combinations of half_iteration, step, valid and delay");
        }
        itsMap.timings.push_back(timing);
        return static_cast<unsigned>(itsMap.timings.size() - 1);
    }

    /// A list of signals, all signals of a kind, or one signal of several segments or units.
    std::vector<Meaning> packedMeanings(const std::string& theirs, const Json& object)
    {
        const unsigned segments =
            object.contains("segments") ? count("segments", object["segments"], 1, mostTogether) : 1;
        const unsigned units = object.contains("units") ? count("units", object["units"], 1, mostTogether) : 1;
        std::vector<Meaning> meanings;
        for (unsigned unit = 0; unit < units; ++unit) {
            for (unsigned segment = 0; segment < segments; ++segment) {
                for (const std::string& signal : packedSignals(theirs, object["packed"])) {
                    meanings.push_back({signal, {}});
                    meanings.back().second.segments = segment;
                    meanings.back().second.units = unit;
                }
            }
        }
        if (meanings.size() > mostTogether) {
            fail("signal " + shown(theirs) + " packs more than " + std::to_string(mostTogether) + " values");
        }
        setBits(object, meanings);
        return meanings;
    }

    std::vector<std::string> packedSignals(const std::string& theirs, const Json& packed)
    {
        std::vector<std::string> signals;
        for (unsigned signal = 0; signal < signalCount; ++signal) {
            if (packed == nameOf(stageOf(signal)) && signalsOf(stageOf(signal)).count > 1) {
                signals.emplace_back(passSignals[signal].name);
            }
        }
        if (packed.is_array()) {
            for (const Json& each : packed) {
                signals.push_back(signalOrTwins(theirs, each));
            }
        } else if (signals.empty()) {
            signals.push_back(signalText(theirs, packed));
        }
        return signals;
    }

    /// Gives each element its bits: the first of them the lowest or, with "first": "high", the highest.
    void setBits(const Json& object, std::vector<Meaning>& meanings) const
    {
        const std::string first = object.contains("first") ? text("first", object["first"]) : "low";
        if (first != "low" && first != "high") {
            fail("\"first\" is " + shown(first) + ", expected low or high");
        }
        if (first == "high") {
            std::reverse(meanings.begin(), meanings.end());
        }
        unsigned lowest = 0;
        for (auto& [signal, element] : meanings) {
            const unsigned usual = itsMap.bits[signalCalled(signal).value_or(0)];
            element.bits = object.contains("bits") ? count("bits", object["bits"], 1, 32) : usual;
            element.lowest = lowest;
            lowest += element.bits;
        }
    }

    const Json& itsObject;
    std::string itsName;
    NameMap itsMap;
};

}  // namespace

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
