// TCalculationEngineModBase: tests of the kernels against the plain formulation, of the correction
// table and of the algorithm type's text.
#include "TCalculationEngineModBase.h"

#include <gtest/gtest.h>

#include <array>
#include <sstream>

#include "support/Blocks.h"
#include "support/CapturedStreams.h"
#include "support/PlainTrellis.h"

namespace {

using Base = TCalculationEngineModBase;
using morvik::blocks::between;
using morvik::blocks::Random;

const TNumberFormat stateFormat(12, 3);
const TNumberFormat branchFormat(8, 3);

constexpr T8 guard{{11, 22, 33, 44, 55, 66, 77, 88}};

/// Alpha, beta and llr have three different tables here, of these numbers of points.
constexpr unsigned tablePoints[3] = {16, 0, 1};

/// The tables of alpha, beta and llr as the engine builds them.
const std::vector<unsigned char>& builtTable(unsigned kernel)
{
    static const std::vector<unsigned char> tables[] = {Base::createLUT(tablePoints[0], stateFormat),
                                                        Base::createLUT(tablePoints[1], stateFormat),
                                                        Base::createLUT(tablePoints[2], stateFormat)};
    return tables[kernel];
}

/// The same tables in the plain formulation.
const std::vector<int>& plainTable(unsigned kernel)
{
    static const std::vector<int> tables[] = {morvik::plain::correctionTable(tablePoints[0]),
                                              morvik::plain::correctionTable(tablePoints[1]),
                                              morvik::plain::correctionTable(tablePoints[2])};
    return tables[kernel];
}

/// The kernels with their tables and formats in place.
class TestEngine : public Base {
public:
    TestEngine()
    {
        itsStateFormat = &stateFormat;
        itsBranchFormat = &branchFormat;
        itsAlphaLUT = &builtTable(0)[32768];
        itsBetaLUT = &builtTable(1)[32768];
        itsLLRLUT = &builtTable(2)[32768];
    }

