// VcdWords: the words of a value change dump (IEEE 1364, clause 18).
#include "VcdWords.h"

#include <algorithm>

namespace morvik::comparison {

bool VcdWords::nextWord()
{
    if (++itsIdle > itsMostIdle) {
        fail("more than " + std::to_string(itsMostIdle) + " words without a change at a new time");
    }
    while (true) {
        itsRest.remove_prefix(std::min(itsRest.find_first_not_of(" \t"), itsRest.size()));
        if (!itsRest.empty()) {
            itsWord = itsRest.substr(0, itsRest.find_first_of(" \t"));
            itsRest.remove_prefix(itsWord.size());
            return true;
        }
        if (!nextFilled()) {
            return false;
        }
        itsRest = text();
    }
}

std::string VcdWords::expectWord(const char* what)
{
    if (!nextWord() || itsWord == "$end") {
        fail(std::string("the dump ends where ") + what + " is expected");
    }
    return std::string(itsWord);
}

std::string VcdWords::restOfCommand()
{
    constexpr std::size_t longest = 65536;
    std::string rest;
    for (;;) {
        if (!nextWord()) {
            fail("a command without $end");
        }
        if (itsWord == "$end") {
            return rest;
        }
        rest += rest.size() < longest ? itsWord : std::string_view();
    }
}

std::string VcdWords::nameOfVariable()
{
    std::string name = expectWord("the name of a variable");
    name += restOfCommand();
    const std::size_t bracket = name.rfind('[');
    if (bracket != std::string::npos && name.find(':', bracket) != std::string::npos) {
        name.erase(bracket);
    }
    name.erase(0, name[0] == '\\' ? 1 : 0);
    return name;
}

}  // namespace morvik::comparison
