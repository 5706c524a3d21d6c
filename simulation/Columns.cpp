// Columns: the columns of result files, with their readers and writers.
#include "Columns.h"

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <cstdlib>
#include <iterator>
#include <optional>

#include "Possible.h"
#include "base/Numbers.h"
#include "base/Thousandths.h"
#include "link/channel/Decibels.h"
#include "link/coding/CodeBlocks.h"
#include "rules/BlockSizes.h"

namespace morvik::simulation {

namespace {

std::string rateText(double rate)
{
    return base::numberText(rate, std::chars_format::scientific, 6);
}

template <class Value>
bool readInto(const std::optional<Value>& parsed, Value& value)
{
    value = parsed.value_or(value);
    return parsed.has_value();
}

template <class Number>
bool readNumber(std::string_view text, Number& value)
{
    return readInto(base::parseNumber<Number>(text), value);
}

bool readBlockSize(std::string_view text, ResultRow& row)
{
    return readNumber(text, row.point.blockSize) && rules::findBlockSize(row.point.blockSize) != nullptr;
}

bool readNumPu(std::string_view text, ResultRow& row)
{
    return readNumber(text, row.point.numPu) && (text == "2" || text == "4" || text == "8");
}

bool readIterations(std::string_view text, ResultRow& row)
{
    return readNumber(text, row.point.iterations) && row.point.iterations >= 1 && row.point.iterations <= 15;
}

bool readScaleOption(std::string_view text, ResultRow& row)
{
    row.point.scaleOption = base::parseThousandths(text);
    return text == "auto" || row.point.scaleOption.value_or(0) > 0;
}

bool readScale(std::string_view text, ResultRow& row)
{
    return readInto(base::parseThousandths(text), row.point.milliScale) && row.point.milliScale > 0;
}

bool readSeconds(std::string_view text, ResultRow& row)
{
    return readNumber(text, row.seconds) && isPossibleTime(row.seconds);
}

std::string failuresText(const ResultRow& row)
{
    std::string text;
    for (const std::uint64_t frame : row.errors.failures) {
        text += (text.empty() ? "" : " ") + std::to_string(frame);
    }
    return text;
}

bool readFailures(std::string_view text, ResultRow& row)
{
    row.errors.failures.clear();
    while (!text.empty()) {
        const std::string_view first = text.substr(0, text.find(' '));
        std::uint64_t frame = 0;
        if (!readNumber(first, frame)) {
            return false;
        }
        row.errors.failures.push_back(frame);
        text.remove_prefix(std::min(first.size() + 1, text.size()));
    }
    return row.errors.failures.size() <= ErrorCounts::keptFailures;
}

bool skip(std::string_view, ResultRow&)
{
    return true;
}

/// Reads a number from 0 to `most`.
bool readUpTo(unsigned most, std::string_view text, unsigned& value)
{
    return readNumber(text, value) && value <= most;
}

bool readTransportBlockSize(std::string_view text, ResultRow& row)
{
    return readUpTo(link::mostTransportBits, text, row.point.link.transportBlockSize);
}

bool readMcs(std::string_view text, ResultRow& row)
{
    row.point.link.mcs.reset();
    const std::size_t space = text.find(' ');
    if (space == std::string_view::npos) {
        return text.empty();
    }
    const auto table = mcsTableOf(text.substr(0, space));
    unsigned index = 0;
    if (!table || !readNumber(text.substr(space + 1), index) || index >= countOf(*table)) {
        return false;
    }
    row.point.link.mcs = {*table, index};
    return true;
}

bool readVersions(std::string_view text, ResultRow& row)
{
    std::vector<unsigned>& versions = row.point.link.versions;
    versions.clear();
    for (std::size_t i = 0; i < text.size(); ++i) {
        const bool isGood = i % 2 == 0 ? text[i] >= '0' && text[i] <= '3' : text[i] == ' ' && i + 1 < text.size();
        if (!isGood) {
            return false;
        }
        if (i % 2 == 0) {
            versions.push_back(static_cast<unsigned>(text[i] - '0'));
        }
    }
    return versions.size() <= mostTransmissions;
}

std::string codeBlocksText(const ResultRow& row)
{
    return std::to_string(codeBlocksOf(row.point));
}

std::string transmissionsText(const ResultRow& row)
{
    return std::to_string(std::max<std::size_t>(row.point.link.versions.size(), 1));
}

bool readSoftBufferBits(std::string_view text, ResultRow& row)
{
    return readUpTo(16, text, row.point.link.softBufferBits) && row.point.link.softBufferBits != 1;
}

bool readAxis(std::string_view text, ResultRow& row)
{
    row.point.axis = text == "esn0" ? Axis::esn0 : Axis::ebn0;
    return text == nameOf(row.point.axis);
}

using Row = ResultRow;
using Text = std::string_view;
constexpr auto number = Column::Kind::number;
constexpr auto text = Column::Kind::text;
constexpr auto list = Column::Kind::list;

// clang-format off
const std::vector<Column> allColumns = {
    {"point", number,
     [](const Row& row) { return std::to_string(row.pointNumber); },
     [](Text field, Row& row) { return readNumber(field, row.pointNumber); }},
    {"block_size", number,
     [](const Row& row) { return std::to_string(row.point.blockSize); },
     readBlockSize},
    {"transport_block_size", number,
     [](const Row& row) { return std::to_string(row.point.link.transportBlockSize); },
     readTransportBlockSize, true},
    {"code_blocks", number, codeBlocksText,
     [](Text field, Row& row) { return field == codeBlocksText(row); }, true},
    {"coded_bits", number,
     [](const Row& row) { return std::to_string(row.point.link.codedBits); },
     [](Text field, Row& row) { return readNumber(field, row.point.link.codedBits); }, true},
    {"mcs", text, [](const Row& row) { return mcsText(row.point.link.mcs); }, readMcs, true},
    {"modulation", text,
     [](const Row& row) { return std::string(nameOf(row.point.link.modulation)); },
     [](Text field, Row& row) { return readInto(link::modulationOf(field), row.point.link.modulation); }, true},
    {"redundancy_versions", list,
     [](const Row& row) { return versionsText(row.point.link.versions, ' '); },
     readVersions, true},
    {"transmissions", number, transmissionsText,
     [](Text field, Row& row) { return field == transmissionsText(row); }, true},
    {"soft_buffer_bits", number,
     [](const Row& row) { return std::to_string(row.point.link.softBufferBits); },
     readSoftBufferBits, true},
    {"soft_buffer_size", number,
     [](const Row& row) { return std::to_string(row.point.link.softBufferSize); },
     [](Text field, Row& row) { return readNumber(field, row.point.link.softBufferSize); }, true},
    {"channel", text,
     [](const Row& row) { return std::string(nameOf(row.point.link.fading)); },
     [](Text field, Row& row) { return readInto(link::fadingOf(field), row.point.link.fading); }, true},
    {"demapper", text,
     [](const Row& row) { return std::string(nameOf(row.point.link.demapper)); },
     [](Text field, Row& row) { return readInto(link::demapperOf(field), row.point.link.demapper); }, true},
    {"early_stop", text,
     [](const Row& row) { return std::string(row.point.link.stopsEarly ? "crc" : "none"); },
     [](Text field, Row& row) { row.point.link.stopsEarly = field == "crc"; return field == "crc" || field == "none"; },
     true},
    {"num_pu", number,
     [](const Row& row) { return std::to_string(row.point.numPu); },
     readNumPu},
    {"algorithm", text,
     [](const Row& row) { return algorithmName(row.point.algorithm); },
     [](Text field, Row& row) { return readInto(algorithmOf(field), row.point.algorithm); }},
    {"scale_option", text,
     [](const Row& row) { return scaleOptionText(row.point.scaleOption); },
     readScaleOption},
    {"iterations", number,
     [](const Row& row) { return std::to_string(row.point.iterations); },
     readIterations},
    {"axis", text, [](const Row& row) { return std::string(nameOf(row.point.axis)); }, readAxis, true},
    {"esn0_db", number,
     [](const Row& row) { return base::thousandthsText(milliEsn0Of(row.point)); },
     [](Text field, Row& row) { return readInto(base::parseThousandths(field), row.point.milliEsn0); }, true},
    {"ebn0_db", number,
     [](const Row& row) { return base::thousandthsText(row.point.milliDecibels); },
     [](Text field, Row& row) { return readInto(base::parseThousandths(field), row.point.milliDecibels); }},
    {"scale", number,
     [](const Row& row) { return base::thousandthsText(row.point.milliScale); },
     readScale},
    {"frames", text,
     [](const Row& row) { return row.frames.text(); },
     [](Text field, Row& row) { return readInto(FrameSet::parse(field), row.frames) && row.frames.size() > 0; }},
    {"blocks", number,
     [](const Row& row) { return std::to_string(row.frames.size()); },
     [](Text field, Row& row) { return field == std::to_string(row.frames.size()); }},
    {"bit_errors", number,
     [](const Row& row) { return std::to_string(row.errors.bitErrors); },
     [](Text field, Row& row) { return readNumber(field, row.errors.bitErrors); }},
    {"block_errors", number,
     [](const Row& row) { return std::to_string(row.errors.blockErrors); },
     [](Text field, Row& row) { return readNumber(field, row.errors.blockErrors); }},
    {"bit_error_squares", number,
     [](const Row& row) { return std::to_string(row.errors.bitErrorSquares); },
     [](Text field, Row& row) { return readNumber(field, row.errors.bitErrorSquares); }},
    {"ber", number, [](const Row& row) { return rateText(bitErrorRate(row)); }, skip},
    {"ber_low", number, [](const Row& row) { return rateText(bitErrorBounds(row).low); }, skip},
    {"ber_high", number, [](const Row& row) { return rateText(bitErrorBounds(row).high); }, skip},
    {"bler", number, [](const Row& row) { return rateText(blockErrorRate(row)); }, skip},
    {"bler_low", number, [](const Row& row) { return rateText(blockErrorBounds(row).low); }, skip},
    {"bler_high", number, [](const Row& row) { return rateText(blockErrorBounds(row).high); }, skip},
    {"code_block_errors", number,
     [](const Row& row) { return std::to_string(receptionOf(row).codeBlockErrors); },
     [](Text field, Row& row) { return readNumber(field, row.errors.reception.codeBlockErrors); }, true},
    {"undetected_errors", number,
     [](const Row& row) { return std::to_string(receptionOf(row).undetected); },
     [](Text field, Row& row) { return readNumber(field, row.errors.reception.undetected); }, true},
    {"sent_transmissions", number,
     [](const Row& row) { return std::to_string(receptionOf(row).transmissions); },
     [](Text field, Row& row) { return readNumber(field, row.errors.reception.transmissions); }, true},
    {"run_iterations", number,
     [](const Row& row) { return std::to_string(receptionOf(row).iterations); },
     [](Text field, Row& row) { return readNumber(field, row.errors.reception.iterations); }, true},
    {"mean_transmissions", number, [](const Row& row) { return rateText(meanTransmissions(row)); }, skip, true},
    {"mean_iterations", number, [](const Row& row) { return rateText(meanIterations(row)); }, skip, true},
    {"throughput", number, [](const Row& row) { return rateText(throughput(row)); }, skip, true},
    {"clipped_values", number,
     [](const Row& row) { return std::to_string(row.clipped); },
     [](Text field, Row& row) { return readNumber(field, row.clipped); }},
    {"clipped_fraction", number, [](const Row& row) { return rateText(clippedFraction(row)); }, skip},
    {"failed_frames", list, failuresText, readFailures},
    {"seconds", number,
     [](const Row& row) { return base::numberText(row.seconds, std::chars_format::fixed, 3); },
     readSeconds},
    {"seed", number,
     [](const Row& row) { return std::to_string(row.seed); },
     [](Text field, Row& row) { return readNumber(field, row.seed); }},
    {"version", text,
     [](const Row& row) { return row.version; },
     [](Text field, Row& row) { row.version = field; return isVersion(field); }},
};
// clang-format on

/// Whether transport blocks can be sent like this.
bool isSent(const LinkFormat& format)
{
    const unsigned perSymbol = bitsPerSymbol(format.modulation);
    return !format.versions.empty() && format.codedBits % perSymbol == 0 &&
           format.codedBits / perSymbol >= link::codeBlocksOf(format.transportBlockSize).count;
}

/// Whether any number of resource blocks has this transport block.
bool isOfMcs(const LinkFormat& format)
{
    const link::Mcs mcs = mcsOf(format.mcs->table, format.mcs->index);
    bool found = false;
    for (unsigned pairs = 1; pairs <= link::mostResourceBlocks && !found; ++pairs) {
        found = link::transportBlockSize(mcs.sizeIndex, pairs) == format.transportBlockSize &&
                format.codedBits % (pairs * mcs.bitsPerSymbol) == 0;
    }
    return found && bitsPerSymbol(format.modulation) == mcs.bitsPerSymbol;
}

/// Whether a point that has been read says the same on both axes, as far as it tells the other one.
bool agreesOnBothAxes(Point& point)
{
    const int ebn0 = point.milliDecibels;
    const int esn0 = point.milliEsn0;
    if (std::abs(ebn0) > link::mostMilliDecibels || std::abs(esn0) > link::mostMilliDecibels) {
        return false;
    }
    setPlace(point, point.axis == Axis::esn0 ? esn0 : ebn0);
    const bool isTold = isWide(point) || esn0 != 0;
    return point.milliDecibels == ebn0 && (!isTold || milliEsn0Of(point) == esn0);
}

}  // namespace

bool isVersion(std::string_view version)
{
    constexpr std::size_t longest = 64;
    return !version.empty() && version.size() <= longest && std::all_of(version.begin(), version.end(), [](char c) {
        return c > ' ' && c <= '~' && c != ',' && c != '"';
    });
}

const std::vector<Column>& columns(bool isWide)
{
    static const std::vector<Column> narrow = [] {
        std::vector<Column> columns;
        std::copy_if(allColumns.begin(), allColumns.end(), std::back_inserter(columns), [](const Column& column) {
            return !column.isWide;
        });
        return columns;
    }();
    return isWide ? allColumns : narrow;
}

std::string contradictionIn(ResultRow& row)
{
    Point& point = row.point;
    const LinkFormat& format = point.link;
    if (!format.hasTransportBlocks()) {
        row.errors.reception = {};  // such rows say what follows from the others
        if (format.codedBits != 0 || format.mcs || !format.versions.empty() || format.stopsEarly) {
            return "transport_block_size is 0, but not what belongs to transport blocks";
        }
    } else if (!isSent(format)) {
        return "transport_block_size, coded_bits, modulation and redundancy_versions do not go together";
    } else if (point.blockSize != link::codeBlocksOf(format.transportBlockSize).sizePlus) {
        return "block_size is not that of the code blocks of transport_block_size";
    } else if (format.mcs && !isOfMcs(format)) {
        return "mcs does not have this transport_block_size, coded_bits and modulation";
    }
    return agreesOnBothAxes(point) ? "" : "ebn0_db and esn0_db are not of one signal-to-noise ratio";
}

}  // namespace morvik::simulation
