// SoftValueReader: reads blocks of soft values from CSV.
#include "SoftValueReader.h"

#include <algorithm>
#include <cstdint>
#include <string_view>

#include "StimulusFile.h"
#include "base/Numbers.h"
#include "base/Shown.h"
#include "base/Text.h"
#include "rules/BlockSizes.h"

namespace morvik {

std::string_view labelOf(const base::LineReader& lines, const base::CsvReader& row)
{
    const std::string_view label = row.fields().front();
    const bool isLabel =
        !label.empty() && std::all_of(label.begin(), label.end(), [](char c) { return c >= '0' && c <= '9'; });
    if (!isLabel) {
        lines.fail("block " + base::shown(label) + " is not a label, expected a non-negative integer");
    }
    return label;
}

SoftValueReader::SoftValueReader(std::istream& input, const std::string& name)
    : itsLines(input, name, base::LineReader::shortLines)
{
    itsRow.expectHeader(softValueHeader);
    advance();
    if (itsAtEnd && !itsMistake) {
        itsLines.failAt(itsLines.number() + 1, "no rows after the header, expected at least one block");
    }
}

bool SoftValueReader::next(SoftBlock& block)
{
    block.rsc1Sys.clear();
    block.rsc1Par.clear();
    block.rsc2Par.clear();
    if (itsAtEnd) {
        if (itsMistake) {
            throw base::Error(*itsMistake);
        }
        return false;
    }
    itsFirstLine = itsLines.number();
    const std::string label = itsLabel;
    while (!itsAtEnd && itsLabel == label) {
        if (block.size() == maxPositions) {
            failBlock("block of more than " + std::to_string(maxPositions) + " rows, expected " + allowedRows);
        }
        appendRow(block);
        advance();
    }
    return true;
}

void SoftValueReader::failBlock(const std::string& what) const
{
    if (itsMistake) {
        throw base::Error(*itsMistake);
    }
    itsLines.failAt(itsFirstLine, what);
}

void SoftValueReader::advance()
{
    try {
        itsAtEnd = !itsRow.next();
        if (!itsAtEnd) {
            readLabel();
        }
    } catch (const base::Error& mistake) {
        itsMistake = mistake;
        itsAtEnd = true;
    }
}

void SoftValueReader::readLabel()
{
    if (base::trimmed(itsLines.text()).empty()) {
        itsLines.expectOnlyBlankLines();
        itsAtEnd = true;
        return;
    }
    itsLabel = labelOf(itsLines, itsRow);
}

void SoftValueReader::appendRow(SoftBlock& block) const
{
    if (itsRow.fields().size() != 4) {
        itsLines.fail(base::counted(itsRow.fields().size(), "field") + ", expected the four of " +
                      base::shown(softValueHeader));
    }
    block.rsc1Sys.push_back(value(1));
    block.rsc1Par.push_back(value(2));
    block.rsc2Par.push_back(value(3));
}

std::int32_t SoftValueReader::value(std::size_t column) const
{
    const std::string_view field = itsRow.fields()[column];
    const auto value = base::parseNumber<std::int32_t>(field);
    if (!value) {
        itsLines.fail(std::string(base::fieldsOf(softValueHeader)[column]) + ' ' + base::shown(field) +
                      " is not allowed, expected an integer from -2147483648 to 2147483647");
    }
    return *value;
}

SoftBlock readBlock(const std::string& file, std::uint32_t number)
{
    StimulusFile input(file);
    SoftValueReader reader(input.stream(), input.name());
    SoftBlock block;
    for (std::uint32_t i = 0; i <= number; ++i) {
        if (!reader.next(block)) {
            throw base::Error(input.name() + ": has " + base::counted(i, "block") + ", there is no block " +
                              std::to_string(number));
        }
    }
    if (block.size() < rules::tailPositions ||
        rules::findBlockSize(static_cast<std::uint32_t>(block.size() - rules::tailPositions)) == nullptr) {
        reader.failBlock("block of " + std::to_string(block.size()) + " rows, expected " + allowedRows);
    }
    return block;
}

}  // namespace morvik
