// CompleteResults: whether a run needs to be run, told from a result file.
#include "CompleteResults.h"

#include <algorithm>

#include "ResultFiles.h"

namespace simulation {

namespace {

/// What the rows tell of a point of the plan.
PointResult resultOf(const Plan& plan, std::size_t number, const std::vector<ResultRow>& rows)
{
    const Point& point = plan.points[number];
    const std::size_t counts = plan.countsOf(point);
    PointResult result = {number, Tally(counts), 0};
    for (std::size_t i = 0; i < counts; ++i) {
        Point wanted = point;
        wanted.iterations -= static_cast<unsigned>(counts - 1 - i);
        const auto row =
            std::find_if(rows.begin(), rows.end(), [&wanted](const ResultRow& each) { return each.point == wanted; });
        if (row != rows.end()) {
            result.tally.errors[i] = row->errors;
            result.tally.blocks = row->frames.size();
            result.tally.clipped = row->clipped;
            result.seconds = row->seconds;
        }
    }
    return result;
}

/// Whether nothing is left to be counted.
bool hasEnded(const Plan& plan, const PointResult& result)
{
    const Tally& tally = result.tally;
    const bool isTimeUp = plan.rules.maxSeconds && tally.blocks > 0;
    return isTimeUp || tally.blocks == plan.frames.to - plan.frames.from ||
           isReached(plan.rules, tally.blocks, tally.errors.back());
}

}  // namespace

std::optional<std::vector<PointResult>> pointsOfComplete(const Plan& plan, const Results& results)
{
    std::vector<PointResult> points;
    for (std::size_t number = 0; number < plan.points.size(); ++number) {
        if (isCurveEnded(plan, number, points)) {
            continue;
        }
        points.push_back(resultOf(plan, number, results.rows));
        if (!hasEnded(plan, points.back())) {
            return std::nullopt;
        }
    }
    // What the points were not made from, such as the seed or other rows, shows in the text.
    if (csvText(resultsOf(plan, points)) != csvText(results)) {
        return std::nullopt;
    }
    return points;
}

}  // namespace simulation
