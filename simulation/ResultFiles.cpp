// ResultFiles: results as CSV and JSON.
#include "ResultFiles.h"

#include <algorithm>
#include <sstream>
#include <string_view>
#include <vector>

#include "Columns.h"
#include "Possible.h"
#include "base/Csv.h"
#include "base/Error.h"
#include "base/Json.h"
#include "base/OutputFile.h"
#include "base/Shown.h"
#include "base/TextFile.h"

namespace morvik::simulation {

namespace {

bool endsIn(std::string_view text, std::string_view end)
{
    return text.size() > end.size() && text.substr(text.size() - end.size()) == end;
}

/// Whether any point is wide.
bool isWide(const Results& results)
{
    return std::any_of(
        results.rows.begin(), results.rows.end(), [](const ResultRow& row) { return isWide(row.point); });
}

std::string headerLine(bool isWide)
{
    std::string line;
    for (const Column& column : columns(isWide)) {
        line += (line.empty() ? "" : ",") + std::string(column.name);
    }
    return line;
}

/// Parses a field into the row. Throws Error, prefixed with `place`.
void readField(const Column& column, const std::string& text, ResultRow& row, const std::string& place)
{
    if (!column.read(text, row)) {
        throw base::Error(place + ": " + std::string(column.name) + ' ' + base::shown(text) + " is not allowed");
    }
}

/// Throws Error unless the row's parameters fit together and its numbers are possible, so that rates and bounds can be
/// computed.
void checkRow(ResultRow& row, const std::string& place)
{
    const std::string contradiction = contradictionIn(row);
    if (!contradiction.empty()) {
        throw base::Error(place + ": " + contradiction);
    }
    if (const auto wrong = impossibleCount(row.frames, row.point, row.errors, row.clipped)) {
        throw base::Error(place + ": " + *wrong);
    }
}

ResultRow csvRow(const std::vector<Column>& columns,
                 const std::vector<std::string_view>& fields,
                 const std::string& place)
{
    if (fields.size() != columns.size()) {
        throw base::Error(place + ": " + std::to_string(fields.size()) + " fields, expected " +
                          std::to_string(columns.size()));
    }
    ResultRow row;
    for (std::size_t i = 0; i < fields.size(); ++i) {
        readField(columns[i], std::string(fields[i]), row, place);
    }
    checkRow(row, place);
    return row;
}

Results parseCsv(const std::string& text, const std::string& fileName)
{
    std::istringstream input(text);
    base::LineReader lines(input, fileName, base::largestText);
    base::CsvReader row(lines);
    const bool hasHeader = row.next();
    const bool isWide = hasHeader && row.is(headerLine(true));
    if (!hasHeader || !(isWide || row.is(headerLine(false)))) {
        lines.fail("no header of a result file, expected \"" + headerLine(false) + '"');
    }
    Results results;
    while (row.next()) {
        results.rows.push_back(csvRow(columns(isWide), row.fields(), lines.place()));
    }
    return results;
}

/// A row's value as the text of its column.
std::string jsonField(const base::JsonMembers& row, const Column& column)
{
    const std::string name(column.name);
    if (column.kind == Column::Kind::text) {
        return row.text(name);
    }
    if (column.kind == Column::Kind::number) {
        row.number(name);
        return row.at(name).dump();
    }
    std::string text;
    for (const base::Json& element : row.list(name)) {
        text += (text.empty() ? "" : " ") + base::shownValue(element);
    }
    return text;
}

ResultRow jsonRow(const base::Json& value, const std::string& place)
{
    const base::JsonMembers members(value, place);
    ResultRow row;
    for (const Column& column : columns(members.has("transport_block_size"))) {
        readField(column, jsonField(members, column), row, place);
    }
    checkRow(row, place);
    return row;
}

Results parseJson(const std::string& text, const std::string& fileName)
{
    const base::Json json = base::parseJson(text, fileName);
    const base::JsonMembers members(json, fileName);
    Results results;
    results.version = members.text("version");
    if (!results.version.empty() && !isVersion(results.version)) {
        members.refuse("version", "which is none");
    }
    results.command = members.text("command");
    for (const base::Json& row : members.list("rows")) {
        results.rows.push_back(jsonRow(row, fileName + ": row " + std::to_string(results.rows.size() + 1)));
    }
    return results;
}

std::string jsonValue(const Column& column, const ResultRow& row)
{
    std::string text = column.write(row);
    switch (column.kind) {
    case Column::Kind::number:
        return text;
    case Column::Kind::text:
        return base::jsonString(text);
    case Column::Kind::list:
        std::replace(text.begin(), text.end(), ' ', ',');
        return '[' + text + ']';
    }
    return {};
}

}  // namespace

ResultFormat formatOf(const std::string& fileName)
{
    if (endsIn(fileName, ".csv")) {
        return ResultFormat::csv;
    }
    if (endsIn(fileName, ".json")) {
        return ResultFormat::json;
    }
    throw base::Error(fileName + ": is not a name for results, expected one that ends in .csv or .json");
}

std::string csvText(const Results& results)
{
    const bool wide = isWide(results);
    std::string text = headerLine(wide) + '\n';
    for (const ResultRow& row : results.rows) {
        std::string line;
        for (const Column& column : columns(wide)) {
            line += (line.empty() ? "" : ",") + column.write(row);
        }
        text += line + '\n';
    }
    return text;
}

std::string jsonText(const Results& results)
{
    std::string text = "{\n  \"version\": " + base::jsonString(results.version) +
                       ",\n  \"command\": " + base::jsonString(results.command) + ",\n  \"rows\": [";
    const char* separator = "\n";
    const bool wide = isWide(results);
    for (const ResultRow& row : results.rows) {
        std::string object;
        for (const Column& column : columns(wide)) {
            object += (object.empty() ? "" : ", ") + base::jsonString(std::string(column.name)) + ": " +
                      jsonValue(column, row);
        }
        text += separator + ("    {" + object + '}');
        separator = ",\n";
    }
    return text + "\n  ]\n}\n";
}

void writeResults(const std::string& fileName, const Results& results)
{
    const bool isCsv = formatOf(fileName) == ResultFormat::csv;
    base::writeFile(fileName, isCsv ? csvText(results) : jsonText(results));
}

Results readResults(const std::string& fileName)
{
    formatOf(fileName);  // before the file is opened
    return parseResults(base::readText(fileName), fileName);
}

Results parseResults(const std::string& text, const std::string& fileName)
{
    const ResultFormat format = formatOf(fileName);
    return format == ResultFormat::csv ? parseCsv(text, fileName) : parseJson(text, fileName);
}

}  // namespace morvik::simulation
