// Misc: tests of property-string splitting and of the text utilities.
#include "Misc.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdio>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <streambuf>

namespace {

using Parameters = std::map<std::string, std::string>;
using Pair = std::pair<std::string, std::string>;
using Strings = std::vector<std::string>;
using namespace std::string_literals;

/// What an action writes on the standard error stream; nothing may appear on standard output.
template <class Action>
std::string errorsOf(Action action)
{
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    action();
    std::string errors = testing::internal::GetCapturedStderr();
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
    return errors;
}

/// The map that a parameter text without errors leaves, with every name allowed.
Parameters parsed(const std::string& text)
{
    std::istringstream stream(text);
    Parameters parameters;
    EXPECT_EQ(errorsOf([&] { EXPECT_TRUE(parse(stream, parameters, false)); }), "");
    return parameters;
}

/// A file of the given content that lives as long as the object.
class TemporaryFile {
public:
    explicit TemporaryFile(const std::string& content)
        : itsName(testing::TempDir() + "morvik_misc_" + std::to_string(getpid()))
    {
        std::ofstream(itsName) << content;
    }

    ~TemporaryFile()
    {
        std::remove(itsName.c_str());
    }

    TemporaryFile(const TemporaryFile&) = delete;
    TemporaryFile& operator=(const TemporaryFile&) = delete;

