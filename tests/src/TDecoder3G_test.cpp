// TDecoder3G: tests of the input layouts, the arithmetic between passes, the schedule and error counting.
#include "TDecoder3G.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <memory>
#include <numeric>

#include "DecoderState.h"
#include "TDecoder3GPU.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/PlainDecoder.h"

namespace {

using Bits = std::vector<unsigned char>;
using Counts = std::vector<unsigned long long>;
using Soft = std::vector<short>;

constexpr bool layouts[] = {false, true};  // LTE, 3GPP2

/// The single-engine decoder with the engine of algorithm type 0 or 2.
class SingleEngine : public TDecoder3G {
public:
    explicit SingleEngine(bool layout3GPP2 = false, int algorithm = 0) : TDecoder3G(layout3GPP2), itsParts(2, algorithm)
    {
        itsInterleaver = itsParts.state()->interleaver;
        itsEngine = itsParts.state()->engine;
    }

private:
    morvik::blocks::Decoder itsParts;  // owns interleaver and engine
};

/// Keeps what its last kernel was called with, and computes nothing.
class RecordingEngine : public TCalculationEngine {
public:
    unsigned steps = 0;
    std::vector<const void*> arguments;

    std::string getProperties() const override
    {
        return "";
    }

    T8* gamma(unsigned n, const short* intrinsic, const short* parity0, const short* parity1, T8* g) override
    {
        return record(n, {intrinsic, parity0, parity1, g}, g);
    }

    T8* alpha(unsigned n, const T8* g, T8* a) override
    {
        return record(n, {g, a}, a);
    }

    T8* beta(unsigned n, const T8* g, T8* b) override
    {
        return record(n, {g, b}, b);
    }

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        return record(n, {a, b, g, out}, out);
    }

private:
    template <class Result>
    Result* record(unsigned n, std::vector<const void*> pointers, Result* result)
    {
        steps = n;
        arguments = std::move(pointers);
        return result;
    }
};

/// The kernels over a range of steps, as derived decoders use them.
class Ranges : public SingleEngine {
public:
    using TDecoder3G::calcAlpha;
    using TDecoder3G::calcBeta;
    using TDecoder3G::calcGamma;
    using TDecoder3G::calcLLR;
};

/// 1, 2, 3, ...
Soft numbered(std::size_t count)
{
    Soft values(count);
    std::iota(values.begin(), values.end(), short{1});
    return values;
}

/// The turbo encoder of both layouts: rate 1/3, or 1/5 with a second parity bit from each encoder.
Soft encode(const std::vector<int>& bits, bool layout3GPP2, short amplitude = 128)
{
    Soft soft;
    std::size_t states[2] = {0, 0};
    const auto push = [&](unsigned bit) {
        soft.push_back(bit == 1 ? amplitude : static_cast<short>(-amplitude));
    };
    const auto step = [&](std::size_t& state, unsigned bit) {
        const morvik::plain::Transition edge = morvik::plain::transition(state, bit);
        push(edge.parity0);
        if (layout3GPP2) {
            push(edge.parity1);
        }
        state = edge.to;
    };
    const std::vector<unsigned> interleaved = morvik::plain::permutation(static_cast<unsigned>(bits.size()));
    for (std::size_t k = 0; k < bits.size(); ++k) {
        push(static_cast<unsigned>(bits[k]));
        step(states[0], static_cast<unsigned>(bits[k]));
        step(states[1], static_cast<unsigned>(bits[interleaved[k]]));
    }
    for (std::size_t& state : states) {
        for (unsigned tail = 0; tail < 3; ++tail) {
            const unsigned bit = morvik::plain::transition(state, 0).to < 4 ? 0 : 1;  // shifts a 0 in
            push(bit);
            step(state, bit);
        }
    }
    return soft;
}

Bits asBytes(const std::vector<int>& bits)
{
    return {bits.begin(), bits.end()};
}

/// A stream taken from every stride-th value of the data and from three values of the tail.
Soft stream(const Soft& soft,
            unsigned stride,
            unsigned offset,
            const std::vector<unsigned>& order,
            const std::array<unsigned, 3>& tail)
{
    Soft values;
    for (const unsigned k : order) {
        values.push_back(soft[stride * k + offset]);
    }
    for (const unsigned t : tail) {
        values.push_back(soft[stride * order.size() + t]);
    }
    return values;
}

}  // namespace

