// Frames: ranges as text, and sets of them that are joined.
#include "simulation/Frames.h"

#include <gtest/gtest.h>

namespace morvik::simulation {
namespace {

FrameSet framesOf(const char* text)
{
    return FrameSet::parse(text).value();
}

TEST(Frames, ReadARange)
{
    EXPECT_EQ(parseFrameRange("0:10"), (FrameRange{0, 10}));
    EXPECT_EQ(parseFrameRange("7:18446744073709551615"), (FrameRange{7, UINT64_MAX}));
}

TEST(Frames, RefuseARangeThatIsNoneOrEmptyOrReversed)
{
    for (const char* text :
         {"", ":", "1", "1:", ":1", "1:1", "2:1", "a:b", "-1:2", "1:2:3", "0:18446744073709551616"}) {
        EXPECT_EQ(parseFrameRange(text), std::nullopt) << text;
    }
}

TEST(Frames, JoinNeighboursIntoOneRange)
{
    FrameSet frames(FrameRange{10, 20});
    EXPECT_TRUE(frames.join(FrameSet(FrameRange{20, 30})));
    EXPECT_TRUE(frames.join(FrameSet(FrameRange{0, 10})));
    EXPECT_EQ(frames.text(), "0:30");
    EXPECT_EQ(frames.size(), 30U);
}

TEST(Frames, KeepGaps)
{
    FrameSet frames(FrameRange{40, 50});
    EXPECT_TRUE(frames.join(framesOf("0:10 20:30")));
    EXPECT_EQ(frames.text(), "0:10 20:30 40:50");
    EXPECT_EQ(frames.size(), 30U);
    EXPECT_TRUE(frames.join(framesOf("10:20 30:40")));
    EXPECT_EQ(frames.text(), "0:50");
}

TEST(Frames, RefuseToJoinWhatTheyHave)
{
    for (const char* other : {"10:20", "0:11", "19:30", "12:15", "0:100", "0:5 15:16"}) {
        FrameSet frames(FrameRange{10, 20});
        EXPECT_FALSE(frames.join(framesOf(other))) << other;
        EXPECT_EQ(frames.text(), "10:20");
    }
}

TEST(Frames, OfAnEmptyRangeAreNone)
{
    const FrameSet none(FrameRange{5, 5});
    EXPECT_EQ(none.size(), 0U);
    EXPECT_EQ(none.text(), "");
}

TEST(Frames, ReadASet)
{
    EXPECT_EQ(framesOf("").size(), 0U);
    EXPECT_EQ(framesOf("0:10 30:40").text(), "0:10 30:40");
    for (const char* text : {" ", "0:10  20:30", "0:10,20:30", "0:10 5:15", "0:10 x"}) {
        EXPECT_FALSE(FrameSet::parse(text).has_value()) << text;
    }
}

}  // namespace
}  // namespace morvik::simulation
