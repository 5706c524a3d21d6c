// Thousandths: what is read as a decimal of three places, and how it is written.
#include "base/Thousandths.h"

#include <gtest/gtest.h>

#include <climits>

namespace morvik::base {
namespace {

TEST(Thousandths, ReadsDecimals)
{
    EXPECT_EQ(parseThousandths("0"), 0);
    EXPECT_EQ(parseThousandths("1.2"), 1200);
    EXPECT_EQ(parseThousandths("-0.05"), -50);
    EXPECT_EQ(parseThousandths("+3"), 3000);
    EXPECT_EQ(parseThousandths(".125"), 125);
    EXPECT_EQ(parseThousandths("7."), 7000);
    EXPECT_EQ(parseThousandths("0.001"), 1);
    EXPECT_EQ(parseThousandths("1.2340000"), 1234);
    EXPECT_EQ(parseThousandths("999999.999"), 999999999);
    EXPECT_EQ(parseThousandths("-999999.999"), -999999999);
}

TEST(Thousandths, RefusesWhatIsNoneOrTooFineOrTooLarge)
{
    for (const char* text :
         {"", "-", "+", ".", "-.", "1.2345", "1e3", "0x1", "1,2", " 1", "1 ", "1.2.3", "--1", "1-", "1000000"}) {
        EXPECT_EQ(parseThousandths(text), std::nullopt) << text;
    }
}

TEST(Thousandths, WritesTheShortestDecimal)
{
    EXPECT_EQ(thousandthsText(0), "0");
    EXPECT_EQ(thousandthsText(1200), "1.2");
    EXPECT_EQ(thousandthsText(-50), "-0.05");
    EXPECT_EQ(thousandthsText(3000), "3");
    EXPECT_EQ(thousandthsText(-1), "-0.001");
    EXPECT_EQ(thousandthsText(INT_MAX), "2147483.647");
}

TEST(Thousandths, ReadsWhatItWrites)
{
    for (int value = -12345; value <= 12345; ++value) {
        ASSERT_EQ(parseThousandths(thousandthsText(value)), value);
    }
}

}  // namespace
}  // namespace morvik::base
