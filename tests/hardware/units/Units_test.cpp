// The units by their C interface: every value of the model from the values before it, and what they refuse.
#include <gtest/gtest.h>

#include <array>
#include <map>

#include "morvik_units.h"
#include "rules/BlockSizes.h"
#include "rules/Cut.h"
#include "rules/Schedule.h"
#include "rules/Tail.h"
#include "support/Checkers.h"
#include "support/Configurations.h"

namespace morvik {
namespace {

using Row = std::array<std::int32_t, 8>;
using Branches = std::array<std::int32_t, 4>;

/// A recursion on its way: the column, and the corrections pending with it.
struct Column {
    Row metrics{};
    Row pending{};
};

/// The values of a block as the checker knows them, and what the units make of them.
class Units : public testing::TestWithParam<Configuration> {
protected:
    void start(std::uint32_t K)
    {
        const auto [units, type] = GetParam();
        algorithm = type;
        cut = rules::Cut(K, static_cast<unsigned>(units));
        blocks::Random random(K);
        block = blocks::randomBlock(random, K, blocks::Values::uniform);
        checker = support::makeChecker(units, type);
        ASSERT_EQ(support::start(checker, block, 3), MORVIK_CHECKER_AGREES);
    }

    std::int32_t value(int signal, unsigned pass, std::uint32_t step) const
    {
        return morvik_checker_value(
            checker.get(), signal, static_cast<std::int32_t>(pass), static_cast<std::int32_t>(step));
    }

    template <class Values>
    Values row(int first, unsigned pass, std::uint32_t step) const
    {
        Values values{};
        for (int& each : values) {
            each = value(first++, pass, step);
        }
        return values;
    }

    Row alpha(unsigned pass, std::uint32_t step) const
    {
        return row<Row>(MORVIK_CHECKER_ALPHA, pass, step);
    }

    Row beta(unsigned pass, std::uint32_t step) const
    {
        return row<Row>(MORVIK_CHECKER_BETA, pass, step);
    }

    Branches g(unsigned pass, std::uint32_t step) const
    {
        return row<Branches>(MORVIK_CHECKER_G, pass, step);
    }

    std::uint32_t address(std::uint32_t step) const
    {
        int position = -1;
        EXPECT_EQ(morvik_unit_address(static_cast<int>(cut.K()), static_cast<int>(step), &position), MORVIK_UNIT_OK);
        return static_cast<std::uint32_t>(position);
    }

    /// A value of the tail's three steps (rule 12).
    int tailValue(unsigned pass, unsigned step, bool isParity) const
    {
        const unsigned place = rules::tailPlace(rules::constituentOf(pass), step, isParity);
        const std::size_t position = cut.K() + place / 3;
        return place % 3 == 0 ? block.sys[position] : place % 3 == 1 ? block.par1[position] : block.par2[position];
    }

    int systematic(unsigned pass, std::uint32_t step) const
    {
        if (step >= cut.K()) {
            return tailValue(pass, step - cut.K(), false);
        }
        return block.sys[rules::constituentOf(pass) == 1 ? address(step) : step];
    }

    int parity(unsigned pass, std::uint32_t step) const
    {
        return (rules::constituentOf(pass) == 1 ? block.par2 : block.par1)[step];
    }

    int twiceIntrinsic(unsigned pass, std::uint32_t step) const
    {
        int apriori = 0;
        if (pass > 0 && step < cut.K()) {
            const std::uint32_t from = rules::constituentOf(pass) == 1 ? address(step) : inverse.at(step);
            apriori = value(MORVIK_CHECKER_EXTRINSIC, pass - 1, from);
        }
        int twice = 0;
        EXPECT_EQ(morvik_unit_intrinsic(apriori, systematic(pass, step), &twice), MORVIK_UNIT_OK);
        return twice;
    }

    Column forward(const Column& from, unsigned pass, std::uint32_t step) const
    {
        Column next;
        EXPECT_EQ(morvik_unit_forward(algorithm,
                                      from.metrics.data(),
                                      from.pending.data(),
                                      g(pass, step).data(),
                                      next.metrics.data(),
                                      next.pending.data()),
                  MORVIK_UNIT_OK);
        return next;
    }

    Column backward(const Column& from, unsigned pass, std::uint32_t step) const
    {
        Column previous;
        EXPECT_EQ(morvik_unit_backward(algorithm,
                                       from.metrics.data(),
                                       from.pending.data(),
                                       g(pass, step).data(),
                                       previous.metrics.data(),
                                       previous.pending.data()),
                  MORVIK_UNIT_OK);
        return previous;
    }

