// DumpText: dumps read from texts, for the tests of both forms.
#ifndef MORVIK_TESTS_HARDWARE_COMPARISON_DUMPTEXT_H
#define MORVIK_TESTS_HARDWARE_COMPARISON_DUMPTEXT_H

#include <gtest/gtest.h>

#include <sstream>
#include <string>

#include "base/Error.h"
#include "hardware/comparison/Dump.h"

namespace morvik::comparison {

inline NameMap mapOf(const std::string& json)
{
    std::istringstream input(json);
    return readNameMap(input, "map.json");
}

using Reader = void (*)(std::istream&, const std::string&, const NameMap&, Dump&);

/// Two passes of 43 steps.
inline Dump read(Reader reader, const std::string& text, const NameMap& map = {})
{
    std::istringstream input(text);
    Dump dump(2, 43);
    reader(input, "dump", map, dump);
    return dump;
}

inline void expectRefused(Reader reader, const std::string& text, const std::string& message, const NameMap& map = {})
{
    try {
        read(reader, text, map);
        FAIL() << "accepted";
    } catch (const base::Error& error) {
        EXPECT_EQ(error.what(), message);
    }
}

// The numbers of two signals.
constexpr unsigned alpha3 = signalsOf(Stage::forward).first + 3;
constexpr unsigned llr = signalsOf(Stage::ratio).first;

}  // namespace morvik::comparison

#endif
