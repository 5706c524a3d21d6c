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

namespace {

constexpr std::size_t longestOfPattern = 4096;  ///< of names that patterns match, with their scopes

}  // namespace

VcdScopes::VcdScopes(const NameMap& map, bool hasBlocks) : itsMap(map), itsHasBlocks(hasBlocks), itsLacking(map.needed)
{
    for (const Timing& timing : map.timings) {
        Controls controls;
        controls.pass = controlOf(timing.pass);
        controls.step = controlOf(timing.step);
        controls.valid = controlOf(timing.valid);
        controls.clock = timing.countsClocks ? controlOf(map.clock) : nobody;
        controls.block = !hasBlocks ? nobody : controlOf(map.start.empty() ? map.blockColumn : map.start);
        itsControls.push_back(controls);
    }
    itsControlVariables.resize(itsControlNames.size());
    itsScopes.emplace_back();
    for (const auto& [name, elements] : map.signals) {
        itsLongestName = std::max(itsLongestName, name.size());
    }
    for (const NameMap::Pattern& pattern : map.patterns) {
        itsMostParts = std::max(itsMostParts, pattern.name.parts());
    }
}

/// The number of a name that tells of places; nobody for an empty one.
unsigned VcdScopes::controlOf(const std::string& name)
{
    if (name.empty()) {
        return nobody;
    }
    itsLongestName = std::max(itsLongestName, name.size());
    const auto number = static_cast<unsigned>(itsControlNames.size());
    return itsControlNames.try_emplace(name, number).first->second;
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
    if (itsScope == outside) {
        throw base::Error("$upscope outside of all scopes");
    }
    itsScope = itsScopes[itsScope].parent;
}

/// Calls use(name, whether it has scopes) with the variable's name, then with the scope around it prefixed, the next
/// scope, and so on, as far as a name or a pattern of the map may reach.
template <class Use>
void VcdScopes::forEachName(const VcdVariable& variable, Use use) const
{
    std::string name = variable.name;
    use(name, false);
    std::size_t parts = 1;
    for (unsigned scope = variable.scope; scope != outside; scope = itsScopes[scope].parent) {
        const std::size_t length = name.size() + itsScopes[scope].name.size();
        const bool mayMatchAPattern = ++parts <= itsMostParts && length <= longestOfPattern;
        if (length >= itsLongestName && !mayMatchAPattern) {
            return;
        }
        name.insert(0, itsScopes[scope].name + '.');
        use(name, true);
    }
}

/// Finds the elements by the longest name in the map that matches the variable.
std::vector<Element> VcdScopes::findElements(VcdVariable& variable)
{
    std::vector<Element> elements;
    forEachName(variable, [&](const std::string& name, bool hasScopes) {
        if (auto found = itsMap.find(name)) {
            itsLacking.erase(found->name);
            variable.byPath = hasScopes;
            elements = std::move(found->elements);
        }
    });
    return elements;
}

/// Whether the variable tells of places, which it then does for its scope.
bool VcdScopes::takeControls(const VcdVariable& variable, unsigned number)
{
    std::set<unsigned> controls;
    forEachName(variable, [&](const std::string& name, bool) {
        if (const auto found = itsControlNames.find(name); found != itsControlNames.end()) {
            controls.insert(found->second);
        }
    });
    for (const unsigned each : controls) {
        const auto [known, isNew] = itsControlVariables[each].try_emplace(variable.scope, number);
        if (!isNew && netOf(known->second) != variable.net) {
            throw base::Error("two variables are " + base::shown(pathOf(variable)));
        }
        known->second = number;
    }
    return !controls.empty();
}

std::size_t VcdScopes::declare(VcdVariable variable)
{
    variable.scope = itsScope;
    const std::vector<Element> elements = findElements(variable);
    const auto number = static_cast<unsigned>(itsVariables.size());
    if (takeControls(variable, number)) {
        variable.role = Role::control;
        itsVariables.push_back(variable);
        return 1;
    }
    for (const Element& each : elements) {
        variable.element = each;
        itsScopes[itsScope].signals.push_back(static_cast<unsigned>(itsVariables.size()));
        itsVariables.push_back(variable);
    }
    return elements.size();
}

/// Enclosing scopes come first in the list.
void VcdScopes::inheritControls()
{
    for (const std::map<unsigned, unsigned>& own : itsControlVariables) {
        std::vector<unsigned>& all = itsInherited.emplace_back(itsScopes.size(), nobody);
        for (std::size_t scope = 0; scope < itsScopes.size(); ++scope) {
            const unsigned parent = itsScopes[scope].parent;
            const auto found = own.find(static_cast<unsigned>(scope));
            all[scope] = found != own.end() ? found->second : parent != nobody ? all[parent] : nobody;
        }
    }
}

