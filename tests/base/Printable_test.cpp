// Printable: nothing in a text works on the terminal.
#include "base/Printable.h"

#include <gtest/gtest.h>

namespace {

using morvik::base::visible;
using morvik::base::visibleLines;

TEST(Printable, ShowsControlCharacters)
{
    EXPECT_EQ(visible("a\x1b[31mb\x07\x7f\n\t"), "a\\x1b[31mb\\x07\\x7f\\x0a\\x09");
    EXPECT_EQ(visible(std::string("\0", 1)), "\\x00");
    EXPECT_EQ(visible("\xc2\x9b"
                      "31m"),
              "\\xc2\\x9b31m")
        << "CSI of C1";
}

TEST(Printable, LeavesTextAlone)
{
    EXPECT_EQ(visible("k40.csv: ~ \\ \""), "k40.csv: ~ \\ \"");
    EXPECT_EQ(visible("\u00a0\u00e9\u20ac\U0001f600"), "\u00a0\u00e9\u20ac\U0001f600");
    EXPECT_EQ(visible(""), "");
}

TEST(Printable, ShowsWhatIsNoCharacter)
{
    EXPECT_EQ(visible("\x9b"
                      "31m"),
              "\\x9b31m");
    EXPECT_EQ(visible("\xe9"
                      "t\xe9"),
              "\\xe9t\\xe9");
    EXPECT_EQ(visible("\xc0\x9b\xed\xa0\x80"), "\\xc0\\x9b\\xed\\xa0\\x80");
}

TEST(Printable, KeepsLinesWhereThereAreSome)
{
    EXPECT_EQ(visibleLines("one\ntwo\r\n"), "one\ntwo\\x0d\n");
}

TEST(Printable, IsCutBetweenCharacters)
{
    EXPECT_EQ(morvik::base::shortened("abcd", 4), "abcd");
    EXPECT_EQ(morvik::base::shortened("abcde", 4), "abcd...");
    EXPECT_EQ(morvik::base::shortened("a\x1b", 4), "a...");
    EXPECT_EQ(morvik::base::shortened("a\x1b", 5), "a\\x1b");
    EXPECT_EQ(morvik::base::shortened("abc\u00e9", 4), "abc...");
}

}  // namespace
