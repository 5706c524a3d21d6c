// TDecoder: tests of the factory, the block storage, the base's error counting and the dump count.
#include "TDecoder.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <new>
#include <sstream>

#include "support/CapturedStreams.h"

namespace {

using Bits = std::vector<unsigned char>;
using Counts = std::vector<unsigned long long>;
using DecoderPointer = std::unique_ptr<TDecoder>;

/// Decides what it is told to, and leaves all else to the base.
class FixedDecoder : public TDecoder {
public:
    Bits decisions;
    bool succeeds = true;
    unsigned iterationsRun = 0;

    std::string getProperties() const override
    {
        return "";
    }

    bool decode(const std::vector<short>&, Bits& hard, unsigned int iterations) override
    {
        hard = decisions;
        iterationsRun = iterations;
        return succeeds;
    }

    void dumpFull(std::ostream& out, unsigned int halfIteration) override
    {
        out << halfIteration << ';';
    }

    using TDecoder::checkDump;
    using TDecoder::decode;
};

/// The error line with which a property string is refused.
std::string refusalOfDecoder(const std::string& properties)
{
    const CapturedStreams streams;
    EXPECT_EQ(DecoderPointer(TDecoder::create(properties)), nullptr) << properties;
    EXPECT_EQ(streams.out(), "");
    return streams.err();
}

}  // namespace

TEST(TDecoder, MakesProcessingUnitDecodersAlone)
{
    const struct {
        const char* given;
        const char* properties;
    } cases[] = {
        {"3GPPPU", "3GPPPU:4"}, {"3GPPPU:", "3GPPPU:4"}, {"3GPPPU:8", "3GPPPU:8"}, {"3GPPPU:2,1", "3GPPPU:2,1"}};
    for (const auto& [given, properties] : cases) {
        const DecoderPointer decoder(TDecoder::create(given));
        ASSERT_NE(decoder, nullptr) << given;
        EXPECT_EQ(decoder->getProperties(), properties);
    }
    EXPECT_EQ(TDecoder::getNames(), std::vector<std::string>{"3GPPPU"});
}

TEST(TDecoder, RefusesOtherNames)
{
    for (const std::string type : {"3GPP", "3GPP2", "3GPP2PU", "3gpppu", "3GPPPU ", ""}) {
        EXPECT_EQ(refusalOfDecoder(type), "ERROR:TDecoder:Unrecognised type:" + type + "\n");
        EXPECT_EQ(refusalOfDecoder(type + ":4"), "ERROR:TDecoder:Unrecognised type:" + type + "\n");
    }
    EXPECT_EQ(refusalOfDecoder("3GPPPU:0"), "ERROR:TDecoder3GPU:Illegal number of processing units:0\n");
}

TEST(TDecoder, StartsEmptyAndUnscaled)
{
    const FixedDecoder decoder;
    EXPECT_EQ(decoder.itsInterleaver, nullptr);
    EXPECT_EQ(decoder.itsEngine, nullptr);
    EXPECT_EQ(decoder.itsBlockSize, 0U);
    EXPECT_EQ(decoder.itsMetricBufferSize, 0U);
    EXPECT_TRUE(decoder.itsExtrinsicIn.empty());
    EXPECT_EQ(decoder.itsExtrinsicScale, 1.0);
    EXPECT_EQ(decoder.itsDecodeCount, 0U);
    EXPECT_EQ(decoder.itsHalfIterationCount, 0U);
    EXPECT_EQ(decoder.itsTraceLevel, 0U);
    EXPECT_EQ(decoder.itsDumpCount, 0U);
    EXPECT_FALSE(decoder.itsStopAfterDump);
}

TEST(TDecoder, GrowsTheMetricBufferBy64ColumnsAndNeverShrinksIt)
{
    const struct {
        unsigned blockSize;
        std::uint32_t bytes;
        unsigned columns;
    } cases[] = {{40, 3088, 64}, {100, 6160, 128}, {40, 6160, 128}, {128, 6160, 128}, {129, 9232, 192}};
    FixedDecoder decoder;
    for (const auto& [blockSize, bytes, columns] : cases) {
        ASSERT_TRUE(decoder.allocate(blockSize));
        EXPECT_EQ(decoder.itsBlockSize, blockSize);
        EXPECT_EQ(decoder.itsMetricBufferSize, bytes);
        EXPECT_EQ(reinterpret_cast<std::uintptr_t>(decoder.itsAlpha) % 16, 0U);
        EXPECT_EQ(decoder.itsBeta, decoder.itsAlpha + columns);
        EXPECT_EQ(decoder.itsGamma, decoder.itsBeta + columns);
    }
}

TEST(TDecoder, RefusesABufferBeyond32Bits)
{
    FixedDecoder decoder;
    decoder.allocate(40);
    EXPECT_THROW(decoder.allocate(89478465), std::bad_alloc);  // 2^32 + 2064 bytes
    EXPECT_TRUE(decoder.allocate(100));
    EXPECT_EQ(decoder.itsMetricBufferSize, 6160U);
}

