// CodedValueReader: reads the soft values of transmissions of transport blocks from CSV.
#include "CodedValueReader.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "SoftValueReader.h"
#include "base/Numbers.h"
#include "base/Shown.h"
#include "base/Text.h"

namespace morvik {

namespace {

/// Characters of a row: of its label and of numbers with any reasonable number of digits.
std::size_t longestRow(std::uint32_t codedBits)
{
    constexpr std::size_t perNumber = 32;
    constexpr std::size_t most = std::size_t{1} << 30;
    return std::max(base::LineReader::shortLines, codedBits < most / perNumber ? codedBits * perNumber : most);
}

}  // namespace

CodedValueReader::CodedValueReader(std::istream& input, const std::string& name, std::uint32_t codedBits)
    : itsLines(input, name, longestRow(codedBits)), itsCodedBits(codedBits)
{
    itsRow.expectHeader(codedValueHeader);
}

bool CodedValueReader::next()
{
    if (!itsRow.next()) {
        return false;
    }
    if (base::trimmed(itsLines.text()).empty()) {
        itsLines.expectOnlyBlankLines();
        return false;
    }
    readRow();
    return true;
}

void CodedValueReader::readRow()
{
    itsLabel = labelOf(itsLines, itsRow);
    const std::size_t found = itsRow.fields().size() - 1;
    if (found != itsCodedBits) {
        itsLines.fail(base::counted(found, "value") + ", expected the " + std::to_string(itsCodedBits) +
                      " of --coded-bits");
    }
    itsValues.resize(found);
    for (std::size_t i = 0; i < found; ++i) {
        const std::string_view field = itsRow.fields()[i + 1];
        const auto value = base::parseNumber<double>(field);
        if (!value || !(std::abs(*value) <= static_cast<double>(std::numeric_limits<float>::max()))) {
            itsLines.fail(
                "column " + std::to_string(i + 2) + ": " + base::shown(field) +
                " is not allowed, expected a decimal number in the range of a float, such as 4, -0.5 or 1e-3");
        }
        itsValues[i] = static_cast<float>(*value);
    }
}

}  // namespace morvik
