// Wording: what texts and figures look like.
#include "report/Wording.h"

#include <gtest/gtest.h>

#include "base/Numbers.h"
#include "support/CommaLocale.h"

namespace morvik::report {
namespace {

TEST(Wording, PrintableKeepsWholeCharacters)
{
    const std::string text = "K = 512, \u00b5, \u2026, \U0001d6fc, \ufffd";
    EXPECT_EQ(printable(text), text);
    EXPECT_EQ(printable(""), "");
}

TEST(Wording, PrintableHasOneLine)
{
    EXPECT_EQ(printable("a\nb\tc\rd\x1b[e\x7f"), "a b c d [e ");
    EXPECT_EQ(printable(std::string("a\0b", 3)), "a b");
}

TEST(Wording, PrintableReplacesBytesThatMakeNoCharacter)
{
    EXPECT_EQ(printable("\x80"), "?");
    EXPECT_EQ(printable("a\xff"), "a?");
    EXPECT_EQ(printable("\xc3"), "?") << "cut off";
    EXPECT_EQ(printable("\xe2\x80x"), "??x") << "cut off";
    EXPECT_EQ(printable("\xc0\xaf"), "??") << "longer than need be";
    EXPECT_EQ(printable("\xe0\x80\xaf"), "???") << "longer than need be";
    EXPECT_EQ(printable("\xf0\x80\x80\xaf"), "????") << "longer than need be";
    EXPECT_EQ(printable("\xed\xa0\x80"), "???") << "a surrogate";
    EXPECT_EQ(printable("\xf4\x90\x80\x80"), "????") << "beyond the last character";
    EXPECT_EQ(printable("\xef\xbf\xbf"), "???") << "XML does not have it";
}

TEST(Wording, EscapesMarkup)
{
    EXPECT_EQ(escaped("<a b='c' d=\"e\">&</a>\n"), "&lt;a b=&#39;c&#39; d=&quot;e&quot;&gt;&amp;&lt;/a&gt; ");
}

TEST(Wording, ShortensToACountOfCharacters)
{
    EXPECT_EQ(shortened("abc", 3), "abc");
    EXPECT_EQ(shortened("abcd", 3), "ab\u2026");
    EXPECT_EQ(shortened("\u00e4\u00f6\u00fc", 3), "\u00e4\u00f6\u00fc");
    EXPECT_EQ(shortened("\u00e4\u00f6\u00fc\u00df", 3), "\u00e4\u00f6\u2026");
    EXPECT_EQ(characters("\u00e4b\U0001d6fc"), 3U);
}

TEST(Wording, DecibelsHaveTheDecimalsTheyNeed)
{
    EXPECT_EQ(decibels(0), "0.00");
    EXPECT_EQ(decibels(1.2), "1.20");
    EXPECT_EQ(decibels(0.1 + 0.2), "0.30");
    EXPECT_EQ(decibels(0.125), "0.125");
    EXPECT_EQ(decibels(-0.5), "\u22120.50");
    EXPECT_EQ(decibels(-1e-9), "0.00");
}

TEST(Wording, RatesHaveThreeDigits)
{
    EXPECT_EQ(rate(1), "1.00e+00");
    EXPECT_EQ(rate(0.00130049), "1.30e-03");
    EXPECT_EQ(rate(9.996e-9), "1.00e-08");
}

TEST(Wording, CountsHaveTheirDigitsInThrees)
{
    EXPECT_EQ(grouped(0), "0");
    EXPECT_EQ(grouped(999), "999");
    EXPECT_EQ(grouped(1000), "1\u202f000");
    EXPECT_EQ(grouped(15333312), "15\u202f333\u202f312");
    EXPECT_EQ(grouped(UINT64_MAX), "18\u202f446\u202f744\u202f073\u202f709\u202f551\u202f615");
}

TEST(Wording, LocalesHaveNoSay)
{
    const CommaLocale locale;
    EXPECT_EQ(decibels(1234.5), "1234.50");
    EXPECT_EQ(rate(0.0123), "1.23e-02");
    EXPECT_EQ(morvik::base::numberText(1234.5), "1234.5");
    EXPECT_EQ(grouped(1234), "1\u202f234");
}

}  // namespace
}  // namespace morvik::report