    std::string getProperties() const override
    {
        return "";
    }
};

/// A variant of the kernels under its three names. The other two kernels run another one, so that
/// a kernel that looks at a type not its own is found out.
struct Variant {
    Base::AlgorithmType type;
    Base::AlgorithmType other;
    morvik::plain::Decision rule;
};

constexpr Variant variants[] = {
    {Base::MOD, Base::MOD_HASH, morvik::plain::Decision::max},
    {Base::MOD_STAR, Base::MOD, morvik::plain::Decision::maxStar},
    {Base::MOD_HASH, Base::MOD_STAR, morvik::plain::Decision::maxHash},
};

/// Values anywhere, at the extremes, around the wrap point, or close to each other.
short drawMetric(Random& random, int kind)
{
    switch (kind) {
    case 0:
        return static_cast<short>(between(random, -32768, 32767));
    case 1:
        return between(random, 0, 1) == 0 ? -32768 : 32767;
    case 2:
        return static_cast<short>(morvik::plain::wrap16(32768 + 16 * between(random, -40, 40)));
    default:
        return static_cast<short>(16 * between(random, -8, 8));
    }
}

constexpr int metricKinds = 4;

using Columns = std::vector<T8>;

Columns drawColumns(Random& random, std::size_t count)
{
    Columns columns(count);
    const int kind = between(random, 0, metricKinds - 1);
    for (T8& column : columns) {
        for (short& metric : column.metric) {
            metric = drawMetric(random, kind);
        }
    }
    return columns;
}

morvik::plain::Column plainColumn(const T8& column)
{
    morvik::plain::Column metrics{};
    std::copy(column.metric, column.metric + 8, metrics.begin());
    return metrics;
}

morvik::plain::BranchColumn plainBranches(const T8& column)
{
    return {column[0], column[1], column[2], column[3]};
}

std::vector<morvik::plain::BranchColumn> plainBranches(const Columns& columns)
{
    std::vector<morvik::plain::BranchColumn> g;
    for (const T8& column : columns) {
        g.push_back(plainBranches(column));
    }
    return g;
}

/// The columns that a recursion should leave behind, between two guards.
Columns betweenGuards(const std::vector<morvik::plain::Column>& columns)
{
    Columns all(columns.size() + 2, guard);
    for (std::size_t i = 0; i < columns.size(); ++i) {
        std::copy(columns[i].begin(), columns[i].end(), all[i + 1].metric);
    }
    return all;
}

void expectColumns(const Columns& got, const Columns& expected)
{
    ASSERT_EQ(got.size(), expected.size());
    for (std::size_t i = 0; i < got.size(); ++i) {
        ASSERT_EQ(plainColumn(got[i]), plainColumn(expected[i])) << "column " << i << " of " << got.size();
    }
}

/// One stretch of n steps through all three kernels.
void checkVariant(const Variant& variant, Random& random, unsigned n)
{
    TestEngine engine;
    const Columns g = drawColumns(random, n);
    const Columns start = drawColumns(random, 1);

    engine.itsAlphaAlgorithmType = variant.type;
    engine.itsBetaAlgorithmType = engine.itsLLRAlgorithmType = variant.other;
    Columns a(n + 2, guard);
    a[1] = start[0];
    EXPECT_EQ(engine.alpha(n, g.data(), &a[1]), &a[1] + n);
    expectColumns(
        a, betweenGuards(morvik::plain::forward(plainBranches(g), plainColumn(start[0]), variant.rule, plainTable(0))));

    engine.itsBetaAlgorithmType = variant.type;
    engine.itsAlphaAlgorithmType = variant.other;
    Columns b(n + 2, guard);
    b[n] = start[0];
    EXPECT_EQ(engine.beta(n, &g[n - 1], &b[n]), &b[n] - n);
    expectColumns(
        b,
        betweenGuards(morvik::plain::backward(plainBranches(g), plainColumn(start[0]), variant.rule, plainTable(1))));

    engine.itsLLRAlgorithmType = variant.type;
    engine.itsBetaAlgorithmType = variant.other;
    const Columns other = drawColumns(random, n);
    std::vector<short> out(n + 2, 99);
    EXPECT_EQ(engine.llr(n, &a[1], other.data(), g.data(), &out[1]), &out[1] + n);
    for (unsigned k = 0; k < n; ++k) {
        ASSERT_EQ(out[k + 1],
                  morvik::plain::logLikelihoodRatio(
                      plainColumn(a[k + 1]), plainColumn(other[k]), plainBranches(g[k]), variant.rule, plainTable(2)))
            << "step " << k << " of " << n;
    }
    EXPECT_EQ(out.front(), 99);
    EXPECT_EQ(out.back(), 99);
}

/// The branch metrics of one step, with elements 4 to 7 from the guard.
T8 branchesOf(Base& engine, short intrinsic, short parity0, short parity1)
{
    T8 g[3] = {guard, guard, guard};
    EXPECT_EQ(engine.gamma(1, &intrinsic, &parity0, &parity1, g + 1), g + 2);
    EXPECT_TRUE(compareT8(g[0], guard));
    EXPECT_TRUE(compareT8(g[2], guard));
    return g[1];
}

/// Reads an algorithm type, and what is left in the stream behind it.
std::pair<Base::AlgorithmType, std::string> readType(const std::string& text)
{
    std::istringstream is(text);
    Base::AlgorithmType type = Base::MOD_STAR;
    is >> type;
    is.clear();
    return {type, {std::istreambuf_iterator<char>(is), {}}};
}

std::string createFailure(unsigned points, const TNumberFormat& format)
{
    const CapturedStreams streams;
    EXPECT_TRUE(Base::createLUT(points, format).empty());
    EXPECT_EQ(streams.out(), "");
    return streams.err();
}

}  // namespace

TEST(TCalculationEngineModBase, ComputesGammaLikeThePlainFormulation)
{
    TestEngine engine;
    Random random(1);
    for (int i = 0; i < 4000; ++i) {
        const int kind = i % metricKinds;
        const short x = drawMetric(random, kind);
        const short p = drawMetric(random, kind);
        const short q = drawMetric(random, kind);
        const T8 g = branchesOf(engine, x, p, q);
        ASSERT_EQ(plainBranches(g), morvik::plain::branchMetrics(x, p, q)) << x << ' ' << p << ' ' << q;
        for (unsigned element = 4; element < 8; ++element) {
            ASSERT_EQ(g[element], guard[element]);
        }
    }
}

TEST(TCalculationEngineModBase, ClipsGammaBeforeItWraps)
{
    TestEngine engine;
    EXPECT_EQ(plainBranches(branchesOf(engine, 0, 0, 0)), (morvik::plain::BranchColumn{0, 0, 0, 0}));
    EXPECT_EQ(plainBranches(branchesOf(engine, 16384, 0, 0)), (morvik::plain::BranchColumn{2032, 2032, 2032, 2032}));
    EXPECT_EQ(plainBranches(branchesOf(engine, -16385, 0, 0)),
              (morvik::plain::BranchColumn{-2048, -2048, -2048, -2048}));
    EXPECT_EQ(plainBranches(branchesOf(engine, 0, 2032, 0)), (morvik::plain::BranchColumn{2032, -2032, -2032, 2032}));
    EXPECT_EQ(plainBranches(branchesOf(engine, 0, 2033, 15)), (morvik::plain::BranchColumn{2032, -2018, -2048, 2018}));
    EXPECT_EQ(plainBranches(branchesOf(engine, -32768, -32768, 32767)),
              (morvik::plain::BranchColumn{-2048, -1, -2048, -2048}));
}