TEST(TDecoder, ZeroesSoftValuesAtEveryAllocationButColumnsAtNewOnesOnly)
{
    FixedDecoder decoder;
    decoder.itsExtrinsicIn = {7};
    decoder.allocate(64);
    const T8 zero{};
    for (unsigned column = 0; column < 3 * 64; ++column) {
        ASSERT_TRUE(compareT8(decoder.itsAlpha[column], zero)) << column;
    }
    decoder.itsGamma[63][7] = 5;
    for (std::vector<short>* values : {&decoder.itsIntrinsic, &decoder.itsLLR, &decoder.itsExtrinsic}) {
        EXPECT_EQ(*values, std::vector<short>(64, 0));
        values->assign(64, 1);
    }
    decoder.allocate(40);
    for (const std::vector<short>* values : {&decoder.itsIntrinsic, &decoder.itsLLR, &decoder.itsExtrinsic}) {
        EXPECT_EQ(*values, std::vector<short>(40, 0));
    }
    EXPECT_EQ(decoder.itsGamma[63][7], 5);
    EXPECT_EQ(decoder.itsExtrinsicIn, std::vector<short>{7});
}

TEST(TDecoder, CountsDifferentAndMissingBitsIntoTheLastEntry)
{
    const struct {
        Bits reference;
        Bits decisions;
        unsigned long long errors;
    } cases[] = {
        {{0, 1, 0, 1}, {0, 1, 0, 1}, 0},
        {{0, 2, 0, 255}, {0, 1, 0, 1}, 0},  // every byte but 0 is a 1
        {{1, 1, 0, 0}, {0, 1, 0, 1}, 2},
        {{0, 1}, {0, 1, 0, 1}, 2},
        {{0, 0, 0, 1, 1}, {0, 1}, 4},
        {{}, {}, 0},
    };
    for (const auto& [reference, decisions, errors] : cases) {
        FixedDecoder decoder;
        decoder.decisions = decisions;
        Counts bitErrors{10, 20, 30};
        Counts blockErrors{1, 2, 3};
        EXPECT_TRUE(decoder.decode({}, reference, bitErrors, blockErrors));
        EXPECT_EQ(decoder.iterationsRun, 3U);
        EXPECT_EQ(bitErrors, (Counts{10, 20, 30 + errors}));
        EXPECT_EQ(blockErrors, (Counts{1, 2, errors == 0 ? 3U : 4U}));
    }
}

TEST(TDecoder, CountsNothingWhenTheDecodeFailsOrHasNoEntryToCountInto)
{
    FixedDecoder decoder;
    decoder.decisions = {1};
    Counts none;
    EXPECT_TRUE(decoder.decode({}, {0}, none, none));
    EXPECT_TRUE(none.empty());
    decoder.succeeds = false;
    Counts bitErrors{5};
    Counts blockErrors{6};
    EXPECT_FALSE(decoder.decode({}, {0}, bitErrors, blockErrors));
    EXPECT_EQ(bitErrors, Counts{5});
    EXPECT_EQ(blockErrors, Counts{6});
}

TEST(TDecoder, ExtendsTheBlockErrorsToTheBitErrors)
{
    FixedDecoder decoder;
    decoder.decisions = {1};
    Counts bitErrors(2);
    Counts blockErrors;
    EXPECT_TRUE(decoder.decode({}, {0}, bitErrors, blockErrors));
    EXPECT_EQ(blockErrors, (Counts{0, 1}));
}

TEST(TDecoder, DumpsNothingOfItsOwn)
{
    FixedDecoder decoder;
    std::ostringstream os;
    decoder.dump(os);
    decoder.TDecoder::dumpFull(os, 0);
    EXPECT_EQ(os.str(), "");
}

TEST(TDecoder, DumpsHalfIterationsWhileTheCountLasts)
{
    FixedDecoder decoder;
    decoder.itsDumpCount = 2;
    const CapturedStreams streams;
    for (const unsigned h : {0U, 7U, 8U}) {
        EXPECT_TRUE(decoder.checkDump(h));
    }
    EXPECT_EQ(streams.out(), "0;7;");
    EXPECT_EQ(streams.err(), "");
    EXPECT_EQ(decoder.itsDumpCount, 0U);
}

TEST(TDecoder, EndsTheDecodeAfterTheLastDumpWhenAskedTo)
{
    FixedDecoder decoder;
    decoder.itsStopAfterDump = true;
    EXPECT_TRUE(decoder.checkDump(0));  // no dump, no end
    decoder.itsDumpCount = 2;
    const CapturedStreams streams;
    EXPECT_TRUE(decoder.checkDump(1));
    EXPECT_EQ(streams.err(), "");
    EXPECT_FALSE(decoder.checkDump(2));
    EXPECT_EQ(streams.out(), "1;2;");
    EXPECT_EQ(streams.err(), "STOP:Dump complete\n");
    EXPECT_TRUE(decoder.checkDump(3));
}
