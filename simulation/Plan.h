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

/// Values of each parameter; every combination is a point.
struct Sweep {
    std::vector<unsigned> blockSizes;
    std::vector<unsigned> numPus;
    std::vector<unsigned> algorithms;
    std::vector<ScaleOption> scaleOptions;
    std::vector<unsigned> iterations;
    std::vector<int> milliDecibels;          // along the axis; if empty, a range suited to the block and its format
    std::vector<LinkFormat> formats = {{}};  // plain code blocks are combined with the block sizes
    Axis axis = Axis::ebn0;
};

/// The Eb/N0 values over which the error rates of K-bit blocks fall, in thousandths of a decibel.
std::vector<int> usualMilliDecibels(unsigned K);

/// The Es/N0 values over which the error rates of what is sent in this format fall, in thousandths of a decibel: from
/// Shannon's limit for all transmissions together, to where a single one has been received for long on this channel.
std::vector<int> usualMilliEsn0(const LinkFormat& format, unsigned K);

/// An Es/N0 amid the fall of the error rate of the first transmission, likewise.
int milliEsn0Amid(const LinkFormat& format, unsigned K);

/// The number of points of a sweep.
std::uint64_t countOfPoints(const Sweep& sweep);

/// The points in the order of results.
std::vector<Point> pointsOf(const Sweep& sweep);

/// Everything that determines the results of a run.
struct Plan {
    std::vector<Point> points;
    bool eachIteration = false;  // counts errors after each iteration, up to the point's
    StopRules rules;
    FrameRange frames = {0, UINT64_MAX};
    std::uint64_t seed = 0;
    std::string version;
    std::string command;  // repeats the run; plans are equal if their commands and versions are

    /// The most frames of a point that may be counted.
    std::uint64_t mostFrames() const
    {
        return std::min(rules.maxBlocks.value_or(UINT64_MAX), frames.to - frames.from);
    }

    /// How many iteration counts a point has results for.
    std::size_t countsOf(const Point& point) const
    {
        return eachIteration ? point.iterations : 1;
    }
};

/// Why a run with the command `now` cannot resume one with the command `before`, both as plans have them: "--seed 1
/// instead of 2, without --each-iteration". Empty if it can: the options are equal, or those that differ are limits of
/// points, none smaller than before.
std::string obstaclesBetween(const std::string& before, const std::string& now);

/// The counts of a point of a plan.
struct PointResult {
    std::size_t number = 0;
    Tally tally;
    double seconds = 0;
};

/// Whether an earlier point of the curve has a block error rate below the one that ends curves. `earlier` holds all
/// earlier points, in plan order.
bool isCurveEnded(const Plan& plan, std::size_t point, const std::vector<PointResult>& earlier);

/// The first point after `earlier` whose curve has not ended; the number of points if there is none.
std::size_t nextPoint(const Plan& plan, const std::vector<PointResult>& earlier);

/// The last points of curves whose block error rates are still above `most` there. Points are in plan order.
std::vector<PointResult> unfallenEnds(const Plan& plan, const std::vector<PointResult>& points, double most);

/// The rows of all points.
Results resultsOf(const Plan& plan, const std::vector<PointResult>& points);

}  // namespace morvik::simulation

#endif