TEST(TDecoder3G, IsMadeForEitherLayoutWithoutProperties)
{
    const std::unique_ptr<TDecoder> lte(TDecoder3G::create(false, ""));
    const std::unique_ptr<TDecoder> cdma2000(TDecoder3G::create(true, ""));
    EXPECT_EQ(lte->getProperties(), "3GPP");
    EXPECT_EQ(cdma2000->getProperties(), "3GPP2");

    const CapturedStreams streams;
    EXPECT_EQ(std::unique_ptr<TDecoder>(TDecoder3G::create(false, "4")), nullptr);
    EXPECT_EQ(streams.err(), "ERROR:TDecoder3G:Unexpected properties 4\n");
    EXPECT_EQ(streams.out(), "");
}

TEST(TDecoder3G, SeparatesTheStreamsOfBothLayouts)
{
    std::vector<unsigned> natural(40);
    std::iota(natural.begin(), natural.end(), 0U);
    const std::vector<unsigned> interleaved = morvik::plain::permutation(40);

    SingleEngine lte(false);
    Soft soft = numbered(3 * 40 + 12);
    ASSERT_TRUE(lte.extract(soft));
    EXPECT_EQ(lte.itsBlockSize, 43U);
    EXPECT_EQ(lte.itsSys[0], stream(soft, 3, 0, natural, {0, 2, 4}));
    EXPECT_EQ(lte.itsPar0[0], stream(soft, 3, 1, natural, {1, 3, 5}));
    EXPECT_EQ(lte.itsPar1[0], Soft(43, 0));
    EXPECT_EQ(lte.itsSys[1], stream(soft, 3, 0, interleaved, {6, 8, 10}));
    EXPECT_EQ(lte.itsPar0[1], stream(soft, 3, 2, natural, {7, 9, 11}));
    EXPECT_EQ(lte.itsPar1[1], Soft(43, 0));

    SingleEngine cdma2000(true);
    soft = numbered(5 * 40 + 18);
    ASSERT_TRUE(cdma2000.extract(soft));
    EXPECT_EQ(cdma2000.itsBlockSize, 43U);
    EXPECT_EQ(cdma2000.itsSys[0], stream(soft, 5, 0, natural, {0, 3, 6}));
    EXPECT_EQ(cdma2000.itsPar0[0], stream(soft, 5, 1, natural, {1, 4, 7}));
    EXPECT_EQ(cdma2000.itsPar1[0], stream(soft, 5, 2, natural, {2, 5, 8}));
    EXPECT_EQ(cdma2000.itsSys[1], stream(soft, 5, 0, interleaved, {9, 12, 15}));
    EXPECT_EQ(cdma2000.itsPar0[1], stream(soft, 5, 3, natural, {10, 13, 16}));
    EXPECT_EQ(cdma2000.itsPar1[1], stream(soft, 5, 4, natural, {11, 14, 17}));
}

TEST(TDecoder3G, UsesAPermutationOfTheBlockSizeAsItStands)
{
    SingleEngine decoder;
    std::vector<unsigned>& pi = decoder.itsInterleaver->itsPi;
    pi.resize(40);
    std::iota(pi.rbegin(), pi.rend(), 0U);
    const Soft soft = numbered(132);
    ASSERT_TRUE(decoder.extract(soft));
    EXPECT_EQ(decoder.itsSys[1], stream(soft, 3, 0, pi, {6, 8, 10}));
}

TEST(TDecoder3G, MakesThePermutationEvenIfItsInverseIsThere)
{
    SingleEngine decoder;
    decoder.itsInterleaver->itsPiInv.assign(40, 0);
    const Soft soft = numbered(132);
    ASSERT_TRUE(decoder.extract(soft));
    EXPECT_EQ(decoder.itsSys[1], stream(soft, 3, 0, morvik::plain::permutation(40), {6, 8, 10}));
}

