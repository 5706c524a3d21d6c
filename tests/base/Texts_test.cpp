// Numbers as text and back, blanks, and counts of things.
#include <gtest/gtest.h>

#include <cstdint>
#include <optional>

#include "base/Numbers.h"
#include "base/Text.h"

namespace morvik::base {
namespace {

TEST(Numbers, AreTheWholeText)
{
    EXPECT_EQ(parseNumber<std::int32_t>("-2147483648"), INT32_MIN);
    EXPECT_EQ(parseNumber<std::uint64_t>("18446744073709551615"), UINT64_MAX);
    EXPECT_EQ(parseNumber<double>("-1.5e3"), -1500.0);
    EXPECT_EQ(parseNumber<std::uint64_t>("fF", 16), 255U);
    for (const char* text : {"", " 1", "1 ", "+1", "1,", "2147483648", "0x1", "1.0"}) {
        EXPECT_EQ(parseNumber<std::int32_t>(text), std::nullopt) << text;
    }
    EXPECT_EQ(parseNumber<std::uint32_t>("-1"), std::nullopt);
}

TEST(Numbers, AreWrittenAsShortAsCanBe)
{
    EXPECT_EQ(numberText(1234.5), "1234.5");
    EXPECT_EQ(numberText(0.1 + 0.2), "0.30000000000000004");
    EXPECT_EQ(numberText(2.5, std::chars_format::fixed, 3), "2.500");
    EXPECT_EQ(numberText(255U, 16), "ff");
}

TEST(Numbers, AreTakenFromTheBeginningOfAText)
{
    std::string_view rest = "step -12, x";
    EXPECT_FALSE(take(rest, "pass"));
    EXPECT_TRUE(take(rest, "step "));
    EXPECT_EQ(takeInteger(rest), -12);
    EXPECT_EQ(rest, ", x");
    EXPECT_EQ(takeInteger(rest), std::nullopt);
    EXPECT_EQ(rest, ", x");
}

TEST(Text, LosesTheBlanksAroundIt)
{
    EXPECT_EQ(trimmed(" \ta b\r"), "a b");
    EXPECT_EQ(trimmed(" \t\r"), "");
    EXPECT_EQ(withoutMark("\xEF\xBB\xBF"
                          "a"),
              "a");
    EXPECT_EQ(withoutMark("\xEF\xBB"), "\xEF\xBB");
}

TEST(Text, CountsOneAndSeveral)
{
    EXPECT_EQ(counted(0, "row"), "0 rows");
    EXPECT_EQ(counted(1, "bit error"), "1 bit error");
    EXPECT_EQ(counted(UINT64_MAX, "row"), "18446744073709551615 rows");
    EXPECT_EQ(plural("signal", 1), "signal");
}

TEST(Text, ListsNeighboursAsRanges)
{
    const auto name = [](unsigned number) {
        return std::to_string(number);
    };
    const auto withinTens = [](unsigned number) {
        return number % 10 != 0;
    };
    EXPECT_EQ(listed({}, name, withinTens), "");
    EXPECT_EQ(listed({1, 2, 4, 6, 7, 8}, name, withinTens), "1, 2, 4, 6 to 8");
    EXPECT_EQ(listed({7, 8, 9, 10, 11, 12}, name, withinTens), "7 to 9, 10 to 12");
}

}  // namespace
}  // namespace morvik::base
