// Point: the parameters of one simulated error rate.
#include "Point.h"

#include <tuple>

#include "base/Numbers.h"
#include "base/Thousandths.h"
#include "rules/Algorithms.h"

namespace morvik::simulation {

namespace {

auto curveOf(const Point& point)
{
    return std::tie(point.blockSize, point.numPu, point.algorithm, point.scaleOption, point.iterations);
}

auto parametersOf(const Point& point)
{
    return std::tuple_cat(curveOf(point), std::tie(point.milliDecibels, point.milliScale));
}

}  // namespace

bool operator==(const Point& a, const Point& b)
{
    return parametersOf(a) == parametersOf(b);
}

bool operator<(const Point& a, const Point& b)
{
    return parametersOf(a) < parametersOf(b);
}

bool onSameCurve(const Point& a, const Point& b)
{
    return curveOf(a) == curveOf(b);
}

std::string algorithmName(unsigned algorithm)
{
    return std::string(rules::algorithmNames.at(algorithm));
}

std::optional<unsigned> algorithmOf(std::string_view nameOrNumber)
{
    const auto named = rules::findAlgorithm(nameOrNumber);
    const auto number = nameOrNumber.size() == 1 ? base::parseNumber<unsigned>(nameOrNumber) : std::nullopt;
    return number && *number < rules::algorithmNames.size() ? number : named;
}

std::string scaleOptionText(const ScaleOption& option)
{
    return option ? base::thousandthsText(*option) : "auto";
}

}  // namespace morvik::simulation
