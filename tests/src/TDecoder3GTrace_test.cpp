// TDecoder3G: tests of the trace: input streams, tables, and the count of passes.
#include <gtest/gtest.h>

#include <iomanip>
#include <memory>
#include <numeric>
#include <sstream>

#include "DecoderState.h"
#include "TDecoder3G.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"

namespace {

using Bits = std::vector<unsigned char>;
using Soft = std::vector<short>;

class TDecoder3GTrace : public testing::Test {
protected:
    std::unique_ptr<TDecoder> makeDecoder(bool layout3GPP2 = false) const
    {
        std::unique_ptr<TDecoder> decoder(TDecoder3G::create(layout3GPP2, ""));
        decoder->itsInterleaver = itsParts.state()->interleaver;
        decoder->itsEngine = itsParts.state()->engine;
        return decoder;
    }

private:
    morvik::blocks::Decoder itsParts{2, 0};  // owns interleaver and engine
};

/// The lines of a trace that tell what was traced: "in" for input streams, else the pass.
std::string tracedParts(const std::string& trace)
{
    std::istringstream lines(trace);
    std::string parts;
    for (std::string line; std::getline(lines, line);) {
        if (line.rfind("itsSys [0]=[", 0) == 0) {
            parts += "in;";
        } else if (line.rfind("decode=", 0) == 0) {
            parts += line + ";";
        }
    }
    return parts;
}

/// A row of the trace table from its step and its 23 values.
std::string traceRow(const std::string& step, const std::vector<std::string>& values)
{
    const auto padded = [](std::string field, std::size_t width) {
        field.resize(width, ' ');
        return field;
    };
    std::string row = padded(step, 5);
    for (std::size_t i = 0; i < values.size(); ++i) {
        row += padded(values[i], 12);
        row += i == 0 || i == 8 || i == 16 || i == 20 ? "  " : "";
    }
    return row + "\n";
}

}  // namespace

TEST_F(TDecoder3GTrace, DumpsTheInputStreams)
{
    const struct {
        bool layout3GPP2;
        std::size_t length;
        const char* lines;
    } cases[] = {{false,
                  12,
                  "itsSys [0]=[-1 3 5]\nitsPar0[0]=[2 4 6]\nitsPar1[0]=[0 0 0]\n"
                  "itsSys [1]=[7 9 11]\nitsPar0[1]=[8 10 12]\nitsPar1[1]=[0 0 0]\n"},
                 {true,
                  18,
                  "itsSys [0]=[-1 4 7]\nitsPar0[0]=[2 5 8]\nitsPar1[0]=[3 6 9]\n"
                  "itsSys [1]=[10 13 16]\nitsPar0[1]=[11 14 17]\nitsPar1[1]=[12 15 18]\n"}};
    for (const auto& [layout3GPP2, length, lines] : cases) {
        const auto decoder = makeDecoder(layout3GPP2);
        Soft soft(length);
        std::iota(soft.begin(), soft.end(), short{1});
        soft[0] = -1;
        Bits hard;
        const CapturedStreams streams;
        ASSERT_TRUE(decoder->decode(soft, hard, 0));
        EXPECT_EQ(streams.out(), "");
        decoder->itsDumpCount = 1;
        ASSERT_TRUE(decoder->decode(soft, hard, 0));
        EXPECT_EQ(streams.out(), std::string(120, '-') + "\n" + lines);
        EXPECT_EQ(streams.err(), "");
    }
}

TEST_F(TDecoder3GTrace, DumpsATableOfRealNumbersWhateverTheStreamIsSetTo)
{
    const auto decoder = makeDecoder();
    decoder->allocate(3);
    decoder->itsDecodeCount = 10;
    decoder->itsIntrinsic[1] = -8;  // rounded down to a step: -1 of 1/8
    decoder->itsAlpha[1] = {{0, 16, 24, 32, -16, -24, -32, 2032}};
    decoder->itsBeta[1] = {{-32768, 32767, 0, 0, 0, 0, 0, -128}};
    decoder->itsGamma[1] = {{1, 2, 3, 4, 64, -64, 0, 800}};
    decoder->itsLLR[1] = 16000;
    decoder->itsExtrinsic[1] = 8;

    const std::vector<std::string> zeros(23, "+0.000000");
    const std::vector<std::string> values = {
        "-0.125000",  "+0.000000",   "+0.125000",   "+0.125000", "+0.250000", "-0.125000",   "-0.250000", "-0.250000",
        "+15.875000", "-256.000000", "+255.875000", "+0.000000", "+0.000000", "+0.000000",   "+0.000000", "+0.000000",
        "-1.000000",  "+0.500000",   "-0.500000",   "+0.000000", "+6.250000", "+125.000000", "+0.000000"};
    const std::string header =
        "n    int           a0          a1          a2          a3          a4          a5          a6          a7"
        "            b0          b1          b2          b3          b4          b5          b6          b7"
        "            g4          g5          g6          g7            llr         ext";
    const std::string table = std::string(289, '-') + "\ndecode=10 siso=17\n" + header + "\n" + traceRow("0", zeros) +
                              traceRow("1", values) + traceRow("2", zeros);
    EXPECT_EQ(traceRow("1", values).size(), 290U);  // a full row and its end of line

    std::ostringstream os;
    os << std::hex << std::showbase << std::setprecision(2) << std::setfill('*') << std::setw(40);
    decoder->dumpFull(os, 17);
    EXPECT_EQ(os.str(), table);
    decoder->dump(os);
    EXPECT_EQ(os.str(), table);
}

TEST_F(TDecoder3GTrace, TracesPassesWhileTheDumpCountLasts)
{
    const struct {
        unsigned count;
        const char* parts;  // of three decodes with two iterations each
    } cases[] = {
        {0, ""},
        {1, "in;decode=0 siso=0;"},
        {3, "in;decode=0 siso=0;decode=0 siso=1;decode=0 siso=2;"},
        {5,
         "in;decode=0 siso=0;decode=0 siso=1;decode=0 siso=2;decode=0 siso=3;"
         "in;decode=1 siso=0;"},
    };
    for (const auto& [count, parts] : cases) {
        const auto decoder = makeDecoder();
        decoder->itsDumpCount = count;
        Bits hard;
        const CapturedStreams streams;
        for (unsigned block = 0; block < 3; ++block) {
            EXPECT_TRUE(decoder->decode(Soft(132), hard, 2));
        }
        EXPECT_EQ(tracedParts(streams.out()), parts);
        EXPECT_EQ(streams.err(), "");
        EXPECT_EQ(decoder->itsHalfIterationCount, 12U);
    }
}

TEST_F(TDecoder3GTrace, EndsTheDecodeWhenTheDumpIsComplete)
{
    const auto decoder = makeDecoder();
    decoder->itsDumpCount = 3;
    decoder->itsStopAfterDump = true;
    Bits hard{7};
    const CapturedStreams streams;
    EXPECT_FALSE(decoder->decode(Soft(132), hard, 2));
    EXPECT_EQ(tracedParts(streams.out()), "in;decode=0 siso=0;decode=0 siso=1;decode=0 siso=2;");
    EXPECT_EQ(streams.err(), "STOP:Dump complete\n");
    EXPECT_EQ(hard, Bits{7});
    EXPECT_EQ(decoder->itsDecodeCount, 0U);
    EXPECT_EQ(decoder->itsHalfIterationCount, 0U);
}
