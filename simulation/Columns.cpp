// Columns: the columns of result files, with their readers and writers.
#include "Columns.h"

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <optional>

#include "Possible.h"
#include "base/Numbers.h"
#include "base/Thousandths.h"
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

}  // namespace

bool isVersion(std::string_view version)
{
    constexpr std::size_t longest = 64;
    return !version.empty() && version.size() <= longest && std::all_of(version.begin(), version.end(), [](char c) {
        return c > ' ' && c <= '~' && c != ',' && c != '"';
    });
}

const std::vector<Column>& columns()
{
    return allColumns;
}

}  // namespace morvik::simulation
