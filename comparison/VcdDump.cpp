// VcdDump: dumps as value change dumps (IEEE 1364, clause 18).
#include <algorithm>
#include <array>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <iterator>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "Dump.h"
#include "DumpFile.h"
#include "simulation/Shown.h"

namespace morvik::comparison {

namespace {

using simulation::shown;

/// What a scope's values belong to, and whether they count.
enum class Role : std::uint8_t { pass, step, valid, signal };

constexpr unsigned nobody = ~0U;

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

/// The variables of a scope that count. Those of a scope around it stand for what it lacks itself.
struct Scope {
    std::string name;
    unsigned parent = nobody;
    unsigned pass = nobody;  // variables
    unsigned step = nobody;
    unsigned valid = nobody;
    std::vector<unsigned> signals;  // variables
    bool changed = false;
};

struct Variable {
    std::string name;
    unsigned scope = 0;
    Role role = Role::signal;
    unsigned signal = 0;
    unsigned bits = 0;
    std::optional<std::int64_t> value;  ///< none while unknown
    std::uint32_t line = 0;             ///< where it has changed
};

class VcdReader {
public:
    VcdReader(std::istream& input, const std::string& name, const NameMap& map, Dump& dump)
        : itsFile(input, name), itsMap(map), itsDump(dump)
    {
    }

    void read()
    {
        while (nextWord()) {
            if (itsWord[0] == '$') {
                readCommand();
            } else if (itsWord[0] == '#') {
                keepChanges();
            } else {
                readChange();
            }
        }
        keepChanges();
        if (!itsAnySignal) {
            itsFile.fail("no variable of the dump is a signal that is known; a map tells which is which");
        }
    }

private:
    bool nextWord()
    {
        while (true) {
            itsRest.remove_prefix(std::min(itsRest.find_first_not_of(" \t"), itsRest.size()));
            if (!itsRest.empty()) {
                itsWord = itsRest.substr(0, itsRest.find_first_of(" \t"));
                itsRest.remove_prefix(itsWord.size());
                return true;
            }
            if (!itsFile.next()) {
                return false;
            }
            itsRest = itsFile.line();
        }
    }

    std::string expectWord(const char* what)
    {
        if (!nextWord() || itsWord == "$end") {
            itsFile.fail(std::string("the dump ends where ") + what + " is expected");
        }
        return std::string(itsWord);
    }

    /// The words up to $end, without blanks between them.
    std::string restOfCommand()
    {
        std::string rest;
        for (;;) {
            if (!nextWord()) {
                itsFile.fail("a command without $end");
            }
            if (itsWord == "$end") {
                return rest;
            }
            rest += itsWord;
        }
    }

    void readCommand()
    {
        const std::string command(itsWord);
        if (command == "$dumpvars" || command == "$dumpall" || command == "$dumpon" || command == "$end") {
            return;  // the changes in it are read as others are
        }
        if (command == "$scope") {
            expectWord("the kind of a scope");
            enterScope(expectWord("the name of a scope"));
        } else if (command == "$upscope") {
            if (itsScope == nobody) {
                itsFile.fail("$upscope outside of all scopes");
            }
            itsScope = itsScopes[itsScope].parent;
        } else if (command == "$var") {
            readVariable();
            return;
        } else if (command == "$dumpoff") {
            forgetAll();
        }
        restOfCommand();
    }

    /// A dump may come back to a scope that it has left.
    void enterScope(const std::string& name)
    {
        unsigned scope = 0;
        while (scope < itsScopes.size() && (itsScopes[scope].parent != itsScope || itsScopes[scope].name != name)) {
            ++scope;
        }
        if (scope == itsScopes.size()) {
            Scope entered;
            entered.name = name;
            entered.parent = itsScope;
            itsScopes.push_back(entered);
        }
        itsScope = scope;
    }

    void forgetAll()
    {
        for (Variable& variable : itsVariables) {
            variable.value.reset();
        }
    }

