// VcdScopes: the scopes and variables of a value change dump, and the choice of those to read.
#include "VcdScopes.h"

#include <algorithm>
#include <array>
#include <set>
#include <tuple>

#include "Values.h"
#include "base/Error.h"
#include "base/Printable.h"
#include "base/Shown.h"

namespace morvik::comparison {

VcdScopes::VcdScopes(const NameMap& map) : itsMap(map), itsLacking(map.needed)
{
    itsLongestName = std::max({map.passColumn.size(), map.stepColumn.size(), map.valid.size()});
    for (const auto& [name, signal] : map.signals) {
        itsLongestName = std::max(itsLongestName, name.size());
    }
}

void VcdScopes::enter(const std::string& name)
{
    const auto number = static_cast<unsigned>(itsScopes.size());
    const auto [place, isNew] = itsScopeNumbers.try_emplace({itsScope, name}, number);
    if (isNew) {
        if (number == mostScopes) {
            throw base::Error("more than " + std::to_string(mostScopes) + " scopes");
        }
        VcdScope scope;
        scope.name = name;
        scope.parent = itsScope;
        itsScopes.push_back(scope);
    }
    itsScope = place->second;
}

void VcdScopes::leave()
{
    if (itsScope == nobody) {
        throw base::Error("$upscope outside of all scopes");
    }
    itsScope = itsScopes[itsScope].parent;
}

/// Calls use(name, whether it has scopes) with the variable's name, then with the scope around it prefixed, the next
/// scope, and so on, up to the longest name in the map.
template <class Use>
void VcdScopes::forEachName(const VcdVariable& variable, Use use) const
{
    std::string name = variable.name;
    use(name, false);
    for (unsigned scope = variable.scope; scope != nobody; scope = itsScopes[scope].parent) {
        if (name.size() + itsScopes[scope].name.size() >= itsLongestName) {
            return;
        }
        name.insert(0, itsScopes[scope].name + '.');
        use(name, true);
    }
}

/// Finds the signal by the longest name in the map that matches the variable.
void VcdScopes::findSignal(VcdVariable& variable, bool& found)
{
    std::optional<unsigned> signal;
    forEachName(variable, [&](const std::string& name, bool hasScopes) {
        const auto known = itsMap.signal(name);
        if (known) {
            signal = known;
            itsLacking.erase(name);
            variable.byPath = hasScopes;
        }
    });
    found = signal && *signal != NameMap::leftOut;
    variable.signal = signal.value_or(0);
}

bool VcdScopes::isCalled(const VcdVariable& variable, const std::string& name) const
{
    bool found = false;
    forEachName(variable, [&](const std::string& each, bool) { found = found || each == name; });
    return found && !name.empty();
}

void VcdScopes::setRole(unsigned& member, unsigned number) const
{
    if (member != nobody && netOf(member) != netOf(number)) {
        throw base::Error("two variables are " + base::shown(pathOf(itsVariables[number])));
    }
    member = number;
}

bool VcdScopes::declare(VcdVariable variable)
{
    if (itsScope == nobody) {
        throw base::Error("variable " + base::shown(variable.name) + " outside of all scopes");
    }
    variable.scope = itsScope;
    bool isSignal = false;
    findSignal(variable, isSignal);
    variable.role = isCalled(variable, itsMap.passColumn)   ? Role::pass
                    : isCalled(variable, itsMap.stepColumn) ? Role::step
                    : isCalled(variable, itsMap.valid)      ? Role::valid
                                                            : Role::signal;
    if (variable.role == Role::signal && !isSignal) {
        return false;
    }
    const auto number = static_cast<unsigned>(itsVariables.size());
    itsVariables.push_back(variable);
    VcdScope& scope = itsScopes[itsScope];
    switch (variable.role) {
    case Role::pass:
        setRole(scope.pass, number);
        break;
    case Role::step:
        setRole(scope.step, number);
        break;
    case Role::valid:
        setRole(scope.valid, number);
        break;
    default:
        scope.signals.push_back(number);
    }
    return true;
}

/// Enclosing scopes come first in the list.
void VcdScopes::inheritPlaces()
{
    for (VcdScope& scope : itsScopes) {
        if (scope.parent != nobody) {
            const VcdScope& around = itsScopes[scope.parent];
            scope.pass = scope.pass == nobody ? around.pass : scope.pass;
            scope.step = scope.step == nobody ? around.step : scope.step;
            scope.valid = scope.valid == nobody ? around.valid : scope.valid;
        }
    }
}

void VcdScopes::choose()
{
    inheritPlaces();
    std::array<std::vector<unsigned>, signalCount> candidates;
    for (VcdScope& scope : itsScopes) {
        for (const unsigned number : scope.signals) {
            candidates[itsVariables[number].signal].push_back(number);
        }
        scope.signals.clear();
    }
    for (unsigned signal = 0; signal < signalCount; ++signal) {
        chooseSignal(signal, std::move(candidates[signal]));
    }
}

void VcdScopes::chooseSignal(unsigned signal, std::vector<unsigned> candidates)
{
    preferPaths(signal, candidates);
    joinNets(candidates);
    expectOneOfEachPlace(candidates);
    for (const unsigned number : candidates) {
        expectPlaces(itsVariables[number]);
        itsScopes[itsVariables[number].scope].signals.push_back(number);
    }
}

/// If the map names variables of a signal with their scopes, only those are meant.
void VcdScopes::preferPaths(unsigned signal, std::vector<unsigned>& candidates)
{
    const auto others = std::stable_partition(
        candidates.begin(), candidates.end(), [this](unsigned each) { return itsVariables[each].byPath; });
    if (others == candidates.begin() || others == candidates.end()) {
        return;
    }
    itsNotes.push_back(std::string(passSignals[signal].name) + " is " + pathOf(itsVariables[candidates.front()]) +
                       ", not " + pathOf(itsVariables[*others]));
    candidates.erase(others, candidates.end());
}

/// Takes a net that passes through several scopes where most is known of its values' place, and only once where that is
/// the same.
void VcdScopes::joinNets(std::vector<unsigned>& candidates) const
{
    const auto known = [this](unsigned variable) {
        const VcdScope& scope = itsScopes[itsVariables[variable].scope];
        return (scope.pass != nobody ? 1 : 0) + (scope.step != nobody ? 1 : 0) + (scope.valid != nobody ? 1 : 0);
    };
    std::map<unsigned, int> mostKnown;
    for (const unsigned each : candidates) {
        int& most = mostKnown[netOf(each)];
        most = std::max(most, known(each));
    }
    std::set<std::array<unsigned, 4>> taken;
    const auto isNotNeeded = [&](unsigned each) {
        const VcdScope& scope = itsScopes[itsVariables[each].scope];
        return known(each) < mostKnown[netOf(each)] ||
               !taken.insert({netOf(each), netOf(scope.pass), netOf(scope.step), netOf(scope.valid)}).second;
    };
    candidates.erase(std::remove_if(candidates.begin(), candidates.end(), isNotNeeded), candidates.end());
}

/// Of two variables for one signal, neither may be in a scope around the other's or belong to the same steps.
void VcdScopes::expectOneOfEachPlace(const std::vector<unsigned>& candidates) const
{
    if (candidates.size() < 2) {
        return;
    }
    std::vector<unsigned> around(itsScopes.size(), nobody);  // the candidate in or around a scope
    std::map<std::array<unsigned, 3>, unsigned> ofPlace;
    for (const unsigned each : candidates) {
        const VcdScope& scope = itsScopes[itsVariables[each].scope];
        unsigned& inScope = around[itsVariables[each].scope];
        const auto same = ofPlace.try_emplace({netOf(scope.pass), netOf(scope.step), netOf(scope.valid)}, each).first;
        for (const unsigned other : {inScope, same->second}) {
            if (other != nobody && netOf(other) != netOf(each)) {
                failAboutTwo(*this, itsVariables[other], itsVariables[each]);
            }
        }
        inScope = each;
    }
    for (std::size_t scope = 0; scope < around.size(); ++scope) {
        const unsigned parent = itsScopes[scope].parent;
        const unsigned outer = parent == nobody ? nobody : around[parent];
        if (outer != nobody && around[scope] != nobody && netOf(outer) != netOf(around[scope])) {
            failAboutTwo(*this, itsVariables[outer], itsVariables[around[scope]]);
        }
        around[scope] = around[scope] == nobody ? outer : around[scope];
    }
}

void VcdScopes::expectPlaces(const VcdVariable& variable) const
{
    const VcdScope& scope = itsScopes[variable.scope];
    const bool lacksValid = scope.valid == nobody && !itsMap.valid.empty();
    if (scope.pass == nobody || scope.step == nobody || lacksValid) {
        const std::string& name = scope.pass == nobody   ? itsMap.passColumn
                                  : scope.step == nobody ? itsMap.stepColumn
                                                         : itsMap.valid;
        throw base::Error("no variable " + base::shown(name) + " in the scope of \"" + pathOf(variable) +
                          "\" or around it");
    }
}

unsigned VcdScopes::netOf(unsigned variable) const
{
    return variable == nobody ? nobody : itsVariables[variable].net;
}

std::string VcdScopes::pathOf(const VcdVariable& variable) const
{
    constexpr std::size_t longest = 200;
    std::string path = variable.name;
    for (unsigned scope = variable.scope; scope != nobody && path.size() <= longest; scope = itsScopes[scope].parent) {
        path.insert(0, itsScopes[scope].name + '.');
    }
    return path.size() <= longest ? base::visible(path)
                                  : "..." + base::visible(std::string_view(path).substr(path.size() - longest));
}

void failAboutTwo(const VcdScopes& scopes, const VcdVariable& one, const VcdVariable& other)
{
    const std::string signal = passSignals[other.signal].name;
    throw base::Error("two variables are " + signal + ", " + scopes.pathOf(one) + " and " + scopes.pathOf(other) +
                      "; a map chooses: {\"signals\": {\"" + scopes.pathOf(other) + "\": \"" + signal + "\"}}");
}

}  // namespace morvik::comparison
