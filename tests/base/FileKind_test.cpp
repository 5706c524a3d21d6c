// Files that are no text, by their first bytes.
#include "base/FileKind.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using morvik::base::whyNoText;
using namespace std::string_literals;

TEST(FileKind, KnowsWhatIsNoText)
{
    EXPECT_STREQ(whyNoText("\x1F\x8B\x08\x08\xC0"s), "is compressed by gzip; 'gunzip FILE' unpacks it");
    EXPECT_STREQ(whyNoText("\xFD\x37zXZ\0\0\x04"s), "is compressed by xz; 'unxz FILE' unpacks it");
    EXPECT_STREQ(whyNoText("\x28\xB5\x2F\xFD\x24"s), "is compressed by zstd; 'unzstd FILE' unpacks it");
    EXPECT_STREQ(whyNoText("BZh91AY&SY"s), "is compressed by bzip2; 'bunzip2 FILE' unpacks it");
    EXPECT_STREQ(whyNoText("\0\0\0\0\0\0\0\x01\x49\0"s),
                 "is an FST waveform; 'fst2vcd FILE > FILE.vcd' of GTKWave makes a VCD of it");
    EXPECT_STREQ(whyNoText("\xFF\xFE$\0d\0"s),
                 "is in UTF-16; 'iconv -f UTF-16 -t UTF-8 FILE > NEW' makes a text of it");
}

TEST(FileKind, TakesAnythingElseForAText)
{
    for (const std::string& text : {""s, "\x1F"s, "BZ"s, "half_iteration,step"s, "$date"s, "\xEF\xBB\xBFx"s, "\0\0"s}) {
        EXPECT_EQ(whyNoText(text), nullptr) << text;
    }
}

}  // namespace