TEST(TDecoder3G, RefusesLengthsThatAreNoBlock)
{
    const struct {
        bool layout3GPP2;
        std::vector<std::size_t> lengths;
    } cases[] = {{false, {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 13, 14, 131, 133, 218}},
                 {true, {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16, 17, 19, 22, 132, 217, 219}}};
    for (const auto& [layout3GPP2, lengths] : cases) {
        for (const std::size_t length : lengths) {
            SingleEngine decoder(layout3GPP2);
            Bits hard{7};
            const CapturedStreams streams;
            EXPECT_FALSE(decoder.decode(Soft(length), hard, 1)) << length;
            EXPECT_EQ(streams.err(),
                      "ERROR:TDecoder3G:Number of soft inputs does not match rate and number of tail bits\n");
            EXPECT_EQ(streams.out(), "");
            EXPECT_EQ(hard, Bits{7});
            EXPECT_EQ(decoder.itsBlockSize, 0U);
        }
    }
}

TEST(TDecoder3G, RefusesSizesThatTheInterleaverDoesNotKnow)
{
    SingleEngine decoder;
    decoder.itsDumpCount = 1;
    Bits hard;
    const CapturedStreams streams;
    EXPECT_FALSE(decoder.decode(Soft(3 * 44 + 12), hard, 1));
    EXPECT_EQ(streams.err(), "ERROR:TDecoder3G:Block size not supported\n");
    EXPECT_EQ(streams.out(), "");
    EXPECT_EQ(decoder.itsDumpCount, 1U);
}

TEST(TDecoder3G, RunsNoPassOnASizeThatTheInterleaverDoesNotKnow)
{
    SingleEngine decoder;
    ASSERT_TRUE(decoder.allocate(44 + 3));
    EXPECT_FALSE(decoder.calcIntrinsic(0));
    EXPECT_FALSE(decoder.calcIntrinsic(1));
}

TEST(TDecoder3G, CountsNothingOfARefusedBlock)
{
    const CapturedStreams streams;
    SingleEngine decoder;
    Counts bitErrors(2);
    Counts blockErrors(2);
    EXPECT_FALSE(decoder.decode(Soft(131), Bits(40), bitErrors, blockErrors));
    EXPECT_EQ(bitErrors, Counts(2));
    EXPECT_EQ(blockErrors, Counts(2));
    EXPECT_EQ(decoder.itsDecodeCount, 0U);
}

TEST(TDecoder3G, DecidesForOnesWithoutIterationsAndCountsDecodes)
{
    SingleEngine decoder;
    Bits hard;
    ASSERT_TRUE(decoder.decode(Soft(132, -128), hard, 3));
    EXPECT_EQ(hard, Bits(40, 0));
    EXPECT_EQ(decoder.itsDecodeCount, 1U);
    EXPECT_EQ(decoder.itsHalfIterationCount, 6U);
    ASSERT_TRUE(decoder.decode(Soft(132, -128), hard, 0));
    EXPECT_EQ(hard, Bits(40, 1));  // ratios of 0
    EXPECT_EQ(decoder.itsDecodeCount, 2U);
    EXPECT_EQ(decoder.itsHalfIterationCount, 6U);
}

TEST(TDecoder3G, FailsSilentlyAndUncountedWhenAKernelFails)
{
    SingleEngine decoder;
    decoder.itsEngine->itsUseSSE2 = true;
    Bits hard;
    Counts errors(1);
    const CapturedStreams streams;
    EXPECT_FALSE(decoder.decode(Soft(132), hard, 1));
    EXPECT_FALSE(decoder.decode(Soft(132), Bits(40), errors, errors));
    EXPECT_EQ(streams.out() + streams.err(), "");
    EXPECT_EQ(decoder.itsDecodeCount, 0U);
    EXPECT_EQ(decoder.itsHalfIterationCount, 0U);
}

