// Files that are no text, by their first bytes.
#include "base/FileKind.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using morvik::base::whyNoText;
using namespace std::string_literals;

TEST(FileKind, KnowsWhatIsNoText)
{
    EXPECT_STREQ(whyNoText("\x1F\x8B\x08\x08\xC0"s), "is compressed with gzip; unpack it by 'gunzip FILE'");
    EXPECT_STREQ(whyNoText("\xFD\x37zXZ\0\0\x04"s), "is compressed with xz; unpack it by 'unxz FILE'");
    EXPECT_STREQ(whyNoText("\x28\xB5\x2F\xFD\x24"s), "is compressed with zstd; unpack it by 'unzstd FILE'");
    EXPECT_STREQ(whyNoText("BZh91AY&SY"s), "is compressed with bzip2; unpack it by 'bunzip2 FILE'");
    EXPECT_STREQ(whyNoText("\0\0\0\0\0\0\0\x01\x49\0"s),
                 "is an FST waveform; convert it by GTKWave's 'fst2vcd FILE > FILE.vcd'");
    EXPECT_STREQ(whyNoText("\xFF\xFE$\0d\0"s), "is in UTF-16; convert it by 'iconv -f UTF-16 -t UTF-8 FILE > NEW'");
}

TEST(FileKind, TakesAnythingElseForAText)
{
    for (const std::string& text : {""s, "\x1F"s, "BZ"s, "half_iteration,step"s, "$date"s, "\xEF\xBB\xBFx"s, "\0\0"s}) {
        EXPECT_EQ(whyNoText(text), nullptr) << text;
    }
}

TEST(FileKind, KnowsWhatOtherProgramsUnpack)
{
    using morvik::base::Packing;
    using morvik::base::packingOf;
    EXPECT_EQ(packingOf("\x1F\x8B\x08"s), Packing::gzip);
    EXPECT_EQ(packingOf("\0\0\0\0\0\0\0\x01\x49\0"s), Packing::fst);
    EXPECT_EQ(packingOf("\xFE\0\0\0\0"s), Packing::fst);
    EXPECT_EQ(packingOf("BZh91AY&SY"s), Packing::none);
    EXPECT_EQ(packingOf("$date"s), Packing::none);
}

}  // namespace
