// Series: what can be drawn, and that series can be told apart.
#include "report/Series.h"

#include <gtest/gtest.h>

#include <set>
#include <tuple>
#include <utility>

#include "support/SampleCurves.h"

namespace morvik::report {
namespace {

const Curve curve = morvik::support::sampleCurves().at(1);
const Curve farCurve = morvik::support::sampleCurves().at(2);
const Curve reference = morvik::support::sampleCurves().at(0);

/// The curve with its rates multiplied.
Curve multiplied(Curve result, double factor)
{
    for (Sample& sample : result.samples) {
        for (double* const rate : {&sample.ber, &sample.berHigh, &sample.bler, &sample.blerHigh}) {
            *rate *= factor;
        }
    }
    return result;
}

TEST(Series, OnlyRatesAboveZeroCanBeDrawn)
{
    EXPECT_TRUE((Rate{0.1, unknown, unknown, false}.canBeDrawn()));
    EXPECT_FALSE((Rate{0, 0, 0.1, false}.canBeDrawn()));
    EXPECT_FALSE((Rate{unknown, unknown, unknown, false}.canBeDrawn()));
    EXPECT_TRUE((Rate{0, 0, 0.1, true}.canBeDrawn())) << "at the bound";
    EXPECT_FALSE((Rate{0, 0, unknown, true}.canBeDrawn()));
    EXPECT_FALSE((Rate{0.1, 0, unknown, false}.hasInterval()));
    EXPECT_TRUE((Rate{0.1, 0, 0.2, false}.hasInterval()));
}

TEST(Series, ThroughputsTakeThePlaceOfBitErrorRates)
{
    Sample sample;
    sample.ebn0 = 1;
    sample.bler = 1;
    std::vector<Curve> curves = {{"a", false, {sample}}};
    EXPECT_EQ(quantitiesOf(curves), (std::vector<const Quantity*>{&bitErrorRate, &blockErrorRate}));
    EXPECT_EQ(viewsOf(curves)[0].axis, &ebn0Axis);
    curves[0].samples[0].throughput = 0;
    curves[0].samples[0].esn0 = 3;
    EXPECT_EQ(quantitiesOf(curves), (std::vector<const Quantity*>{&blockErrorRate, &throughput}));
    EXPECT_TRUE(throughput.of(curves[0].samples[0]).canBeDrawn()) << "its axis is linear";
    EXPECT_EQ(viewsOf(curves)[0].axis, &esn0Axis);
    curves[0].reference = true;
    EXPECT_EQ(viewsOf(curves)[0].axis, &ebn0Axis);
}

TEST(Series, ReferencesAreBehindTheOthers)
{
    const auto ordered = inOrder({reference, curve, reference, farCurve});
    EXPECT_EQ(ordered[0].title, curve.title);
    EXPECT_EQ(ordered[1].title, farCurve.title);
    EXPECT_TRUE(ordered[2].reference && ordered[3].reference);
}

TEST(Series, ThirtyFiveSeriesLookDifferent)
{
    const std::vector<Curve> curves(35, Curve{"", false, {}});
    std::set<std::tuple<std::string, std::size_t>> looks;
    for (std::size_t i = 0; i < curves.size(); ++i) {
        const Look look = lookOf(curves, i);
        EXPECT_LT(look.dash, dashes);
        EXPECT_LT(look.marker, markers);
        looks.emplace(look.colour.onLight, look.marker);
    }
    EXPECT_EQ(looks.size(), curves.size());
}

TEST(Series, SeriesOfAColourDifferInMarkerAndDash)
{
    const std::vector<Curve> curves(28, Curve{"", false, {}});
    for (std::size_t i = 0; i < curves.size(); ++i) {
        for (std::size_t j = 0; j < i; ++j) {
            const Look one = lookOf(curves, i);
            const Look other = lookOf(curves, j);
            const bool sameColour = one.colour.onLight == other.colour.onLight;
            EXPECT_FALSE(sameColour && (one.marker == other.marker || one.dash == other.dash)) << i << ' ' << j;
        }
    }
}

TEST(Series, AFamilyIsToldApartWithoutColours)
{
    const std::vector<Curve> curves = morvik::support::iterationCurves(15, {0, 1});
    std::set<std::pair<std::size_t, std::size_t>> looks;
    for (std::size_t i = 0; i < curves.size(); ++i) {
        looks.emplace(lookOf(curves, i).marker, lookOf(curves, i).dash);
    }
    EXPECT_EQ(looks.size(), 15U);
}

TEST(Series, ReferencesAreGreyAndDashedAndCountOnTheirOwn)
{
    const std::vector<Curve> curves = {curve, reference, farCurve, reference};
    EXPECT_EQ(lookOf(curves, 1).colour.onLight, std::string(referenceColour.onLight));
    EXPECT_EQ(lookOf(curves, 1).dash, 1U);
    EXPECT_EQ(lookOf(curves, 3).dash, 2U);
    EXPECT_EQ(lookOf(curves, 3).marker, 1U);
    EXPECT_EQ(lookOf(curves, 2).colour.onLight, std::string(colours[1].onLight));
    EXPECT_EQ(lookOf(curves, 2).marker, 1U);
}

TEST(Series, CurvesThatOthersCoverLieBelowThem)
{
    const std::vector<Curve> curves = {curve, farCurve, curve, multiplied(curve, 1.05), multiplied(curve, 1.2), curve};
    EXPECT_EQ(lookOf(curves, 0).layer, 3U);
    EXPECT_EQ(lookOf(curves, 1).layer, 0U) << "it is elsewhere";
    EXPECT_EQ(lookOf(curves, 2).layer, 2U);
    EXPECT_EQ(lookOf(curves, 3).layer, 1U) << "the difference does not show";
    EXPECT_EQ(lookOf(curves, 4).layer, 0U) << "the difference shows";
    EXPECT_EQ(lookOf(curves, 5).layer, 0U) << "it is on top";
    EXPECT_EQ(lookOf({curve, reference, reference}, 0).layer, 0U) << "references are drawn first";
    EXPECT_EQ(lookOf({reference, reference}, 0).layer, 0U);
}

TEST(Series, AFewOtherPointsDoNotUncoverACurve)
{
    Curve above = curve;
    above.samples[0].ber *= 2;
    above.samples[1].bler *= 2;
    above.samples[2].ebn0 += 0.1;
    above.samples.pop_back();
    EXPECT_EQ(lookOf({curve, above}, 0).layer, 1U);
    above.samples.resize(4);
    EXPECT_EQ(lookOf({curve, above}, 0).layer, 0U);
}

TEST(Series, AtMostThreeLayersAreShown)
{
    EXPECT_EQ(lookOf(std::vector<Curve>(9, curve), 0).layer, 3U);
    EXPECT_EQ(lookOf(std::vector<Curve>(9, curve), 6).layer, 2U);
}

/// How bright the eye finds a colour, 0 to 2550.
int brightness(const std::string& colour)
{
    const auto part = [&colour](std::size_t start) {
        return std::stoi(colour.substr(start, 2), nullptr, 16);
    };
    return 2 * part(1) + 7 * part(3) + part(5);
}

TEST(Series, ALargeFamilyHasColoursThatRun)
{
    std::vector<Curve> curves = morvik::support::iterationCurves(15, {0, 1});
    curves.push_back(reference);
    std::set<std::string> seen;
    for (std::size_t i = 0; i < 15; ++i) {
        const Look look = lookOf(curves, i);
        ASSERT_EQ(look.colour.onLight.size(), 7U);
        seen.insert(look.colour.onLight);
        EXPECT_EQ(look.layer, 0U);
        if (i > 0) {
            EXPECT_LT(brightness(look.colour.onLight), brightness(lookOf(curves, i - 1).colour.onLight)) << i;
            EXPECT_GT(brightness(look.colour.onDark), brightness(lookOf(curves, i - 1).colour.onDark)) << i;
        }
    }
    EXPECT_EQ(seen.size(), 15U);
    EXPECT_EQ(lookOf(curves, 15).colour.onLight, referenceColour.onLight);
}

TEST(Series, FamiliesHaveOtherColoursEach)
{
    std::vector<Curve> curves = morvik::support::iterationCurves(4, {0});
    const std::vector<Curve> first = curves;
    for (Curve each : first) {
        each.family = "another";
        curves.push_back(each);
    }
    std::set<std::string> seen;
    for (std::size_t i = 0; i < curves.size(); ++i) {
        seen.insert(lookOf(curves, i).colour.onLight);
    }
    EXPECT_EQ(seen.size(), 8U);
    EXPECT_EQ(lookOf(curves, 0).colour.onLight, lookOf(first, 0).colour.onLight);
}

TEST(Series, ASmallFamilyHasColoursThatDiffer)
{
    const std::vector<Curve> curves = morvik::support::iterationCurves(3, {0});
    for (std::size_t i = 0; i < curves.size(); ++i) {
        EXPECT_EQ(lookOf(curves, i).colour.onLight, colours[i].onLight);
    }
}

TEST(Series, AreSeenAgainstIterationsWhereThereAreSome)
{
    EXPECT_EQ(viewsOf(morvik::support::sampleCurves()).size(), 1U);
    std::vector<Curve> curves = morvik::support::iterationCurves(3, {0, 1});
    curves.insert(curves.begin(), reference);
    const std::vector<View> views = viewsOf(curves);
    ASSERT_EQ(views.size(), 2U);
    EXPECT_EQ(views[0].axis, &ebn0Axis);
    EXPECT_EQ(views[0].curves.size(), 4U);
    EXPECT_TRUE(views[0].curves[3].reference);
    EXPECT_EQ(views[1].axis, &iterationAxis);
    EXPECT_EQ(views[1].curves.size(), 2U);
    EXPECT_EQ(iterationAxis.of(views[1].curves[0].samples[2]), 3);
    for (Curve& each : curves) {
        each.reference = true;
    }
    EXPECT_EQ(viewsOf(curves).size(), 1U) << "references alone";
    EXPECT_EQ(viewsOf(morvik::support::iterationCurves(2, std::vector<double>(40, 1))).size(), 2U);
    std::vector<double> many;
    for (int i = 0; i <= 40; ++i) {
        many.push_back(i);
    }
    EXPECT_EQ(viewsOf(morvik::support::iterationCurves(2, many)).size(), 1U) << "more than can be told apart";
}

}  // namespace
}  // namespace morvik::report
