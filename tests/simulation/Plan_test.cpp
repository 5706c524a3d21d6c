// Plan: which points a sweep has, in which order, and what becomes of their results.
#include "simulation/Plan.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "rules/BlockSizes.h"

namespace morvik::simulation {
namespace {

Sweep sweepOf(std::vector<int> milliDecibels)
{
    return {{40}, {4}, {1}, {std::nullopt}, {8}, std::move(milliDecibels)};
}

Plan planOf(const Sweep& sweep)
{
    Plan plan;
    plan.points = pointsOf(sweep);
    plan.version = "1.2.3";
    plan.command = "how to";
    plan.seed = 5;
    return plan;
}

PointResult resultOf(std::size_t number, std::uint64_t blocks, std::uint64_t failed)
{
    PointResult result;
    result.number = number;
    result.tally.blocks = blocks;
    result.tally.clipped = 7;
    for (std::uint64_t i = 0; i < failed; ++i) {
        result.tally.errors[0].add(i, 3);
    }
    result.seconds = 2.5;
    return result;
}

TEST(Plan, HasEveryCombinationWithEbn0Innermost)
{
    const Sweep sweep = {{40, 48}, {2, 8}, {0, 2}, {std::nullopt, 12000}, {4, 6}, {0, 500}};
    const std::vector<Point> points = pointsOf(sweep);
    ASSERT_EQ(points.size(), 64U);
    std::size_t i = 0;
    for (const unsigned K : sweep.blockSizes) {
        for (const unsigned numPu : sweep.numPus) {
            for (const unsigned algorithm : sweep.algorithms) {
                for (const ScaleOption& scale : sweep.scaleOptions) {
                    for (const unsigned iterations : sweep.iterations) {
                        for (const int milliDecibels : sweep.milliDecibels) {
                            const Point& point = points[i++];
                            EXPECT_EQ(point.blockSize, K);
                            EXPECT_EQ(point.numPu, numPu);
                            EXPECT_EQ(point.algorithm, algorithm);
                            EXPECT_EQ(point.scaleOption, scale);
                            EXPECT_EQ(point.iterations, iterations);
                            EXPECT_EQ(point.milliDecibels, milliDecibels);
                            EXPECT_EQ(point.milliScale, scale.value_or(point.milliScale));
                            EXPECT_GT(point.milliScale, 0);
                        }
                    }
                }
            }
        }
    }
}

TEST(Plan, PutsPointsInAscendingOrder)
{
    const std::vector<Point> points =
        pointsOf({{512, 40}, {8, 2}, {1}, {16000, std::nullopt, 8000}, {8}, {1000, -500}});
    EXPECT_TRUE(std::is_sorted(points.begin(), points.end()));
    EXPECT_EQ(points.front().blockSize, 40U);
    EXPECT_EQ(points.front().scaleOption, std::nullopt);
    EXPECT_EQ(points.front().milliDecibels, -500);
}

TEST(Plan, ChoosesEbn0ByTheSizeWhereItIsNotGiven)
{
    Sweep sweep = sweepOf({});
    sweep.blockSizes = {40, 512, 6144};
    std::vector<int> seen[3];
    for (const Point& point : pointsOf(sweep)) {
        seen[point.blockSize == 40 ? 0 : point.blockSize == 512 ? 1 : 2].push_back(point.milliDecibels);
    }
    EXPECT_EQ(seen[0], usualMilliDecibels(40));
    EXPECT_EQ(seen[1], usualMilliDecibels(512));
    EXPECT_EQ(seen[2], usualMilliDecibels(6144));
    for (const morvik::rules::BlockSize& size : morvik::rules::blockSizes) {
        EXPECT_GE(usualMilliDecibels(size.K).size(), 10U) << size.K;
        EXPECT_TRUE(std::is_sorted(seen[0].begin(), seen[0].end()));
    }
}

TEST(Plan, EndsACurveBelowTheFloor)
{
    Sweep sweep = sweepOf({0, 1000, 2000});
    sweep.iterations = {4, 8};
    Plan plan = planOf(sweep);
    plan.rules.stopBler = 0.01;
    const std::vector<PointResult> atFloor = {resultOf(0, 1000, 10)};
    EXPECT_FALSE(isCurveEnded(plan, 1, atFloor));
    const std::vector<PointResult> belowFloor = {resultOf(0, 1000, 9)};
    EXPECT_TRUE(isCurveEnded(plan, 1, belowFloor));
    EXPECT_TRUE(isCurveEnded(plan, 2, belowFloor));
    EXPECT_FALSE(isCurveEnded(plan, 3, belowFloor)) << "another curve";
    plan.rules.stopBler = 0;
    EXPECT_FALSE(isCurveEnded(plan, 1, {resultOf(0, 1000, 0)}));
}

TEST(Plan, MakesARowOfAPoint)
{
    Plan plan = planOf(sweepOf({1500}));
    plan.frames = {100, 5000};
    const Results results = resultsOf(plan, {resultOf(0, 40, 4)});
    EXPECT_EQ(results.version, "1.2.3");
    EXPECT_EQ(results.command, "how to");
    ASSERT_EQ(results.rows.size(), 1U);
    const ResultRow& row = results.rows[0];
    EXPECT_EQ(row.point, plan.points[0]);
    EXPECT_EQ(row.frames.text(), "100:140");
    EXPECT_EQ(row.errors.bitErrors, 12U);
    EXPECT_EQ(row.errors.bitErrorSquares, 36U);
    EXPECT_EQ(row.clipped, 7U);
    EXPECT_EQ(row.seconds, 2.5);
    EXPECT_EQ(row.seed, 5U);
    EXPECT_EQ(row.version, "1.2.3");
    EXPECT_DOUBLE_EQ(blockErrorRate(row), 0.1);
    EXPECT_DOUBLE_EQ(bitErrorRate(row), 12.0 / 1600);
    EXPECT_DOUBLE_EQ(clippedFraction(row), 7.0 / (40 * 132));
}

TEST(Plan, MakesRowsAfterEachIterationInTheOrderOfASweepOverThem)
{
    Sweep sweep = sweepOf({0, 1000});
    sweep.iterations = {2};
    Plan plan = planOf(sweep);
    plan.eachIteration = true;
    std::vector<PointResult> points;
    for (std::size_t number = 0; number < 2; ++number) {
        PointResult result;
        result.number = number;
        result.tally = Tally(plan.countsOf(plan.points[number]));
        result.tally.blocks = 10;
        ASSERT_EQ(result.tally.errors.size(), 2U);
        result.tally.errors[0].add(3, 20);
        result.tally.errors[1].add(4, 10);
        points.push_back(result);
    }
    const Results results = resultsOf(plan, points);
    ASSERT_EQ(results.rows.size(), 4U);
    const struct {
        unsigned iterations;
        int milliDecibels;
        std::size_t number;
        std::uint64_t bitErrors;
    } expected[] = {{1, 0, 0, 20}, {1, 1000, 1, 20}, {2, 0, 0, 10}, {2, 1000, 1, 10}};
    for (std::size_t i = 0; i < 4; ++i) {
        EXPECT_EQ(results.rows[i].point.iterations, expected[i].iterations);
        EXPECT_EQ(results.rows[i].point.milliDecibels, expected[i].milliDecibels);
        EXPECT_EQ(results.rows[i].pointNumber, expected[i].number);
        EXPECT_EQ(results.rows[i].errors.bitErrors, expected[i].bitErrors);
    }
}

TEST(Plan, TellsWhatKeepsARunFromGoingOn)
{
    EXPECT_EQ(obstaclesBetween("morvik ber --seed 1 --num-pu 4", "morvik ber --seed 1 --num-pu 4"), "");
    EXPECT_EQ(obstaclesBetween("morvik ber --ebn0 -1:0.5:2 --seed 1", "morvik ber --ebn0 -1 --seed 1"),
              "--ebn0 -1:0.5:2 instead of -1");
    EXPECT_EQ(obstaclesBetween("morvik ber --each-iteration --seed 1", "morvik ber --seed 2 --frames 0:5"),
              "--each-iteration, --seed 1 instead of 2, without --frames");
    const std::string hostile = obstaclesBetween("morvik ber --\x1b[31m" + std::string(100000, 'x'), "morvik ber");
    EXPECT_EQ(hostile.substr(0, 11), "--\\x1b[31mx");
    EXPECT_LT(hostile.size(), 100U);
}

TEST(Plan, LetsLimitsGrow)
{
    const auto obstacle = [](const std::string& before, const std::string& now) {
        return obstaclesBetween("morvik ber " + before, "morvik ber " + now);
    };
    for (const char* const option : {"--block-errors ", "--bit-errors ", "--max-blocks ", "--max-time "}) {
        const std::string limit = option;
        EXPECT_EQ(obstacle(limit + "9", limit + "10"), "");
        EXPECT_EQ(obstacle(limit + "9", ""), "");
        EXPECT_EQ(obstacle(limit + "10", limit + "9"), limit + "10 instead of 9");
        EXPECT_NE(obstacle("", limit + "10"), "");
        EXPECT_NE(obstacle(limit + "x", limit + "10"), "");
    }
    EXPECT_EQ(obstacle("--max-time 1.5", "--max-time 1e3"), "");
    EXPECT_EQ(obstacle("--frames 5:10", "--frames 5:11"), "");
    EXPECT_EQ(obstacle("--frames 5:10", "--frames 4:11"), "--frames 5:10 instead of 4:11");
    EXPECT_EQ(obstacle("--frames 5:10", "--frames 5:9"), "--frames 5:10 instead of 5:9");
    EXPECT_EQ(obstacle("--frames 0:10", ""), "");
    EXPECT_EQ(obstacle("--frames 5:10", ""), "--frames 5:10");
    EXPECT_EQ(obstacle("--stop-bler 0", "--stop-bler 1"), "--stop-bler 0 instead of 1");
}

}  // namespace
}  // namespace morvik::simulation