TEST(TCalculationEngineModBase, AlignsTheBranchLimitsLikeStateMetrics)
{
    const struct {
        TNumberFormat state;
        short lowest;
        short highest;
    } cases[] = {{{16, 3}, -128, 127}, {{12, 3}, -2048, 2032}, {{8, 3}, -32768, 32512}};
    for (const auto& [state, lowest, highest] : cases) {
        TestEngine engine;
        engine.itsStateFormat = &state;
        EXPECT_EQ(branchesOf(engine, 32767, 0, 0)[0], highest);
        EXPECT_EQ(branchesOf(engine, -32768, 0, 0)[0], lowest);
    }
}

TEST(TCalculationEngineModBase, RunsGammaAndLLROverNoStepsAtAll)
{
    TestEngine engine;
    T8 column = guard;
    short value = 99;
    EXPECT_EQ(engine.gamma(0, &value, &value, &value, &column), &column);
    EXPECT_EQ(engine.llr(0, &column, &column, &column, &value), &value);
    EXPECT_TRUE(compareT8(column, guard));
    EXPECT_EQ(value, 99);
}

TEST(TCalculationEngineModBase, RunsEveryVariantLikeThePlainFormulation)
{
    Random random(2);
    for (const Variant& variant : variants) {
        for (const unsigned n : {1U, 2U, 3U, 64U}) {  // with one step, a recursion writes nothing
            for (int repetition = 0; repetition < 40; ++repetition) {
                SCOPED_TRACE(testing::Message() << variant.type << " n=" << n << " repetition " << repetition);
                checkVariant(variant, random, n);
                ASSERT_FALSE(HasFailure());
            }
        }
    }
}

TEST(TCalculationEngineModBase, ComparesMetricsAcrossTheWrapPoint)
{
    TestEngine engine;
    const T8 g[2] = {};
    T8 a[2] = {{{32767, -32768, -32768, 32767, 0, 0, 0, 0}}, guard};
    engine.alpha(2, g, a);
    EXPECT_EQ(plainColumn(a[1]), (morvik::plain::Column{-32768, -32768, 0, 0, -32768, -32768, 0, 0}));
}

TEST(TCalculationEngineModBase, RefusesIllegalAlgorithmTypesKernelByKernel)
{
    for (const int illegal : {0, 4, -1}) {
        TestEngine engine;
        T8 columns[3] = {guard, guard, guard};
        short out = 99;
        const auto type = static_cast<Base::AlgorithmType>(illegal);
        engine.itsAlphaAlgorithmType = engine.itsBetaAlgorithmType = engine.itsLLRAlgorithmType = type;
        const CapturedStreams streams;
        EXPECT_EQ(engine.alpha(2, columns, columns), nullptr);
        EXPECT_EQ(engine.beta(2, columns + 2, columns + 2), nullptr);
        EXPECT_EQ(engine.llr(1, columns, columns, columns, &out), nullptr);
        EXPECT_EQ(streams.err(),
                  "ERROR:TCalculationEngineModBase::alpha:Illegal algorithm type\n"
                  "ERROR:TCalculationEngineModBase::beta:Illegal algorithm type\n"
                  "ERROR:TCalculationEngineModBase::llr:Illegal algorithm type\n");
        EXPECT_EQ(streams.out(), "");
        expectColumns({columns, columns + 3}, {guard, guard, guard});
        EXPECT_EQ(out, 99);
    }
}

TEST(TCalculationEngineModBase, BuildsTheTableOf16Points)
{
    const std::vector<unsigned char> table = Base::createLUT(16, stateFormat);
    ASSERT_EQ(table.size(), 65536U);
    const struct {
        int first;
        int last;
        int entry;
    } stretches[] = {{0, 63, 96},
                     {-64, -1, 96},
                     {64, 127, 64},
                     {-128, -65, 64},
                     {128, 191, 48},
                     {-192, -129, 48},
                     {192, 255, 32},
                     {256, 383, 16},
                     {384, 32767, 0},
                     {-32768, -385, 0}};
    for (const auto& [first, last, entry] : stretches) {
        for (int d = first; d <= last; ++d) {
            ASSERT_EQ(table[static_cast<std::size_t>(d + 32768)], entry) << d;
        }
    }
}

