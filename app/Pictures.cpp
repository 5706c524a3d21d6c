// Pictures: what `morvik ber` draws of its results.
#include "Pictures.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "report/Page.h"
#include "report/Plot.h"
#include "report/Reference.h"
#include "simulation/Results.h"
#include "simulation/Thousandths.h"

namespace morvik {

namespace {

constexpr const char* title = "Error rates";

report::Row rowOf(const simulation::ResultRow& row)
{
    const simulation::Point& point = row.point;
    const simulation::Bounds bits = bitErrorBounds(row);
    const simulation::Bounds blocks = blockErrorBounds(row);
    report::Row drawn;
    drawn.setting = {point.blockSize,
                     point.numPu,
                     simulation::algorithmName(point.algorithm),
                     point.iterations,
                     simulation::scaleOptionText(point.scaleOption)};
    drawn.sample = {point.milliDecibels / 1000.0,
                    bitErrorRate(row),
                    bits.low,
                    bits.high,
                    blockErrorRate(row),
                    blocks.low,
                    blocks.high,
                    row.errors.bitErrors == 0,
                    row.errors.blockErrors == 0,
                    row.frames.size(),
                    row.errors.bitErrors,
                    row.errors.blockErrors,
                    clippedFraction(row)};
    return drawn;
}

std::string rangeText(const std::vector<simulation::Point>& points)
{
    int least = points.front().milliDecibels;
    int most = least;
    for (const simulation::Point& point : points) {
        least = std::min(least, point.milliDecibels);
        most = std::max(most, point.milliDecibels);
    }
    return simulation::thousandthsText(least) + " to " + simulation::thousandthsText(most) + " dB";
}

}  // namespace

Pictures::Pictures(const PictureOptions& options) : itsOptions(options)
{
    for (const std::string& file : options.references) {
        std::vector<report::Curve> curves = report::readReference(file);
        std::move(curves.begin(), curves.end(), std::back_inserter(itsReferences));
    }
    if (!options.plot.empty()) {
        report::checkPlot(options.plot);
    }
    if (!options.report.empty()) {
        report::checkReport(options.report);
    }
}

void Pictures::draw(const simulation::Plan& plan, const std::vector<simulation::PointResult>& points) const
{
    std::vector<report::Row> rows;
    for (const simulation::ResultRow& row : resultsOf(plan, points).rows) {
        rows.push_back(rowOf(row));
    }
    std::vector<report::Curve> curves = curvesOf(rows);
    curves.insert(curves.end(), itsReferences.begin(), itsReferences.end());
    if (!itsOptions.plot.empty()) {
        report::writePlot(itsOptions.plot, curves, title);
    }
    if (!itsOptions.report.empty()) {
        report::writeReport(itsOptions.report,
                            curves,
                            {title,
                             {{"Channel", "BPSK over white Gaussian noise; Eb/N0 counts the tail"},
                              {"Eb/N0", rangeText(plan.points)},
                              {"Points", std::to_string(points.size()) + " of " + std::to_string(plan.points.size())},
                              {"Seed", std::to_string(plan.seed)},
                              {"Version", plan.version}},
                             plan.command});
    }
}

}  // namespace morvik
