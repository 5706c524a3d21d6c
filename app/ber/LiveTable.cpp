// LiveTable: prints a run's points as a growing table, with a progress line on terminals.
#include "LiveTable.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <stdexcept>
#include <string_view>

#include "base/Error.h"
#include "base/Numbers.h"
#include "base/Text.h"
#include "base/Thousandths.h"
#include "simulation/Confidence.h"
#include "simulation/LinkWords.h"
#include "simulation/Results.h"
#include "simulation/StopRules.h"

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

/// "1.23e-04" with two decimals.
std::string rateText(double rate, int decimals)
{
    char text[32];
    std::snprintf(text, sizeof text, "%.*e", decimals, rate);
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

/// The cells of a line, which fits 79 columns. `iterations` is empty unless each iteration is measured.
struct Line {
    std::string point;
    std::optional<std::string> iterations;
    std::string ebn0;
    std::string blocks;
    std::string failed;
    std::string bler;
    std::string bounds;
    std::string ber;
    std::string speed;
    std::string time;

    std::string text() const
    {
        return right(point, 5) + (iterations ? right(*iterations, 5) : "") + right(ebn0, 7) + right(blocks, 10) +
               right(failed, 7) + right(bler, 9) + right(bounds, 16) + right(ber, 9) + right(speed, 9) + right(time, 7);
    }
};

std::string headLine(bool eachIteration, const Point& point)
{
    Line line = {"point", {}, "Eb/N0", "blocks", "failed", "BLER", "95 % bounds", "BER", "blocks/s", "time"};
    if (point.axis == simulation::Axis::esn0) {
        line.ebn0 = "Es/N0";
    }
    if (point.link.hasTransportBlocks()) {
        line.ber = "bit/symb";
    }
    if (eachIteration) {
        line.iterations = "iter";
    }
    return line.text();
}

Line tableLine(const ResultRow& row, bool eachIteration)
{
    const std::uint64_t blocks = row.frames.size();
    const auto bounds = simulation::blockErrorBounds(row.errors, blocks);
    const bool hasFailed = row.errors.blockErrors > 0;
    const auto rate = [hasFailed](double value) {
        return hasFailed ? rateText(value, 2) : "0";
    };
    Line line;
    line.point = std::to_string(row.pointNumber);
    if (eachIteration) {
        line.iterations = std::to_string(row.point.iterations);
    }
    line.ebn0 = base::thousandthsText(placeOf(row.point));
    line.blocks = std::to_string(blocks);
    line.failed = std::to_string(row.errors.blockErrors);
    line.bler = rate(simulation::blockErrorRate(row));
    line.bounds = (hasFailed ? rateText(bounds.low, 1) + ' ' : "below ") + rateText(bounds.high, 1);
    line.ber = row.point.link.hasTransportBlocks()
                   ? base::numberText(simulation::throughput(row), std::chars_format::fixed, 4)
                   : rate(simulation::bitErrorRate(row));
    line.speed = row.seconds > 0 ? std::to_string(std::lround(static_cast<double>(blocks) / row.seconds)) : "";
    line.time = timeText(row.seconds);
    return line;
}

std::string timeLeft(const Plan& plan, const PointResult& point)
{
    simulation::StopRules rules = plan.rules;
    rules.maxBlocks = std::min(rules.maxBlocks.value_or(UINT64_MAX), plan.frames.to - plan.frames.from);
    const double done = progressOf(rules, point.tally.blocks, point.tally.errors.back(), point.seconds);
    return done > 0 ? timeText(point.seconds / done - point.seconds) + " left" : "";
}

}  // namespace

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
    Line line = tableLine(resultsOf(itsPlan, {running}).rows.back(), itsPlan.eachIteration);
    line.bounds = timeLeft(itsPlan, running);
    std::string text = line.text();
    text.resize(std::min(text.size(), *itsWidth - 1));  // a cursor past the last column would wrap
    itsHasMovingLine = true;
    write('\r' + text + std::string(eraseToEnd));
}

void LiveTable::hasEnded(const PointResult& point)
{
    eraseMovingLine();
    writeHeading(itsPlan.points[point.number]);
    for (const ResultRow& row : resultsOf(itsPlan, {point}).rows) {
        write(tableLine(row, itsPlan.eachIteration).text() + '\n');
    }
}

/// Starts the table of a curve unless it is already open.
void LiveTable::writeHeading(const Point& point)
{
    if (itsHeading && onSameCurve(*itsHeading, point)) {
        return;
    }
    eraseMovingLine();
    write((itsHeading ? "\n" : "") + simulation::curveText(point) + '\n' + headLine(itsPlan.eachIteration, point) +
          '\n');
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
