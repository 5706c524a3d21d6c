// SoftValueReader: blocks of soft values from CSV text.
#include "SoftValueReader.h"

#include <algorithm>
#include <cstdint>
#include <string_view>

#include "Text.h"
#include "base/Csv.h"
#include "rules/BlockSizes.h"

namespace morvik {

namespace {

/// Takes the text up to the next comma, or all of it, off the front of `row`. Blanks around it do not count.
std::string_view takeField(std::string_view& row)
{
    const std::string_view field = row.substr(0, row.find(','));
    row.remove_prefix(std::min(field.size() + 1, row.size()));
    return base::trimmed(field);
}

bool isLabel(std::string_view text)
{
    return !text.empty() && std::all_of(text.begin(), text.end(), [](char c) { return c >= '0' && c <= '9'; });
}

}  // namespace

SoftValueReader::SoftValueReader(std::istream& input, const std::string& name) : itsLines(input, name)
{
    const std::string header = shown(softValueHeader);
    if (!itsLines.next()) {
        itsLines.fail("no header, expected " + header);
    }
    if (base::fieldsOf(itsLines.text()) != base::fieldsOf(softValueHeader)) {
        itsLines.fail("wrong header " + shown(itsLines.text()) + ", expected " + header);
    }
    advance();
    if (itsAtEnd && !itsMistake) {
        itsLines.fail("no rows after the header, expected at least one block");
    }
}

bool SoftValueReader::next(SoftBlock& block)
{
    block.rsc1Sys.clear();
    block.rsc1Par.clear();
    block.rsc2Par.clear();
    if (itsAtEnd) {
        if (itsMistake) {
            throw FileError(*itsMistake);
        }
        return false;
    }
    itsFirstLine = itsLines.number();
    const std::string label = itsLabel;
    while (!itsAtEnd && itsLabel == label) {
        if (block.size() == maxPositions) {
            failBlock("block of more than " + std::to_string(maxPositions) + " rows, allowed are " + allowedRows);
        }
        appendRow(block);
        advance();
    }
    return true;
}

void SoftValueReader::failBlock(const std::string& what) const
{
    if (itsMistake) {
        throw FileError(*itsMistake);
    }
    itsLines.failAt(itsFirstLine, what);
}

void SoftValueReader::advance()
{
    try {
        itsAtEnd = !itsLines.next();
        if (!itsAtEnd) {
            readLabel();
        }
    } catch (const FileError& mistake) {
        itsMistake = mistake;
        itsAtEnd = true;
    }
}

void SoftValueReader::readLabel()
{
    if (base::trimmed(itsLines.text()).empty()) {
        expectOnlyBlankLines();
        itsAtEnd = true;
        return;
    }
    std::string_view row = itsLines.text();
    itsLabel = takeField(row);
    if (!isLabel(itsLabel)) {
        itsLines.fail("block " + shown(itsLabel) + " is no label, allowed are non-negative integers");
    }
}

void SoftValueReader::expectOnlyBlankLines()
{
    const std::size_t first = itsLines.number();
    while (itsLines.next()) {
        if (!base::trimmed(itsLines.text()).empty()) {
            itsLines.failAt(first, "blank line, allowed at the end only");
        }
        itsLines.expectAnEnd(first);
    }
}

void SoftValueReader::appendRow(SoftBlock& block) const
{
    std::string_view row = itsLines.text();
    const auto fields = std::count(row.begin(), row.end(), ',') + 1;
    if (fields != 4) {
        itsLines.fail(std::to_string(fields) + (fields == 1 ? " field" : " fields") + ", expected the four of " +
                      shown(softValueHeader));
    }
    takeField(row);  // the label
    const auto takeValue = [&](const char* column) {
        const std::string_view field = takeField(row);
        const auto value = parseInteger<std::int32_t>(field);
        if (!value) {
            itsLines.fail(std::string(column) + ' ' + shown(field) +
                          " is not allowed, allowed are the integers -2147483648 to 2147483647");
        }
        return *value;
    };
    block.rsc1Sys.push_back(takeValue("rsc1_sys"));
    block.rsc1Par.push_back(takeValue("rsc1_par"));
    block.rsc2Par.push_back(takeValue("rsc2_par"));
}

SoftBlock readBlock(const std::string& file, std::uint32_t number)
{
    InputFile input(file);
    SoftValueReader reader(input.stream(), input.name());
    SoftBlock block;
    for (std::uint32_t i = 0; i <= number; ++i) {
        if (!reader.next(block)) {
            throw FileError(input.name(),
                            "has " + std::to_string(i) + (i == 1 ? " block" : " blocks") + ", there is no block " +
                                std::to_string(number));
        }
    }
    if (block.size() < rules::tailPositions ||
        standard::findBlockSize(static_cast<std::uint32_t>(block.size() - rules::tailPositions)) == nullptr) {
        reader.failBlock("block of " + std::to_string(block.size()) + " rows, allowed are " + allowedRows);
    }
    return block;
}

}  // namespace morvik
