// VcdDump: dumps as value change dumps (IEEE 1364, clause 18).
#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <iterator>
#include <limits>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "Dump.h"
#include "VcdScopes.h"
#include "VcdWords.h"
#include "base/Error.h"
#include "base/Numbers.h"
#include "base/Shown.h"

namespace morvik::comparison {

namespace {

using base::shown;

/// A digit of a vector: 0, 1, or unknown. VHDL has nine states (IEEE 1076, package std_logic_1164), L and H weak 0
/// and 1.
enum class Digit : std::uint8_t { zero, one, unknown, none };

Digit digitOf(char character)
{
    constexpr std::string_view ofAKind[] = {"0L", "1H", "xXzZuUwW-"};
    std::uint8_t kind = 0;
    while (kind < std::size(ofAKind) && ofAKind[kind].find(character) == std::string_view::npos) {
        ++kind;
    }
    return static_cast<Digit>(kind);
}

/// The unit of the dump's times, "10ps".
struct Timescale {
    std::uint64_t factor = 1;
    std::string unit;
};

class VcdReader {
public:
    VcdReader(std::istream& input,
              const std::string& name,
              const NameMap& map,
              DumpSink& sink,
              bool hasBlocks,
              const DumpLimits& limits)
        : itsFile(input, name),
          itsMap(map),
          itsSink(sink),
          itsHasBlocks(hasBlocks),
          itsLimits(limits),
          itsScopes(map, hasBlocks)
    {
        itsReals.numbers = NumberForm::real;
    }

    void read()
    {
        if (itsMap.namesRows) {
            itsFile.failAsAWhole("is VCD; the columns \"signal\" and \"value\" in a map are for CSV");
        }
        while (itsFile.nextWord()) {
            if (itsFile.word()[0] == '$') {
                readCommand();
            } else if (itsFile.word()[0] == '#') {
                keepChanges();
                readTime();
            } else {
                readChange();
            }
        }
        endDeclarations();
        keepChanges();
    }

private:
    /// More than any design has: guards against endless dumps.
    static constexpr unsigned mostNets = 1U << 23;

    /// Each identifier may have two vectors at one time.
    static constexpr unsigned wordsOfChanges = 4;

    /// Prefixes errors with the location.
    template <class Action>
    auto placed(Action action)
    try {
        return action();
    } catch (const base::Error& error) {
        itsFile.fail(error.what());
    }

    void readCommand()
    {
        const std::string command(itsFile.word());
        if (command == "$dumpvars" || command == "$dumpall" || command == "$dumpon" || command == "$end") {
            return;  // changes inside are read like any others
        }
        if (command == "$scope") {
            itsFile.expectWord("the kind of a scope");
            const std::string name = itsFile.expectWord("the name of a scope");
            placed([&] { itsScopes.enter(name); });
        } else if (command == "$upscope") {
            placed([this] { itsScopes.leave(); });
        } else if (command == "$var") {
            readVariable();
            return;
        } else if (command == "$timescale") {
            readTimescale(itsFile.restOfCommand());
            return;
        } else if (command == "$dumpoff") {
            forgetAll();
        }
        itsFile.restOfCommand();
    }

    void forgetAll()
    {
        for (VcdVariable& variable : itsScopes.variables()) {
            variable.value.reset();
        }
    }

    void readTimescale(const std::string& text)
    {
        const std::size_t digits = std::min(text.find_first_not_of("0123456789"), text.size());
        const auto factor = base::parseNumber<std::uint64_t>(std::string_view(text).substr(0, digits));
        const std::string unit = text.substr(digits);
        constexpr std::array<std::string_view, 6> units = {"s", "ms", "us", "ns", "ps", "fs"};
        if (factor.value_or(0) == 0 || std::find(units.begin(), units.end(), unit) == units.end()) {
            itsFile.fail("timescale " + shown(text) +
                         " is not allowed, expected 1, 10 or 100 and s, ms, us, ns, ps or fs");
        }
        itsTimescale = {*factor, unit};
    }

    void readTime()
    {
        const auto time = base::parseNumber<std::uint64_t>(itsFile.word().substr(1));
        if (!time || *time > std::numeric_limits<std::uint64_t>::max() / itsTimescale.factor) {
            itsFile.fail(shown(itsFile.word()) + " is not a time");
        }
        itsTime = *time * itsTimescale.factor;
        if (++itsIdleTimes > itsLimits.idleTimes) {
            itsFile.fail("more than " + std::to_string(itsLimits.idleTimes) + " times without a further value");
        }
    }