    void readVariable()
    {
        Variable variable;
        expectWord("the kind of a variable");
        const std::string width = expectWord("the width of a variable");
        const std::string identifier = expectWord("the identifier of a variable");
        variable.name = expectWord("the name of a variable");
        variable.name = plainName(variable.name + restOfCommand());
        if (itsScope == nobody) {
            itsFile.fail("variable " + shown(variable.name) + " outside of all scopes");
        }
        variable.scope = itsScope;
        if (takesPart(variable)) {
            variable.bits = itsFile.count("width", width, 1, 65536) + 1;
            itsByIdentifier[identifier].push_back(static_cast<unsigned>(itsVariables.size()));
            itsVariables.push_back(variable);
        } else {
            itsByIdentifier[identifier];  // so that its changes are known to be of a variable
        }
    }

    /// Without the range of bits, and the mark of a name that is no identifier. An element, NAME[N], keeps its number.
    static std::string plainName(std::string name)
    {
        const std::size_t bracket = name.rfind('[');
        if (bracket != std::string::npos && name.find(':', bracket) != std::string::npos) {
            name.erase(bracket);
        }
        name.erase(0, name[0] == '\\' ? 1 : 0);
        return name;
    }

    /// The variable's name, and the same behind the scope that it is in, behind the one around that, and so on.
    std::vector<std::string> namesOf(const Variable& variable) const
    {
        std::vector<std::string> names = {variable.name};
        for (unsigned scope = variable.scope; scope != nobody; scope = itsScopes[scope].parent) {
            names.push_back(itsScopes[scope].name + '.' + names.back());
        }
        return names;
    }

    /// What the longest name that the map has says of the variable.
    std::optional<unsigned> signalOf(const std::vector<std::string>& names) const
    {
        std::optional<unsigned> signal;
        for (const std::string& name : names) {
            const auto known = itsMap.signal(name);
            signal = known ? known : signal;
        }
        return signal;
    }

    /// Finds out what the variable is for; false when it does not count.
    bool takesPart(Variable& variable)
    {
        Scope& scope = itsScopes[variable.scope];
        const auto number = static_cast<unsigned>(itsVariables.size());
        const std::vector<std::string> names = namesOf(variable);
        const auto isCalled = [&names](const std::string& name) {
            return std::find(names.begin(), names.end(), name) != names.end();
        };
        const auto signal = signalOf(names);
        if (isCalled(itsMap.passColumn)) {
            variable.role = Role::pass;
            scope.pass = number;
        } else if (isCalled(itsMap.stepColumn)) {
            variable.role = Role::step;
            scope.step = number;
        } else if (!itsMap.valid.empty() && isCalled(itsMap.valid)) {
            variable.role = Role::valid;
            scope.valid = number;
        } else if (signal && *signal != NameMap::leftOut) {
            variable.signal = *signal;
            scope.signals.push_back(number);
            itsDump.given[*signal] = true;
            itsAnySignal = true;
        } else {
            return false;
        }
        return true;
    }

    void readChange()
    {
        std::string digits(itsWord);
        std::string identifier;
        const char kind = digits[0];
        if (kind == 'b' || kind == 'B' || kind == 'r' || kind == 'R') {
            digits.erase(0, 1);
            identifier = expectWord("the identifier of a variable");
        } else if (digitOf(kind) != Digit::none) {
            identifier = digits.substr(1);
            digits.resize(1);
        } else if (kind == 's' || kind == 'S') {
            expectWord("the identifier of a variable");
            return;  // a text
        } else {
            itsFile.fail(shown(itsWord) + " is no change of a value");
        }
        const auto found = itsByIdentifier.find(identifier);
        if (found == itsByIdentifier.end()) {
            itsFile.fail("no variable has the identifier " + shown(identifier));
        }
        for (const unsigned number : found->second) {
            change(itsVariables[number], digits, kind == 'r' || kind == 'R');
        }
    }

    void change(Variable& variable, const std::string& digits, bool isReal)
    {
        variable.value = isReal ? realValue(variable, digits) : bitsValue(variable, digits);
        variable.line = itsFile.number();
        itsScopes[variable.scope].changed = true;
        // What a scope says of its place holds for those in it, too, and they come behind it.
        for (std::size_t i = variable.scope; variable.role != Role::signal && i < itsScopes.size(); ++i) {
            itsScopes[i].changed = itsScopes[i].changed || isInside(i, variable.scope);
        }
    }

