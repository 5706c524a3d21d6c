// Precise: tests against numbers of 106 bits that are known.
#include "link/channel/Precise.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

using morvik::link::exponential;
using morvik::link::Precise;
using morvik::link::squareRoot;
using morvik::link::upperTail;

/// How far a number is from another one, relative to it.
double distance(const Precise& a, const Precise& b)
{
    return std::fabs(static_cast<double>((a - b) / b));
}

constexpr double ofOperations = 0x1p-100;
constexpr double ofFunctions = 0x1p-60;

}  // namespace

TEST(Precise, KeepsWhatADoubleLoses)
{
    const Precise small = 0x1p-70;
    EXPECT_EQ(static_cast<double>(Precise(1) + small - 1), 0x1p-70);
    EXPECT_EQ(static_cast<double>((Precise(1) + 0x1p-50) * (Precise(1) - 0x1p-50) - 1), -0x1p-100);
    EXPECT_EQ(static_cast<double>(small - Precise(1) + Precise(1)), 0x1p-70);
}

TEST(Precise, DividesAndTakesRoots)
{
    for (const double a : {1.0, 3.0, 0.1, 7e100, 1e-100}) {
        for (const double b : {3.0, 49.0, 0.7, 1e-90}) {
            EXPECT_LT(distance(Precise(a) / Precise(b) * b, a), ofOperations) << a << ' ' << b;
            EXPECT_LT(distance(Precise(a) / b, Precise(a) / Precise(b)), ofOperations) << a << ' ' << b;
        }
        EXPECT_LT(distance(squareRoot(a) * squareRoot(a), a), ofOperations) << a;
    }
    EXPECT_LT(distance(squareRoot(2), {1.4142135623730951, -9.667293313452913e-17}), ofOperations);
}

TEST(Precise, KnowsExponentials)
{
    EXPECT_LT(distance(exponential(1), {2.718281828459045, 1.4456468917292502e-16}), ofFunctions);
    EXPECT_LT(distance(exponential(-30), {9.357622968840175e-14, -2.1170146272646406e-30}), ofFunctions);
    EXPECT_EQ(static_cast<double>(exponential(0)), 1);
}

TEST(Precise, KnowsTailsOfTheGaussianDistribution)
{
    EXPECT_LT(distance(upperTail(0.5), {0.3085375387259869, 1.4568778275699303e-17}), ofFunctions);
    EXPECT_LT(distance(upperTail(4.25), {1.068852577493442e-05, 5.367763737933911e-23}), ofFunctions);
    EXPECT_LT(distance(upperTail(4.5), {3.3976731247300603e-06, 1.5021902648019703e-22}), ofFunctions);
    EXPECT_LT(distance(upperTail(8.5), {9.479534822203318e-18, 7.041129563898285e-34}), ofFunctions);
    EXPECT_LT(distance(upperTail(36), {4.182624065797283e-284, 2.8599864938910797e-300}), ofFunctions);
    EXPECT_EQ(static_cast<double>(upperTail(0)), 0.5);
}

TEST(Precise, RoundsByBothOfItsParts)
{
    EXPECT_EQ(Precise(5, 0).rounded(), 5U);
    EXPECT_EQ(Precise(4.5).rounded(), 5U);
    EXPECT_EQ(Precise(4.5, -0x1p-60).rounded(), 4U);
    EXPECT_EQ(Precise(0x1p50, -0.25).rounded(), std::uint64_t{1} << 50);
    EXPECT_EQ(Precise(0).rounded(), 0U);
}
