// VcdScopes: the scopes and variables of a value change dump, and the choice of those to read.
#ifndef MORVIK_HARDWARE_COMPARISON_VCDSCOPES_H
#define MORVIK_HARDWARE_COMPARISON_VCDSCOPES_H

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

/// The role of a variable: it gives the place of its scope's values, marks them valid, or holds one.
enum class Role : std::uint8_t { pass, step, valid, signal };

struct VcdVariable {
    std::string name;
    unsigned scope = 0;
    unsigned net = 0;  ///< number of its identifier: variables of one net are always equal
    unsigned bits = 0;
    Role role = Role::signal;
    unsigned signal = 0;
    bool byPath = false;                ///< whether the map names it with scopes
    std::optional<std::int64_t> value;  ///< none while unknown
    std::uint32_t line = 0;             ///< of its last change
};

/// The variables to read in a scope. Once all are declared, it inherits those that it lacks from enclosing scopes.
struct VcdScope {
    std::string name;
    unsigned parent = nobody;
    unsigned pass = nobody;  // variables
    unsigned step = nobody;
    unsigned valid = nobody;
    std::vector<unsigned> signals;  // variables
};

/// Collects scopes and variables, and chooses those to read. Memory and time grow with their number, not with the depth
/// of nesting. Throws base::Error without a location.
class VcdScopes {
public:
    /// More than any design has: guards against endless dumps.
    static constexpr unsigned mostScopes = 1U << 20;

    explicit VcdScopes(const NameMap& map);

    /// A dump may re-enter a scope.
    void enter(const std::string& name);
    void leave();

    /// Finds the variable's role; false if it is not to be read.
    bool declare(VcdVariable variable);

    /// Ends the declarations: keeps the variables to read, and refuses two for one signal if neither is preferred.
    void choose();

    const std::vector<VcdScope>& scopes() const
    {
        return itsScopes;
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
    template <class Use>
    void forEachName(const VcdVariable& variable, Use use) const;
    void findSignal(VcdVariable& variable, bool& found);
    bool isCalled(const VcdVariable& variable, const std::string& name) const;
    void setRole(unsigned& member, unsigned number) const;

    void inheritPlaces();
    void chooseSignal(unsigned signal, std::vector<unsigned> candidates);
    void preferPaths(unsigned signal, std::vector<unsigned>& candidates);
    void joinNets(std::vector<unsigned>& candidates) const;
    void expectOneOfEachPlace(const std::vector<unsigned>& candidates) const;
    void expectPlaces(const VcdVariable& variable) const;
    unsigned netOf(unsigned variable) const;

    const NameMap& itsMap;
    std::set<std::string, std::less<>> itsLacking;
    std::size_t itsLongestName = 0;  // in the map
    std::vector<VcdScope> itsScopes;
    std::map<std::pair<unsigned, std::string>, unsigned> itsScopeNumbers;  // by parent and name
    unsigned itsScope = nobody;
    std::vector<VcdVariable> itsVariables;
    std::vector<std::string> itsNotes;
};

/// Throws the error about two variables for the same signal.
[[noreturn]] void failAboutTwo(const VcdScopes& scopes, const VcdVariable& one, const VcdVariable& other);

}  // namespace morvik::comparison

#endif
