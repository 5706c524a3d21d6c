// DumpNames: the names in a dump, whatever they stand for.
#ifndef MORVIK_HARDWARE_COMPARISON_DUMPNAMES_H
#define MORVIK_HARDWARE_COMPARISON_DUMPNAMES_H

#include <istream>
#include <set>
#include <string>
#include <vector>

namespace morvik::comparison {

struct DumpName {
    std::string name;
    unsigned bits = 0;  ///< of a vector; 0 if the dump does not tell, or for a real

    bool operator<(const DumpName& other) const
    {
        return name != other.name ? name < other.name : bits < other.bits;
    }
};

struct DumpNames {
    bool hasRows = false;        ///< rows of CSV name the signals
    bool isHexadecimal = false;  ///< some value has hexadecimal digits, and none another form
    std::set<DumpName> names;    ///< columns, or signals of rows, or variables without their scopes
};

/// Read a dump's names. Throw base::Error, prefixed with the location.
DumpNames namesOfCsv(std::istream& input, const std::string& name);
DumpNames namesOfVcd(std::istream& input, const std::string& name);

/// A map for the names, and what it leaves out.
struct SuggestedMap {
    std::string json;
    std::vector<std::string> notes;  ///< what could not be placed, and what is lacking
};

/// Suggests a map by what designers usually call the signals.
SuggestedMap suggestMap(const DumpNames& names);

}  // namespace morvik::comparison

#endif