    static Row border(const Row& column)
    {
        Row kept{};
        EXPECT_EQ(morvik_unit_border(column.data(), kept.data()), MORVIK_UNIT_OK);
        return kept;
    }

    Row tail(unsigned pass) const
    {
        std::array<int, 3> x{};
        std::array<int, 3> p{};
        for (unsigned step = 0; step < 3; ++step) {
            x[step] = tailValue(pass, step, false);
            p[step] = tailValue(pass, step, true);
        }
        Row column{};
        EXPECT_EQ(morvik_unit_tail(x.data(), p.data(), column.data()), MORVIK_UNIT_OK);
        return column;
    }

    void expectStepValues(unsigned pass)
    {
        for (std::uint32_t step = 0; step < cut.K(); ++step) {
            const int twice = twiceIntrinsic(pass, step);
            ASSERT_EQ(twice >> 1, value(MORVIK_CHECKER_INTRINSIC, pass, step)) << pass << ' ' << step;
            Branches branches{};
            ASSERT_EQ(morvik_unit_branch(twice, parity(pass, step), branches.data()), MORVIK_UNIT_OK);
            ASSERT_EQ(branches, g(pass, step)) << pass << ' ' << step;
            int ratio = 0;
            ASSERT_EQ(morvik_unit_ratio(
                          algorithm, alpha(pass, step).data(), beta(pass, step).data(), branches.data(), &ratio),
                      MORVIK_UNIT_OK);
            ASSERT_EQ(ratio, value(MORVIK_CHECKER_LLR, pass, step)) << pass << ' ' << step;
            int extrinsic = 0;
            ASSERT_EQ(morvik_unit_extrinsic(algorithm, ratio, twice, &extrinsic), MORVIK_UNIT_OK);
            ASSERT_EQ(extrinsic, value(MORVIK_CHECKER_EXTRINSIC, pass, step)) << pass << ' ' << step;
        }
        for (std::uint32_t step = cut.K(); step < cut.K() + rules::tailSteps; ++step) {
            ASSERT_EQ(twiceIntrinsic(pass, step) >> 1, value(MORVIK_CHECKER_INTRINSIC, pass, step)) << pass;
        }
    }

    void expectForwardMetrics(unsigned pass)
    {
        Column column;
        for (std::uint32_t step = 0; step < cut.K(); ++step) {
            if (cut.startsSegment(step)) {
                if (step > 0 && !rules::isFirstPass(pass)) {
                    ASSERT_EQ(alpha(pass, step), border(ends.at({rules::passBefore(pass), step}))) << pass;
                    ++borders;
                }
                column = {alpha(pass, step), {}};
            }
            ASSERT_EQ(alpha(pass, step), column.metrics) << pass << ' ' << step;
            column = forward(column, pass, step);
            ends[{pass, step + 1}] = column.metrics;
        }
        ASSERT_EQ(alpha(pass, cut.K()), column.metrics) << pass;
    }

    void expectBackwardMetrics(unsigned pass)
    {
        for (unsigned number = 0; number < cut.windows(); ++number) {
            const rules::Window window = cut.window(number);
            Column column{beta(pass, window.last), {}};
            if (cut.startsAtTail(window)) {
                ASSERT_EQ(column.metrics, tail(pass)) << pass;
            } else if (!rules::isFirstPass(pass)) {
                const unsigned of = cut.startsFromThisPass(window) ? pass : rules::passBefore(pass);
                ASSERT_EQ(column.metrics, border(beginnings.at({of, window.last + 1}))) << pass << ' ' << number;
                ++borders;
            }
            for (std::uint32_t step = window.last; step > window.first; --step) {
                column = backward(column, pass, step);
                ASSERT_EQ(column.metrics, beta(pass, step - 1)) << pass << ' ' << step;
            }
            beginnings[{pass, window.first}] = backward(column, pass, window.first).metrics;
        }
    }

    void expectEveryValue(std::uint32_t K)
    {
        start(K);
        inverse.assign(K, 0);
        for (std::uint32_t step = 0; step < K; ++step) {
            inverse.at(address(step)) = step;
        }
        for (unsigned pass = 0; pass < 6; ++pass) {
            expectStepValues(pass);
            expectForwardMetrics(pass);
            expectBackwardMetrics(pass);
        }
        EXPECT_EQ(borders, 4 * (cut.segments() - 1 + cut.windows() - 1));
    }

