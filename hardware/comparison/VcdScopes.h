// VcdScopes: the scopes and variables of a value change dump, and the choice of those to read.
#ifndef MORVIK_HARDWARE_COMPARISON_VCDSCOPES_H
#define MORVIK_HARDWARE_COMPARISON_VCDSCOPES_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "NameMap.h"

namespace morvik::comparison {

constexpr unsigned nobody = ~0U;

/// The scope around all others, without a name. GHDL writes the top level's variables there in FST.
constexpr unsigned outside = 0;

/// Whether a variable tells of the place and validity of values, or holds some.
enum class Role : std::uint8_t { control, signal };

struct VcdVariable {
    std::string name;
    unsigned scope = 0;
    unsigned net = 0;  ///< number of its identifier: variables of one net are always equal
    unsigned bits = 0;
    Role role = Role::signal;
    Element element;                    ///< of a signal
    bool byPath = false;                ///< whether the map names it with scopes
    std::optional<std::int64_t> value;  ///< none while unknown
    std::uint64_t rises = 0;            ///< how often it has become 1
    std::uint32_t line = 0;             ///< of its last change
};

struct VcdScope {
    std::string name;
    unsigned parent = nobody;
    std::vector<unsigned> signals;  // variables
};

/// The signals of a scope that have the same timing, and the variables that tell their place. nobody stands for one
/// that the map does not name.
struct VcdGroup {
    unsigned pass = nobody;
    unsigned step = nobody;
    unsigned valid = nobody;
    unsigned clock = nobody;
    unsigned block = nobody;
    unsigned timing = 0;
    std::vector<unsigned> signals;
};

/// Collects scopes and variables, and chooses those to read. Memory and time grow with their number, not with the depth
/// of nesting. Throws base::Error without a location.
class VcdScopes {
public:
    /// More than any design has: guards against endless dumps.
    static constexpr unsigned mostScopes = 1U << 20;

    /// With blocks, variables tell the block of values, too.
    VcdScopes(const NameMap& map, bool hasBlocks);

    /// A dump may re-enter a scope.
    void enter(const std::string& name);
    void leave();

    /// Finds the variable's role; keeps it, as often as it has elements, if it is to be read. Returns how often.
    std::size_t declare(VcdVariable variable);

    /// Ends the declarations: keeps the variables to read, and refuses two for one signal if neither is preferred.
    void choose();

    /// Once chosen.
    const std::vector<VcdGroup>& groups() const
    {
        return itsGroups;
    }

    const std::vector<VcdVariable>& variables() const
    {
        return itsVariables;
    }

    std::vector<VcdVariable>& variables()
    {
        return itsVariables;
    }

    /// The names that the map needs and no variable has.
    const std::set<std::string, std::less<>>& lacking() const
    {
        return itsLacking;
    }

    /// The path, "tb.dut.llr", escaped for terminals; only the end of very long ones.
    std::string pathOf(const VcdVariable& variable) const;

    /// Choices made by the map: "llr is tb.dut.llr, not tb.llr".
    const std::vector<std::string>& notes() const
    {
        return itsNotes;
    }

private:
    /// Numbers of the names of a timing.
    struct Controls {
        unsigned pass = nobody;
        unsigned step = nobody;
        unsigned valid = nobody;
        unsigned clock = nobody;
        unsigned block = nobody;
    };

    unsigned controlOf(const std::string& name);

    template <class Use>
    void forEachName(const VcdVariable& variable, Use use) const;
    std::vector<Element> findElements(VcdVariable& variable);
    bool takeControls(const VcdVariable& variable, unsigned number);

    void inheritControls();
    VcdGroup groupOf(const VcdVariable& variable) const;
    void chooseSignal(unsigned signal, std::vector<unsigned> candidates);
    void addToGroup(unsigned number);
    void preferPaths(unsigned signal, std::vector<unsigned>& candidates);
    void joinNets(std::vector<unsigned>& candidates) const;
    void expectOneOfEachPlace(const std::vector<unsigned>& candidates) const;
    void expectPlaces(const VcdVariable& variable) const;
    unsigned netOf(unsigned variable) const;
    std::array<unsigned, 3> placeNets(unsigned variable) const;

    const NameMap& itsMap;
    bool itsHasBlocks;
    std::set<std::string, std::less<>> itsLacking;
    std::size_t itsLongestName = 0;                                 // in the map
    std::size_t itsMostParts = 0;                                   // of a pattern
    std::map<std::string, unsigned, std::less<>> itsControlNames;   // to their numbers
    std::vector<Controls> itsControls;                              // of each timing
    std::vector<std::map<unsigned, unsigned>> itsControlVariables;  // of each control: variables by scope
    std::vector<std::vector<unsigned>> itsInherited;                // the same with those of enclosing scopes
    std::vector<VcdScope> itsScopes;
    std::map<std::pair<unsigned, std::string>, unsigned> itsScopeNumbers;  // by parent and name
    unsigned itsScope = outside;
    std::vector<VcdVariable> itsVariables;
    std::vector<VcdGroup> itsGroups;
    std::map<std::pair<unsigned, unsigned>, std::size_t> itsGroupNumbers;  // by scope and timing
    std::vector<std::string> itsNotes;
};

/// Throws the error about two variables for the same signal.
[[noreturn]] void failAboutTwo(const VcdScopes& scopes, const VcdVariable& one, const VcdVariable& other);

}  // namespace morvik::comparison

#endif
