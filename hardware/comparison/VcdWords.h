// VcdWords: the words of a value change dump (IEEE 1364, clause 18).
#ifndef MORVIK_HARDWARE_COMPARISON_VCDWORDS_H
#define MORVIK_HARDWARE_COMPARISON_VCDWORDS_H

#include <cstddef>
#include <string>
#include <string_view>

#include "DumpFile.h"

namespace morvik::comparison {

class VcdWords : public DumpFile {
public:
    using DumpFile::DumpFile;

    /// Advances to the next word; false at the end. Throws after too many words since goOn().
    bool nextWord();

    std::string_view word() const
    {
        return itsWord;
    }

    /// The next word, which is to be `what`.
    std::string expectWord(const char* what);

    /// The words up to $end, without blanks between them; long texts such as comments are cut.
    std::string restOfCommand();

    /// The rest of a declaration: the name without the bit range and the escape mark. An element, NAME[N], keeps its
    /// number.
    std::string nameOfVariable();

    /// Something new has come: a variable, or the first change at a time. Comments, times at which nothing changes, and
    /// changes at one time may not go on for ever.
    void goOn()
    {
        itsIdle = 0;
    }

    /// Allows more words without anything new.
    void allow(std::size_t words)
    {
        itsMostIdle += words;
    }

private:
    std::string_view itsRest;
    std::string_view itsWord;
    std::size_t itsIdle = 0;  // words since something new
    std::size_t itsMostIdle = 4000000;
};

}  // namespace morvik::comparison

#endif