    void readVariable()
    {
        itsFile.goOn();
        VcdVariable variable;
        itsFile.expectWord("the kind of a variable");
        const std::string width = itsFile.expectWord("the width of a variable");
        const std::string identifier = itsFile.expectWord("the identifier of a variable");
        variable.name = itsFile.nameOfVariable();
        if (itsIsDeclared) {
            itsFile.fail("variable " + shown(variable.name) + " after the first values");
        }
        variable.net = static_cast<unsigned>(itsNets.size());
        const auto [net, isNew] = itsNets.try_emplace(identifier, variable.net);
        variable.net = net->second;
        itsFile.allow(isNew ? wordsOfChanges : 0);
        if (variable.net == mostNets) {
            itsFile.fail("more than " + std::to_string(mostNets) + " identifiers");
        }
        const std::size_t kept = placed([&] { return itsScopes.declare(variable); });
        for (auto each = itsScopes.variables().end() - static_cast<std::ptrdiff_t>(kept);
             each != itsScopes.variables().end();
             ++each) {
            setBits(*each, itsFile.count("width", itsFile.integer("width", width), 1, 65536) + 1);
        }
    }

    void setBits(VcdVariable& variable, unsigned width) const
    {
        const Element& element = variable.element;
        variable.bits = element.bits > 0 ? element.bits : width;
        if (element.bits > 0 && element.lowest + element.bits > width) {
            itsFile.fail(variable.name + " has " + std::to_string(width) + " bits, the map packs " +
                         std::to_string(element.lowest + element.bits) + " or more in it");
        }
    }

    /// Chooses the variables to read, and finds the groups that depend on them.
    void endDeclarations()
    {
        if (itsIsDeclared) {
            return;
        }
        itsIsDeclared = true;
        itsFile.expectNoneLacking(itsScopes.lacking(), itsMap);
        placed([this] { itsScopes.choose(); });
        const auto& groups = itsScopes.groups();
        itsDependents.resize(itsScopes.variables().size());
        itsHasChanged.resize(groups.size());
        for (unsigned group = 0; group < groups.size(); ++group) {
            const VcdGroup& each = groups[group];
            itsHistories.emplace_back(itsMap.timings[each.timing].delay);
            itsTicks.push_back(false);
            itsOwners.push_back(
                each.signals.empty() ? "" : " of " + itsScopes.pathOf(itsScopes.variables()[each.signals.front()]));
            for (const unsigned control : {each.pass, each.step, each.valid, each.clock, each.block}) {
                if (control != nobody) {
                    itsDependents[control].push_back(group);
                }
            }
            for (const unsigned signal : each.signals) {
                itsDependents[signal].push_back(group);
                itsGiven[itsScopes.variables()[signal].element.signal] = true;
            }
        }
        if (std::find(itsGiven.begin(), itsGiven.end(), true) == itsGiven.end()) {
            itsFile.fail("no variable of the dump is a known signal; use a map to name them");
        }
        if (!itsHasBlocks) {
            beginBlock(itsMap.firstBlock);
        }
        itsOfNet.resize(itsNets.size());
        for (unsigned variable = 0; variable < itsDependents.size(); ++variable) {
            if (!itsDependents[variable].empty()) {
                itsOfNet[itsScopes.variables()[variable].net].push_back(variable);
            }
        }
    }

    void readChange()
    {
        if (itsTime != itsTimeOfChange) {
            itsTimeOfChange = itsTime;
            itsFile.goOn();
        }
        endDeclarations();
        std::string_view digits = itsFile.word();
        std::string_view identifier;
        std::string kept;
        const char kind = digits[0];
        if (kind == 'b' || kind == 'B' || kind == 'r' || kind == 'R') {
            kept = digits.substr(1);
            digits = kept;
            itsFile.expectWord("the identifier of a variable");
            identifier = itsFile.word();
        } else if (digitOf(kind) != Digit::none) {
            identifier = digits.substr(1);
            digits = digits.substr(0, 1);
        } else if (kind == 's' || kind == 'S') {
            itsFile.expectWord("the identifier of a variable");
            return;  // a string
        } else {
            itsFile.fail(shown(itsFile.word()) + " is not a value change");
        }
        const auto found = itsNets.find(identifier);
        if (found == itsNets.end()) {
            itsFile.fail("no variable has the identifier " + shown(identifier));
        }
        for (const unsigned number : itsOfNet[found->second]) {
            change(number, digits, kind == 'r' || kind == 'R');
        }
    }

