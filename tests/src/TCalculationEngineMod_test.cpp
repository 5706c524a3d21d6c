// TCalculationEngineMod: tests of the properties and of what initialise sets.
#include "TCalculationEngineMod.h"

#include <gtest/gtest.h>

#include <memory>

#include "support/CapturedStreams.h"

using Base = TCalculationEngineModBase;

TEST(TCalculationEngineMod, TakesNoProperties)
{
    const CapturedStreams streams;
    EXPECT_EQ(std::unique_ptr<TCalculationEngine>(TCalculationEngineMod::create("0")), nullptr);
    EXPECT_EQ(streams.err(), "ERROR:TCalculationEngineMod:Unexpected properties:0\n");
    EXPECT_EQ(streams.out(), "");
}

TEST(TCalculationEngineMod, InitialisesEveryKernelToMODWithoutATable)
{
    const std::unique_ptr<TCalculationEngine> engine(TCalculationEngineMod::create(""));
    auto& base = dynamic_cast<Base&>(*engine);
    const unsigned char table[1] = {0};
    base.itsAlphaAlgorithmType = base.itsBetaAlgorithmType = base.itsLLRAlgorithmType = Base::MOD_STAR;
    base.itsAlphaLUT = base.itsBetaLUT = base.itsLLRLUT = table;
    const TNumberFormat wide(17, 3);  // of which the base would warn
    base.itsStateFormat = &wide;
    const CapturedStreams streams;
    EXPECT_TRUE(engine->initialise());
    EXPECT_EQ(base.itsAlphaAlgorithmType, Base::MOD);
    EXPECT_EQ(base.itsBetaAlgorithmType, Base::MOD);
    EXPECT_EQ(base.itsLLRAlgorithmType, Base::MOD);
    EXPECT_EQ(base.itsAlphaLUT, nullptr);
    EXPECT_EQ(base.itsBetaLUT, nullptr);
    EXPECT_EQ(base.itsLLRLUT, nullptr);
    EXPECT_EQ(streams.out() + streams.err(), "");
}
