// VcdScopes: the scopes and variables of a value change dump, and which of them count.
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

/// What a scope's values belong to, and whether they count.
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
    std::uint32_t line = 0;             ///< where it has changed
};

/// The variables of a scope that count. Once all are declared, those of a scope around it stand for what it lacks.
struct VcdScope {
    std::string name;
    unsigned parent = nobody;
    unsigned pass = nobody;  // variables
    unsigned step = nobody;
    unsigned valid = nobody;
    std::vector<unsigned> signals;  // variables
};

/// Memory and time grow with the number of scopes and variables, and not with how deep they lie. What is wrong is
/// thrown as a base::Error without a place.
class VcdScopes {
public:
    /// More than a design has: a dump with more has no end.
    static constexpr unsigned mostScopes = 1U << 20;

    explicit VcdScopes(const NameMap& map);

    /// A dump may come back to a scope that it has left.
    void enter(const std::string& name);
    void leave();

    /// Finds out what the variable is for; false when it does not count.
    bool declare(VcdVariable variable);

    /// All are declared: leaves those that count, and refuses two variables for one signal where none is to be
    /// preferred.
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

    /// "tb.dut.llr", as a terminal may get it; of very long ones, the end.
    std::string pathOf(const VcdVariable& variable) const;

    /// What the map has decided: "llr is tb.dut.llr, not tb.llr".
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
    std::size_t itsLongestName = 0;  // that the map has
    std::vector<VcdScope> itsScopes;
    std::map<std::pair<unsigned, std::string>, unsigned> itsScopeNumbers;  // by parent and name
    unsigned itsScope = nobody;
    std::vector<VcdVariable> itsVariables;
    std::vector<std::string> itsNotes;
};

/// The error about two variables that are the same signal.
[[noreturn]] void failAboutTwo(const VcdScopes& scopes, const VcdVariable& one, const VcdVariable& other);

}  // namespace morvik::comparison

#endif
