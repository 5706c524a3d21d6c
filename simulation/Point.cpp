// Point: what one error rate is simulated for.
#include "Point.h"

#include <array>
#include <tuple>

#include "base/Thousandths.h"

namespace morvik::simulation {

namespace {

constexpr std::array<std::string_view, 3> algorithmNames = {"max-log", "scaled", "table"};

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
    return std::string(algorithmNames.at(algorithm));
}

std::optional<unsigned> algorithmOf(std::string_view nameOrNumber)
{
    for (unsigned i = 0; i < algorithmNames.size(); ++i) {
        if (nameOrNumber == algorithmNames[i] || nameOrNumber == std::to_string(i)) {
            return i;
        }
    }
    return std::nullopt;
}

std::string scaleOptionText(const ScaleOption& option)
{
    return option ? base::thousandthsText(*option) : "auto";
}

}  // namespace morvik::simulation
