// TDecoder3GPU: tests of the property string, the segmentation, the border columns and the trace.
#include "TDecoder3GPU.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <sstream>
#include <utility>

#include "DecoderState.h"
#include "TCalculationEngineModBase.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/PlainDecoder.h"

namespace {

using Bits = std::vector<unsigned char>;
using Soft = std::vector<short>;

constexpr int algorithms[] = {0, 1, 2};

/// A decoder of the given units and threads, with the engine and scale of an algorithm type.
class Units : public TDecoder3GPU {
public:
    explicit Units(unsigned units, unsigned threads = 4, int algorithm = 0, bool layout3GPP2 = false)
        : TDecoder3GPU(layout3GPP2, units, threads), itsParts(2, algorithm)
    {
        itsInterleaver = itsParts.state()->interleaver;
        itsEngine = itsParts.state()->engine;
        itsExtrinsicScale = itsParts.state()->decoder->itsExtrinsicScale;
    }

    using TDecoder3GPU::preCalcBetaTail;

private:
    morvik::blocks::Decoder itsParts;  // owns interleaver and engine
};

/// Soft values of -128 to 127 aligned and in the order of the input vector.
Soft aligned(const morvik::blocks::Block& block)
{
    Soft soft;
    for (std::size_t k = 0; k < block.sys.size(); ++k) {
        for (const std::int32_t value : {block.sys[k], block.par1[k], block.par2[k]}) {
            soft.push_back(static_cast<short>(16 * value));
        }
    }
    return soft;
}

Soft drawSoft(morvik::blocks::Random& random,
              unsigned K,
              morvik::blocks::Values values = morvik::blocks::Values::uniform)
{
    return aligned(morvik::blocks::randomBlock(random, K, values));
}

std::vector<int> firstOf(const Soft& values, std::size_t count)
{
    return {values.begin(), values.begin() + static_cast<std::ptrdiff_t>(count)};
}

template <class PlainColumn>
void expectColumns(const T8* got, const std::vector<PlainColumn>& expected, const char* what)
{
    for (std::size_t k = 0; k < expected.size(); ++k) {
        PlainColumn column;
        std::copy_n(got[k].metric, column.size(), column.begin());
        ASSERT_EQ(column, expected[k]) << what << ", step " << k;
    }
}

void expectPass(const TDecoder3GPU& decoder, const morvik::plain::Pass& pass)
{
    EXPECT_EQ(firstOf(decoder.itsIntrinsic, pass.intrinsic.size()), pass.intrinsic);
    expectColumns(decoder.itsGamma, pass.gamma, "gamma");
    expectColumns(decoder.itsAlpha, pass.alpha, "alpha");
    expectColumns(decoder.itsBeta, pass.beta, "beta");
    EXPECT_EQ(firstOf(decoder.itsLLR, pass.llr.size()), pass.llr);
    EXPECT_EQ(firstOf(decoder.itsExtrinsic, pass.extrinsic.size()), pass.extrinsic);
}

std::string textOf(const std::vector<TDecoder3GPU::ABSegment>& segments)
{
    std::ostringstream os;
    for (const TDecoder3GPU::ABSegment& segment : segments) {
        os << segment;
    }
    return os.str();
}

/// The error line with which a property string is refused.
std::string refusalOfUnits(const std::string& properties)
{
    const CapturedStreams streams;
    EXPECT_EQ(std::unique_ptr<TDecoder>(TDecoder3GPU::create(false, properties)), nullptr) << properties;
    EXPECT_EQ(streams.out(), "");
    return streams.err();
}

}  // namespace

TEST(TDecoder3GPU, ReadsUnitsAndThreadsFromItsProperties)
{
    const struct {
        bool layout3GPP2;
        const char* given;
        const char* properties;
    } cases[] = {{false, "", "3GPPPU:4"},
                 {false, "8", "3GPPPU:8"},
                 {false, "2,1", "3GPPPU:2,1"},
                 {false, "8,4", "3GPPPU:8"},
                 {false, "3;7", "3GPPPU:3"},
                 {false, " 2 ,1", "3GPPPU:2"},
                 {false, "2, 8x", "3GPPPU:2,8"},
                 {true, "", "3GPP2PU:4"},
                 {true, "2,1", "3GPP2PU:2,1"}};
    for (const auto& [layout3GPP2, given, properties] : cases) {
        const std::unique_ptr<TDecoder> decoder(TDecoder3GPU::create(layout3GPP2, given));
        ASSERT_NE(decoder, nullptr) << given;
        EXPECT_EQ(decoder->getProperties(), properties) << given;
    }
}