    void change(unsigned number, std::string_view digits, bool isReal)
    {
        VcdVariable& variable = itsScopes.variables()[number];
        const auto before = variable.value;
        variable.value = isReal ? realValue(variable, digits) : bitsValue(variable, partOf(variable, digits));
        variable.line = static_cast<std::uint32_t>(itsFile.number());
        const bool rises = variable.role == Role::control && variable.value == 1 && before != 1;
        variable.rises += rises ? 1U : 0U;
        for (const unsigned group : itsDependents[number]) {
            itsTicks[group] = itsTicks[group] || (rises && itsScopes.groups()[group].clock == number);
            if (!itsHasChanged[group]) {
                itsHasChanged[group] = true;
                itsChanged.push_back(group);
            }
        }
    }

    /// The digits of an element of a packed vector. Omitted leading digits are 0, or unknown if the first one is.
    std::string_view partOf(const VcdVariable& variable, std::string_view digits)
    {
        if (variable.element.bits == 0) {
            return digits;
        }
        const std::size_t end = std::size_t{variable.element.lowest} + variable.element.bits;
        if (digits.size() < end) {
            itsExtended.assign(end - digits.size(),
                               !digits.empty() && digitOf(digits[0]) == Digit::unknown ? 'x' : '0');
            itsExtended += digits;
            digits = itsExtended;
        }
        return digits.substr(digits.size() - end, variable.element.bits);
    }

    std::int64_t realValue(const VcdVariable& variable, std::string_view digits) const
    {
        const bool inEighths = variable.role == Role::signal;
        const auto value = itsReals.number(digits, variable.element.signal);
        if (!value || (!inEighths && *value % 8 != 0)) {
            itsFile.fail(variable.name + ' ' + shown(digits) + " is not allowed, expected " +
                         (inEighths ? itsReals.expectedNumber(variable.element.signal) : "an integer"));
        }
        return inEighths ? *value : *value / 8;
    }

    /// Omitted leading digits are 0, or unknown if the first digit is x or z.
    std::optional<std::int64_t> bitsValue(const VcdVariable& variable, std::string_view digits) const
    {
        std::int64_t value = 0;
        for (const char character : digits) {
            const Digit digit = digitOf(character);
            if (digit == Digit::none) {
                itsFile.fail(variable.name + ' ' + shown(digits) + " is not allowed, expected binary digits");
            }
            if (digit == Digit::unknown) {
                return std::nullopt;
            }
            value = 2 * value + (digit == Digit::one ? 1 : 0);
            if (value >> 32 != 0) {
                itsFile.fail(variable.name + " has more than 32 bits");
            }
        }
        const bool isNegative =
            variable.role == Role::signal && digits.size() >= variable.bits && digitOf(digits[0]) == Digit::one;
        return isNegative ? value - (std::int64_t{1} << digits.size()) : value;
    }

    void keepChanges()
    {
        std::sort(itsChanged.begin(), itsChanged.end());
        for (const unsigned group : itsChanged) {
            keep(group);
            itsHasChanged[group] = false;
            itsTicks[group] = false;
        }
        itsChanged.clear();
    }

    /// The value of a variable that tells of places, if it is known.
    std::optional<std::int64_t> valueOf(unsigned variable) const
    {
        return itsScopes.variables()[variable].value;
    }

    void keep(unsigned number)
    {
        const VcdGroup& group = itsScopes.groups()[number];
        const bool isOfABlock = !itsHasBlocks || beginBlockOf(group);
        const auto named = isOfABlock ? placeOf(number) : std::nullopt;
        if (!named || (group.valid != nobody && valueOf(group.valid).value_or(0) != 1)) {
            return;
        }
        const StepPlace place = itsFile.placeOf(*named, itsMap, itsDump->values, itsOwners[number]);
        for (const unsigned signal : group.signals) {
            if (const auto own = itsDump->placeOf(place, itsScopes.variables()[signal].element)) {
                keepValue(signal, *own);
            }
        }
    }

    /// Where the group's values belong: now, or before a delay.
    std::optional<NamedPlace> placeOf(unsigned number)
    {
        const VcdGroup& group = itsScopes.groups()[number];
        const Timing& timing = itsMap.timings[group.timing];
        const auto pass = valueOf(group.pass);
        const auto step = valueOf(group.step);
        std::optional<NamedPlace> place;
        if (pass && step) {
            place = {*pass, *step};
        }
        if (timing.delay == 0) {
            return place;
        }
        PlaceHistory& history = itsHistories[number];
        if (!timing.countsClocks) {
            history.follow(place);
        } else if (itsTicks[number]) {
            history.begin(place);
        } else {
            history.settle(place);
        }
        return history.delayed();
    }

    /// Goes to the block of the group's values; false if it is unknown or has not begun.
    bool beginBlockOf(const VcdGroup& group)
    {
        const VcdVariable& variable = itsScopes.variables()[group.block];
        if (!itsMap.start.empty()) {
            if (variable.rises > 0) {
                beginBlock(itsMap.firstBlock + variable.rises - 1);
            }
            return variable.rises > 0;
        }
        if (variable.value) {
            beginBlock(static_cast<std::uint64_t>(*variable.value));
        }
        return variable.value.has_value();
    }

