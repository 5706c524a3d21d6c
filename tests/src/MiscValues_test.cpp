// Misc: tests of the conversions between values and short texts.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <sstream>

#include "Misc.h"
#include "support/CommaLocale.h"

namespace {

using namespace std::string_literals;

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

double justAbove(double value)
{
    return std::nextafter(value, kInfinity);
}

double justBelow(double value)
{
    return std::nextafter(value, -kInfinity);
}

// --- toSIString ----------------------------------------------------------------------------------

TEST(ToSIString, FormatsTheDocumentedExamples)
{
    EXPECT_EQ(toSIString(1500.0, 2), "1.50 k");
    EXPECT_EQ(toSIString(0.25, 1), "250.0 m");
    EXPECT_EQ(toSIString(2e-6, 2), "2.00 u");
    EXPECT_EQ(toSIString(-3e9, 1), "-3.0 G");
    EXPECT_EQ(toSIString(0.0, 2), "0.00 ");
    EXPECT_EQ(toSIString(5e14, 1), "500.0 T");
    EXPECT_EQ(toSIString(1e-9, 3), "0.001 u");
    EXPECT_EQ(toSIString(1e-10, 1), "0.1 n");
    EXPECT_EQ(toSIString(1e-16, 2), "0.00 ");
}

TEST(ToSIString, ChangesThePrefixStrictlyBeyondEachLimit)
{
    struct Limit {
        double value;
        unsigned precision;
        const char* at;
        const char* beyond;
    };
    const Limit limits[] = {
        {5e14, 1, "500.0 T", "0.5 P"},
        {5e11, 1, "500.0 G", "0.5 T"},
        {5e8, 1, "500.0 M", "0.5 G"},
        {5e5, 1, "500.0 k", "0.5 M"},
        {500, 1, "500.0 ", "0.5 k"},
        {0.5, 1, "500.0 m", "0.5 "},
        {5e-4, 1, "500.0 u", "0.5 m"},
        {5e-10, 4, "0.5000 n", "0.0005 u"},
        {5e-13, 4, "0.5000 p", "0.0005 n"},
    };
    for (const Limit& limit : limits) {
        EXPECT_EQ(toSIString(limit.value, limit.precision), limit.at) << limit.value;
        EXPECT_EQ(toSIString(justAbove(limit.value), limit.precision), limit.beyond) << limit.value;
        EXPECT_EQ(toSIString(-limit.value, limit.precision), "-"s + limit.at) << limit.value;
        EXPECT_EQ(toSIString(-justAbove(limit.value), limit.precision), "-"s + limit.beyond) << limit.value;
    }
}

TEST(ToSIString, TakesAValueBelow1e15thAsUnscaled)
{
    EXPECT_EQ(toSIString(1e-15, 3), "0.001 p");
    EXPECT_EQ(toSIString(justBelow(1e-15), 3), "0.000 ");
    EXPECT_EQ(toSIString(-1e-16, 18), "-0.000000000000000100 ");
}

TEST(ToSIString, PrintsTwoDigitsByDefault)
{
    EXPECT_EQ(toSIString(1500.0), "1.50 k");
    EXPECT_EQ(toSIString(1500.0L), "1.50 k");
    EXPECT_EQ(toSIString(std::uint64_t{1500}), "1.50 k");
    EXPECT_EQ(toSIString(std::uint32_t{1500}), "1.50 k");
}

TEST(ToSIString, PrintsNoPointWithPrecisionZero)
{
    EXPECT_EQ(toSIString(1400.0, 0), "1 k");
    EXPECT_EQ(toSIString(499.6, 0), "500 ");
}

TEST(ToSIString, ConvertsUnsignedValuesWithoutASign)
{
    EXPECT_EQ(toSIString(std::uint64_t{1} << 63, 2), "9223.37 P");
    EXPECT_EQ(toSIString(std::numeric_limits<std::uint32_t>::max(), 3), "4.295 G");
    EXPECT_EQ(toSIString(std::uint64_t{0}, 1), "0.0 ");
    // 2^53 + 1, which a double would round to an even number.
    EXPECT_EQ(toSIString(std::uint64_t{9007199254740993}, 15), "9.007199254740993 P");
}

TEST(ToSIString, ScalesInExtendedPrecision)
{
    // In double arithmetic the digits would be 18446.744073709551.
    EXPECT_EQ(toSIString(std::numeric_limits<std::uint64_t>::max(), 12), "18446.744073709552 P");
    // 2^16000 is about 3.019e4816, beyond the doubles.
    const std::string largest = toSIString(0x1p16000L, 0);
    EXPECT_EQ(largest.substr(0, 3), "301");
    EXPECT_EQ(largest.size(), 4802U + 2U);
}

TEST(ToSIString, KeepsTheSignOfANegativeZero)
{
    EXPECT_EQ(toSIString(-0.0, 1), "-0.0 ");
}

TEST(ToSIString, FormatsValuesThatAreNoNumbers)
{
    EXPECT_EQ(toSIString(kInfinity, 3), "inf P");
    EXPECT_EQ(toSIString(-kInfinity, 3), "-inf P");
    EXPECT_EQ(toSIString(kNaN, 3), "nan p");
    EXPECT_EQ(toSIString(kInfinity, 20000), "inf P");
}

TEST(ToSIString, PrintsEveryDigitOfTheLongestFraction)
{
    // The smallest long double, 2^-16445 on x86, ends in a 5 at its 16445th digit.
    using Limits = std::numeric_limits<long double>;
    const long double smallest = Limits::denorm_min();
    constexpr unsigned digits = static_cast<unsigned>(Limits::digits - Limits::min_exponent);
    const std::string exact = toSIString(smallest, digits);
    EXPECT_EQ(exact.size(), 2U + digits + 1U);
    EXPECT_EQ(exact.substr(exact.size() - 2), "5 ");
    EXPECT_EQ(toSIString(smallest, digits + 2), exact.substr(0, exact.size() - 1) + "00 ");
}

TEST(ToSIString, SurvivesAPrecisionBeyondTheStack)
{
    const std::string text = toSIString(1.5, 20000000);
    EXPECT_EQ(text.size(), 2U + 20000000U + 1U);
    EXPECT_EQ(text.substr(0, 6), "1.5000");
    EXPECT_EQ(text.find_first_not_of('0', 3), text.size() - 1);
}

// --- timeToString --------------------------------------------------------------------------------

TEST(TimeToString, ChoosesTheUnitAtEachLimit)
{
    EXPECT_EQ(timeToString(0U), "0s");
    EXPECT_EQ(timeToString(59U), "59s");
    EXPECT_EQ(timeToString(60U), "1min");
    EXPECT_EQ(timeToString(90U), "1.5min");
    EXPECT_EQ(timeToString(3599U), "59.9833min");
    EXPECT_EQ(timeToString(3600U), "1hr");
    EXPECT_EQ(timeToString(86400U), "24hr");
    EXPECT_EQ(timeToString(259199U), "71.9997hr");
    EXPECT_EQ(timeToString(259200U), "1days");
    EXPECT_EQ(timeToString(345600U), "1.33333days");
    EXPECT_EQ(timeToString(std::numeric_limits<std::uint32_t>::max()), "16570.1days");
}

TEST(TimeToString, TruncatesADoubleTowardZero)
{
    EXPECT_EQ(timeToString(59.999), "59s");
    EXPECT_EQ(timeToString(90.9), "1.5min");
    EXPECT_EQ(timeToString(-0.9), "0s");
    EXPECT_EQ(timeToString(-1.9), "16570.1days");
}

TEST(TimeToString, TakesTheLow32BitsOfADouble)
{
    EXPECT_EQ(timeToString(4294967296.0 + 59), "59s");
    EXPECT_EQ(timeToString(-4294967296.0 + 90), "1.5min");
    EXPECT_EQ(timeToString(0x1p40), "0s");
}

TEST(TimeToString, TakesADoubleBeyond64BitsAsZero)
{
    EXPECT_EQ(timeToString(justBelow(0x1p63)), "16570.1days");  // 2^63 - 1024
    EXPECT_EQ(timeToString(-justBelow(0x1p63)), "17.0667min");  // 1024 - 2^63
    EXPECT_EQ(timeToString(0x1p63), "0s");
    EXPECT_EQ(timeToString(-0x1p63), "0s");
    EXPECT_EQ(timeToString(0x1p64 - 2048), "0s");
    EXPECT_EQ(timeToString(1e300), "0s");
    EXPECT_EQ(timeToString(kInfinity), "0s");
    EXPECT_EQ(timeToString(-kInfinity), "0s");
    EXPECT_EQ(timeToString(kNaN), "0s");
}

TEST(TimeToString, TakesASignedLongAsUnsigned)
{
    EXPECT_EQ(timeToString(90L), "1.5min");
    EXPECT_EQ(timeToString(-1L), "16570.1days");
    EXPECT_EQ(timeToString(std::numeric_limits<long>::max()), sizeof(long) > 4 ? "16570.1days" : "8285.04days");
    EXPECT_EQ(timeToString(std::numeric_limits<long>::min()), sizeof(long) > 4 ? "0s" : "8285.04days");
}

// --- stringToTime --------------------------------------------------------------------------------

TEST(StringToTime, MultipliesByTheUnit)
{
    EXPECT_EQ(stringToTime("90"), 90);
    EXPECT_EQ(stringToTime("90s"), 90);
    EXPECT_EQ(stringToTime("1.5m"), 90);
    EXPECT_EQ(stringToTime("2 hours"), 7200);
    EXPECT_EQ(stringToTime("1D"), 259200);
    EXPECT_EQ(stringToTime("3M"), 180);
    EXPECT_EQ(stringToTime("3H"), 10800);
    EXPECT_EQ(stringToTime("3d"), 777600);
}

TEST(StringToTime, TakesAnyOtherUnitAsSeconds)
{
    EXPECT_EQ(stringToTime("7x"), 7);
    EXPECT_EQ(stringToTime("7 , 5"), 7);
    EXPECT_EQ(stringToTime("7\0m"s), 7);
    EXPECT_EQ(stringToTime("7\xcdm"), 7);  // 'M' with the top bit set
}

TEST(StringToTime, ReadsNumbersAsStreamsDo)
{
    EXPECT_EQ(stringToTime(" \t\n +2.5e1 \t m"), 1500);
    EXPECT_EQ(stringToTime("-5"), -5);
    EXPECT_EQ(stringToTime("-1.5h"), -5400);
    EXPECT_EQ(stringToTime(".5m"), 30);
    EXPECT_EQ(stringToTime("0x10"), 0);
    EXPECT_EQ(stringToTime("1,500"), 1);
}

TEST(StringToTime, TruncatesTowardZero)
{
    EXPECT_EQ(stringToTime("0.9s"), 0);
    EXPECT_EQ(stringToTime("-0.9"), 0);
    EXPECT_EQ(stringToTime("1.999"), 1);
    EXPECT_EQ(stringToTime("-1.999"), -1);
}

TEST(StringToTime, FormsTheProductInExtendedPrecision)
{
    // The double next to 0.7 lies below it; its product with 60 is 42 only when rounded to a double.
    EXPECT_EQ(stringToTime("0.7m"), 41);
    EXPECT_EQ(stringToTime("1.1m"), 66);
}

TEST(StringToTime, GivesZeroWithoutANumber)
{
    for (const char* text : {"", "  ", "m", "hello", "-", "+m", ".", "1e", "inf", "-inf", "nan", "NaN d"}) {
        EXPECT_EQ(stringToTime(text), 0) << text;
    }
}

TEST(StringToTime, ClipsToTheRangeOfTheResult)
{
    constexpr std::int32_t kLargest = std::numeric_limits<std::int32_t>::max();
    constexpr std::int32_t kSmallest = std::numeric_limits<std::int32_t>::min();
    EXPECT_EQ(stringToTime("2147483646.9"), kLargest - 1);
    EXPECT_EQ(stringToTime("2147483647"), kLargest);
    EXPECT_EQ(stringToTime("2147483648"), kLargest);
    EXPECT_EQ(stringToTime("-2147483647.9"), kSmallest + 1);
    EXPECT_EQ(stringToTime("-2147483648"), kSmallest);
    EXPECT_EQ(stringToTime("-2147483649"), kSmallest);
    EXPECT_EQ(stringToTime("8285d"), 8285 * 259200);
    EXPECT_EQ(stringToTime("8286d"), kLargest);
    EXPECT_EQ(stringToTime("1e30"), kLargest);
    EXPECT_EQ(stringToTime("-1e30"), kSmallest);
    EXPECT_EQ(stringToTime("1e308d"), kLargest);
    EXPECT_EQ(stringToTime("1e999"), kLargest);
    EXPECT_EQ(stringToTime("-1e999d"), kSmallest);
    EXPECT_EQ(stringToTime("1e-999d"), 0);
}

TEST(StringToTime, ReadsWhatTimeToStringWrites)
{
    for (const std::uint32_t seconds : {0U, 59U, 60U, 90U, 3600U, 86400U, 259200U, 25920000U}) {
        EXPECT_EQ(stringToTime(timeToString(seconds)), static_cast<std::int32_t>(seconds));
    }
}

// --- all -----------------------------------------------------------------------------------------

TEST(Misc, FormatsAndReadsNumbersAlikeUnderEveryGlobalLocale)
{
    const CommaLocale locale;
    std::ostringstream local;
    local << 1234.5;
    ASSERT_EQ(local.str(), "1.234,5");

    EXPECT_EQ(toSIString(1234500.0, 2), "1.23 M");
    EXPECT_EQ(toSIString(1e20L, 1), "100000.0 P");
    EXPECT_EQ(timeToString(90U), "1.5min");
    EXPECT_EQ(timeToString(4294967295U), "16570.1days");
    EXPECT_EQ(stringToTime("1.5m"), 90);
    EXPECT_EQ(stringToTime("1,5m"), 1);
    EXPECT_EQ(stringToTime("1.234"), 1);
}

}  // namespace