TEST(TDecoder3GPU, RefusesNoUnitsNoThreadsAndWhatIsNoNumber)
{
    for (const char* properties : {"0", "x", ",4", "0,4"}) {
        EXPECT_EQ(refusalOfUnits(properties), "ERROR:TDecoder3GPU:Illegal number of processing units:0\n")
            << properties;
    }
    EXPECT_EQ(refusalOfUnits("4294967296"), "ERROR:TDecoder3GPU:Illegal number of processing units:4294967295\n");
    for (const char* properties : {"4,0", "4,x", "4,,"}) {
        EXPECT_EQ(refusalOfUnits(properties), "ERROR:TDecoder3GPU:Illegal number of threads per processing unit:0\n")
            << properties;
    }
}

TEST(TDecoder3GPU, CutsBlocksIntoSegmentsForEveryThreadDownTo64Steps)
{
    const struct {
        unsigned units;
        unsigned threads;
        unsigned K;
        std::uint32_t segments;
        std::size_t windows;
    } cases[] = {
        {2, 4, 40, 1, 1},
        {8, 4, 127, 1, 2},
        {4, 4, 128, 2, 2},
        {4, 4, 254, 2, 4},
        {4, 4, 256, 4, 4},
        {4, 4, 508, 4, 8},
        {4, 4, 512, 8, 8},
        {4, 4, 1016, 8, 16},
        {4, 4, 1024, 16, 16},
        {2, 4, 6144, 8, 96},
        {4, 4, 6144, 16, 96},
        {8, 4, 6144, 32, 96},
        {2, 1, 6144, 2, 96},
        {1, 1, 6144, 1, 96},
        {1, 2, 128, 2, 2},
        {3, 1, 128, 2, 2},
        {3, 1, 256, 4, 4},
        {5, 1, 1024, 8, 16},
    };
    for (const auto& [units, threads, K, segments, windows] : cases) {
        SCOPED_TRACE(testing::Message() << units << "," << threads << " K=" << K);
        Units decoder(units, threads);
        ASSERT_TRUE(decoder.allocate(K + 3));
        EXPECT_EQ(decoder.itsNT, segments);
        ASSERT_EQ(decoder.itsAlphaSegment.size(), segments);
        EXPECT_EQ(decoder.itsBetaSegment.size(), windows);
        for (std::uint32_t u = 0; u < segments; ++u) {
            EXPECT_EQ(decoder.itsAlphaSegment[u].from, u * (K / segments));
            EXPECT_EQ(decoder.itsAlphaSegment[u].to, (u + 1) * (K / segments));
        }
        for (const unsigned d : {0U, 1U}) {
            EXPECT_EQ(decoder.itsAlphaInit[d].size(), segments);
            EXPECT_EQ(decoder.itsBetaInit[d].size(), windows);
        }
    }
}

TEST(TDecoder3GPU, CutsSegmentsIntoWindowsAndHalvesTheRest)
{
    const struct {
        unsigned K;
        const char* windows;
    } cases[] = {{40, "[39,0)"},
                 {64, "[63,0)"},
                 {65, "[32,0)[64,32)"},
                 {100, "[49,0)[99,49)"},
                 {127, "[63,0)[126,63)"},
                 {128, "[63,0)[127,63)"},
                 {129, "[63,0)[96,63)[128,96)"},
                 {191, "[63,0)[127,63)[190,127)"}};
    for (const auto& [K, windows] : cases) {
        Units decoder(1, 1);
        ASSERT_TRUE(decoder.allocate(K + 3));
        EXPECT_EQ(textOf(decoder.itsBetaSegment), windows);
    }
}

TEST(TDecoder3GPU, ListsWindowsRowByRow)
{
    Units decoder(1, 2);
    ASSERT_TRUE(decoder.allocate(258 + 3));
    EXPECT_EQ(textOf(decoder.itsAlphaSegment), "[0,129)[129,258)");
    EXPECT_EQ(textOf(decoder.itsBetaSegment), "[63,0)[192,128)[96,63)[225,192)[128,96)[257,225)");
}

