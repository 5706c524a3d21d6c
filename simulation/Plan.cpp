// Plan: the points of a sweep, and how long each is simulated.
#include "Plan.h"

#include <algorithm>
#include <cmath>
#include <initializer_list>
#include <map>
#include <sstream>
#include <string_view>

#include "link/DefaultScale.h"

namespace simulation {

namespace {

int automaticMilliScale(unsigned K, unsigned algorithm, int milliDecibels)
{
    return static_cast<int>(
        std::lround(1000 * morvik::link::defaultScale(static_cast<int>(algorithm), K, milliDecibels)));
}

std::vector<int> range(int start, int step, int stop)
{
    std::vector<int> values;
    for (int value = start; value <= stop; value += step) {
        values.push_back(value);
    }
    return values;
}

const std::vector<int>& milliDecibelsOf(const Sweep& sweep, const std::vector<int>& usual)
{
    return sweep.milliDecibels.empty() ? usual : sweep.milliDecibels;
}

/// The rows of a point: its counts of iterations end at the point's own.
void appendRows(const Plan& plan, const PointResult& result, std::vector<ResultRow>& rows)
{
    const Point& point = plan.points[result.number];
    const std::size_t counts = result.tally.errors.size();
    for (std::size_t i = 0; i < counts; ++i) {
        ResultRow row;
        row.pointNumber = result.number;
        row.point = point;
        row.point.iterations = point.iterations - static_cast<unsigned>(counts - 1 - i);
        row.frames = FrameSet({plan.frames.from, plan.frames.from + result.tally.blocks});
        row.errors = result.tally.errors[i];
        row.clipped = result.tally.clipped;
        row.seconds = result.seconds;
        row.seed = plan.seed;
        row.version = plan.version;
        rows.push_back(row);
    }
}

/// The options of a command, with their values, if they have some.
std::map<std::string, std::string> optionsOf(const std::string& command)
{
    std::map<std::string, std::string> options;
    std::istringstream words(command);
    std::string option;
    for (std::string word; words >> word;) {
        if (word.substr(0, 2) == "--") {
            option = word;
            options[option];
        } else if (!option.empty()) {
            options[option] = word;
        }
    }
    return options;
}

}  // namespace

std::vector<int> usualMilliDecibels(unsigned K)
{
    if (K <= 128) {
        return range(0, 500, 6000);
    }
    return K <= 1024 ? range(0, 200, 3000) : range(0, 100, 1500);
}

std::vector<Point> pointsOf(const Sweep& sweep)
{
    std::vector<Point> points;
    for (const unsigned K : sweep.blockSizes) {
        const std::vector<int> usual = usualMilliDecibels(K);
        for (const unsigned numPu : sweep.numPus) {
            for (const unsigned algorithm : sweep.algorithms) {
                for (const ScaleOption& scale : sweep.scaleOptions) {
                    for (const unsigned iterations : sweep.iterations) {
                        for (const int milliDecibels : milliDecibelsOf(sweep, usual)) {
                            const int used = scale.value_or(automaticMilliScale(K, algorithm, milliDecibels));
                            points.push_back({K, numPu, algorithm, scale, used, iterations, milliDecibels});
                        }
                    }
                }
            }
        }
    }
    std::sort(points.begin(), points.end());
    return points;
}

std::string differenceOf(const std::string& command, const std::string& other)
{
    const auto ours = optionsOf(command);
    const auto theirs = optionsOf(other);
    std::string text;
    const auto append = [&text](std::initializer_list<std::string_view> parts) {
        text += text.empty() ? "" : ", ";
        for (const std::string_view part : parts) {
            text += part;
        }
    };
    for (const auto& [option, value] : ours) {
        const auto found = theirs.find(option);
        if (found == theirs.end()) {
            append({option, value.empty() ? "" : " ", value});
        } else if (found->second != value) {
            append({option, " ", value, " instead of ", found->second});
        }
    }
    for (const auto& [option, value] : theirs) {
        if (ours.count(option) == 0) {
            append({"without ", option});
        }
    }
    return text;
}

bool isCurveEnded(const Plan& plan, std::size_t point, const std::vector<PointResult>& earlier)
{
    return std::any_of(earlier.begin(), earlier.end(), [&](const PointResult& result) {
        const auto blockErrors = static_cast<double>(result.tally.errors.back().blockErrors);
        return onSameCurve(plan.points[result.number], plan.points[point]) &&
               blockErrors < plan.rules.stopBler * static_cast<double>(result.tally.blocks);
    });
}

Results resultsOf(const Plan& plan, const std::vector<PointResult>& points)
{
    Results results = {plan.version, plan.command, {}};
    for (const PointResult& result : points) {
        appendRows(plan, result, results.rows);
    }
    std::stable_sort(results.rows.begin(), results.rows.end(), [](const ResultRow& a, const ResultRow& b) {
        return a.point < b.point;
    });
    return results;
}

}  // namespace simulation