    int algorithm = 0;
    rules::Cut cut;
    blocks::Block block;
    support::Checker checker;
    std::vector<std::uint32_t> inverse;
    std::map<std::pair<unsigned, std::uint32_t>, Row> ends;        ///< by pass and step, of the forward recursion
    std::map<std::pair<unsigned, std::uint32_t>, Row> beginnings;  ///< of windows
    unsigned borders = 0;                                          ///< that were compared
};

INSTANTIATE_TEST_SUITE_P(, Units, everyConfiguration(), configurationName);

TEST_P(Units, ComputeEveryValueOfTheModel)
{
    expectEveryValue(40);
}

// Segments of three windows with two units, of two with four and eight.
TEST_P(Units, ComputeEveryValueAcrossBorders)
{
    expectEveryValue(1536);
}

TEST(UnitValues, ClipAndWrapAtTheEndsOfRegisters)
{
    int twice = 0;
    EXPECT_EQ(morvik_unit_intrinsic(-128, -128, &twice), MORVIK_UNIT_OK);
    EXPECT_EQ(twice, -192);
    EXPECT_EQ(morvik_unit_intrinsic(127, 127, &twice), MORVIK_UNIT_OK);
    EXPECT_EQ(twice, 190);
    EXPECT_EQ(morvik_unit_intrinsic(-3, 0, &twice), MORVIK_UNIT_OK);
    EXPECT_EQ(twice, -2);
    Branches branches{};
    EXPECT_EQ(morvik_unit_branch(190, 127, branches.data()), MORVIK_UNIT_OK);
    EXPECT_EQ(branches, (Branches{127, 63, 63, 127}));
    EXPECT_EQ(morvik_unit_branch(-192, 127, branches.data()), MORVIK_UNIT_OK);
    EXPECT_EQ(branches, (Branches{-65, -128, -128, -65}));
    Row next{};
    const Row highest = {2047, 2047, 2047, 2047, 2047, 2047, 2047, 2047};
    const Branches ones = {1, 1, 1, 1};
    EXPECT_EQ(morvik_unit_forward(0, highest.data(), nullptr, ones.data(), next.data(), nullptr), MORVIK_UNIT_OK);
    EXPECT_EQ(next, (Row{-2048, -2048, -2048, -2048, -2048, -2048, -2048, -2048}));
    int extrinsic = 0;
    EXPECT_EQ(morvik_unit_extrinsic(1, -1, 0, &extrinsic), MORVIK_UNIT_OK);
    EXPECT_EQ(extrinsic, -1);  // -0.75, rounded down
    EXPECT_EQ(morvik_unit_extrinsic(0, 2047, -192, &extrinsic), MORVIK_UNIT_OK);
    EXPECT_EQ(extrinsic, 127);
}

TEST(UnitValues, CorrectionsComeOneDecisionLate)
{
    const Row zeros{};
    const Branches none{};
    Column first;
    EXPECT_EQ(morvik_unit_backward(2, zeros.data(), nullptr, none.data(), first.metrics.data(), first.pending.data()),
              MORVIK_UNIT_OK);
    EXPECT_EQ(first.metrics, zeros);
    EXPECT_EQ(first.pending, (Row{6, 6, 6, 6, 6, 6, 6, 6}));
    Column second = first;  // results may be the inputs
    EXPECT_EQ(
        morvik_unit_backward(
            2, second.metrics.data(), second.pending.data(), none.data(), second.metrics.data(), second.pending.data()),
        MORVIK_UNIT_OK);
    EXPECT_EQ(second.metrics, first.pending);
}

TEST(UnitValues, AddressesAreThoseOfTheStandard)
{
    for (const rules::BlockSize& size : rules::blockSizes) {
        for (const std::uint64_t i : {std::uint64_t{0}, std::uint64_t{1}, std::uint64_t{size.K - 1}}) {
            int address = -1;
            EXPECT_EQ(morvik_unit_address(static_cast<int>(size.K), static_cast<int>(i), &address), MORVIK_UNIT_OK);
            EXPECT_EQ(static_cast<std::uint64_t>(address), (size.f1 * i + size.f2 * i * i) % size.K);
        }
    }
}

TEST(UnitRefusals, NameTheFirstWrongArgument)
{
    Row row{};
    Row high{};
    high[7] = 2048;
    const Row pending = {0, 0, 0, 0, 0, 0, 0, 7};
    const Row one = {1, 0, 0, 0, 0, 0, 0, 0};
    const Branches g{};
    const Branches wide = {0, 0, 0, 128};
    int out = 5;
    EXPECT_EQ(morvik_unit_intrinsic(0, 0, nullptr), MORVIK_UNIT_NULL_POINTER);
    EXPECT_EQ(morvik_unit_intrinsic(128, 0, &out), MORVIK_UNIT_APRIORI);
    EXPECT_EQ(morvik_unit_intrinsic(128, -129, &out), MORVIK_UNIT_SOFT_VALUE);
    EXPECT_EQ(morvik_unit_branch(191, 0, row.data()), MORVIK_UNIT_TWICE_INTRINSIC);
    EXPECT_EQ(morvik_unit_branch(0, 128, row.data()), MORVIK_UNIT_SOFT_VALUE);
    EXPECT_EQ(morvik_unit_forward(3, high.data(), nullptr, g.data(), row.data(), nullptr), MORVIK_UNIT_ALGORITHM);
    EXPECT_EQ(morvik_unit_forward(1, high.data(), nullptr, g.data(), row.data(), nullptr), MORVIK_UNIT_METRIC);
    EXPECT_EQ(morvik_unit_forward(1, high.data(), nullptr, wide.data(), row.data(), nullptr),
              MORVIK_UNIT_BRANCH_METRIC);
    EXPECT_EQ(morvik_unit_backward(2, row.data(), pending.data(), g.data(), row.data(), nullptr), MORVIK_UNIT_PENDING);
    EXPECT_EQ(morvik_unit_backward(1, row.data(), one.data(), g.data(), row.data(), nullptr), MORVIK_UNIT_PENDING);
    EXPECT_EQ(morvik_unit_backward(1, row.data(), nullptr, nullptr, row.data(), nullptr), MORVIK_UNIT_NULL_POINTER);
    EXPECT_EQ(morvik_unit_ratio(-1, row.data(), row.data(), g.data(), &out), MORVIK_UNIT_ALGORITHM);
    EXPECT_EQ(morvik_unit_ratio(0, row.data(), high.data(), g.data(), &out), MORVIK_UNIT_METRIC);
    EXPECT_EQ(morvik_unit_extrinsic(0, -2049, 0, &out), MORVIK_UNIT_METRIC);
    EXPECT_EQ(morvik_unit_extrinsic(0, -2049, -193, &out), MORVIK_UNIT_TWICE_INTRINSIC);
    EXPECT_EQ(morvik_unit_address(41, 0, &out), MORVIK_UNIT_BLOCK_SIZE);
    EXPECT_EQ(morvik_unit_address(-40, 0, &out), MORVIK_UNIT_BLOCK_SIZE);
    EXPECT_EQ(morvik_unit_address(40, 40, &out), MORVIK_UNIT_STEP);
    EXPECT_EQ(morvik_unit_address(40, -1, &out), MORVIK_UNIT_STEP);
    EXPECT_EQ(morvik_unit_tail(high.data(), nullptr, row.data()), MORVIK_UNIT_NULL_POINTER);
    const std::array<int, 3> loud = {0, 0, 128};
    EXPECT_EQ(morvik_unit_tail(row.data(), loud.data(), row.data()), MORVIK_UNIT_SOFT_VALUE);
    EXPECT_EQ(morvik_unit_border(high.data(), row.data()), MORVIK_UNIT_METRIC);
    EXPECT_EQ(out, 5);  // nothing has been written
    EXPECT_EQ(row, Row{});
}

TEST(UnitRefusals, HaveATextEach)
{
    EXPECT_STREQ(morvik_unit_status_text(MORVIK_UNIT_METRIC), "a metric or the ratio is not from -2048 to 2047");
    std::map<std::string, int> texts;
    for (int status = MORVIK_UNIT_OK; status <= MORVIK_UNIT_STEP; ++status) {
        texts[morvik_unit_status_text(status)] = status;
    }
    texts[morvik_unit_status_text(MORVIK_UNIT_OUT_OF_MEMORY)] = MORVIK_UNIT_OUT_OF_MEMORY;
    EXPECT_EQ(texts.size(), 12U);
    EXPECT_EQ(texts.count("unknown status"), 0U);
    EXPECT_STREQ(morvik_unit_status_text(98), "unknown status");
}

}  // namespace
}  // namespace morvik