TEST(TDecoder3GPU, RefusesSizesThatDoNotDivideIntoSegmentsEveryTime)
{
    const struct {
        unsigned units;
        unsigned threads;
        unsigned K;
    } cases[] = {{4, 4, 129}, {4, 4, 514}, {3, 1, 258}};
    for (const auto& [units, threads, K] : cases) {
        Units decoder(units, threads);
        Bits hard;
        const CapturedStreams streams;
        ASSERT_TRUE(decoder.decode(Soft(3 * 136 + 12), hard, 1));
        EXPECT_FALSE(decoder.decode(Soft(3 * K + 12), hard, 1));
        EXPECT_FALSE(decoder.decode(Soft(3 * K + 12), hard, 1));
        EXPECT_EQ(streams.err(),
                  "ERROR:TDecoder3GPU:Block size not supported\nERROR:TDecoder3GPU:Block size not supported\n");
        EXPECT_TRUE(decoder.decode(Soft(3 * 136 + 12), hard, 1)) << "a size that was in use before";
        EXPECT_EQ(decoder.itsNT, 2U);
        EXPECT_EQ(decoder.itsDecodeCount, 2U);
    }
}

TEST(TDecoder3GPU, RunsEveryPassLikeThePlainFormulation)
{
    const unsigned sizes[] = {40, 104, 256, 512, 1024, 1056, 2048};  // segments of 1, 2, 1, 1, 2, 3 and 4 windows
    morvik::blocks::Random random(6);
    for (const int algorithm : algorithms) {
        Units decoder(2, 4, algorithm);
        for (const unsigned K : sizes) {
            for (const auto values :
                 {morvik::blocks::Values::uniform, morvik::blocks::Values::extreme, morvik::blocks::Values::small}) {
                const morvik::blocks::Block block = morvik::blocks::randomBlock(random, K, values);
                const auto result =
                    morvik::plain::decode(block.sys, block.par1, block.par2, 2, static_cast<unsigned>(algorithm), 3);
                ASSERT_TRUE(decoder.extract(aligned(block)));
                for (unsigned h = 0; h < 6; ++h) {
                    SCOPED_TRACE(testing::Message() << "type " << algorithm << " K=" << K << " pass " << h);
                    ASSERT_TRUE(decoder.calcSISO(h));
                    expectPass(decoder, result->passes[h]);
                    ASSERT_FALSE(HasFailure());
                }
            }
        }
    }
}

TEST(TDecoder3GPU, EndsWithTheRatiosAndExtrinsicValuesOfThePlainFormulation)
{
    morvik::blocks::Random random(7);
    for (const int units : {2, 4, 8}) {
        for (const int algorithm : algorithms) {
            morvik::blocks::Decoder decoder(units, algorithm);
            decoder.decodeByComponents();
            for (const unsigned K : {48U, 128U, 832U, 2112U, 6144U}) {
                SCOPED_TRACE(testing::Message() << units << " units, type " << algorithm << " K=" << K);
                const morvik::blocks::Block block =
                    morvik::blocks::randomBlock(random, K, morvik::blocks::Values::uniform);
                const auto expected = morvik::plain::decode(block.sys,
                                                            block.par1,
                                                            block.par2,
                                                            static_cast<unsigned>(units),
                                                            static_cast<unsigned>(algorithm),
                                                            2);
                const auto result = decoder.decode(block, 2);
                EXPECT_EQ(std::vector<int>(result.bits.begin(), result.bits.end()), expected->bits);
                EXPECT_EQ(firstOf(decoder.state()->decoder->itsLLR, K), expected->llr);
                EXPECT_EQ(firstOf(decoder.state()->decoder->itsExtrinsic, K), expected->extrinsic);
            }
        }
    }
}

// The lanes have neither.
TEST(TDecoder3GPU, IsPresetAndTracedInAStateOfTheCInterface)
{
    morvik::blocks::Random random(8);
    const morvik::blocks::Block block = morvik::blocks::randomBlock(random, 40, morvik::blocks::Values::uniform);
    morvik::blocks::Decoder preset(4, 1);
    preset.state()->decoder->itsExtrinsicIn.assign(43, -2048);
    EXPECT_NE(preset.decode(block, 1).bits, morvik::blocks::Decoder(4, 1).decode(block, 1).bits);
    EXPECT_TRUE(preset.state()->decoder->itsExtrinsicIn.empty());

    morvik::blocks::Decoder traced(4, 1);
    traced.state()->decoder->itsTraceLevel = 2;
    const CapturedStreams streams;
    EXPECT_EQ(traced.decode(block, 1).bits, morvik::blocks::Decoder(4, 1).decode(block, 1).bits);
    EXPECT_NE(streams.out().find("itsAlphaSegment=[0,40)"), std::string::npos) << streams.out();
}

