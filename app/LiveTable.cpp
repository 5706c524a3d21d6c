// LiveTable: a run's points as a table that grows, with a line for the running point on terminals.
#include "LiveTable.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <stdexcept>
#include <string_view>

#include "simulation/Confidence.h"
#include "simulation/Results.h"
#include "simulation/StopRules.h"
#include "simulation/Thousandths.h"

namespace morvik {

namespace {

using simulation::Plan;
using simulation::Point;
using simulation::PointResult;
using simulation::ResultRow;

constexpr std::chrono::milliseconds moveInterval(200);
constexpr std::string_view eraseToEnd = "\x1b[K";  // of the line

std::string right(const std::string& text, std::size_t width)
{
    return std::string(width - std::min(width, text.size()), ' ') + text;
}

/// "1.23e-04".
std::string rateText(double rate)
{
    char text[32];
    std::snprintf(text, sizeof text, "%.2e", rate);
    return text;
}

/// "1:02", "3:04:05".
std::string timeText(double seconds)
{
    const auto whole = static_cast<std::uint64_t>(std::lround(std::min(seconds, 1e15)));
    const auto twoDigits = [](std::uint64_t number) {
        return std::to_string(100 + number % 100).substr(1);
    };
    const std::string hours = whole >= 3600 ? std::to_string(whole / 3600) + ':' : "";
    const std::string minutes = hours.empty() ? std::to_string(whole / 60) : twoDigits(whole / 60 % 60);
    return hours + minutes + ':' + twoDigits(whole % 60);
}

std::string cells(const std::string& point,
                  const std::string& iterations,
                  const std::string& ebn0,
                  const std::string& blocks,
                  const std::string& errors,
                  const std::string& bler,
                  const std::string& bounds,
                  const std::string& ber)
{
    return right(point, 5) + right(iterations, iterations.empty() ? 0 : 6) + right(ebn0, 8) + right(blocks, 12) +
           right(errors, 8) + right(bler, 11) + right(bounds, 21) + right(ber, 11);
}

std::string columnHeads(bool eachIteration)
{
    return cells("point", eachIteration ? "iter" : "", "Eb/N0", "blocks", "failed", "BLER", "95 % confidence", "BER") +
           right("blocks/s", 11) + right("time", 9);
}

/// What has been counted, without the speed.
std::string countCells(const ResultRow& row, bool eachIteration)
{
    const std::uint64_t blocks = row.frames.size();
    const auto bounds = simulation::blockErrorBounds(row.errors, blocks);
    const bool hasFailed = row.errors.blockErrors > 0;
    const auto rate = [hasFailed](double value) {
        return hasFailed ? rateText(value) : "0";
    };
    return cells(std::to_string(row.pointNumber),
                 eachIteration ? std::to_string(row.point.iterations) : "",
                 simulation::thousandthsText(row.point.milliDecibels),
                 std::to_string(blocks),
                 std::to_string(row.errors.blockErrors),
                 rate(simulation::blockErrorRate(row)),
                 (hasFailed ? rateText(bounds.low) + " .. " : "below ") + rateText(bounds.high),
                 rate(simulation::bitErrorRate(row)));
}

std::string speedCell(const PointResult& point)
{
    const double speed = point.seconds > 0 ? static_cast<double>(point.tally.blocks) / point.seconds : 0;
    return right(std::to_string(std::lround(speed)), 11);
}

std::string remaining(const Plan& plan, const PointResult& point)
{
    simulation::StopRules rules = plan.rules;
    rules.maxBlocks = std::min(rules.maxBlocks.value_or(UINT64_MAX), plan.frames.to - plan.frames.from);
    const double done = progressOf(rules, point.tally.blocks, point.tally.errors.back(), point.seconds);
    return done > 0 ? timeText(point.seconds / done - point.seconds) + " left" : "";
}

}  // namespace

std::optional<std::size_t> terminalWidth()
{
    winsize size = {};
    if (isatty(STDOUT_FILENO) == 0) {
        return std::nullopt;
    }
    const bool isKnown = ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0;
    return isKnown ? size.ws_col : 80;
}

LiveTable::LiveTable(const Plan& plan, std::ostream& stream, std::optional<std::size_t> width)
    : itsPlan(plan), itsStream(stream), itsWidth(width)
{
}

LiveTable::~LiveTable()
{
    eraseMovingLine();
    itsStream.flush();
}

void LiveTable::isAt(const PointResult& running)
{
    const auto now = std::chrono::steady_clock::now();
    if (!itsWidth || running.tally.blocks == 0 || now - itsLastMove < moveInterval) {
        return;
    }
    itsLastMove = now;
    writeHeading(itsPlan.points[running.number]);
    const ResultRow row = resultsOf(itsPlan, {running}).rows.back();
    std::string line = countCells(row, itsPlan.eachIteration) + speedCell(running) + "  " + remaining(itsPlan, running);
    line.resize(std::min(line.size(), *itsWidth - 1));  // a cursor behind the last column would go to the next line
    itsHasMovingLine = true;
    write('\r' + line + std::string(eraseToEnd));
}

void LiveTable::hasEnded(const PointResult& point)
{
    eraseMovingLine();
    writeHeading(itsPlan.points[point.number]);
    for (const ResultRow& row : resultsOf(itsPlan, {point}).rows) {
        write(countCells(row, itsPlan.eachIteration) + speedCell(point) + right(timeText(point.seconds), 9) + '\n');
    }
}

/// Opens the table of a curve, unless that is the one that is open.
void LiveTable::writeHeading(const Point& point)
{
    if (itsHeading && onSameCurve(*itsHeading, point)) {
        return;
    }
    eraseMovingLine();
    const std::string iterations =
        std::to_string(point.iterations) + (point.iterations == 1 ? " iteration" : " iterations");
    write((itsHeading ? "\nK = " : "K = ") + std::to_string(point.blockSize) + ", " + std::to_string(point.numPu) +
          " units, " + simulation::algorithmName(point.algorithm) + ", scale " +
          simulation::scaleOptionText(point.scaleOption) + ", " + iterations + '\n' +
          columnHeads(itsPlan.eachIteration) + '\n');
    itsHeading = point;
}

void LiveTable::write(const std::string& text)
{
    if (!(itsStream << text << std::flush)) {
        throw std::runtime_error("<stdout>: cannot be written");
    }
}

void LiveTable::eraseMovingLine()
{
    if (itsHasMovingLine) {
        itsStream << '\r' << eraseToEnd;
        itsHasMovingLine = false;
    }
}

}  // namespace morvik
