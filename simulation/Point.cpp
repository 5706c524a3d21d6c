// Point: the parameters of one simulated error rate.
#include "Point.h"

#include <algorithm>
#include <tuple>

#include "base/Numbers.h"
#include "base/Thousandths.h"
#include "link/RatioScale.h"
#include "link/channel/Decibels.h"
#include "link/coding/CodeBlocks.h"
#include "link/coding/TurboEncoder.h"
#include "rules/Algorithms.h"
#include "rules/Tail.h"

namespace morvik::simulation {

namespace {

auto curveOf(const Point& point)
{
    return std::tie(
        point.link, point.blockSize, point.numPu, point.algorithm, point.scaleOption, point.iterations, point.axis);
}

auto parametersOf(const Point& point)
{
    return std::tuple_cat(curveOf(point), std::tie(point.milliDecibels, point.milliEsn0, point.milliScale));
}

}  // namespace

std::string_view nameOf(Axis axis)
{
    return axis == Axis::ebn0 ? "ebn0" : "esn0";
}

bool operator==(const Point& a, const Point& b)
{
    return parametersOf(a) == parametersOf(b);
}

bool operator<(const Point& a, const Point& b)
{
    return parametersOf(a) < parametersOf(b);
}

bool onSameCurve(const Point& a, const Point& b)
{
    return curveOf(a) == curveOf(b);
}

unsigned codeBlocksOf(const Point& point)
{
    return point.link.hasTransportBlocks() ? link::codeBlocksOf(point.link.transportBlockSize).count : 1;
}

std::uint32_t smallestBatchOf(const Point& point)
{
    return std::max(link::TurboEncoder::blocksAtOnce / codeBlocksOf(point), 1U);
}

std::uint64_t countedBitsOf(const Point& point)
{
    return countedBitsOf(point.link, point.blockSize);
}

std::uint64_t countedBitsOf(const LinkFormat& format, unsigned blockSize)
{
    if (!format.hasTransportBlocks()) {
        return blockSize;
    }
    const link::CodeBlocks blocks = link::codeBlocksOf(format.transportBlockSize);
    return std::uint64_t{blocks.bits} + link::crcBits + std::uint64_t{blocks.count} * blocks.ownCrcBits();
}

std::uint64_t softValuesOf(const Point& point)
{
    const auto ofSize = [](std::uint64_t K) {
        return 3 * (K + rules::tailPositions);
    };
    if (!point.link.hasTransportBlocks()) {
        return ofSize(point.blockSize);
    }
    const link::CodeBlocks blocks = link::codeBlocksOf(point.link.transportBlockSize);
    return blocks.countPlus * ofSize(blocks.sizePlus) + blocks.countMinus * ofSize(blocks.sizeMinus);
}

std::uint64_t symbolsOf(const LinkFormat& link, unsigned blockSize)
{
    const std::uint64_t bits =
        link.hasTransportBlocks() ? link.codedBits : 3 * (std::uint64_t{blockSize} + rules::tailPositions);
    const unsigned each = bitsPerSymbol(link.modulation);
    return (bits + each - 1) / each;
}

double bitsPerSymbolOf(const LinkFormat& link, unsigned blockSize)
{
    const unsigned bits = link.hasTransportBlocks() ? link.transportBlockSize : blockSize;
    return bits / static_cast<double>(symbolsOf(link, blockSize));
}

int milliEsn0Of(const Point& point)
{
    if (!point.link.isPlainBpsk()) {
        return point.milliEsn0;
    }
    return link::milliDecibelsOf(link::ratioOf(point.milliDecibels) * bitsPerSymbolOf(point.link, point.blockSize));
}

void setPlace(Point& point, int milliDecibels)
{
    const double bitsPerSymbol = bitsPerSymbolOf(point.link, point.blockSize);
    const double ratio = link::ratioOf(milliDecibels);
    const bool isOnEsn0 = point.axis == Axis::esn0;
    point.milliDecibels = isOnEsn0 ? link::milliDecibelsOf(ratio / bitsPerSymbol) : milliDecibels;
    point.milliEsn0 = point.link.isPlainBpsk() ? 0
                      : isOnEsn0               ? milliDecibels
                                               : link::milliDecibelsOf(ratio * bitsPerSymbol);
}

int placeOf(const Point& point)
{
    return point.axis == Axis::ebn0 ? point.milliDecibels : milliEsn0Of(point);
}

double automaticScale(const Point& point, unsigned transmission)
{
    const double rate =
        bitsPerSymbolOf(point.link, point.blockSize) / (bitsPerSymbol(point.link.modulation) * (transmission + 1.0));
    return link::ratioScale(static_cast<int>(point.algorithm), point.link.modulation, rate);
}

bool isWide(const Point& point)
{
    return !point.link.isPlainBpsk() || point.axis == Axis::esn0;
}

std::string algorithmName(unsigned algorithm)
{
    return std::string(rules::algorithmNames.at(algorithm));
}

std::optional<unsigned> algorithmOf(std::string_view nameOrNumber)
{
    const auto named = rules::findAlgorithm(nameOrNumber);
    const auto number = nameOrNumber.size() == 1 ? base::parseNumber<unsigned>(nameOrNumber) : std::nullopt;
    return number && *number < rules::algorithmNames.size() ? number : named;
}

std::string scaleOptionText(const ScaleOption& option)
{
    return option ? base::thousandthsText(*option) : "auto";
}

}  // namespace morvik::simulation