TEST(TDecoder3G, HalvesAprioriAndIntrinsicValuesTowardZero)
{
    const TNumberFormat fullWidth(16, 3);
    SingleEngine decoder;
    const TNumberFormat* stateFormat = decoder.itsEngine->itsStateFormat;
    const struct {
        const TNumberFormat* state;
        short apriori;
        short systematic;
        short intrinsic;
    } cases[] = {
        {&fullWidth, -3, 0, 0},    // -3 / 2 = -1, -1 / 2 = 0
        {&fullWidth, -7, -2, -2},  // (-3 - 2) / 2
        {&fullWidth, 32767, 32767, 24575},
        {stateFormat, 47, 0, 8},   // 23 & ~15 = 16
        {stateFormat, -1, 0, 0},   // -1 / 2 = 0
        {stateFormat, -2, 0, -8},  // -1 & ~15 = -16
        {stateFormat, 0, -7, -3},  // the systematic value is not masked
        {stateFormat, -2048, -2048, -1536},
        {stateFormat, 2032, 2032, 1520},  // 1016 & ~15 = 1008
    };
    for (const auto& [state, apriori, systematic, intrinsic] : cases) {
        decoder.itsEngine->itsStateFormat = state;
        ASSERT_TRUE(decoder.extract(Soft(132, systematic)));
        decoder.itsExtrinsic.assign(43, apriori);
        for (const unsigned h : {0U, 1U}) {
            ASSERT_TRUE(decoder.calcIntrinsic(h));
            Soft expected(40, intrinsic);
            expected.resize(43, static_cast<short>(systematic / 2));  // nothing is known beforehand of the tail
            EXPECT_EQ(decoder.itsIntrinsic, expected) << apriori << ' ' << systematic;
        }
    }
}

TEST(TDecoder3G, ScalesSaturatesAndMasksExtrinsicValues)
{
    const TNumberFormat narrow(12, 3);
    const TNumberFormat fullWidth(16, 3);
    const struct {
        const TNumberFormat* state;
        double scale;
        int llr;
        int intrinsic;
        int extrinsic;
    } cases[] = {
        {&narrow, 1.0, 7, 0, 7},  // exactly 1: not masked
        {&narrow, 1.0, 100, 30, -20},
        {&narrow, 1.0, 2033, 0, 2032},
        {&narrow, 1.0, -2049, 0, -2048},
        {&narrow, 1.0, 32767, -32768, 2032},
        {&narrow, 1.0, -32768, 32767, -2048},
        {&fullWidth, 0.75, -5, 0, -3},  // -15 / 4 toward zero
        {&fullWidth, 0.75, 5, 0, 3},
        {&fullWidth, 0.75, 200, 0, 127},
        {&narrow, 0.75, 100, 0, 64},    // 75 & ~15
        {&narrow, 0.75, -100, 0, -80},  // -75 & ~15
        {&narrow, 0.75, -21, 0, -16},   // -15 & ~15
        {&narrow, 0.75, 32767, -32768, 2032},
        {&narrow, 0.75, -32768, 32767, -2048},
        {&fullWidth, 0.5, -5, 0, -2},  // -2.5 toward zero
        {&narrow, 0.5, 101, 0, 48},
        {&narrow, 0.5, -65, 0, -32},
        {&narrow, 0.5, 32767, -32768, 2032},
        {&narrow, -1.0, 100, 0, -112},
        {&narrow, 0.0, 32767, 0, 0},
        {&narrow, 1e300, 1, 0, 2032},
        {&narrow, 1e300, -1, 0, -2048},
        {&narrow, HUGE_VAL, -1, 0, -2048},
    };
    for (const auto& [state, scale, llr, intrinsic, extrinsic] : cases) {
        SingleEngine decoder;
        decoder.itsEngine->itsStateFormat = state;
        decoder.itsExtrinsicScale = scale;
        decoder.allocate(43);
        decoder.itsLLR.assign(43, static_cast<short>(llr));
        decoder.itsIntrinsic.assign(43, static_cast<short>(intrinsic));
        ASSERT_TRUE(decoder.calcExtrinsic(0));
        EXPECT_EQ(decoder.itsExtrinsic, Soft(43, static_cast<short>(extrinsic)))
            << scale << ' ' << llr << ' ' << intrinsic;
    }
}

