// Csv: reads comma-separated values of any origin.
#include "Csv.h"

#include <algorithm>
#include <string>

#include "Shown.h"
#include "Text.h"

namespace morvik::base {

namespace {

void split(std::string_view line, std::vector<std::string_view>& fields)
{
    fields.clear();
    for (std::size_t comma = line.find(','); comma != std::string_view::npos; comma = line.find(',')) {
        fields.push_back(trimmed(line.substr(0, comma)));
        line.remove_prefix(comma + 1);
    }
    fields.push_back(trimmed(line));
}

}  // namespace

std::vector<std::string_view> fieldsOf(std::string_view line)
{
    std::vector<std::string_view> fields;
    split(line, fields);
    return fields;
}

bool CsvReader::next()
{
    if (!itsLines.next()) {
        return false;
    }
    takeLine();
    return true;
}

void CsvReader::takeLine()
{
    split(itsLines.text(), itsFields);
}

bool CsvReader::is(std::string_view line) const
{
    return itsFields == fieldsOf(line);
}

void CsvReader::expectHeader(std::string_view header)
{
    if (!next()) {
        itsLines.fail("no header, expected " + shown(header));
    }
    if (!is(header)) {
        itsLines.fail("wrong header " + shown(itsLines.text()) + ", expected " + shown(header));
    }
}

std::optional<std::size_t> CsvReader::find(std::string_view text) const
{
    const auto found = std::find(itsFields.begin(), itsFields.end(), text);
    return found == itsFields.end() ? std::nullopt : std::optional(static_cast<std::size_t>(found - itsFields.begin()));
}

}  // namespace morvik::base
