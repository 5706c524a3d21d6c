// TCalculationEngine: tests of the factory and of what all engines share.
#include "TCalculationEngine.h"

#include <gtest/gtest.h>

#include <memory>

#include "TCalculationEngineModBase.h"
#include "support/CapturedStreams.h"

namespace {

using EnginePointer = std::unique_ptr<TCalculationEngine>;

/// An engine with nothing but what the base classes give it.
class BareEngine : public TCalculationEngineModBase {
public:
    std::string getProperties() const override
    {
        return "";
    }
};

/// The error line with which a property string is refused.
std::string refusalOfEngine(const std::string& properties)
{
    const CapturedStreams streams;
    EXPECT_EQ(EnginePointer(TCalculationEngine::create(properties)), nullptr) << properties;
    EXPECT_EQ(streams.out(), "");
    return streams.err();
}

}  // namespace

TEST(TCalculationEngine, IsMadeByItsExactNameAndAnnouncesMODAlone)
{
    const struct {
        const char* given;
        const char* properties;
    } cases[] = {{"MOD", "MOD"}, {"MOD:", "MOD"}, {"MOD#", "MOD#:0"}, {"MOD#:", "MOD#:0"}, {"MOD#:16", "MOD#:16"}};
    for (const auto& [given, properties] : cases) {
        const EnginePointer engine(TCalculationEngine::create(given));
        ASSERT_NE(engine, nullptr) << given;
        EXPECT_EQ(engine->getProperties(), properties);
    }
    EXPECT_EQ(TCalculationEngine::getNames(), std::vector<std::string>{"MOD"});
}

TEST(TCalculationEngine, RefusesOtherNames)
{
    for (const std::string type : {"mod", "MOD*", "MOD##", "MO", " MOD", "MOD ", "Mod#", ""}) {
        EXPECT_EQ(refusalOfEngine(type), "ERROR:TCalculationEngine:Unrecognised type:" + type + "\n");
    }
    EXPECT_EQ(refusalOfEngine("MOD*:16"), "ERROR:TCalculationEngine:Unrecognised type:MOD*\n");
    EXPECT_EQ(refusalOfEngine("MOD:0:1"), "ERROR:TCalculationEngineMod:Unexpected properties:0:1\n");
    EXPECT_EQ(refusalOfEngine("MOD#:abc"), "ERROR:TCalculationEngineModHash:Illegal number of points\n");
}

TEST(TCalculationEngine, StartsWithoutFormatsAndWithoutSSE2)
{
    for (const char* properties : {"MOD", "MOD#"}) {
        const EnginePointer engine(TCalculationEngine::create(properties));
        EXPECT_FALSE(engine->itsUseSSE2);
        EXPECT_EQ(engine->itsInputFormat, nullptr);
        EXPECT_EQ(engine->itsStateFormat, nullptr);
        EXPECT_EQ(engine->itsBranchFormat, nullptr);
    }
}

TEST(TCalculationEngine, WarnsOfAStateFormatWithoutASpareBit)
{
    const struct {
        unsigned bits;
        std::string warning;
    } cases[] = {
        {12, ""},
        {16, ""},
        {17,
         "WARNING:The state number format is set to maximum bit width. "
         "Note that this will cause a 1-bit truncation during intrinsic calculations\n"},
    };
    for (const auto& [bits, warning] : cases) {
        const TNumberFormat format(bits, 3);
        BareEngine engine;
        engine.itsStateFormat = &format;
        const CapturedStreams streams;
        EXPECT_TRUE(engine.initialise());
        EXPECT_EQ(streams.out(), warning) << bits;
        EXPECT_EQ(streams.err(), "");
    }
}

TEST(TCalculationEngine, RunsNoKernelWhenSSE2IsAskedFor)
{
    EXPECT_FALSE(TCalculationEngineModBase::hasSSE2());
    BareEngine engine;
    engine.itsUseSSE2 = true;
    const short soft[1] = {256};
    const T8 before{{1, 2, 3, 4, 5, 6, 7, 8}};
    T8 columns[3] = {before, before, before};
    short ratio = 99;
    const CapturedStreams streams;
    EXPECT_EQ(engine.gamma(1, soft, soft, soft, columns), nullptr);
    EXPECT_EQ(engine.alpha(2, columns, columns), nullptr);
    EXPECT_EQ(engine.beta(2, columns + 2, columns + 2), nullptr);
    EXPECT_EQ(engine.llr(1, columns, columns, columns, &ratio), nullptr);
    for (const T8& column : columns) {
        EXPECT_TRUE(compareT8(column, before));
    }
    EXPECT_EQ(ratio, 99);
    EXPECT_EQ(streams.out() + streams.err(), "");
}

TEST(T8, ComparesFourBranchMetricsOrEightStateMetrics)
{
    const T8 a{{1, 2, 3, 4, 5, 6, 7, 8}};
    for (unsigned i = 0; i < 8; ++i) {
        T8 b = a;
        EXPECT_TRUE(compareT8(a, b));
        b[i] = 0;
        EXPECT_EQ(compareT8_4(a, b), i >= 4) << i;
        EXPECT_FALSE(compareT8(a, b)) << i;
    }
}
