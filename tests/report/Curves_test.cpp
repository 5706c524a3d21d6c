// Curves: which rows make up a curve, and what it is called.
#include "report/Curves.h"

#include <gtest/gtest.h>

namespace morvik::report {
namespace {

Row row(const Setting& setting, double ebn0)
{
    Row result;
    result.setting = setting;
    result.sample.ebn0 = ebn0;
    return result;
}

std::vector<std::string> titles(const std::vector<Curve>& curves)
{
    std::vector<std::string> result;
    result.reserve(curves.size());
    for (const Curve& curve : curves) {
        result.push_back(curve.title);
    }
    return result;
}

TEST(Curves, RowsOfOneSettingMakeACurve)
{
    const Setting small{40, 2, "max-log", 6, "auto"};
    const Setting large{6144, 8, "scaled", 1, ""};
    const auto curves =
        curvesOf({row(small, 1.0), row(large, 0.5), row(small, 0.5), row(large, 0.25), row(small, 2.0)});
    EXPECT_EQ(
        titles(curves),
        (std::vector<std::string>{"K = 40, 2 units, max-log, 6 iterations", "K = 6144, 8 units, scaled, 1 iteration"}));
    ASSERT_EQ(curves[0].samples.size(), 3U);
    EXPECT_EQ(curves[0].samples[0].ebn0, 0.5);
    EXPECT_EQ(curves[0].samples[1].ebn0, 1.0);
    EXPECT_EQ(curves[0].samples[2].ebn0, 2.0);
    ASSERT_EQ(curves[1].samples.size(), 2U);
    EXPECT_FALSE(curves[1].reference);
}

TEST(Curves, EveryPartOfTheSettingTellsCurvesApart)
{
    const Setting setting{512, 4, "table", 8, "8"};
    std::vector<Row> rows = {
        row(setting, 0), row(setting, 0), row(setting, 0), row(setting, 0), row(setting, 0), row(setting, 0)};
    rows[1].setting.blockSize = 40;
    rows[2].setting.numPu = 8;
    rows[3].setting.algorithm = "scaled";
    rows[4].setting.iterations = 6;
    rows[5].setting.scale = "12";
    EXPECT_EQ(titles(curvesOf(rows)),
              (std::vector<std::string>{"K = 512, 4 units, table, 8 iterations, scale 8",
                                        "K = 40, 4 units, table, 8 iterations, scale 8",
                                        "K = 512, 8 units, table, 8 iterations, scale 8",
                                        "K = 512, 4 units, scaled, 8 iterations, scale 8",
                                        "K = 512, 4 units, table, 6 iterations, scale 8",
                                        "K = 512, 4 units, table, 8 iterations, scale 12"}));
}

TEST(Curves, WhatIsNotKnownIsNotNamed)
{
    EXPECT_EQ(titles(curvesOf({row({}, 0)})), std::vector<std::string>{""});
    EXPECT_EQ(titles(curvesOf({row({512, 0, "", 0, ""}, 0)})), std::vector<std::string>{"K = 512"});
    EXPECT_TRUE(curvesOf({}).empty());
}

TEST(Curves, ThatDifferInIterationsAloneAreAFamily)
{
    const auto curves = curvesOf(
        {row({512, 8, "scaled", 1, ""}, 0), row({512, 8, "scaled", 2, ""}, 0), row({512, 4, "scaled", 2, ""}, 0)});
    ASSERT_EQ(curves.size(), 3U);
    EXPECT_EQ(curves[0].family, "K = 512, 8 units, scaled");
    EXPECT_EQ(curves[1].family, curves[0].family);
    EXPECT_NE(curves[2].family, curves[0].family);
}

TEST(Curves, AgainstIterationsHaveTheSamplesOfAnEbn0)
{
    const Setting one{512, 8, "scaled", 1, ""};
    const Setting six{512, 8, "scaled", 6, ""};
    const Setting other{40, 8, "scaled", 6, ""};
    const auto curves = againstIterations(
        curvesOf({row(six, 1.0), row(six, 0.5), row(one, 0.5), row(one, 1.0), row(one, 2), row(other, 1.0)}));
    ASSERT_EQ(titles(curves),
              (std::vector<std::string>{"K = 512, 8 units, scaled, 0.50 dB", "K = 512, 8 units, scaled, 1.00 dB"}))
        << "where there are several";
    ASSERT_EQ(curves[1].samples.size(), 2U);
    EXPECT_EQ(curves[1].samples[0].iterations, 1U);
    EXPECT_EQ(curves[1].samples[1].iterations, 6U);
    EXPECT_EQ(curves[1].samples[0].ebn0, 1.0);
    EXPECT_EQ(curves[0].family, curves[1].family);
    EXPECT_TRUE(againstIterations(curvesOf({row({}, 0), row({}, 1)})).empty()) << "of unknown iterations";
}

TEST(Curves, AgainstIterationsKeepReferencesApart)
{
    auto curves = curvesOf({row({512, 8, "scaled", 1, ""}, 0), row({512, 8, "scaled", 2, ""}, 0)});
    curves[1].reference = true;
    EXPECT_TRUE(againstIterations(curves).empty());
    curves[0].reference = true;
    ASSERT_EQ(againstIterations(curves).size(), 1U);
    EXPECT_TRUE(againstIterations(curves)[0].reference);
}

}  // namespace

TEST(Curves, SchemesAreAFamilyIfAllHaveTheSameIterations)
{
    const auto row = [](const std::string& sent, unsigned iterations) {
        Row made;
        made.setting = {512, 2, "scaled", iterations, "auto", sent, ", rayleigh"};
        made.sample.esn0 = 1;
        return made;
    };
    std::vector<Curve> curves = curvesOf({row("MCS 64qam 1", 8), row("MCS 64qam 2", 8)});
    ASSERT_EQ(curves.size(), 2U);
    EXPECT_EQ(curves[0].title, "MCS 64qam 1, rayleigh, 2 units, scaled, 8 iterations");
    EXPECT_EQ(curves[0].family, curves[1].family);
    curves = curvesOf({row("MCS 64qam 1", 8), row("MCS 64qam 2", 8), row("MCS 64qam 2", 6)});
    EXPECT_NE(curves[0].family, curves[1].family);
    EXPECT_EQ(curves[1].family, curves[2].family);
}

}  // namespace morvik::report