/// The variables that tell the place of a signal; the group has no signals.
VcdGroup VcdScopes::groupOf(const VcdVariable& variable) const
{
    const Controls& controls = itsControls[variable.element.timing];
    const auto inScope = [&](unsigned control) {
        return control == nobody ? nobody : itsInherited[control][variable.scope];
    };
    VcdGroup group;
    group.pass = inScope(controls.pass);
    group.step = inScope(controls.step);
    group.valid = inScope(controls.valid);
    group.clock = inScope(controls.clock);
    group.block = inScope(controls.block);
    group.timing = variable.element.timing;
    return group;
}

void VcdScopes::choose()
{
    inheritControls();
    std::array<std::vector<unsigned>, signalCount> candidates;
    for (VcdScope& scope : itsScopes) {
        for (const unsigned number : scope.signals) {
            candidates[itsVariables[number].element.signal].push_back(number);
        }
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
        addToGroup(number);
    }
}

void VcdScopes::addToGroup(unsigned number)
{
    const VcdVariable& variable = itsVariables[number];
    const auto [place, isNew] =
        itsGroupNumbers.try_emplace({variable.scope, variable.element.timing}, itsGroups.size());
    if (isNew) {
        itsGroups.push_back(groupOf(variable));
    }
    itsGroups[place->second].signals.push_back(number);
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
        const VcdGroup group = groupOf(itsVariables[variable]);
        return (group.pass != nobody ? 1 : 0) + (group.step != nobody ? 1 : 0) + (group.valid != nobody ? 1 : 0);
    };
    std::map<unsigned, int> mostKnown;
    for (const unsigned each : candidates) {
        int& most = mostKnown[netOf(each)];
        most = std::max(most, known(each));
    }
    std::set<std::tuple<unsigned, unsigned, unsigned, std::array<unsigned, 3>>> taken;
    const auto isNotNeeded = [&](unsigned each) {
        const Element& element = itsVariables[each].element;
        return known(each) < mostKnown[netOf(each)] ||
               !taken.insert({netOf(each), element.lowest, element.timing, placeNets(each)}).second;
    };
    candidates.erase(std::remove_if(candidates.begin(), candidates.end(), isNotNeeded), candidates.end());
}

/// Of two variables for one signal, neither may be in a scope around the other's or belong to the same steps, unless
/// the map gives them different timings.
void VcdScopes::expectOneOfEachPlace(const std::vector<unsigned>& candidates) const
{
    if (candidates.size() < 2) {
        return;
    }
    std::vector<unsigned> around(itsScopes.size(), nobody);  // the candidate in or around a scope
    std::map<std::array<unsigned, 3>, unsigned> ofPlace;
    for (const unsigned each : candidates) {
        unsigned& inScope = around[itsVariables[each].scope];
        const auto same = ofPlace.try_emplace(placeNets(each), each).first;
        for (const unsigned other : {inScope, same->second}) {
            if (other != nobody && netOf(other) != netOf(each) &&
                itsVariables[other].element.timing == itsVariables[each].element.timing) {
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
    const VcdGroup group = groupOf(variable);
    const Timing& timing = itsMap.timings[group.timing];
    const auto expect = [&](unsigned known, const std::string& name) {
        if (known == nobody) {
            throw base::Error("no variable " + base::shown(name) + " in the scope of \"" + pathOf(variable) +
                              "\" or around it");
        }
    };
    expect(group.pass, timing.pass);
    expect(group.step, timing.step);
    if (!timing.valid.empty()) {
        expect(group.valid, timing.valid);
    }
    if (timing.countsClocks) {
        if (itsMap.clock.empty()) {
            throw base::Error("a delay in clocks needs \"clock\" in the map");
        }
        expect(group.clock, itsMap.clock);
    }
    if (itsHasBlocks) {
        expect(group.block, itsMap.start.empty() ? itsMap.blockColumn : itsMap.start);
    }
}

/// The nets of the variables that tell where values belong.
std::array<unsigned, 3> VcdScopes::placeNets(unsigned variable) const
{
    const VcdGroup group = groupOf(itsVariables[variable]);
    return {netOf(group.pass), netOf(group.step), netOf(group.valid)};
}

unsigned VcdScopes::netOf(unsigned variable) const
{
    return variable == nobody ? nobody : itsVariables[variable].net;
}

std::string VcdScopes::pathOf(const VcdVariable& variable) const
{
    constexpr std::size_t longest = 200;
    std::string path = variable.name;
    for (unsigned scope = variable.scope; scope != outside && path.size() <= longest; scope = itsScopes[scope].parent) {
        path.insert(0, itsScopes[scope].name + '.');
    }
    return path.size() <= longest ? base::visible(path)
                                  : "..." + base::visible(std::string_view(path).substr(path.size() - longest));
}

void failAboutTwo(const VcdScopes& scopes, const VcdVariable& one, const VcdVariable& other)
{
    const std::string signal = passSignals[other.element.signal].name;
    throw base::Error("two variables are " + signal + ", " + scopes.pathOf(one) + " and " + scopes.pathOf(other) +
                      "; a map chooses: {\"signals\": {\"" + scopes.pathOf(other) + "\": \"" + signal + "\"}}");
}

}  // namespace morvik::comparison