    const std::string& name() const
    {
        return itsName;
    }

private:
    std::string itsName;
};

/// Delivers a text and then fails, as a medium with a read error does, instead of ending.
class FailingBuffer : public std::streambuf {
public:
    explicit FailingBuffer(std::string text) : itsText(std::move(text))
    {
        setg(itsText.data(), itsText.data(), itsText.data() + itsText.size());
    }

protected:
    int_type underflow() override
    {
        throw std::runtime_error("read error");
    }

private:
    std::string itsText;
};

// --- splitString ---------------------------------------------------------------------------------

TEST(SplitString, SplitsAtTheFirstDelimiterOnly)
{
    EXPECT_EQ(splitString("a:b:c", ":"), Pair("a", "b:c"));
    EXPECT_EQ(splitString("Fix_12_3", "_"), Pair("Fix", "12_3"));
}

TEST(SplitString, GivesTheWholeTextWithoutADelimiter)
{
    EXPECT_EQ(splitString("abc", ":"), Pair("abc", ""));
    EXPECT_EQ(splitString("", ":"), Pair("", ""));
    EXPECT_EQ(splitString("a:b", ""), Pair("a:b", ""));
}

TEST(SplitString, AllowsEmptyHeadAndTail)
{
    EXPECT_EQ(splitString(":", ":"), Pair("", ""));
    EXPECT_EQ(splitString(":b", ":"), Pair("", "b"));
    EXPECT_EQ(splitString("a:", ":"), Pair("a", ""));
    EXPECT_EQ(splitString("::", ":"), Pair("", ":"));
}

TEST(SplitString, TakesEachDelimiterCharacterOnItsOwnInAnyOrder)
{
    EXPECT_EQ(splitString("x_y:z", ":_"), Pair("x", "y:z"));
    EXPECT_EQ(splitString("x_y:z", "_:"), Pair("x", "y:z"));
    EXPECT_EQ(splitString("x:y_z", ":_"), Pair("x", "y_z"));
}

TEST(SplitString, ChangesNoCharacter)
{
    EXPECT_EQ(splitString(" a : b ", ":"), Pair(" a ", " b "));
    EXPECT_EQ(splitString("a\0b:\xff\0"s, ":"), Pair("a\0b"s, "\xff\0"s));
}

// --- parse ---------------------------------------------------------------------------------------

TEST(Parse, ReadsNamesValuesAndComments)
{
    EXPECT_EQ(parsed("a = 1 // note\n#b = 2\n  c=  x   y  \nd"), (Parameters{{"a", "1"}, {"c", "x y"}, {"d", ""}}));
}

TEST(Parse, CutsAtTheFirstCommentMarkOfEitherKind)
{
    EXPECT_EQ(parsed("a = 1 # x // y"), (Parameters{{"a", "1"}}));
    EXPECT_EQ(parsed("a = 1 // x # y"), (Parameters{{"a", "1"}}));
    EXPECT_EQ(parsed("a = b//c//d"), (Parameters{{"a", "b"}}));
    EXPECT_EQ(parsed("!a = 1"), (Parameters{{"!a", "1"}}));  // the first character above a blank
    EXPECT_EQ(parsed("a#=1"), (Parameters{{"a", ""}}));
    EXPECT_EQ(parsed("a = /1/"), (Parameters{{"a", "/1/"}}));
}

TEST(Parse, SplitsAtTheFirstEqualsSign)
{
    EXPECT_EQ(parsed("a = b = c"), (Parameters{{"a", "b = c"}}));
    EXPECT_EQ(parsed("= 5"), (Parameters{{"", "5"}}));
    EXPECT_EQ(parsed("="), (Parameters{{"", ""}}));
}

TEST(Parse, TidiesNamesAndValues)
{
    EXPECT_EQ(parsed("\t my  name\t = \t my \t value \r\n"), (Parameters{{"my name", "my value"}}));
}

TEST(Parse, SkipsLinesWithoutContent)
{
    EXPECT_EQ(parsed(""), Parameters());
    EXPECT_EQ(parsed("\n\n"), Parameters());
    EXPECT_EQ(parsed(" \t\r\v\f\x01\x1f\n// x\n  # y\n"), Parameters());
}

TEST(Parse, SkipsOnlyLeadingCharactersOfCode1To32)
{
    // A NUL character or a byte from 128 makes a line with content, whose name is then empty.
    EXPECT_EQ(parsed("\0"s), (Parameters{{"", ""}}));
    EXPECT_EQ(parsed("\x80"), (Parameters{{"", ""}}));
    EXPECT_EQ(parsed("\xff\n"), (Parameters{{"", ""}}));
}

TEST(Parse, OverwritesAnEarlierValue)
{
    EXPECT_EQ(parsed("a = 1\na = 2\na"), (Parameters{{"a", ""}}));
}

TEST(Parse, ReadsALastLineWithAndWithoutALineFeed)
{
    EXPECT_EQ(parsed("a = 1\nb = 2"), (Parameters{{"a", "1"}, {"b", "2"}}));
    EXPECT_EQ(parsed("a = 1\nb = 2\n"), (Parameters{{"a", "1"}, {"b", "2"}}));
}

TEST(Parse, RefusesAnUnknownNameWithItsLineNumberAndReadsOn)
{
    std::istringstream stream("// header\n\n# more\nz = 3\na = 1\n");
    Parameters parameters{{"a", "0"}};
    EXPECT_EQ(errorsOf([&] { EXPECT_FALSE(parse(stream, parameters, true)); }),
              "ERROR:4:Parameter name 'z' is invalid\n");
    EXPECT_EQ(parameters, (Parameters{{"a", "1"}}));
}

TEST(Parse, ReportsEveryUnknownName)
{
    std::istringstream stream("x\ny  z = 1\n= 2\na = 1");
    Parameters parameters{{"a", "0"}};
    EXPECT_EQ(errorsOf([&] { EXPECT_FALSE(parse(stream, parameters)); }),
              "ERROR:1:Parameter name 'x' is invalid\n"
              "ERROR:2:Parameter name 'y z' is invalid\n"
              "ERROR:3:Parameter name '' is invalid\n");
    EXPECT_EQ(parameters, (Parameters{{"a", "1"}}));
}

TEST(Parse, ChecksNamesUnlessToldOtherwise)
{
    std::istringstream checked("b = 1");
    std::istringstream unchecked("b = 1");
    Parameters parameters;
    EXPECT_EQ(errorsOf([&] { EXPECT_FALSE(parse(checked, parameters)); }), "ERROR:1:Parameter name 'b' is invalid\n");
    EXPECT_EQ(parameters, Parameters());
    EXPECT_EQ(errorsOf([&] { EXPECT_TRUE(parse(unchecked, parameters, false)); }), "");
    EXPECT_EQ(parameters, (Parameters{{"b", "1"}}));
}

TEST(Parse, AcceptsTheKnownNames)
{
    std::istringstream stream("K = 6144 // largest\n# done");
    Parameters parameters{{"rate", "1"}, {"K", "40"}};
    EXPECT_EQ(errorsOf([&] { EXPECT_TRUE(parse(stream, parameters)); }), "");
    EXPECT_EQ(parameters, (Parameters{{"rate", "1"}, {"K", "6144"}}));
}

TEST(Parse, LeavesAStreamAtItsEndUntouched)
{
    std::istringstream stream("a = 1");
    std::string rest;
    std::getline(stream, rest);
    ASSERT_EQ(stream.rdstate(), std::ios::eofbit);

    Parameters parameters;
    EXPECT_EQ(errorsOf([&] { EXPECT_TRUE(parse(stream, parameters)); }), "");
    EXPECT_EQ(stream.rdstate(), std::ios::eofbit);
    EXPECT_EQ(parameters, Parameters());
}

TEST(Parse, StopsWhenTheStreamFails)
{
    FailingBuffer buffer("a = 1\nb = 2\nc = 3");
    std::istream stream(&buffer);
    Parameters parameters;
    EXPECT_EQ(errorsOf([&] { EXPECT_TRUE(parse(stream, parameters, false)); }), "");
    EXPECT_TRUE(stream.bad());
    EXPECT_FALSE(stream.eof());
    EXPECT_EQ(parameters, (Parameters{{"a", "1"}, {"b", "2"}}));
}

TEST(Parse, ReadsNothingFromAStreamThatHasFailed)
{
    std::istringstream stream("a = 1");
    stream.setstate(std::ios::failbit);
    Parameters parameters;
    EXPECT_EQ(errorsOf([&] { EXPECT_TRUE(parse(stream, parameters, false)); }), "");
    EXPECT_EQ(parameters, Parameters());
}

TEST(ParseFile, ReadsTheNamedFile)
{
    const TemporaryFile file("a = 1\nz = 2\nb = 3\n");
    Parameters parameters{{"a", ""}, {"b", ""}};
    EXPECT_EQ(errorsOf([&] { EXPECT_FALSE(parse(file.name(), parameters)); }),
              "ERROR:2:Parameter name 'z' is invalid\n");
    EXPECT_EQ(parameters, (Parameters{{"a", "1"}, {"b", "3"}}));

    EXPECT_EQ(errorsOf([&] { EXPECT_TRUE(parse(file.name(), parameters, false)); }), "");
    EXPECT_EQ(parameters, (Parameters{{"a", "1"}, {"b", "3"}, {"z", "2"}}));
}

TEST(ParseFile, ReportsAFileThatCannotBeOpened)
{
    Parameters parameters{{"a", "0"}};
    EXPECT_EQ(errorsOf([&] { EXPECT_FALSE(parse("/no/such/file.txt", parameters)); }),
              "ERROR:Could not open input file '/no/such/file.txt'\n");
    EXPECT_EQ(errorsOf([&] { EXPECT_FALSE(parse("", parameters, false)); }), "ERROR:Could not open input file ''\n");
    EXPECT_EQ(parameters, (Parameters{{"a", "0"}}));
}

TEST(ParseFile, ReadsAFolderAsAFileWithoutLines)
{
    Parameters parameters;
    EXPECT_EQ(errorsOf([&] { EXPECT_TRUE(parse(testing::TempDir(), parameters)); }), "");
    EXPECT_EQ(parameters, Parameters());
}

// --- stringtok -----------------------------------------------------------------------------------

TEST(Stringtok, SplitsAtDelimitersAndSkipsLeadingWhitespace)
{
    EXPECT_EQ(stringtok("a,,b", ",", " "), (Strings{"a", "", "b"}));
    EXPECT_EQ(stringtok("a, b,", ",", " "), (Strings{"a", "b"}));
    EXPECT_EQ(stringtok("a;b,c", ",;", " "), (Strings{"a", "b", "c"}));
    EXPECT_EQ(stringtok("abc", ",", " "), (Strings{"abc"}));
}

TEST(Stringtok, KeepsWhitespaceBehindAToken)
{
    EXPECT_EQ(stringtok(" a b , c ", ",", " "), (Strings{"a b ", "c "}));
}

TEST(Stringtok, GivesAnEmptyTokenForALeadingDelimiterAndNoneForATrailingOne)
{
    EXPECT_EQ(stringtok(",a", ",", " "), (Strings{"", "a"}));
    EXPECT_EQ(stringtok("a,,", ",", " "), (Strings{"a", ""}));
    EXPECT_EQ(stringtok(",", ",", " "), (Strings{""}));
    EXPECT_EQ(stringtok("a,  ", ",", " "), (Strings{"a"}));
}

TEST(Stringtok, SkipsDelimitersThatAreWhitespaceToo)
{
    EXPECT_EQ(stringtok("  a   b ", " ", " "), (Strings{"a", "b"}));
    EXPECT_EQ(stringtok("a, ,b", ", ", " ,"), (Strings{"a", "b"}));
}

TEST(Stringtok, GivesNothingForATextWithoutTokens)
{
    EXPECT_EQ(stringtok("", ",", " "), Strings());
    EXPECT_EQ(stringtok("   ", ",", " "), Strings());
}

TEST(Stringtok, AllowsEmptySets)
{
    EXPECT_EQ(stringtok(" a,b ", "", ""), (Strings{" a,b "}));
    EXPECT_EQ(stringtok(" a,b ", ",", ""), (Strings{" a", "b "}));
}

TEST(Stringtok, SkipsBlankTabReturnAndLineFeedByDefault)
{
    EXPECT_EQ(stringtok(" \t\r\na,\vb", ","), (Strings{"a", "\vb"}));
}

// --- stripws -------------------------------------------------------------------------------------

TEST(Stripws, TrimsAndJoinsRunsOfBlanks)
{
    EXPECT_EQ(stripws("  a \t b  "), "a b");
    EXPECT_EQ(stripws("a b"), "a b");
    EXPECT_EQ(stripws("abc"), "abc");
    EXPECT_EQ(stripws(" a  b\tc "), "a b c");
}

TEST(Stripws, EmptiesATextOfBlanks)
{
    EXPECT_EQ(stripws(""), "");
    EXPECT_EQ(stripws(" \t\r\n"), "");
}

TEST(Stripws, TakesCodesUpTo32AndFrom128AsBlanks)
{
    for (int code = 0; code < 256; ++code) {
        const char c = static_cast<char>(code);
        const bool blank = code <= 32 || code >= 128;
        EXPECT_EQ(stripws("a"s + c + "b"), blank ? "a b"s : "a"s + c + "b") << "code " << code;
    }
}

// --- expandTabs ----------------------------------------------------------------------------------

TEST(ExpandTabs, UsesColumnsOf16WithoutWidths)
{
    EXPECT_EQ(expandTabs("a\tb", {}), "a" + std::string(15, ' ') + "b");
    EXPECT_EQ(expandTabs("\t\tb", {}), std::string(32, ' ') + "b");
}

TEST(ExpandTabs, PutsOneBlankWhereTheColumnIsPassed)
{
    const std::string letters = "abcdefghijklmnopqrstuvwxyz";
    EXPECT_EQ(expandTabs(letters + "\tX", {}), letters + " X");
    EXPECT_EQ(expandTabs("abc\tX", {4}), "abc X");
    EXPECT_EQ(expandTabs("abcd\tX", {4}), "abcd X");
    EXPECT_EQ(expandTabs("abcde\tX", {4}), "abcde X");
}

TEST(ExpandTabs, AddsUpTheWidthsAndRepeatsTheLast)
{
    EXPECT_EQ(expandTabs("a\tb\tc", {4, 2}), "a   b c");
    EXPECT_EQ(expandTabs("a\tb\tc\td", {4, 2}), "a   b c d");
    EXPECT_EQ(expandTabs("a\tb\tc\td", {2, 4}), "a b   c   d");
}

TEST(ExpandTabs, CountsAPassedColumnAllTheSame)
{
    EXPECT_EQ(expandTabs("abcdef\tg\th", {4, 8}), "abcdef g    h");
}

TEST(ExpandTabs, AllowsAWidthOfZero)
{
    EXPECT_EQ(expandTabs("\ta\tb", {0}), " a b");
}

TEST(ExpandTabs, DoesNotReturnToColumnZeroAtALineFeed)
{
    EXPECT_EQ(expandTabs("ab\n\tc", {8}), "ab\n     c");
}

TEST(ExpandTabs, LeavesATextWithoutTabsAsItIs)
{
    EXPECT_EQ(expandTabs("", {4}), "");
    EXPECT_EQ(expandTabs(" a\0\xff\n"s, {4}), " a\0\xff\n"s);
}

TEST(ExpandTabs, ExpandsManyTabsInLinearTime)
{
    EXPECT_EQ(expandTabs(std::string(1 << 20, '\t'), {2}), std::string(1 << 21, ' '));
}

#if SIZE_MAX == UINT32_MAX  // a 64-bit process has room for the widest column
TEST(ExpandTabs, RefusesMoreColumnsThanA32BitProcessCanHold)
{
    EXPECT_THROW(expandTabs("\t", {4294967295U}), std::length_error);
    EXPECT_THROW(expandTabs(std::string(64, 'a') + "\tb", {4294967295U}), std::length_error);
    // At the second tab the column is 2^32 + 1, which must not wrap to 1.
    EXPECT_THROW(expandTabs("a\tb\t", {2, 4294967295U}), std::length_error);
}
#endif

// --- nocase_compare ------------------------------------------------------------------------------

TEST(NocaseCompare, IgnoresTheCaseOfLetters)
{
    EXPECT_TRUE(nocase_compare("MOD#", "mod#"));
    EXPECT_TRUE(nocase_compare("", ""));
    EXPECT_FALSE(nocase_compare("abc", "abd"));
}

TEST(NocaseCompare, TellsLengthsApart)
{
    EXPECT_FALSE(nocase_compare("MOD", "MOD#"));
    EXPECT_FALSE(nocase_compare("MOD#", "MOD"));
    EXPECT_FALSE(nocase_compare("", "a"));
    EXPECT_FALSE(nocase_compare("a", "a\0"s));
}

TEST(NocaseCompare, FoldsNothingButAToZInAllPairsOfCharacters)
{
    const auto folded = [](int code) {
        return code >= 'a' && code <= 'z' ? code - 32 : code;
    };
    for (int a = 0; a < 256; ++a) {
        for (int b = 0; b < 256; ++b) {
            ASSERT_EQ(nocase_compare2(static_cast<char>(a), static_cast<char>(b)), folded(a) == folded(b))
                << "codes " << a << " and " << b;
        }
    }
}

// --- toFilename ----------------------------------------------------------------------------------

TEST(ToFilename, MapsEachSpecialCharacter)
{
    EXPECT_EQ(toFilename("a+b"), "apb");
    EXPECT_EQ(toFilename("a-b"), "amb");
    EXPECT_EQ(toFilename("a.b"), "apb");
    EXPECT_EQ(toFilename("a,b"), "acb");
    EXPECT_EQ(toFilename("a%b"), "apcb");
    EXPECT_EQ(toFilename("a=b"), "ab");
    EXPECT_EQ(toFilename("a<b"), "a[b");
    EXPECT_EQ(toFilename("a>b"), "a]b");
}

TEST(ToFilename, KeepsAllOtherCharacters)
{
    const std::string special = "+-.,%=<>";
    for (char c = 33; c < 127; ++c) {
        if (special.find(c) == std::string::npos) {
            EXPECT_EQ(toFilename(std::string(1, c)), std::string(1, c));
        }
    }
    EXPECT_EQ(toFilename("\x7f"), "\x7f");
}

TEST(ToFilename, MakesOneUnderscoreOfARunOfBlanks)
{
    EXPECT_EQ(toFilename(" x = -1.5 %"), "_x__m1p5_pc");
    EXPECT_EQ(toFilename("a \t b"), "a_b");
    EXPECT_EQ(toFilename("  a"), "_a");
    EXPECT_EQ(toFilename("a\x01\x80\xff\x20z"), "a_z");
}

TEST(ToFilename, DropsTheRunAtTheEnd)
{
    EXPECT_EQ(toFilename("a  "), "a");
    EXPECT_EQ(toFilename(" \t"), "");
    EXPECT_EQ(toFilename(""), "");
    EXPECT_EQ(toFilename("a = "), "a_");
}

TEST(ToFilename, EndsAtTheFirstNul)
{
    EXPECT_EQ(toFilename("a\0b"s), "a");
    EXPECT_EQ(toFilename("a \0b"s), "a");
    EXPECT_EQ(toFilename("\0b"s), "");
}

}  // namespace