TEST(TDecoder3GPU, FailsWhenAKernelFails)
{
    using Engine = TCalculationEngineModBase;
    const std::pair<const char*, Engine::AlgorithmType Engine::*> kernels[] = {
        {"alpha", &Engine::itsAlphaAlgorithmType},
        {"beta", &Engine::itsBetaAlgorithmType},
        {"llr", &Engine::itsLLRAlgorithmType}};
    for (const auto& [kernel, type] : kernels) {
        Units decoder(4);
        dynamic_cast<Engine&>(*decoder.itsEngine).*type = Engine::UNKNOWN;
        Bits hard;
        const CapturedStreams streams;
        EXPECT_FALSE(decoder.decode(Soft(3 * 128 + 12), hard, 1));
        EXPECT_EQ(streams.err(),
                  "ERROR:TCalculationEngineModBase::" + std::string(kernel) + ":Illegal algorithm type\n");
        EXPECT_EQ(decoder.itsDecodeCount, 0U);
    }
}

TEST(TDecoder3GPU, LeavesTheMetricsOfTheTailAlone)
{
    morvik::blocks::Random random(8);
    Units decoder(4);
    Bits hard;
    ASSERT_TRUE(decoder.decode(drawSoft(random, 40), hard, 2));
    for (unsigned k = 40; k < 43; ++k) {
        EXPECT_TRUE(compareT8(decoder.itsGamma[k], T8{})) << k;
        EXPECT_TRUE(compareT8(decoder.itsBeta[k], T8{})) << k;
    }
    EXPECT_FALSE(compareT8(decoder.itsAlpha[40], T8{}));  // where the last segment ends
    EXPECT_TRUE(compareT8(decoder.itsAlpha[41], T8{}));
    EXPECT_TRUE(compareT8(decoder.itsAlpha[42], T8{}));
}

TEST(TDecoder3GPU, StartsTheLastWindowFromThePathsThatEmptyTheEncoder)
{
    constexpr unsigned K = 40;
    morvik::blocks::Random random(9);
    for (const bool layout3GPP2 : {false, true}) {
        for (int repetition = 0; repetition < 200; ++repetition) {
            Soft soft(layout3GPP2 ? 5 * K + 18 : 3 * K + 12);
            for (short& value : soft) {  // any 16-bit value, so that sums wrap
                value = static_cast<short>(morvik::blocks::between(random, -32768, 32767));
            }
            Units decoder(4, 4, 0, layout3GPP2);
            ASSERT_TRUE(decoder.extract(soft));
            for (const unsigned h : {0U, 1U}) {
                const unsigned d = 1 - h;
                T8 column{};
                ASSERT_TRUE(decoder.preCalcBetaTail(h, &column));
                for (std::size_t state = 0; state < 8; ++state) {
                    int sum = 0;
                    std::size_t current = state;
                    for (unsigned k = K; k < K + 3; ++k) {
                        const bool zeroShiftsIn = morvik::plain::transition(current, 0).to < 4;
                        const morvik::plain::Transition edge = morvik::plain::transition(current, zeroShiftsIn ? 0 : 1);
                        sum += edge.bit == 1 ? decoder.itsSys[d][k] : -decoder.itsSys[d][k];
                        sum += edge.parity0 == 1 ? decoder.itsPar0[d][k] : -decoder.itsPar0[d][k];
                        sum += edge.parity1 == 1 ? decoder.itsPar1[d][k] : -decoder.itsPar1[d][k];
                        current = edge.to;
                    }
                    ASSERT_EQ(column.metric[state], morvik::plain::wrap16(sum) & ~0x7F) << "state " << state;
                }
            }
        }
    }
}

TEST(TDecoder3GPU, ClearsTheBorderColumnsForEveryBlock)
{
    morvik::blocks::Random random(11);
    Units decoder(2);
    Bits hard;
    ASSERT_TRUE(decoder.decode(drawSoft(random, 512), hard, 2));
    ASSERT_TRUE(decoder.allocate(512 + 3));
    for (const auto* columns : {&decoder.itsAlphaInit, &decoder.itsBetaInit}) {
        for (const unsigned d : {0U, 1U}) {
            EXPECT_TRUE(std::all_of(
                (*columns)[d].begin(), (*columns)[d].end(), [](const T8& column) { return compareT8(column, T8{}); }));
        }
    }
}

TEST(TDecoder3GPU, StartsAgainFromUnknownStatesInTheFirstPasses)
{
    morvik::blocks::Random random(12);
    Units decoder(2);
    ASSERT_TRUE(decoder.extract(drawSoft(random, 512)));
    ASSERT_TRUE(decoder.calcSISO(0) && decoder.calcSISO(1));
    const Soft first = decoder.itsLLR;
    ASSERT_TRUE(decoder.calcSISO(2) && decoder.calcSISO(3));
    EXPECT_NE(decoder.itsLLR, first);
    ASSERT_TRUE(decoder.calcSISO(0) && decoder.calcSISO(1));
    EXPECT_EQ(decoder.itsLLR, first);
}