TEST(TCalculationEngineModBase, BuildsTablesOfEveryPowerOfTwoLikeThePlainFormulation)
{
    for (const unsigned count : {0U, 1U, 2U, 4U, 8U, 16U, 32U, 64U, 128U, 65536U}) {
        const std::vector<unsigned char> table = Base::createLUT(count, stateFormat);
        ASSERT_EQ(std::vector<int>(table.begin(), table.end()), morvik::plain::correctionTable(count)) << count;
    }
}

TEST(TCalculationEngineModBase, BuildsTheTableOfAFormatThatFillsTheWord)
{
    // Fix_16_3 with 16 points resolves half a unit, four steps: 8 ln(1 + e^-r) at r = 0, 1/2, 1.
    const std::vector<unsigned char> lut = Base::createLUT(16, TNumberFormat(16, 3));
    ASSERT_EQ(lut.size(), 65536U);
    const unsigned char expected[12] = {6, 6, 6, 6, 4, 4, 4, 4, 3, 3, 3, 3};
    for (unsigned d = 0; d < 12; ++d) {
        EXPECT_EQ(lut[32768 + d], expected[d]) << d;
        EXPECT_EQ(lut[32767 - d], expected[d]) << "-" << d + 1;
    }
}

TEST(TCalculationEngineModBase, RefusesTablesThatCannotBeBuilt)
{
    const std::string number = "ERROR:TCalculationEngineModBase::createLUT:Number of points must be a binary number\n";
    const std::string format =
        "ERROR:TCalculationEngineModBase::createLUT:"
        "Binary point of state metrics is incompatible with 8 bit lookup tables\n";
    for (const unsigned count : {12U, 3U, 65535U, 4294967295U}) {
        EXPECT_EQ(createFailure(count, stateFormat), number) << count;
    }
    EXPECT_EQ(createFailure(16, TNumberFormat(8, 1)), format);  // 1 fraction bit + shift 8 = 9
    EXPECT_EQ(createFailure(12, TNumberFormat(8, 1)), format);
    const std::vector<unsigned char> table = Base::createLUT(16, TNumberFormat(9, 1));  // 1 + 7 = 8
    ASSERT_EQ(table.size(), 65536U);
    EXPECT_EQ(table[32768], 128);  // 2 ln 2 rounds to 1, aligned
}

TEST(AlgorithmType, PrintsItsName)
{
    const struct {
        int type;
        const char* name;
    } cases[] = {{0, "<unknown>"}, {1, "MOD"}, {2, "MOD*"}, {3, "MOD#"}, {4, "<unknown>"}, {-1, "<unknown>"}};
    for (const auto& [type, name] : cases) {
        std::ostringstream os;
        os << static_cast<Base::AlgorithmType>(type);
        EXPECT_EQ(os.str(), name);
    }
}

TEST(AlgorithmType, ReadsANameInAnyCaseAndNothingBehindIt)
{
    using Read = std::pair<Base::AlgorithmType, std::string>;
    EXPECT_EQ(readType("MOD"), Read(Base::MOD, ""));
    EXPECT_EQ(readType("mod:x"), Read(Base::MOD, ":x"));
    EXPECT_EQ(readType("MOD MOD"), Read(Base::MOD, " MOD"));
    EXPECT_EQ(readType("MOD\n"), Read(Base::MOD, "\n"));
    EXPECT_EQ(readType("MOD**"), Read(Base::MOD_STAR, "*"));
    EXPECT_EQ(readType("mOd#:16"), Read(Base::MOD_HASH, ":16"));
}

TEST(AlgorithmType, StopsAtTheFirstCharacterThatDoesNotFit)
{
    using Read = std::pair<Base::AlgorithmType, std::string>;
    EXPECT_EQ(readType(""), Read(Base::UNKNOWN, ""));
    EXPECT_EQ(readType("MO"), Read(Base::UNKNOWN, ""));
    EXPECT_EQ(readType("MAX"), Read(Base::UNKNOWN, "AX"));
    EXPECT_EQ(readType(" MOD"), Read(Base::UNKNOWN, " MOD"));
    EXPECT_EQ(readType("MODx"), Read(Base::UNKNOWN, "x"));
    EXPECT_EQ(readType("MOD!"), Read(Base::UNKNOWN, "!"));  // the first character above a blank
}

TEST(AlgorithmType, ReadsNothingFromAFailedStream)
{
    std::istringstream is("MOD");
    is.setstate(std::ios::failbit);
    Base::AlgorithmType type = Base::MOD_STAR;
    is >> type;
    EXPECT_EQ(type, Base::UNKNOWN);
    is.clear();
    EXPECT_EQ(is.tellg(), 0);
}
