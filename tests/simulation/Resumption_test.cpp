// Resumption: what a run goes on with, and what is refused of files that cannot be of such a run.
#include "simulation/Resumption.h"

#include <gtest/gtest.h>

#include <functional>

#include "base/Error.h"
#include "support/SyntheticFrames.h"

namespace morvik::simulation {
namespace {

class Resumption : public testing::Test {
protected:
    Resumption()
    {
        plan.points = pointsOf({{40}, {4}, {1}, {std::nullopt}, {2}, {0, 500, 1000, 1500}});
        plan.version = "1.2.3";
        plan.command = "morvik ber --max-blocks 500";
        plan.rules.maxBlocks = 500;
    }

    PointResult resultOf(std::size_t number, std::uint64_t blocks) const
    {
        const std::size_t counts = plan.countsOf(plan.points[0]);
        return {number,
                morvik::support::countOneByOne(morvik::support::SyntheticFrames(1), {0, blocks}, StopRules(), counts),
                1};
    }

    Checkpoint example() const
    {
        return {plan.version, plan.command, {resultOf(0, 500), resultOf(1, 500)}, resultOf(2, 70), {}};
    }

    /// Why the checkpoint is refused, with something changed.
    std::string refusal(const std::function<void(Checkpoint&)>& change) const
    {
        Checkpoint checkpoint = example();
        change(checkpoint);
        try {
            standingOf(plan, checkpoint, "a");
        } catch (const morvik::base::Error& error) {
            return error.what();
        }
        return "none";
    }

    Plan plan;
};

/// The numbers of points.
std::vector<std::size_t> numbersOf(const std::vector<PointResult>& points)
{
    std::vector<std::size_t> numbers;
    for (const PointResult& point : points) {
        numbers.push_back(point.number);
    }
    return numbers;
}

using Numbers = std::vector<std::size_t>;

TEST_F(Resumption, GoesOnWithTheRunningPoint)
{
    const Standing standing = standingOf(plan, example(), "a");
    EXPECT_EQ(numbersOf(standing.ended), (Numbers{0, 1}));
    EXPECT_EQ(numbersOf(standing.begun), (Numbers{2}));
}

TEST_F(Resumption, GoesOnWithEndedPointsWhereLimitsHaveGrown)
{
    Checkpoint checkpoint = example();
    checkpoint.ended[1] = resultOf(1, 400);  // it ended by another limit
    plan.command = "morvik ber --max-blocks 600";
    plan.rules.maxBlocks = 600;
    plan.rules.blockErrors = resultOf(0, 500).tally.errors[0].blockErrors;
    const Standing standing = standingOf(plan, checkpoint, "a");
    EXPECT_EQ(numbersOf(standing.ended), (Numbers{0}));
    EXPECT_EQ(numbersOf(standing.begun), (Numbers{1, 2}));
}

TEST_F(Resumption, TakesNoPointThatTheRunHasNot)
{
    EXPECT_EQ(refusal([](Checkpoint&) {}), "none");
    EXPECT_EQ(refusal([](Checkpoint& each) { each.ended[1].number = 4; }), "a: point 4: is none of this run");
    EXPECT_EQ(refusal([](Checkpoint& each) { each.running->number = 4000000000; }),
              "a: point 4000000000: is none of this run");
    const std::string notNext = ": is not the next one of this run";
    EXPECT_EQ(refusal([](Checkpoint& each) { each.ended[1].number = 0; }), "a: point 0" + notNext);
    EXPECT_EQ(refusal([](Checkpoint& each) { each.ended[1].number = 2; }), "a: point 2" + notNext);
    EXPECT_EQ(refusal([](Checkpoint& each) { each.running->number = 3; }), "a: point 3" + notNext);
    EXPECT_EQ(refusal([](Checkpoint& each) { each.running->number = 1; }), "a: point 1" + notNext);
    const std::string outOfOrder = ": is there twice, or out of order";
    EXPECT_EQ(refusal([](Checkpoint& each) { each.begun = {*each.running}; }), "a: point 2" + outOfOrder);
    EXPECT_EQ(refusal([&](Checkpoint& each) {
                  each.begun = {resultOf(3, 5), resultOf(3, 5)};
              }),
              "a: point 3" + outOfOrder);
    plan.rules.stopBler = 1;  // the curve ends with its first point
    EXPECT_EQ(refusal([](Checkpoint&) {}), "a: point 1" + notNext);
}

TEST_F(Resumption, TakesNoCountsThatCannotBe)
{
    const auto withErrors = [this](const std::function<void(ErrorCounts&)>& change) {
        return refusal([&change](Checkpoint& each) { change(each.ended[1].tally.errors[0]); });
    };
    EXPECT_EQ(refusal([](Checkpoint& each) { each.ended[0].tally.errors.clear(); }),
              "a: point 0: has 0 counts of errors, expected 1");
    EXPECT_EQ(refusal([](Checkpoint& each) { each.running->tally.errors.resize(2); }),
              "a: point 2: has 2 counts of errors, expected 1");
    EXPECT_EQ(withErrors([](ErrorCounts& errors) { errors.blockErrors = 501; }),
              "a: point 1: block_errors 501 cannot be, of 500 blocks");
    EXPECT_EQ(withErrors([](ErrorCounts& errors) { errors.bitErrors = 100000; }).substr(0, 40),
              "a: point 1: bit_errors 100000 cannot be,");
    EXPECT_EQ(withErrors([](ErrorCounts& errors) { errors.bitErrorSquares = 0; }).substr(0, 42),
              "a: point 1: bit_error_squares 0 cannot be,");
    EXPECT_EQ(withErrors([](ErrorCounts& errors) { errors.failures.back() = 500; }).substr(0, 36),
              "a: point 1: failed_frames cannot be ");
    EXPECT_EQ(refusal([](Checkpoint& each) { each.running->tally.clipped = 1000000; }),
              "a: point 2: clipped_values 1000000 cannot be, of 70 blocks of 40 bits");
    EXPECT_EQ(refusal([](Checkpoint& each) { each.running->seconds = -1; }), "a: point 2: has taken no possible time");
}

TEST_F(Resumption, TakesNoPointBeyondItsLimits)
{
    const std::string beyond =
        " than the limits of this run allow; they may be larger than before, --overwrite starts anew";
    EXPECT_EQ(refusal([&](Checkpoint& each) { each.ended[1] = resultOf(1, 501); }),
              "a: holds more of point 1" + beyond);
    EXPECT_EQ(refusal([](Checkpoint& each) { each.running->tally.blocks = UINT64_MAX; }),
              "a: point 2: blocks 18446744073709551615 cannot be, of 281474976710656 at most");
    const ErrorCounts errors = resultOf(0, 500).tally.errors[0];
    plan.rules.blockErrors = errors.blockErrors - 1;
    EXPECT_EQ(refusal([](Checkpoint&) {}), "a: holds more of point 0" + beyond);
    plan.rules.blockErrors.reset();
    plan.rules.bitErrors = errors.bitErrors - 40;
    EXPECT_EQ(refusal([](Checkpoint&) {}), "a: holds more of point 0" + beyond);
    plan.rules.bitErrors = errors.bitErrors - 39;
    EXPECT_EQ(refusal([](Checkpoint&) {}), "none");
}

TEST_F(Resumption, TakesNoEndedPointThatHasNot)
{
    EXPECT_EQ(refusal([&](Checkpoint& each) { each.ended[1] = resultOf(1, 499); }),
              "a: point 1: is said to have ended, but has not");
}

}  // namespace
}  // namespace morvik::simulation
