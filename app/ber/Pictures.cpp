// Pictures: draws the results of one run or of several merged ones.
#include "Pictures.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "base/Error.h"
#include "base/OutputFile.h"
#include "base/Thousandths.h"
#include "report/Page.h"
#include "report/Plot.h"
#include "report/Reference.h"
#include "simulation/LinkWords.h"

namespace morvik {

namespace {

constexpr const char* title = "Error rates";

report::Row rowOf(const simulation::ResultRow& row, simulation::Axis axis)
{
    const simulation::Point& point = row.point;
    const simulation::Bounds bits = bitErrorBounds(row);
    const simulation::Bounds blocks = blockErrorBounds(row);
    report::Row drawn;
    drawn.setting = {point.blockSize,
                     point.numPu,
                     simulation::algorithmName(point.algorithm),
                     point.iterations,
                     simulation::scaleOptionText(point.scaleOption),
                     point.link.isPlainBpsk() ? "" : shortSentText(point),
                     receivedText(point.link)};
    report::Sample& sample = drawn.sample;
    sample.ebn0 = point.milliDecibels / 1000.0;
    if (axis == simulation::Axis::esn0) {
        sample.esn0 = milliEsn0Of(point) / 1000.0;
    }
    sample.ber = bitErrorRate(row);
    sample.berLow = bits.low;
    sample.berHigh = bits.high;
    sample.bler = blockErrorRate(row);
    sample.blerLow = blocks.low;
    sample.blerHigh = blocks.high;
    sample.berBelow = row.errors.bitErrors == 0;
    sample.blerBelow = row.errors.blockErrors == 0;
    sample.blocks = row.frames.size();
    sample.bitErrors = row.errors.bitErrors;
    sample.blockErrors = row.errors.blockErrors;
    sample.clipped = clippedFraction(row);
    if (isWide(point)) {
        const double most = bitsPerSymbolOf(point.link, point.blockSize) / meanTransmissions(row);
        sample.throughput = throughput(row);
        sample.throughputLow = most * (1 - blocks.high);
        sample.throughputHigh = most * (1 - blocks.low);
    }
    return drawn;
}

/// The parameter of the axis and its range.
std::pair<std::string, std::string> rangeOf(const std::vector<simulation::ResultRow>& rows, simulation::Axis axis)
{
    const bool isEsn0 = axis == simulation::Axis::esn0;
    const auto place = [isEsn0](const simulation::ResultRow& row) {
        return isEsn0 ? milliEsn0Of(row.point) : row.point.milliDecibels;
    };
    const auto [least, most] = std::minmax_element(
        rows.begin(), rows.end(), [&place](const auto& a, const auto& b) { return place(a) < place(b); });
    return {isEsn0 ? "Es/N0" : "Eb/N0",
            base::thousandthsText(place(*least)) + " to " + base::thousandthsText(place(*most)) + " dB"};
}

std::string channelText(const std::vector<simulation::ResultRow>& rows)
{
    const bool isPlain = std::all_of(
        rows.begin(), rows.end(), [](const simulation::ResultRow& row) { return row.point.link.isPlainBpsk(); });
    return isPlain ? "BPSK over white Gaussian noise; Eb/N0 counts the tail"
                   : "Modulated symbols over white Gaussian noise, with the fading that is named";
}

}  // namespace

void addPictureOptions(CLI::App& command, PictureOptions& options)
{
    command.add_option("--plot", options.plot, "Draw the curves, as SVG, PNG or PDF by the ending .svg, .png or .pdf")
        ->type_name("FILE");
    command.add_option("--report", options.report, "Write a page for a browser: curves, table, parameters")
        ->type_name("FILE.html");
    command
        .add_option(
            "--reference",
            options.references,
            "Draw the error rates of a file, too: another result, or published ones as CSV; can be given several times")
        ->type_name("FILE")
        ->allow_extra_args(false);
}

simulation::Axis axisOf(const std::vector<simulation::Point>& points)
{
    const bool isOnEsn0 = std::any_of(points.begin(), points.end(), [](const simulation::Point& point) {
        return point.axis == simulation::Axis::esn0;
    });
    return isOnEsn0 ? simulation::Axis::esn0 : simulation::Axis::ebn0;
}

Pictures::Pictures(const PictureOptions& options, const std::string& output, std::vector<std::string> inputs)
    : itsOptions(options)
{
    inputs.insert(inputs.end(), options.references.begin(), options.references.end());
    for (const std::string& file : {output, options.plot, options.report, std::string(base::standardStream)}) {
        base::expectOwnFile(file, inputs, "results");
    }
    if (!options.plot.empty()) {
        report::checkPlot(options.plot);
    }
    if (!options.report.empty()) {
        report::checkReport(options.report);
    }
    base::expectDistinct(options.plot, output);
    base::expectDistinct(options.report, output);
    base::expectDistinct(options.report, options.plot);
}

void Pictures::takeAxis(simulation::Axis axis)
{
    itsAxis = axis;
    for (const std::string& file : itsOptions.references) {
        std::vector<report::Curve> curves = report::readReference(file, axis);
        std::move(curves.begin(), curves.end(), std::back_inserter(itsReferences));
    }
}

void Pictures::draw(const simulation::Results& results, const std::string& points) const
{
    std::vector<report::Row> rows;
    rows.reserve(results.rows.size());
    for (const simulation::ResultRow& row : results.rows) {
        rows.push_back(rowOf(row, itsAxis));
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
                             {{"Channel", channelText(results.rows)},
                              rangeOf(results.rows, itsAxis),
                              {"Points", points},
                              {"Seed", std::to_string(results.rows.front().seed)},
                              {"Version", results.version}},
                             results.command});
    }
}

}  // namespace morvik