    bool isInside(std::size_t scope, unsigned outer) const
    {
        while (scope != nobody && scope != outer) {
            scope = itsScopes[scope].parent;
        }
        return scope == outer;
    }

    std::int64_t realValue(const Variable& variable, const std::string& digits) const
    {
        NameMap reals;
        reals.numbers = NumberForm::real;
        const bool inEighths = variable.role == Role::signal;
        const auto value = reals.number(digits, variable.signal);
        if (!value || (!inEighths && *value % 8 != 0)) {
            itsFile.fail(variable.name + ' ' + shown(digits) + " is not allowed, expected " +
                         (inEighths ? reals.expectedNumber(variable.signal) : "an integer"));
        }
        return inEighths ? *value : *value / 8;
    }

    /// Leading digits that a dump leaves out are 0 (or, behind x and z, unknown as well).
    std::optional<std::int64_t> bitsValue(const Variable& variable, const std::string& digits) const
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

    /// The variable of a scope, or of the closest scope around it that has one.
    template <class Member>
    const Variable* find(unsigned scope, Member member) const
    {
        for (; scope != nobody; scope = itsScopes[scope].parent) {
            if (itsScopes[scope].*member != nobody) {
                return &itsVariables[itsScopes[scope].*member];
            }
        }
        return nullptr;
    }

    void keepChanges()
    {
        for (std::size_t i = 0; i < itsScopes.size(); ++i) {
            if (itsScopes[i].changed && !itsScopes[i].signals.empty()) {
                keep(static_cast<unsigned>(i));
            }
            itsScopes[i].changed = false;
        }
    }

    void keep(unsigned scope)
    {
        const Variable* const pass = find(scope, &Scope::pass);
        const Variable* const step = find(scope, &Scope::step);
        const Variable* const valid = find(scope, &Scope::valid);
        if (pass == nullptr || step == nullptr) {
            itsFile.fail("no variable " + shown(pass == nullptr ? itsMap.passColumn : itsMap.stepColumn) +
                         " in the scope of " + shown(itsVariables[itsScopes[scope].signals.front()].name) +
                         " or around it");
        }
        if (!pass->value || !step->value || (valid != nullptr && valid->value.value_or(0) != 1)) {
            return;
        }
        const unsigned h =
            itsFile.count("half-iteration", std::to_string(*pass->value), itsMap.firstPass, itsDump.values.passes());
        const unsigned n =
            itsFile.count("step", std::to_string(*step->value), itsMap.firstStep, itsDump.values.steps());
        for (const unsigned number : itsScopes[scope].signals) {
            const Variable& variable = itsVariables[number];
            const Place place = {h, variable.signal, n};
            if (!variable.value && !itsDump.values.has(place)) {
                itsDump.values.set(place, Values::unknown);
                itsDump.lineOf(place) = itsFile.number();
            }
            if (!variable.value) {
                continue;
            }
            if (*variable.value < Values::smallest || *variable.value > Values::largest) {
                itsFile.fail(variable.name + ' ' + std::to_string(*variable.value) +
                             " is not allowed, expected -2048 to 2047 eighths");
            }
            itsDump.values.set(place, static_cast<std::int16_t>(*variable.value));
            itsDump.lineOf(place) = variable.line;
        }
    }

    DumpFile itsFile;
    const NameMap& itsMap;
    Dump& itsDump;
    std::string_view itsRest;
    std::string_view itsWord;
    std::vector<Scope> itsScopes;
    unsigned itsScope = nobody;
    std::vector<Variable> itsVariables;
    std::map<std::string, std::vector<unsigned>, std::less<>> itsByIdentifier;
    bool itsAnySignal = false;
};

}  // namespace

void readVcd(std::istream& input, const std::string& name, const NameMap& map, Dump& dump)
{
    VcdReader(input, name, map, dump).read();
    completeTwins(name, map, dump);
}

}  // namespace morvik::comparison
