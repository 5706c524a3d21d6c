// Plan: the points of a sweep, and how long each is simulated.
#include "Plan.h"

#include <algorithm>
#include <cmath>
#include <initializer_list>
#include <map>
#include <optional>
#include <sstream>
#include <string_view>

#include "base/Numbers.h"
#include "base/Shown.h"
#include "link/channel/Decibels.h"
#include "link/channel/DefaultScale.h"
#include "link/coding/CodeBlocks.h"

namespace morvik::simulation {

namespace {

int automaticMilliScale(const Point& point)
{
    const auto algorithm = static_cast<int>(point.algorithm);
    const double scale = point.link.isPlainBpsk() ? link::defaultScale(algorithm, point.blockSize, point.milliDecibels)
                                                  : automaticScale(point, 0);
    return std::max(static_cast<int>(std::lround(1000 * scale)), 1);
}

std::vector<int> range(int start, int step, int stop)
{
    std::vector<int> values;
    for (int value = start; value <= stop; value += step) {
        values.push_back(value);
    }
    return values;
}

constexpr int limitStep = 500;

/// The first multiple of limitStep above Shannon's limit for the bits of a symbol, an Es/N0 of 2^bits - 1, in
/// thousandths of a decibel. BPSK uses half the dimensions.
int stepAboveLimit(const LinkFormat& format, double bits)
{
    const int dimensions = format.modulation == link::Modulation::bpsk ? 2 : 1;
    const auto exponent = static_cast<int>(std::lround(3010.3 * bits * dimensions));
    const int limit = link::milliDecibelsOf((link::ratioOf(exponent) - 1) / dimensions);
    return (limit / limitStep + 1) * limitStep;
}

std::vector<int> milliDecibelsOf(const Sweep& sweep, const LinkFormat& format, unsigned K)
{
    if (!sweep.milliDecibels.empty()) {
        return sweep.milliDecibels;
    }
    const bool isUsual = format.isPlainBpsk() && sweep.axis == Axis::ebn0;
    return isUsual ? usualMilliDecibels(K) : usualMilliEsn0(format, K);
}

/// The block sizes that a format is combined with.
std::vector<unsigned> blockSizesOf(const Sweep& sweep, const LinkFormat& format)
{
    return format.hasTransportBlocks() ? std::vector{link::codeBlocksOf(format.transportBlockSize).sizePlus}
                                       : sweep.blockSizes;
}

/// A point of a curve at a place on its axis, with its scale.
Point pointAt(Point point, int milliDecibels)
{
    setPlace(point, milliDecibels);
    point.milliScale = point.scaleOption ? *point.scaleOption : automaticMilliScale(point);
    return point;
}

/// Appends the points of one format and block size.
void appendPoints(const Sweep& sweep, const LinkFormat& format, unsigned K, std::vector<Point>& points)
{
    const std::vector<int> places = milliDecibelsOf(sweep, format, K);
    // Where no place is given, a format's usual ones are on the axis of Es/N0.
    const bool isOnEsn0 = sweep.axis == Axis::esn0 || (sweep.milliDecibels.empty() && !format.isPlainBpsk());
    for (const unsigned numPu : sweep.numPus) {
        for (const unsigned algorithm : sweep.algorithms) {
            for (const ScaleOption& scale : sweep.scaleOptions) {
                for (const unsigned iterations : sweep.iterations) {
                    Point point = {K, numPu, algorithm, scale, 0, iterations, 0, format, Axis::ebn0, 0};
                    point.axis = isOnEsn0 ? Axis::esn0 : Axis::ebn0;
                    for (const int milliDecibels : places) {
                        points.push_back(pointAt(point, milliDecibels));
                    }
                }
            }
        }
    }
}

/// Appends the rows of a point; its iteration counts end at the point's own.
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

/// The options of a command, with their values, if any.
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

template <class Number>
bool isNoLess(const std::string& now, const std::string& before)
{
    const auto limit = base::parseNumber<Number>(now);
    const auto earlier = base::parseNumber<Number>(before);
    return limit && earlier && *limit >= *earlier;
}

/// Whether an option's present value, or its absence, allows all that its earlier value allowed.
bool isWithin(const std::string& option, const std::string& before, const std::optional<std::string>& now)
{
    if (now == before) {
        return true;
    }
    if (option == "--block-errors" || option == "--bit-errors" || option == "--max-blocks") {
        return !now || isNoLess<std::uint64_t>(*now, before);
    }
    if (option == "--max-time") {
        return !now || isNoLess<double>(*now, before);
    }
    if (option == "--frames") {
        const auto frames = parseFrameRange(now.value_or("0:" + std::to_string(UINT64_MAX)));
        const auto earlier = parseFrameRange(before);
        return frames && earlier && frames->from == earlier->from && frames->to >= earlier->to;
    }
    return false;
}

}  // namespace

std::vector<int> usualMilliDecibels(unsigned K)
{
    if (K <= 128) {
        return range(0, 500, 6000);
    }
    return K <= 1024 ? range(0, 200, 3000) : range(0, 100, 1500);
}

std::vector<int> usualMilliEsn0(const LinkFormat& format, unsigned K)
{
    constexpr int last = 50000;  // that options take
    const double perSymbol = bitsPerSymbolOf(format, K);
    const double transmissions = static_cast<double>(std::max<std::size_t>(format.versions.size(), 1));
    const int start = stepAboveLimit(format, perSymbol / transmissions);
    const int above = stepAboveLimit(format, perSymbol);
    // Where blocks of 40 bits, and those of rate 0.95, are below the error rate that ends a curve.
    switch (format.fading) {
    case link::Fading::none:
        break;
    case link::Fading::symbol:
        return range(start, limitStep, std::min(above + 26000, last));
    case link::Fading::constant:
        return range(start, 4 * limitStep, std::min(above + 46000, last));
    }
    return range(start, limitStep, std::min(above + 16000, last));
}

int milliEsn0Amid(const LinkFormat& format, unsigned K)
{
    const int above = stepAboveLimit(format, bitsPerSymbolOf(format, K));
    switch (format.fading) {
    case link::Fading::none:
        break;
    case link::Fading::symbol:
        return above + 5000;
    case link::Fading::constant:
        return above + 16000;
    }
    return above + 3000;
}

std::uint64_t countOfPoints(const Sweep& sweep)
{
    std::uint64_t places = 0;
    for (const LinkFormat& format : sweep.formats) {
        for (const unsigned K : blockSizesOf(sweep, format)) {
            places += milliDecibelsOf(sweep, format, K).size();
        }
    }
    std::uint64_t count = places;
    for (const std::size_t values :
         {sweep.numPus.size(), sweep.algorithms.size(), sweep.scaleOptions.size(), sweep.iterations.size()}) {
        count *= values;
    }
    return count;
}

std::vector<Point> pointsOf(const Sweep& sweep)
{
    std::vector<Point> points;
    for (const LinkFormat& format : sweep.formats) {
        for (const unsigned K : blockSizesOf(sweep, format)) {
            appendPoints(sweep, format, K, points);
        }
    }
    std::sort(points.begin(), points.end());
    return points;
}

std::string obstaclesBetween(const std::string& before, const std::string& now)
{
    const auto earlier = optionsOf(before);
    const auto present = optionsOf(now);
    std::string text;
    const auto append = [&text](std::initializer_list<std::string_view> parts) {
        std::string whole;
        for (const std::string_view part : parts) {
            whole += part;
        }
        constexpr std::size_t longest = 80;
        text += (text.empty() ? "" : ", ") + base::shortened(whole, longest);
    };
    for (const auto& [option, value] : earlier) {
        const auto found = present.find(option);
        if (found == present.end()) {
            if (!isWithin(option, value, std::nullopt)) {
                append({option, value.empty() ? "" : " ", value});
            }
        } else if (!isWithin(option, value, found->second)) {
            append({option, " ", value, " instead of ", found->second});
        }
    }
    for (const auto& [option, value] : present) {
        if (earlier.count(option) == 0) {
            append({"without ", option});
        }
    }
    constexpr std::size_t longest = 400;
    return base::shortened(text, longest);
}

bool isCurveEnded(const Plan& plan, std::size_t point, const std::vector<PointResult>& earlier)
{
    if (plan.rules.stopBler <= 0) {
        return false;
    }
    const auto isOther = [&](const PointResult& result) {
        return !onSameCurve(plan.points[result.number], plan.points[point]);
    };
    return std::any_of(
        earlier.rbegin(), std::find_if(earlier.rbegin(), earlier.rend(), isOther), [&](const PointResult& result) {
            const auto blockErrors = static_cast<double>(result.tally.errors.back().blockErrors);
            return blockErrors < plan.rules.stopBler * static_cast<double>(result.tally.blocks);
        });
}

std::size_t nextPoint(const Plan& plan, const std::vector<PointResult>& earlier)
{
    std::size_t point = earlier.empty() ? 0 : earlier.back().number + 1;
    while (point < plan.points.size() && isCurveEnded(plan, point, earlier)) {
        ++point;
    }
    return point;
}

std::vector<PointResult> unfallenEnds(const Plan& plan, const std::vector<PointResult>& points, double most)
{
    std::vector<PointResult> ends;
    for (std::size_t i = 0; i < points.size(); ++i) {
        const bool isEnd =
            i + 1 == points.size() || !onSameCurve(plan.points[points[i].number], plan.points[points[i + 1].number]);
        const Tally& tally = points[i].tally;
        const auto blockErrors = static_cast<double>(tally.errors.back().blockErrors);
        if (isEnd && blockErrors > most * static_cast<double>(tally.blocks)) {
            ends.push_back(points[i]);
        }
    }
    return ends;
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

}  // namespace morvik::simulation
