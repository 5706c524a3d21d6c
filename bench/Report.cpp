// Report: the tables, as Markdown that reads well in a terminal.
#include "Report.h"

#include <iomanip>
#include <sstream>
#include <string>

#include "ItppDecoding.h"

namespace morvik::bench {

namespace {

std::string number(double value, int digits)
{
    std::ostringstream text;
    text << std::fixed << std::setprecision(digits) << value;
    return text.str();
}

std::string errorRate(double value)
{
    std::ostringstream text;
    text << std::setprecision(2) << value;
    return text.str();
}

std::string callText(const Work& work)
{
    return work.call == Work::Call::single ? "single" : "batch of " + std::to_string(work.blocks);
}

struct Column {
    const char* title;
    int width;
    bool isText;
};

constexpr Column lineColumns[] = {{"K", 6, false},
                                  {"units", 5, false},
                                  {"type", 4, false},
                                  {"call", 12, true},
                                  {"instruction set", 15, true},
                                  {"Mbit/s", 8, false},
                                  {"cycles/bit/iteration", 20, false},
                                  {"latency, us", 11, false},
                                  {"ratio to probe", 14, false}};

constexpr Column comparedColumns[] = {{"decoder", 23, true},
                                      {"K", 4, false},
                                      {"call", 12, true},
                                      {"Mbit/s", 8, false},
                                      {"cycles/bit/iteration", 20, false},
                                      {"latency, us", 11, false},
                                      {"bit error rate", 14, false}};

constexpr Column limitColumns[] = {
    {"instruction set", 15, true}, {"lanes", 5, false}, {"cycles/step/16 lanes", 20, false}};

template <std::size_t count>
void printRow(std::ostream& os, const Column (&columns)[count], const std::string (&cells)[count])
{
    for (std::size_t i = 0; i < count; ++i) {
        os << "| " << (columns[i].isText ? std::left : std::right) << std::setw(columns[i].width) << cells[i] << ' ';
    }
    os << "|\n" << std::flush;
}

template <std::size_t count>
void printHead(std::ostream& os, const char* title, const Column (&columns)[count])
{
    os << '\n' << title << "\n\n";
    std::string titles[count];
    for (std::size_t i = 0; i < count; ++i) {
        titles[i] = columns[i].title;
    }
    printRow(os, columns, titles);
    for (const Column& column : columns) {
        os << '|' << std::string(static_cast<std::size_t>(column.width) + 1, '-') << (column.isText ? '-' : ':');
    }
    os << "|\n";
}

}  // namespace

Report::Report(std::ostream& os, const Limits& limits) : itsStream(os), itsLimits(limits) {}

void Report::add(const Work& work, const Figures& figures)
{
    if (!itsLinesBegun && !itsComparisonBegun) {
        itsStream << "morvik, " << 8 * sizeof(void*) << "-bit build, " << iterations
                  << " iterations of blocks at an Eb/N0 of 1 dB; the clock runs at "
                  << number(cyclesPerSecond() * 1e-9, 2) << " GHz\n";
    }
    if (work.compared) {
        addCompared(work, figures);
    } else {
        addLine(work, figures);
    }
}

void Report::addLine(const Work& work, const Figures& figures)
{
    if (!itsLinesBegun) {
        printHead(itsStream, "Decoding", lineColumns);
        itsLinesBegun = true;
    }
    printRow(itsStream,
             lineColumns,
             {work.sizeText(),
              std::to_string(work.units),
              std::to_string(work.algorithm),
              callText(work),
              work.instructionSet,
              number(figures.megabitsPerSecond, 2),
              number(figures.cyclesPerBitAndIteration, 2),
              number(figures.latency, 1),
              figures.ratio == 0 ? "-" : number(figures.ratio, 2)});
}

void Report::addCompared(const Work& work, const Figures& figures)
{
    if (!itsComparisonBegun) {
        printHead(itsStream, "Max-log-MAP decoders on the same blocks", comparedColumns);
        itsComparisonBegun = true;
    }
    const bool isItpp = work.decoder == Work::Decoder::itpp;
    printRow(itsStream,
             comparedColumns,
             {isItpp ? "IT++ LOGMAX" : "morvik, 4 units, type 0",
              work.sizeText(),
              callText(work),
              number(figures.megabitsPerSecond, 2),
              number(figures.cyclesPerBitAndIteration, 2),
              number(figures.latency, 1),
              errorRate(figures.bitErrorRate)});
}

void Report::printLimits()
{
    printHead(itsStream, "The probe: the plain forward recursion", limitColumns);
    for (const Limits::Limit& limit : itsLimits.all()) {
        printRow(itsStream, limitColumns, {limit.instructionSet, std::to_string(limit.lanes), number(limit.cycles, 2)});
    }
}

void Report::finish()
{
    if (itsComparisonBegun && !itppAvailable()) {
        itsStream << "\nIT++ was left out: it was not there when this program was built.\n";
    }
    printLimits();
}

}  // namespace morvik::bench
