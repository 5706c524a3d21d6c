// Merge: joined results are those of all frames, and only results that belong together are joined.
#include "simulation/Merge.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "base/Error.h"
#include "simulation/ResultFiles.h"
#include "support/ExampleResults.h"

namespace morvik::simulation {
namespace {

using morvik::support::exampleRow;

Part partOf(const std::string& name, std::vector<ResultRow> rows)
{
    return {name, {"1.2.3", "morvik ber", std::move(rows)}};
}

std::string refusal(const std::vector<Part>& parts)
{
    try {
        merge(parts);
    } catch (const morvik::base::Error& error) {
        return error.what();
    }
    return "none";
}

/// The rows as CSV. Their times are added up and are not compared.
std::string textOf(std::vector<ResultRow> rows)
{
    for (ResultRow& row : rows) {
        row.seconds = 0;
    }
    return csvText({"", "", rows});
}

TEST(Merge, OfPartsIsTheRunOfAllFrames)
{
    const std::vector<Part> parts = {partOf("a.csv", {exampleRow(0, 0, {0, 100}), exampleRow(1, 500, {0, 100})}),
                                     partOf("b.csv", {exampleRow(0, 0, {100, 250}), exampleRow(1, 500, {100, 120})}),
                                     partOf("c.csv", {exampleRow(0, 0, {250, 300})})};
    const std::vector<ResultRow> whole = {exampleRow(0, 0, {0, 300}), exampleRow(1, 500, {0, 120})};
    const Results results = merge(parts);
    EXPECT_EQ(textOf(results.rows), textOf(whole));
    EXPECT_EQ(results.rows[0].seconds, 0.375);
    EXPECT_EQ(results.version, "1.2.3");
    EXPECT_EQ(results.command, "morvik merge a.csv b.csv c.csv");
}

TEST(Merge, DoesNotDependOnTheOrder)
{
    std::vector<Part> parts = {partOf("a", {exampleRow(0, 0, {0, 30}), exampleRow(1, 500, {50, 70})}),
                               partOf("b", {exampleRow(0, 0, {60, 90}), exampleRow(2, 700, {0, 10})}),
                               partOf("c", {exampleRow(0, 0, {30, 50}), exampleRow(1, 500, {20, 50})})};
    const std::string first = textOf(merge(parts).rows);
    EXPECT_NE(first.find(",0:50 60:90,"), std::string::npos) << first;
    std::sort(parts.begin(), parts.end(), [](const Part& a, const Part& b) { return a.fileName < b.fileName; });
    while (std::next_permutation(
        parts.begin(), parts.end(), [](const Part& a, const Part& b) { return a.fileName < b.fileName; })) {
        EXPECT_EQ(textOf(merge(parts).rows), first);
    }
}

TEST(Merge, CanBeMergedAgain)
{
    const Part a = partOf("a", {exampleRow(0, 0, {0, 30})});
    const Part b = partOf("b", {exampleRow(0, 0, {60, 90})});
    const Part c = partOf("c", {exampleRow(0, 0, {30, 60})});
    const Part ab = {"ab", merge({a, b})};
    EXPECT_EQ(textOf(merge({ab, c}).rows), textOf({exampleRow(0, 0, {0, 90})}));
}

TEST(Merge, RefusesFramesThatAreThereTwice)
{
    EXPECT_EQ(refusal({partOf("a.csv", {exampleRow(0, 0, {0, 100})}), partOf("b.csv", {exampleRow(0, 0, {99, 200})})}),
              "b.csv: has frames that a.csv has, too: K = 40, 4 units, scaled, scale auto, 8 iterations, Eb/N0 0 dB, "
              "frames 99:200");
    const auto sent = [](FrameRange frames) {
        ResultRow row = exampleRow(0, 0, frames);
        row.point.link.transportBlockSize = 100;
        row.point.link.codedBits = 400;
        row.point.link.modulation = morvik::link::Modulation::qam16;
        row.point.link.versions = {0, 2};
        row.point.iterations = 1;
        row.point.axis = Axis::esn0;
        setPlace(row.point, 2500);
        return row;
    };
    EXPECT_EQ(refusal({partOf("a.csv", {sent({0, 9})}), partOf("b.csv", {sent({8, 10})})}),
              "b.csv: has frames that a.csv has, too: A = 100, G = 400, 16qam, versions 0,2, 4 units, scaled, scale "
              "auto, 1 iteration, Es/N0 2.5 dB, frames 8:10");
}

TEST(Merge, RefusesAnotherSeedOrVersion)
{
    ResultRow row = exampleRow(0, 0, {100, 200});
    row.seed = 2;
    EXPECT_EQ(refusal({partOf("a.csv", {exampleRow(0, 0, {0, 100})}), partOf("b.csv", {row})}),
              "b.csv: has seed 2, but a.csv has 1; only results of the same seed are joined");
    row = exampleRow(0, 0, {100, 200});
    row.version = "1.2.4";
    EXPECT_EQ(refusal({partOf("a.csv", {exampleRow(0, 0, {0, 100})}), partOf("b.csv", {row})}),
              "b.csv: has version 1.2.4, but a.csv has 1.2.3; only results of the same version are joined");
}

TEST(Merge, KeepsRowsOfOtherParametersApart)
{
    ResultRow rows[] = {exampleRow(0, 0, {0, 50}),
                        exampleRow(1, 0, {0, 50}),
                        exampleRow(2, 0, {0, 50}),
                        exampleRow(3, 0, {0, 50}),
                        exampleRow(4, 0, {0, 50}),
                        exampleRow(5, 1, {0, 50})};
    rows[1].point.numPu = 8;
    rows[2].point.algorithm = 2;
    rows[3].point.scaleOption = rows[3].point.milliScale = 8125;
    rows[4].point.iterations = 9;
    std::vector<Part> parts;
    for (const ResultRow& row : rows) {
        parts.push_back(partOf(std::to_string(row.pointNumber), {row}));
    }
    EXPECT_EQ(merge(parts).rows.size(), 6U);
}

TEST(Merge, NumbersThePointsAnewWhereTheNumbersDisagree)
{
    const Results results =
        merge({partOf("a", {exampleRow(0, 500, {0, 10})}), partOf("b", {exampleRow(0, 0, {0, 10})})});
    EXPECT_EQ(results.rows[0].point.milliDecibels, 0);
    EXPECT_EQ(results.rows[0].pointNumber, 0U);
    EXPECT_EQ(results.rows[1].pointNumber, 1U);
    const Results twice =
        merge({partOf("a", {exampleRow(4, 500, {0, 10})}), partOf("b", {exampleRow(3, 500, {10, 20})})});
    EXPECT_EQ(twice.rows[0].pointNumber, 0U);
}

TEST(Merge, KeepsTheNumbersOfPointsWhereTheyAgree)
{
    ResultRow before = exampleRow(4, 500, {10, 20});
    before.point.iterations = 7;  // a row of the same point, which looked at each iteration
    ResultRow after = exampleRow(4, 500, {10, 20});
    const Results results = merge({partOf("a", {before, after}), partOf("b", {exampleRow(4, 500, {0, 10})})});
    ASSERT_EQ(results.rows.size(), 2U);
    EXPECT_EQ(results.rows[0].pointNumber, 4U);
    EXPECT_EQ(results.rows[1].pointNumber, 4U);
}

}  // namespace
}  // namespace morvik::simulation
