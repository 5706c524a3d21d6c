// Resumption: what a run can reuse of an earlier run's counts.
#include "Resumption.h"

#include <algorithm>
#include <map>
#include <optional>

#include "FrameSimulator.h"
#include "Possible.h"
#include "ResultFiles.h"
#include "base/Error.h"
#include "base/Json.h"
#include "base/Text.h"

namespace morvik::simulation {

namespace {

// ---- Whether a point has ended, or should have

/// Whether nothing is left to count.
bool hasEnded(const Plan& plan, const PointResult& result)
{
    constexpr double rounding = 0.0005;  // of times in result files
    const Tally& tally = result.tally;
    const auto& limit = plan.rules.maxSeconds;
    const bool isTimeUp = limit && tally.blocks > 0 && result.seconds + rounding >= *limit;
    return isTimeUp || tally.blocks == plan.mostFrames() || isReached(plan.rules, tally.blocks, tally.errors.back());
}

/// Whether more has been counted than the plan allows.
bool isBeyond(const Plan& plan, const PointResult& result)
{
    const StopRules& rules = plan.rules;
    const ErrorCounts& errors = result.tally.errors.back();
    const std::uint64_t bitsOfLast = countedBitsOf(plan.points[result.number]);
    return result.tally.blocks > plan.mostFrames() || (rules.blockErrors && errors.blockErrors > *rules.blockErrors) ||
           (rules.bitErrors && errors.bitErrors >= *rules.bitErrors &&
            errors.bitErrors - *rules.bitErrors >= bitsOfLast);
}

/// Whether an error limit was met before the last frame.
bool wasMetBefore(const Plan& plan, const PointResult& result, FrameSimulator& simulator)
{
    ErrorCounts errors = result.tally.errors.back();
    StopRules rules = plan.rules;
    rules.maxBlocks.reset();
    const std::uint64_t blocks = result.tally.blocks;
    if (blocks == 0 || !isReached(rules, blocks, errors)) {
        return false;
    }
    BatchResult last = simulator.begin({result.number, plan.frames.from + blocks - 1, 1});
    simulator.proceed(last);
    const std::uint32_t wrongBits = last.wrongBits.back();
    const std::uint64_t wrongBlocks = wrongBits > 0 ? 1 : 0;
    if (errors.bitErrors < wrongBits || errors.blockErrors < wrongBlocks) {
        return true;  // the row is not of these frames
    }
    errors.bitErrors -= wrongBits;
    errors.blockErrors -= wrongBlocks;
    return isReached(rules, blocks - 1, errors);
}

[[noreturn]] void refuseBeyond(const PointResult& result, const std::string& fileName)
{
    throw base::Error(fileName + ": holds more of point " + std::to_string(result.number) +
                      " than the limits of this run allow; they may be larger than before, --overwrite starts anew");
}

// ---- Validation of checkpoints

/// Throws Error unless the plan has the point and its counts are possible.
void checkPoint(const Plan& plan, const PointResult& result, const std::string& fileName)
{
    const std::string place = fileName + ": point " + std::to_string(result.number);
    if (result.number >= plan.points.size()) {
        throw base::Error(place + ": is none of this run");
    }
    const Point& point = plan.points[result.number];
    const Tally& tally = result.tally;
    if (tally.errors.size() != plan.countsOf(point)) {
        throw base::Error(place + ": has " + std::to_string(tally.errors.size()) + " counts of errors, expected " +
                          std::to_string(plan.countsOf(point)));
    }
    if (tally.blocks > plan.frames.to - plan.frames.from) {
        refuseBeyond(result, fileName);
    }
    const FrameSet frames({plan.frames.from, plan.frames.from + tally.blocks});
    for (const ErrorCounts& errors : tally.errors) {
        if (const auto wrong = impossibleCount(frames, point, errors, tally.clipped)) {
            throw base::Error(place + ": " + *wrong);
        }
    }
    if (!isPossibleTime(result.seconds)) {
        throw base::Error(place + ": has taken no possible time");
    }
    if (isBeyond(plan, result)) {
        refuseBeyond(result, fileName);
    }
}

/// Throws Error unless the points are possible and a run reaches each of them.
void checkOrder(const Plan& plan, const Checkpoint& checkpoint, const std::string& fileName)
{
    std::vector<PointResult> earlier;
    const auto checkNext = [&](const PointResult& result) {
        checkPoint(plan, result, fileName);
        if (result.number != nextPoint(plan, earlier)) {
            throw base::Error(fileName + ": point " + std::to_string(result.number) +
                              ": is not the next one of this run");
        }
        earlier.push_back(result);
    };
    std::for_each(checkpoint.ended.begin(), checkpoint.ended.end(), checkNext);
    if (checkpoint.running) {
        checkNext(*checkpoint.running);
    }
    for (const PointResult& result : checkpoint.begun) {
        checkPoint(plan, result, fileName);
        if (!earlier.empty() && result.number <= earlier.back().number) {
            throw base::Error(fileName + ": point " + std::to_string(result.number) +
                              ": is there twice, or out of order");
        }
        earlier.push_back(result);
    }
}

/// Splits the points at the first unfinished one.
Standing parted(const Plan& plan, const std::vector<PointResult>& points)
{
    Standing standing;
    for (const PointResult& point : points) {
        const bool isNext = standing.begun.empty() && point.number == nextPoint(plan, standing.ended);
        (isNext && hasEnded(plan, point) ? standing.ended : standing.begun).push_back(point);
    }
    return standing;
}

// ---- Points from rows

using Rows = std::map<Point, const ResultRow*>;

/// Collects a point's result from the rows.
PointResult resultOf(const Plan& plan, std::size_t number, const Rows& rows)
{
    const Point& point = plan.points[number];
    const std::size_t counts = plan.countsOf(point);
    PointResult result = {number, Tally(counts), 0};
    for (std::size_t i = 0; i < counts; ++i) {
        Point wanted = point;
        wanted.iterations -= static_cast<unsigned>(counts - 1 - i);
        const auto found = rows.find(wanted);
        if (found != rows.end()) {
            const ResultRow& row = *found->second;
            result.tally.errors[i] = row.errors;
            result.tally.blocks = row.frames.size();
            result.tally.clipped = row.clipped;
            result.seconds = row.seconds;
        }
    }
    return result;
}

/// Whether the results are those of a run that has counted these points, and no others. Comparing texts catches what
/// the points do not hold, such as the seed or other rows.
bool areResultsOf(const Plan& plan, const std::vector<PointResult>& points, const Results& results)
{
    return csvText(resultsOf(plan, points)) == csvText(results);
}

/// The points of a run that ends with these results, or has been stopped with them: then the last ones have no blocks.
/// Nothing if the results are not of this run.
std::optional<std::vector<PointResult>> countedPoints(const Plan& plan, const Results& results)
{
    Rows rows;
    for (const ResultRow& row : results.rows) {
        rows.emplace(row.point, &row);
    }
    std::vector<PointResult> points;
    for (std::size_t next = 0; next < plan.points.size(); next = nextPoint(plan, points)) {
        points.push_back(resultOf(plan, next, rows));
        if (points.back().tally.blocks == 0) {
            break;
        }
    }
    std::vector<PointResult> counted = points;
    if (!counted.empty() && counted.back().tally.blocks == 0) {
        counted.pop_back();
    }
    return areResultsOf(plan, counted, results) ? std::optional(points) : std::nullopt;
}

/// Why the command of a result file, if it is that of a run, prevents resuming it.
std::string obstacleIn(const std::string& command, const Plan& plan)
{
    const bool isTold = command.rfind("morvik ber ", 0) == 0;
    return isTold ? obstaclesBetween(command, base::asUtf8(plan.command)) : "";
}

}  // namespace

Standing standingOf(const Plan& plan, const Checkpoint& checkpoint, const std::string& fileName)
{
    checkOrder(plan, checkpoint, fileName);
    std::vector<PointResult> points = checkpoint.ended;
    if (checkpoint.running) {
        points.push_back(*checkpoint.running);
    }
    points.insert(points.end(), checkpoint.begun.begin(), checkpoint.begun.end());
    Standing standing = parted(plan, points);
    if (checkpoint.command == base::asUtf8(plan.command) && standing.ended.size() < checkpoint.ended.size()) {
        throw base::Error(fileName + ": point " + std::to_string(checkpoint.ended[standing.ended.size()].number) +
                          ": is said to have ended, but has not");
    }
    return standing;
}

Standing standingOf(const Plan& plan, const Results& results, const std::string& fileName)
{
    const std::string obstacle = obstacleIn(results.command, plan);
    const auto points = countedPoints(plan, results);
    if (!obstacle.empty() || !points) {
        throw base::Error(fileName + ": holds other results" + (obstacle.empty() ? "" : " (" + obstacle + ')') +
                          ", and there is no checkpoint to resume; --overwrite starts anew");
    }
    if (!points->empty() && points->back().tally.blocks == 0) {
        throw base::Error(
            fileName + ": holds " + base::counted(points->size() - 1, "point") +
            " of this run, which was stopped, but its checkpoint is lost or empty; --overwrite starts anew");
    }
    FrameSimulator simulator(plan, "");
    for (const PointResult& point : *points) {
        checkPoint(plan, point, fileName);
        if (wasMetBefore(plan, point, simulator)) {
            refuseBeyond(point, fileName);
        }
    }
    return parted(plan, *points);
}

}  // namespace morvik::simulation
