// DumpText: dumps read from texts, for the tests of both forms.
#ifndef MORVIK_TESTS_HARDWARE_COMPARISON_DUMPTEXT_H
#define MORVIK_TESTS_HARDWARE_COMPARISON_DUMPTEXT_H

#include <gtest/gtest.h>

#include <sstream>
#include <streambuf>
#include <string>
#include <utility>

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

/// Gives a text once, and another over and over.
class Endless : public std::streambuf {
public:
    explicit Endless(std::string repeated, std::string first = "")
        : itsText(std::move(first)), itsRepeated(std::move(repeated))
    {
        setg(itsText.data(), itsText.data(), itsText.data() + itsText.size());
    }

protected:
    int_type underflow() override
    {
        setg(itsRepeated.data(), itsRepeated.data(), itsRepeated.data() + itsRepeated.size());
        return traits_type::to_int_type(itsRepeated.front());
    }

private:
    std::string itsText;
    std::string itsRepeated;
};

inline void expectEndlessRefused(Reader reader,
                                 const std::string& repeated,
                                 const std::string& message,
                                 const std::string& first = "")
{
    Endless content(repeated, first);
    std::istream input(&content);
    Dump dump(2, 43);
    try {
        reader(input, "dump", {}, dump);
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