    void beginBlock(std::uint64_t number)
    {
        if (itsDump != nullptr && itsBlock == number) {
            return;
        }
        itsBlock = number;
        itsDump = &itsFile.dumpOf(std::to_string(number), itsMap, itsSink);
        if (!itsDump->waveform) {
            itsDump->waveform.emplace(itsDump->lines.size());
            itsDump->waveform->notes = itsScopes.notes();
            itsDump->waveform->unit = itsTimescale.unit;
            itsDump->given = itsGiven;
        }
    }

    /// Keeps the last known value of a place.
    void keepValue(unsigned number, const Place& place)
    {
        const VcdVariable& variable = itsScopes.variables()[number];
        Waveform& waveform = *itsDump->waveform;
        unsigned& owner = waveform.variables[itsDump->values.index(place)];
        const bool has = itsDump->values.has(place);
        if (!variable.value && has) {
            return;
        }
        if (variable.value && (*variable.value < Values::smallest || *variable.value > Values::largest)) {
            itsFile.fail(variable.name + ' ' + std::to_string(*variable.value) +
                         " is not allowed, expected -2048 to 2047 eighths");
        }
        if (has && !isSameSource(itsScopes.variables()[owner], variable)) {
            failAboutOwner(itsScopes.variables()[owner], variable, place);
        }
        itsIdleTimes = variable.value && !has ? 0 : itsIdleTimes;
        itsDump->values.set(place, variable.value ? static_cast<std::int16_t>(*variable.value) : Values::unknown);
        itsDump->lineOf(place) = variable.value ? variable.line : static_cast<std::uint32_t>(itsFile.number());
        owner = number;
        waveform.times[itsDump->values.index(place)] = itsTime;
        if (std::string& name = waveform.names[number]; name.empty()) {
            name = itsScopes.pathOf(variable);
        }
    }

    static bool isSameSource(const VcdVariable& one, const VcdVariable& other)
    {
        return one.net == other.net && one.element.lowest == other.element.lowest;
    }

    [[noreturn]] void failAboutOwner(const VcdVariable& one, const VcdVariable& other, const Place& place) const
    {
        itsFile.fail(itsScopes.pathOf(one) + " and " + itsScopes.pathOf(other) + " both have " +
                     passSignals[place.signal].name + " of half-iteration " + std::to_string(place.pass) + ", step " +
                     std::to_string(place.step) + "; use a map to choose one, or \"valid\" to tell when they count");
    }

    VcdWords itsFile;
    const NameMap& itsMap;
    NameMap itsReals;  // to read real values by
    DumpSink& itsSink;
    Dump* itsDump = nullptr;  // of the block at hand
    std::uint64_t itsBlock = 0;
    bool itsHasBlocks;
    DumpLimits itsLimits;
    VcdScopes itsScopes;
    std::uint64_t itsIdleTimes = 0;  // since a place has got a value
    Timescale itsTimescale;
    std::uint64_t itsTime = 0;                     // in the timescale's unit
    std::optional<std::uint64_t> itsTimeOfChange;  // of the last change
    bool itsIsDeclared = false;
    std::map<std::string, unsigned, std::less<>> itsNets;  // by identifier
    std::vector<std::vector<unsigned>> itsOfNet;           // variables to read
    std::vector<std::vector<unsigned>> itsDependents;      // groups that depend on a variable
    std::vector<PlaceHistory> itsHistories;                // of the groups
    std::vector<std::string> itsOwners;                    // " of " and the first signal of each group
    std::vector<bool> itsTicks;                            // whether the clock of a group has risen
    std::vector<unsigned> itsChanged;                      // groups, since the last time
    std::vector<bool> itsHasChanged;
    std::array<bool, signalCount> itsGiven = {};
    std::string itsExtended;  // digits of a packed vector
};

}  // namespace

void readVcd(std::istream& input, const std::string& name, const NameMap& map, Dump& dump)
{
    readVcdWithin({}, input, name, map, dump);
}

void readVcdWithin(
    const DumpLimits& limits, std::istream& input, const std::string& name, const NameMap& map, Dump& dump)
{
    OneDump sink(dump);
    VcdReader(input, name, map, sink, false, limits).read();
    completeTwins(name, map, dump);
}

void readVcdBlocks(std::istream& input, const std::string& name, const NameMap& map, DumpSink& sink)
{
    VcdReader(input, name, map, sink, true, {}).read();
}

}  // namespace morvik::comparison
