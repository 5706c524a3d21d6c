// TNumberFormat: tests of the derived limits, the property string and the printed line.
#include "TNumberFormat.h"

#include <gtest/gtest.h>

#include <limits>
#include <memory>
#include <sstream>

#include "support/CapturedStreams.h"

namespace {

using FormatPointer = std::unique_ptr<TNumberFormat>;

std::string printed(const TNumberFormat& format)
{
    std::ostringstream os;
    os << format;
    return os.str();
}

/// The error line with which a property string is refused.
std::string refusalOfFormat(const std::string& properties)
{
    const CapturedStreams streams;
    EXPECT_EQ(FormatPointer(TNumberFormat::create(properties)), nullptr) << properties;
    EXPECT_EQ(streams.out(), "");
    return streams.err();
}

}  // namespace

TEST(TNumberFormat, DerivesTheLimits)
{
    const struct {
        const char* properties;
        const char* line;
    } cases[] = {
        {"Fix_8_3", "NBITS=8 BINPT=3 Shift=8 Scale=8 Min=-32768 Max=32512 MinQ=-128 MaxQ=127 Mask=-256"},
        {"Fix_12_3", "NBITS=12 BINPT=3 Shift=4 Scale=8 Min=-32768 Max=32752 MinQ=-2048 MaxQ=2047 Mask=-16"},
        {"Fix_16_3", "NBITS=16 BINPT=3 Shift=0 Scale=8 Min=-32768 Max=32767 MinQ=-32768 MaxQ=32767 Mask=-1"},
        {"Fix_16_15", "NBITS=16 BINPT=15 Shift=0 Scale=32768 Min=-32768 Max=32767 MinQ=-32768 MaxQ=32767 Mask=-1"},
        {"Fix_2_1", "NBITS=2 BINPT=1 Shift=14 Scale=2 Min=-32768 Max=16384 MinQ=-2 MaxQ=1 Mask=-16384"},
    };
    for (const auto& [properties, line] : cases) {
        const CapturedStreams streams;
        const FormatPointer format(TNumberFormat::create(properties));
        ASSERT_NE(format, nullptr) << properties;
        EXPECT_EQ(printed(*format), line);
        EXPECT_EQ(format->getProperties(), properties);
        EXPECT_EQ(streams.out() + streams.err(), "");
    }
}

TEST(TNumberFormat, TakesShiftCountsModulo32OutsideTheCheckedRange)
{
    EXPECT_EQ(printed(TNumberFormat(17, 40)),
              "NBITS=17 BINPT=40 Shift=4294967295 Scale=256 Min=0 Max=0 MinQ=-65536 MaxQ=65535 Mask=0");
    EXPECT_EQ(printed(TNumberFormat(0, 0)),
              "NBITS=0 BINPT=0 Shift=16 Scale=1 Min=0 Max=0 MinQ=-2147483648 MaxQ=2147483647 Mask=0");
}

TEST(TNumberFormat, SkipsBlanksAndIgnoresWhatFollowsTheNumbers)
{
    for (const char* properties : {"Fix_ 8 _3", "Fix_8_ 3", "Fix_8_3_1", "Fix_8_3abc"}) {
        const FormatPointer format(TNumberFormat::create(properties));
        ASSERT_NE(format, nullptr) << properties;
        EXPECT_EQ(format->getProperties(), "Fix_8_3");
    }
}

TEST(TNumberFormat, RefusesOtherTextsAndRepeatsThem)
{
    for (const std::string properties : {"Fix",
                                         "Fix_",
                                         "Fix_8",
                                         "Fix_8_",
                                         "Fix_8:3",
                                         "Fix:8_3",
                                         "Fix_x_3",
                                         "Fix_4294967296_3",
                                         "fix_8_3",
                                         "Fx_8_3",
                                         "Fixx_8_3",
                                         " Fix_8_3",
                                         ""}) {
        EXPECT_EQ(refusalOfFormat(properties), "ERROR:TNumberFormat:Unexpected property string:" + properties + "\n");
    }
}

TEST(TNumberFormat, RefusesWidthsOutside1To16BeforeItLooksAtTheBinaryPoint)
{
    for (const char* properties : {"Fix_0_0", "Fix_17_3", "Fix_17_0", "Fix_-1_3"}) {
        EXPECT_EQ(refusalOfFormat(properties), "ERROR:TNumberFormat:nbits must be in range [1:16]\n") << properties;
    }
}

TEST(TNumberFormat, RefusesABinaryPointOf0OrNotBelowTheWidth)
{
    for (const char* properties : {"Fix_8_0", "Fix_8_8", "Fix_16_16", "Fix_16_17", "Fix_1_1", "Fix_1_0"}) {
        EXPECT_EQ(refusalOfFormat(properties), "ERROR:TNumberFormat:binpt must be in range [1:16] and <nbits\n")
            << properties;
    }
}

TEST(TNumberFormat, PrintsNoEndOfLineAndInTheStreamsNumberBase)
{
    const TNumberFormat format(8, 3);
    std::ostringstream os;
    os << format << format << std::hex << format;
    const std::string line = printed(format);
    EXPECT_EQ(os.str(),
              line + line + "NBITS=8 BINPT=3 Shift=8 Scale=8 Min=8000 Max=7f00 MinQ=ffffff80 MaxQ=7f Mask=ff00");
}

TEST(TNumberFormat, PlacesIntegersAlignedAndSaturated)
{
    const TNumberFormat format(8, 3);
    const struct {
        std::int32_t q;
        short word;
    } cases[] = {
        {0, 0},
        {1, 256},
        {-1, -256},
        {127, 32512},
        {128, 32512},
        {std::numeric_limits<std::int32_t>::max(), 32512},
        {-128, -32768},
        {-129, -32768},
        {std::numeric_limits<std::int32_t>::min(), -32768},
    };
    for (const auto& [q, word] : cases) {
        EXPECT_EQ(format.place(q), word) << q;
    }
}

TEST(TNumberFormat, ReadsWordsRoundingDownToTheFormatsBits)
{
    const TNumberFormat format(12, 3);
    const struct {
        short word;
        std::int32_t q;
        double real;
    } cases[] = {
        {0, 0, 0.0}, {16, 1, 0.125}, {24, 1, 0.125}, {-8, -1, -0.125}, {32767, 2047, 255.875}, {-32768, -2048, -256.0}};
    for (const auto& [word, q, real] : cases) {
        EXPECT_EQ(format.integer(word), q) << word;
        EXPECT_EQ(static_cast<double>(format.real(word)), real) << word;
    }
}

TEST(TNumberFormat, ReadsBackWhatItPlacesInEveryWidth)
{
    for (std::uint32_t bits = 2; bits <= 16; ++bits) {
        const TNumberFormat format(bits, 1);
        for (const std::int32_t q : {format.itsMinQ, format.itsMinQ + 1, -1, 0, 1, format.itsMaxQ}) {
            EXPECT_EQ(format.integer(format.place(q)), q) << bits;
        }
    }
}