TEST(TDecoder3G, KeepsExtrinsicValuesInTheirRangeForAScaleThatIsNoNumber)
{
    SingleEngine decoder;
    decoder.itsExtrinsicScale = std::numeric_limits<double>::quiet_NaN();
    decoder.allocate(43);
    decoder.itsLLR.assign(43, 100);
    ASSERT_TRUE(decoder.calcExtrinsic(0));
    for (const short value : decoder.itsExtrinsic) {
        EXPECT_EQ(value & 15, 0);
        EXPECT_LE(std::abs(value), 2048);
    }
}

TEST(TDecoder3G, StartsTheFirstPassFromThePresetExtrinsicValues)
{
    SingleEngine decoder;
    ASSERT_TRUE(decoder.extract(Soft(132)));
    decoder.itsExtrinsicIn.assign(43, -1);  // masked -16, whose half is masked -16 again
    ASSERT_TRUE(decoder.calcSISO(0));
    EXPECT_EQ(decoder.itsIntrinsic[0], -8);
    EXPECT_TRUE(decoder.itsExtrinsicIn.empty());

    decoder.itsExtrinsicIn.assign(43, -1);
    ASSERT_TRUE(decoder.calcSISO(2));
    EXPECT_EQ(decoder.itsExtrinsicIn.size(), 43U) << "consumed by a later pass";

    decoder.itsExtrinsicIn.clear();
    decoder.itsExtrinsic.assign(43, 2032);  // what another decode left
    ASSERT_TRUE(decoder.calcSISO(0));
    EXPECT_EQ(decoder.itsIntrinsic, Soft(43, 0));
}

TEST(TDecoder3G, RefusesPresetExtrinsicValuesOfAnotherNumberAndKeepsThem)
{
    for (const std::size_t count : {42U, 44U}) {
        SingleEngine decoder;
        decoder.itsExtrinsicIn.assign(count, 16);
        Bits hard;
        const CapturedStreams streams;
        EXPECT_FALSE(decoder.decode(Soft(132), hard, 1));
        EXPECT_EQ(streams.err(), "ERROR:TDecoder3G:Number of soft extrinsic inputs does not match block size\n");
        EXPECT_EQ(streams.out(), "");
        EXPECT_EQ(decoder.itsExtrinsicIn, Soft(count, 16));
        EXPECT_EQ(decoder.itsDecodeCount, 0U);
    }
}

TEST(TDecoder3G, RunsPassesOverTheWholeTrellisInterleavedOrderFirst)
{
    constexpr unsigned K = 40;
    const morvik::plain::Column stateZero = {0, -16384, -16384, -16384, -16384, -16384, -16384, -16384};
    const std::vector<int> table = morvik::plain::correctionTable(16);
    const std::vector<unsigned> interleaved = morvik::plain::permutation(K);
    constexpr auto rule = morvik::plain::Decision::maxHash;
    morvik::blocks::Random random(3);
    for (const bool layout3GPP2 : layouts) {
        Soft soft(layout3GPP2 ? 5 * K + 18 : 3 * K + 12);
        for (short& value : soft) {
            value = static_cast<short>(16 * morvik::blocks::between(random, -128, 127));
        }
        SingleEngine decoder(layout3GPP2, 2);
        ASSERT_TRUE(decoder.extract(soft));
        for (unsigned h = 0; h < 4; ++h) {
            const unsigned d = 1 - h % 2;
            std::vector<int> apriori(K + 3);
            for (unsigned i = 0; i < K && h > 0; ++i) {
                (d == 1 ? apriori[i] : apriori[interleaved[i]]) = decoder.itsExtrinsic[d == 1 ? interleaved[i] : i];
            }
            ASSERT_TRUE(decoder.calcSISO(h));

            std::vector<morvik::plain::BranchColumn> g;
            for (unsigned j = 0; j < K + 3; ++j) {
                ASSERT_EQ(decoder.itsIntrinsic[j], ((apriori[j] / 2 & ~15) + decoder.itsSys[d][j]) / 2)
                    << h << ' ' << j;
                g.push_back(morvik::plain::branchMetrics(
                    decoder.itsIntrinsic[j], decoder.itsPar0[d][j], decoder.itsPar1[d][j]));
            }
            const auto alpha = morvik::plain::forward(g, stateZero, rule, table);
            const auto beta = morvik::plain::backward(g, stateZero, rule, table);
            for (unsigned j = 0; j < K + 3; ++j) {
                const int llr = morvik::plain::logLikelihoodRatio(alpha[j], beta[j], g[j], rule, table);
                ASSERT_EQ(decoder.itsLLR[j], llr) << h << ' ' << j;
                ASSERT_EQ(decoder.itsExtrinsic[j], morvik::plain::clip(llr - 4 * decoder.itsIntrinsic[j], -2048, 2032));
            }
        }
    }
}

