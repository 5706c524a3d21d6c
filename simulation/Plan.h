// Plan: the points of a sweep, and how long each is simulated.
#ifndef MORVIK_SIMULATION_PLAN_H
#define MORVIK_SIMULATION_PLAN_H

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "Frames.h"
#include "Point.h"
#include "Results.h"
#include "StopRules.h"
#include "Tally.h"

namespace morvik::simulation {

/// Values for each parameter, every combination of which is a point.
struct Sweep {
    std::vector<unsigned> blockSizes;
    std::vector<unsigned> numPus;
    std::vector<unsigned> algorithms;
    std::vector<ScaleOption> scaleOptions;
    std::vector<unsigned> iterations;
    std::vector<int> milliDecibels;  // if empty, a range that suits the block size
};

/// The Eb/N0 in which the error rates of blocks of K bits fall, in thousandths of a decibel.
std::vector<int> usualMilliDecibels(unsigned K);

/// How many points a sweep has.
std::uint64_t countOfPoints(const Sweep& sweep);

/// The points in the order of results.
std::vector<Point> pointsOf(const Sweep& sweep);

/// All that the results of a run follow from.
struct Plan {
    std::vector<Point> points;
    bool eachIteration = false;  // looks at the decisions after each iteration, up to the point's
    StopRules rules;
    FrameRange frames = {0, UINT64_MAX};
    std::uint64_t seed = 0;
    std::string version;
    std::string command;  // repeats the run; two plans are the same if their commands and versions are

    /// How many frames of a point can count at most.
    std::uint64_t mostFrames() const
    {
        return std::min(rules.maxBlocks.value_or(UINT64_MAX), frames.to - frames.from);
    }

    /// How many counts of iterations are looked at in a point.
    std::size_t countsOf(const Point& point) const
    {
        return eachIteration ? point.iterations : 1;
    }
};

/// What keeps a run with the command `now` from going on with what one with the command `before` has counted, both as
/// plans have them: "--seed 1 instead of 2, without --each-iteration". Empty if nothing does: the options are the same,
/// or those that differ are limits of points, none of which is smaller than before.
std::string obstaclesBetween(const std::string& before, const std::string& now);

/// What has been counted at a point of a plan.
struct PointResult {
    std::size_t number = 0;
    Tally tally;
    double seconds = 0;
};

/// Whether an earlier point of the curve has a block error rate below the one that ends curves. All earlier points are
/// in the order of the plan.
bool isCurveEnded(const Plan& plan, std::size_t point, const std::vector<PointResult>& earlier);

/// The first point behind the earlier ones that is simulated: whose curve has not ended. The number of points if none
/// is.
std::size_t nextPoint(const Plan& plan, const std::vector<PointResult>& earlier);

/// The rows of all points.
Results resultsOf(const Plan& plan, const std::vector<PointResult>& points);

}  // namespace morvik::simulation

#endif
