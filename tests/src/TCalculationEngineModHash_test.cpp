// TCalculationEngineModHash: tests of the properties and of the table that initialise builds.
#include "TCalculationEngineModHash.h"

#include <gtest/gtest.h>

#include <memory>

#include "support/CapturedStreams.h"

namespace {

using Base = TCalculationEngineModBase;
using EnginePointer = std::unique_ptr<TCalculationEngine>;

const TNumberFormat stateFormat(12, 3);

}  // namespace

TEST(TCalculationEngineModHash, ReadsItsNumberOfPoints)
{
    const struct {
        const char* given;
        unsigned points;
    } cases[] = {{"", 0}, {"0", 0}, {"16", 16}, {"16x", 16}, {" 8 ", 8}};
    for (const auto& [given, points] : cases) {
        const EnginePointer engine(TCalculationEngineModHash::create(given));
        ASSERT_NE(engine, nullptr) << given;
        EXPECT_EQ(dynamic_cast<TCalculationEngineModHash&>(*engine).itsNumPoints, points) << given;
        EXPECT_EQ(engine->getProperties(), "MOD#:" + std::to_string(points));
    }
}

TEST(TCalculationEngineModHash, RefusesWhatIsNoNumber)
{
    for (const char* given : {"abc", " ", ":16", "4294967296"}) {
        const CapturedStreams streams;
        EXPECT_EQ(EnginePointer(TCalculationEngineModHash::create(given)), nullptr) << given;
        EXPECT_EQ(streams.err(), "ERROR:TCalculationEngineModHash:Illegal number of points\n") << given;
        EXPECT_EQ(streams.out(), "");
    }
}

TEST(TCalculationEngineModHash, InitialisesEveryKernelToMODHashWithOneTable)
{
    for (const unsigned points : {16U, 0U}) {
        const EnginePointer engine(TCalculationEngineModHash::create(std::to_string(points)));
        auto& hash = dynamic_cast<TCalculationEngineModHash&>(*engine);
        EXPECT_TRUE(hash.itsLUT.empty());
        engine->itsStateFormat = &stateFormat;
        ASSERT_TRUE(engine->initialise());
        EXPECT_EQ(hash.itsLUT, Base::createLUT(points, stateFormat));
        const unsigned char* middle = &hash.itsLUT[32768];
        EXPECT_EQ(hash.itsAlphaAlgorithmType, Base::MOD_HASH);
        EXPECT_EQ(hash.itsBetaAlgorithmType, Base::MOD_HASH);
        EXPECT_EQ(hash.itsLLRAlgorithmType, Base::MOD_HASH);
        EXPECT_EQ(hash.itsAlphaLUT, middle);
        EXPECT_EQ(hash.itsBetaLUT, middle);
        EXPECT_EQ(hash.itsLLRLUT, middle);
    }
}

TEST(TCalculationEngineModHash, ChangesNothingWhenTheTableCannotBeBuilt)
{
    const EnginePointer engine(TCalculationEngineModHash::create("12"));
    auto& hash = dynamic_cast<TCalculationEngineModHash&>(*engine);
    engine->itsStateFormat = &stateFormat;
    const CapturedStreams streams;
    EXPECT_FALSE(engine->initialise());
    EXPECT_EQ(streams.err(), "ERROR:TCalculationEngineModBase::createLUT:Number of points must be a binary number\n");
    EXPECT_TRUE(hash.itsLUT.empty());
    EXPECT_EQ(hash.itsAlphaAlgorithmType, Base::MOD);
    EXPECT_EQ(hash.itsBetaAlgorithmType, Base::MOD);
    EXPECT_EQ(hash.itsLLRAlgorithmType, Base::MOD);
    EXPECT_EQ(hash.itsAlphaLUT, nullptr);
    EXPECT_EQ(hash.itsBetaLUT, nullptr);
    EXPECT_EQ(hash.itsLLRLUT, nullptr);
}