TEST(TDecoder3G, HandsARangeOfStepsToTheKernels)
{
    using Pointers = std::vector<const void*>;
    RecordingEngine engine;
    Ranges decoder;
    ASSERT_TRUE(decoder.extract(Soft(132)));
    decoder.itsEngine = &engine;
    for (const unsigned h : {0U, 1U}) {
        const unsigned d = 1 - h;
        for (const auto& [j, k] : std::vector<std::pair<unsigned, unsigned>>{{0, 42}, {5, 20}, {42, 42}}) {
            ASSERT_TRUE(decoder.calcGamma(h, j, k));
            EXPECT_EQ(engine.steps, k - j + 1);
            EXPECT_EQ(
                engine.arguments,
                (Pointers{
                    &decoder.itsIntrinsic[j], &decoder.itsPar0[d][j], &decoder.itsPar1[d][j], decoder.itsGamma + j}));
            ASSERT_TRUE(decoder.calcAlpha(h, j, k));
            EXPECT_EQ(engine.steps, k - j + 1);
            EXPECT_EQ(engine.arguments, (Pointers{decoder.itsGamma + j, decoder.itsAlpha + j}));
            ASSERT_TRUE(decoder.calcBeta(h, k, j));
            EXPECT_EQ(engine.steps, k - j + 1);
            EXPECT_EQ(engine.arguments, (Pointers{decoder.itsGamma + k, decoder.itsBeta + k}));
            ASSERT_TRUE(decoder.calcLLR(h, j, k));
            EXPECT_EQ(engine.steps, k - j + 1);
            EXPECT_EQ(engine.arguments,
                      (Pointers{decoder.itsAlpha + j, decoder.itsBeta + j, decoder.itsGamma + j, &decoder.itsLLR[j]}));
        }
    }
    ASSERT_TRUE(decoder.calcGamma(1));  // the whole trellis
    EXPECT_EQ(engine.steps, 43U);
    EXPECT_EQ(engine.arguments.back(), decoder.itsGamma);
    ASSERT_TRUE(decoder.calcLLR(1));
    EXPECT_EQ(engine.steps, 43U);
    EXPECT_EQ(engine.arguments.back(), decoder.itsLLR.data());
}

TEST(TDecoder3G, WritesNoColumnBeyondTheTrellis)
{
    SingleEngine decoder;
    std::vector<unsigned char> hard;
    ASSERT_TRUE(decoder.decode(numbered(3 * 40 + 12), hard, 1));
    for (unsigned k = 43; k < 64; ++k) {  // there is storage for 64
        EXPECT_TRUE(compareT8(decoder.itsAlpha[k], T8{})) << k;
        EXPECT_TRUE(compareT8(decoder.itsBeta[k], T8{})) << k;
        EXPECT_TRUE(compareT8(decoder.itsGamma[k], T8{})) << k;
    }
}

TEST(TDecoder3G, StartsEachBlockFromTheKnownStateWhateverItDecodedBefore)
{
    morvik::blocks::Random random(5);
    SingleEngine kept;
    for (const unsigned K : {512U, 40U, 48U, 512U}) {
        Soft soft(3 * K + 12);
        for (short& value : soft) {
            value = static_cast<short>(16 * morvik::blocks::between(random, -128, 127));
        }
        SingleEngine fresh;
        Bits hard;
        Bits expected;
        ASSERT_TRUE(fresh.decode(soft, expected, 2));
        ASSERT_TRUE(kept.decode(soft, hard, 2));
        EXPECT_EQ(kept.itsLLR, fresh.itsLLR) << K;
        EXPECT_EQ(hard, expected) << K;
    }
}