TEST(TDecoder3GPU, DecodesEachBlockAsIfItWereTheFirst)
{
    morvik::blocks::Random random(10);
    Units decoder(2, 4, 2);
    for (const unsigned K : {512U, 512U, 40U, 2048U, 0U, 1024U, 512U}) {
        const Soft soft = drawSoft(random, K);
        Units fresh(2, 4, 2);
        Bits hard;
        Bits freshHard;
        ASSERT_TRUE(decoder.decode(soft, hard, 3));
        ASSERT_TRUE(fresh.decode(soft, freshHard, 3));
        EXPECT_EQ(hard, freshHard) << K;
        EXPECT_EQ(firstOf(decoder.itsLLR, K), firstOf(fresh.itsLLR, K)) << K;
        EXPECT_EQ(firstOf(decoder.itsExtrinsic, K), firstOf(fresh.itsExtrinsic, K)) << K;
    }
}

TEST(TDecoder3GPU, DecodesABlockOfNoBitsToNothing)
{
    for (const unsigned before : {0U, 40U}) {
        Units decoder(4);
        Bits hard;
        ASSERT_TRUE(decoder.decode(Soft(3 * before + 12), hard, 1));
        decoder.itsDumpCount = 1;
        const CapturedStreams streams;
        EXPECT_TRUE(decoder.decode(Soft(12, 256), hard, 1));
        EXPECT_TRUE(hard.empty());
        EXPECT_EQ(decoder.itsInterleaver->itsPi.size(), before);  // left as it was
        const std::string trace = streams.out();
        EXPECT_EQ(std::count(trace.begin(), trace.end(), '\n'), 7 + 3 + 3);  // input, header, three tail rows
        EXPECT_EQ(streams.err(), "");
    }
}

TEST(TDecoder3GPU, TracesSegmentsAndColumnsByLevel)
{
    const std::string segments = "itsNT=2\n";
    const std::string windows =
        "itsAlphaSegment=[0,64) [64,128)\n"
        "itsBetaSegment =[63,0) [127,63)\n";
    const std::string columns =
        "TDecoder3GPU::calcAlpha(0)\n"
        "from=0 to=64 init=[0 -16384 -16384 -16384 -16384 -16384 -16384 -16384]"
        " newinit=[0 -16384 -16384 -16384 -16384 -16384 -16384 -16384]\n"
        "from=64 to=128 init=[0 0 0 0 0 0 0 0] newinit=[0 0 0 0 0 0 0 0]\n"
        "itsAlphaInit[0]=[0 -16384 -16384 -16384 -16384 -16384 -16384 -16384]\n"
        "itsAlphaInit[1]=[0 0 0 0 0 0 0 0]\n"
        "TDecoder3GPU::calcBeta(0)\n"
        "from=63 to=0 beta[from]=[0 0 0 0 0 0 0 0] beta[to]=[0 0 0 0 0 0 0 0]\n"
        "from=127 to=63 beta[from]=[-256 256 256 -256 -256 256 256 -256]"
        " beta[to]=[256 256 256 256 256 256 256 256]\n"
        " init[0]=[256 256 256 256 256 256 256 256]\n"
        "itsBetaInit[0]=[256 256 256 256 256 256 256 256]\n"
        "itsBetaInit[1]=[-256 256 256 -256 -256 256 256 -256]\n";
    const struct {
        unsigned level;
        std::string trace;
    } cases[] = {
        {0, ""}, {1, segments}, {2, segments + windows}, {8, segments + windows}, {9, segments + windows + columns}};
    Soft soft(3 * 128 + 12);
    soft[3 * 128 + 6] = 256;  // the first tail bit of the second encoder
    for (const auto& [level, trace] : cases) {
        Units decoder(1, 2);
        decoder.itsTraceLevel = level;
        const CapturedStreams streams;
        ASSERT_TRUE(decoder.extract(soft));
        ASSERT_TRUE(decoder.calcSISO(0));
        EXPECT_EQ(streams.out(), trace) << level;
        ASSERT_TRUE(decoder.extract(soft));
        EXPECT_EQ(streams.out(), trace) << "the segments of an unchanged size are traced again";
        EXPECT_EQ(streams.err(), "");
    }
}
