// LineReader: lines of any text, their numbers, and what is refused; rows of CSV in them.
#include "base/LineReader.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

#include "base/Csv.h"
#include "base/Error.h"

namespace {

using morvik::base::CsvReader;
using morvik::base::LineReader;

std::vector<std::string> linesOf(const std::string& text, std::size_t longest = 10)
{
    std::istringstream input(text);
    LineReader reader(input, "a.txt", longest);
    std::vector<std::string> lines;
    while (reader.next()) {
        lines.emplace_back(reader.text());
        EXPECT_EQ(reader.number(), lines.size());
    }
    EXPECT_EQ(reader.number(), lines.size()) << "the end is no line";
    return lines;
}

/// The message about a text that cannot be read to its end.
std::string refusal(std::istream& input, std::size_t longest = 10)
{
    try {
        LineReader reader(input, "a.txt", longest);
        while (reader.next()) {
        }
    } catch (const morvik::base::Error& error) {
        return error.what();
    }
    return "none";
}

std::string refusal(const std::string& text, std::size_t longest = 10)
{
    std::istringstream input(text);
    return refusal(input, longest);
}

TEST(LineReader, TakesLinesWithAnyEnd)
{
    using Texts = std::vector<std::string>;
    EXPECT_EQ(linesOf(""), Texts());
    EXPECT_EQ(linesOf("\n"), Texts({""}));
    EXPECT_EQ(linesOf("a\nb"), Texts({"a", "b"}));
    EXPECT_EQ(linesOf("a\r\n\r\nb\r\n"), Texts({"a", "", "b"}));
    EXPECT_EQ(linesOf("a\rb\r"), Texts({"a\rb"}));
    EXPECT_EQ(linesOf("\xEF\xBB\xBF"
                      "a\n\xEF\xBB\xBF"),
              Texts({"a", "\xEF\xBB\xBF"}))
        << "a mark is before the first";
}

TEST(LineReader, BoundsTheLengthOfLines)
{
    const std::string tooLong = "line is longer than 10 characters";
    EXPECT_EQ(linesOf("0123456789\n0123456789\r\n0123456789").size(), 3U);
    EXPECT_EQ(linesOf("\xEF\xBB\xBF"
                      "0123456789\r\n")
                  .size(),
              1U)
        << "neither mark nor end counts";
    EXPECT_EQ(refusal("01234567890"), "a.txt:1: " + tooLong);
    EXPECT_EQ(refusal("a\n01234567890\n"), "a.txt:2: " + tooLong);
    EXPECT_EQ(refusal("a\n" + std::string(100000, 'x') + "\n"), "a.txt:2: " + tooLong);
}

TEST(LineReader, TakesLinesOfAllLengthsAroundItsBuffer)
{
    constexpr std::size_t longest = 40000;
    for (std::size_t length = 8180; length < 8200; ++length) {
        const std::string line(length, 'x');
        EXPECT_EQ(linesOf(line + '\n' + line, longest), std::vector<std::string>({line, line})) << length;
    }
    const std::string most(longest, 'x');
    EXPECT_EQ(linesOf(most + "\r\na\n" + most, longest), std::vector<std::string>({most, "a", most}));
    EXPECT_NE(refusal(most + 'x', longest), "none");
    EXPECT_NE(refusal(most + "x\n", longest), "none");
}

TEST(LineReader, TellsThePlace)
{
    EXPECT_EQ(refusal("\x1F\x8B\n"), "a.txt: is compressed with gzip; unpack it by 'gunzip FILE'");
    EXPECT_EQ(refusal("a\n\x1F\x8B\n"), "none") << "the first line tells";
    std::istringstream broken("a\n");
    broken.setstate(std::ios::badbit);
    EXPECT_EQ(refusal(broken).substr(0, 24), "a.txt:1: cannot be read:");
    std::istringstream input("a\nb\n");
    LineReader reader(input, "a.txt", 10);
    EXPECT_EQ(reader.place(), "a.txt:1");
    while (reader.next()) {
    }
    EXPECT_EQ(reader.place(), "a.txt:2");
}

TEST(LineReader, HasNoPatienceWithBlankLines)
{
    std::istringstream input(std::string(LineReader::mostBlank + 2, '\n'));
    LineReader reader(input, "a.txt", 10);
    reader.next();
    while (reader.number() <= LineReader::mostBlank) {
        EXPECT_NO_THROW(reader.expectAnEnd(1));
        reader.next();
    }
    EXPECT_THROW(reader.expectAnEnd(1), morvik::base::Error);
}

TEST(CsvReader, SplitsLinesAtCommas)
{
    std::istringstream input(" a , b,c\r\n\n,\"x,y\"\n");
    LineReader lines(input, "a.csv", 100);
    CsvReader row(lines);
    using Fields = std::vector<std::string_view>;
    ASSERT_TRUE(row.next());
    EXPECT_EQ(row.fields(), Fields({"a", "b", "c"}));
    EXPECT_TRUE(row.is("a,b, c"));
    EXPECT_FALSE(row.is("a,b"));
    EXPECT_EQ(row.find("c"), 2U);
    EXPECT_EQ(row.find("d"), std::nullopt);
    ASSERT_TRUE(row.next());
    EXPECT_EQ(row.fields(), Fields({""})) << "a blank line has one field";
    ASSERT_TRUE(row.next());
    EXPECT_EQ(row.fields(), Fields({"", "\"x", "y\""})) << "quotation marks keep nothing together";
    EXPECT_FALSE(row.next());
}

}  // namespace