TEST(TDecoder3G, CountsErrorsIterationByIteration)
{
    morvik::blocks::Random random(4);
    for (const bool layout3GPP2 : layouts) {
        const std::vector<int> bits = morvik::blocks::randomBits(random, 512);
        Soft soft = encode(bits, layout3GPP2);
        const int noise = layout3GPP2 ? 320 : 230;
        for (short& value : soft) {
            value = static_cast<short>(16 * ((value + morvik::blocks::between(random, -noise, noise)) / 16));
        }
        Bits reference = asBytes(bits);
        reference[0] = reference[0] != 0 ? 200 : 0;  // every byte but 0 is a 1
        Counts bitErrors(4, 100);
        Counts blockErrors{5, 5};
        SingleEngine decoder(layout3GPP2);
        ASSERT_TRUE(decoder.decode(soft, reference, bitErrors, blockErrors));
        EXPECT_EQ(decoder.itsDecodeCount, 1U);
        EXPECT_EQ(decoder.itsHalfIterationCount, 8U);
        EXPECT_EQ(decoder.itsLLR.size(), 515U);
        EXPECT_EQ(Soft(decoder.itsLLR.end() - 3, decoder.itsLLR.end()), Soft(3, 0));
        for (unsigned t = 0; t < 4; ++t) {
            Bits hard;
            ASSERT_TRUE(decoder.decode(soft, hard, t + 1));
            unsigned errors = 0;
            for (std::size_t k = 0; k < bits.size(); ++k) {
                errors += hard[k] != bits[k] ? 1U : 0U;
            }
            EXPECT_EQ(bitErrors[t], 100 + errors);
            EXPECT_EQ(blockErrors[t], (t < 2 ? 5U : 0U) + (errors != 0 ? 1U : 0U));
        }
        EXPECT_GT(bitErrors.front(), 100U);  // else the test shows nothing
        EXPECT_EQ(bitErrors.back(), 100U);
    }
}

TEST(TDecoder3G, CountsMissingReferenceBitsAsErrors)
{
    const Soft soft = encode(std::vector<int>(40, 0), false);
    for (const std::size_t length : {0U, 37U, 43U}) {
        SingleEngine decoder;
        Counts bitErrors(1);
        Counts blockErrors(1);
        ASSERT_TRUE(decoder.decode(soft, Bits(length), bitErrors, blockErrors));
        EXPECT_EQ(bitErrors[0], length > 40 ? length - 40 : 40 - length);
        EXPECT_EQ(blockErrors[0], 1U);
    }
}

TEST(TDecoder3G, CountsADecodeWithoutIterations)
{
    SingleEngine decoder;
    Counts none;
    EXPECT_TRUE(decoder.decode(Soft(132), Bits(40), none, none));
    EXPECT_EQ(decoder.itsDecodeCount, 1U);
    EXPECT_EQ(decoder.itsHalfIterationCount, 0U);
    EXPECT_EQ(decoder.itsSys[0].size(), 43U);
}

TEST(TDecoder3G, DecodesRateOneFifthBlocksWithEitherParityStream)
{
    morvik::blocks::Random random(5);
    const morvik::blocks::Decoder parts(2, 0);
    const std::vector<int> bits = morvik::blocks::randomBits(random, 512);
    for (const unsigned erased : {0U, 1U, 2U}) {  // none, the first or the second parity stream
        Soft soft = encode(bits, true);
        for (std::size_t k = 0; k < bits.size(); ++k) {
            short* const values = &soft[5 * k];
            values[0] = static_cast<short>(k % 7 == 0 ? -values[0] : values[0]);  // for the parity to correct
            if (erased != 0) {
                values[erased] = values[erased + 2] = 0;
            }
        }
        for (auto* create : {&TDecoder3G::create, &TDecoder3GPU::create}) {
            const std::unique_ptr<TDecoder> decoder(create(true, ""));
            decoder->itsInterleaver = parts.state()->interleaver;
            decoder->itsEngine = parts.state()->engine;
            Bits hard;
            ASSERT_TRUE(decoder->decode(soft, hard, 8));
            EXPECT_EQ(hard, asBytes(bits)) << decoder->getProperties() << " without parity " << erased;
        }
    }
}
