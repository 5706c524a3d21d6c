// ResultFiles: results as CSV and JSON.
#include "ResultFiles.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string_view>
#include <vector>

#include "Columns.h"
#include "Error.h"
#include "Shown.h"
#include "TextFile.h"
#include "base/Csv.h"
#include "base/OutputFile.h"

namespace simulation {

namespace {

bool endsIn(std::string_view text, std::string_view end)
{
    return text.size() > end.size() && text.substr(text.size() - end.size()) == end;
}

std::string headerLine()
{
    std::string line;
    for (const Column& column : columns()) {
        line += (line.empty() ? "" : ",") + std::string(column.name);
    }
    return line;
}

/// Puts the text into the row. Throws Error, which opens with `place`.
void readField(const Column& column, const std::string& text, ResultRow& row, const std::string& place)
{
    if (!column.read(text, row)) {
        throw Error(place + ": " + std::string(column.name) + ' ' + shown(text) + " is not allowed");
    }
}

/// Throws Error unless the row's numbers of errors are possible, so that rates and bounds can be computed.
void checkCounts(const ResultRow& row, const std::string& place)
{
    const ErrorCounts& errors = row.errors;
    const std::uint64_t blocks = row.frames.size();
    constexpr std::uint64_t mostBlocks = std::uint64_t{1} << 48;  // years of work, and products stay within 64 bits
    const std::uint64_t bits = blocks * row.point.blockSize;
    if (blocks > mostBlocks || row.clipped > 3 * (bits + 4 * blocks) ||
        errors.bitErrorSquares / row.point.blockSize > errors.bitErrors || errors.blockErrors > blocks ||
        errors.bitErrors < errors.blockErrors || errors.bitErrors > bits || errors.bitErrorSquares < errors.bitErrors ||
        errors.failures.size() > errors.blockErrors) {
        throw Error(place + ": numbers of errors that cannot be");
    }
}

ResultRow csvRow(const std::string& line, const std::string& place)
{
    const std::vector<std::string_view> fields = base::fieldsOf(line);
    if (fields.size() != columns().size()) {
        throw Error(place + ": " + std::to_string(fields.size()) + " fields, expected " +
                    std::to_string(columns().size()));
    }
    ResultRow row;
    for (std::size_t i = 0; i < fields.size(); ++i) {
        readField(columns()[i], std::string(fields[i]), row, place);
    }
    checkCounts(row, place);
    return row;
}

/// Reads a line, which ends in \n or \r\n.
bool nextLine(std::istream& lines, std::string& line)
{
    if (!std::getline(lines, line)) {
        return false;
    }
    if (!line.empty() && line.back() == '\r') {
        line.pop_back();
    }
    return true;
}

Results parseCsv(const std::string& text, const std::string& fileName)
{
    std::istringstream lines(text);
    std::string line;
    if (!nextLine(lines, line) || base::fieldsOf(line) != base::fieldsOf(headerLine())) {
        throw Error(fileName + ":1: no header of a result file, expected \"" + headerLine() + '"');
    }
    Results results;
    for (std::size_t number = 2; nextLine(lines, line); ++number) {
        results.rows.push_back(csvRow(line, fileName + ':' + std::to_string(number)));
    }
    return results;
}

/// A row's value as the text of its column.
std::string jsonField(const nlohmann::json& value, Column::Kind kind)
{
    if (kind == Column::Kind::text) {
        return value.get<std::string>();
    }
    if (kind == Column::Kind::number) {
        return value.is_number() ? value.dump() : "";
    }
    std::string text;
    for (const auto& element : value) {
        text += (text.empty() ? "" : " ") + element.dump();
    }
    return text;
}

Results parseJson(const std::string& text, const std::string& fileName)
{
    Results results;
    try {
        const auto json = nlohmann::json::parse(text);
        results.version = json.at("version").get<std::string>();
        results.command = json.at("command").get<std::string>();
        for (const auto& object : json.at("rows")) {
            const std::string place = fileName + ": row " + std::to_string(results.rows.size() + 1);
            ResultRow row;
            for (const Column& column : columns()) {
                readField(column, jsonField(object.at(std::string(column.name)), column.kind), row, place);
            }
            checkCounts(row, place);
            results.rows.push_back(row);
        }
    } catch (const nlohmann::json::exception& error) {
        throw Error(fileName + ": is no result file (" + error.what() + ')');
    }
    return results;
}

/// File names in a command, and texts of CSV, may hold bytes that are no UTF-8, which JSON cannot: U+FFFD stands for
/// them.
std::string jsonString(const std::string& text)
{
    return nlohmann::json(text).dump(-1, ' ', false, nlohmann::json::error_handler_t::replace);
}

std::string jsonValue(const Column& column, const ResultRow& row)
{
    std::string text = column.write(row);
    switch (column.kind) {
    case Column::Kind::number:
        return text;
    case Column::Kind::text:
        return jsonString(text);
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
    throw Error(fileName + ": is no name for results, allowed are names that end in .csv or .json");
}

std::string csvText(const Results& results)
{
    std::string text = headerLine() + '\n';
    for (const ResultRow& row : results.rows) {
        std::string line;
        for (const Column& column : columns()) {
            line += (line.empty() ? "" : ",") + column.write(row);
        }
        text += line + '\n';
    }
    return text;
}

std::string jsonText(const Results& results)
{
    std::string text = "{\n  \"version\": " + jsonString(results.version) +
                       ",\n  \"command\": " + jsonString(results.command) + ",\n  \"rows\": [";
    const char* separator = "\n";
    for (const ResultRow& row : results.rows) {
        std::string object;
        for (const Column& column : columns()) {
            object +=
                (object.empty() ? "" : ", ") + jsonString(std::string(column.name)) + ": " + jsonValue(column, row);
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
    return parseResults(readText(fileName), fileName);
}

Results parseResults(const std::string& text, const std::string& fileName)
{
    const ResultFormat format = formatOf(fileName);
    return format == ResultFormat::csv ? parseCsv(text, fileName) : parseJson(text, fileName);
}

}  // namespace simulation
