// Description: NAME.json, which tells what the tables of a unit have.
#include "Description.h"

#include <algorithm>
#include <array>
#include <cstddef>

#include "base/Error.h"
#include "base/Json.h"
#include "base/Shown.h"
#include "rules/Algorithms.h"

namespace morvik::units {

namespace {

using Json = nlohmann::ordered_json;

Json columnsOf(Number unit, int algorithm)
{
    Json columns = Json::array();
    for (const tables::Column& column : tableOf(unit, algorithm).columns) {
        columns.push_back({{"name", column.name}, {"bits", column.bits}, {"signed", column.isSigned}});
    }
    return columns;
}

std::string placesName(const Situation& situation)
{
    return "in_each_" + situation.place;
}

Json jsonOf(const Situation& situation)
{
    Json json = {{"name", situation.name}, {"count", situation.total()}};
    if (situation.counts.size() > 1) {
        json[placesName(situation)] = situation.counts;
    }
    return json;
}

/// The counts of a situation of the unit, in each of its places.
void readCounts(const base::JsonMembers& json, Situation& situation)
{
    if (json.text("name") != situation.name) {
        json.refuse("name", "expected " + base::shown(situation.name));
    }
    constexpr std::uint64_t most = std::uint64_t{1} << 53;
    const std::uint64_t total = json.integer("count", 0, most);
    if (situation.counts.size() == 1) {
        situation.counts = {total};
        return;
    }
    const std::string name = placesName(situation);
    const base::Json& counts = json.list(name);
    const bool areNumbers =
        std::all_of(counts.begin(), counts.end(), [](const base::Json& count) { return count.is_number_unsigned(); });
    if (counts.size() != situation.counts.size() || !areNumbers) {
        json.refuse(name, "expected " + std::to_string(situation.counts.size()) + " counts");
    }
    for (std::size_t i = 0; i < counts.size(); ++i) {
        situation.counts[i] = counts[i].get<std::uint64_t>();
    }
    if (situation.total() != total) {
        json.refuse("count", "expected the sum of " + name);
    }
}

std::vector<Situation> situationsFrom(const base::JsonMembers& json, Number unit, int algorithm)
{
    std::vector<Situation> situations = Situations(unit, algorithm).all();
    const base::Json& list = json.list("situations");
    if (list.size() != situations.size()) {
        json.refuse("situations", "expected " + std::to_string(situations.size()) + " situations");
    }
    for (std::size_t i = 0; i < situations.size(); ++i) {
        readCounts({list[i], json.place() + ": situation " + std::to_string(i)}, situations[i]);
    }
    return situations;
}

/// The formats whose files are named, one format after the other.
std::vector<DescribedFormat> formatsFrom(const base::JsonMembers& json, Number unit, int algorithm)
{
    const tables::Table table = tableOf(unit, algorithm);
    const base::Json& list = json.list("files");
    std::vector<DescribedFormat> formats;
    for (std::size_t next = 0; next < list.size();) {
        const std::string place = json.place() + ": file " + std::to_string(next);
        const base::JsonMembers first(list[next], place);
        const std::string name = first.text("name");
        const auto& all = tables::formats();
        const auto format = std::find_if(
            all.begin(), all.end(), [&](const tables::Format& each) { return each.files(table).front() == name; });
        const bool isTwice = std::any_of(formats.begin(), formats.end(), [&](const DescribedFormat& each) {
            return each.files.front().name == name;
        });
        if (format == all.end() || isTwice) {
            throw base::Error(place + ' ' + base::shown(name) + " begins no further format of the unit");
        }
        formats.push_back({format->name, {}});
        for (const std::string& expected : format->files(table)) {
            if (next == list.size()) {
                throw base::Error(json.place() + ": lacks the file " + expected);
            }
            const base::JsonMembers file(list[next], json.place() + ": file " + std::to_string(next));
            if (file.text("name") != expected) {
                file.refuse("name", "expected " + expected);
            }
            formats.back().files.push_back({expected, file.text("sha256")});
            ++next;
        }
    }
    if (formats.empty()) {
        json.refuse("files", "expected at least one");
    }
    return formats;
}

Extent extentFrom(const base::JsonMembers& json)
{
    Extent extent;
    extent.isExhaustive = json.flag("exhaustive");
    extent.directed = json.integer("directed", 0, UINT32_MAX);
    extent.random = json.integer("random", 0, UINT32_MAX);
    const std::uint64_t cases = json.integer("cases", 1, UINT64_MAX);
    if (cases != extent.directed + extent.random || (extent.isExhaustive && extent.random > 0)) {
        json.refuse("cases", "expected directed and random ones, or exhaustive directed ones");
    }
    return extent;
}

}  // namespace

std::string nameOf(Number unit)
{
    return allUnits()[static_cast<std::size_t>(unit)].name;
}

std::string descriptionName(Number unit)
{
    return nameOf(unit) + ".json";
}

std::string textOf(const Description& description)
{
    Json json;
    json["morvik"] = description.version;
    json["command"] = description.command;
    json["unit"] = nameOf(description.unit);
    json["algorithm"] = rules::algorithmNames.at(static_cast<std::size_t>(description.algorithm));
    json["exhaustive"] = description.extent.isExhaustive;
    json["cases"] = description.cases();
    json["directed"] = description.extent.directed;
    json["random"] = description.extent.random;
    json["columns"] = columnsOf(description.unit, description.algorithm);
    json["situations"] = Json::array();
    for (const Situation& situation : description.situations) {
        json["situations"].push_back(jsonOf(situation));
    }
    json["files"] = Json::array();
    for (const DescribedFormat& format : description.formats) {
        for (const DescribedFormat::File& file : format.files) {
            json["files"].push_back({{"name", file.name}, {"sha256", file.sha256}});
        }
    }
    constexpr int indentation = 2;
    return json.dump(indentation, ' ', false, Json::error_handler_t::replace) + '\n';
}

Description parseDescription(const std::string& text, const std::string& fileName, Number unit)
{
    const base::Json value = base::parseJson(text, fileName);
    const base::JsonMembers json(value, fileName);
    Description description;
    description.version = json.text("morvik");
    description.command = json.text("command");
    description.unit = unit;
    if (json.text("unit") != nameOf(unit)) {
        json.refuse("unit", "expected " + nameOf(unit));
    }
    const auto algorithm = rules::findAlgorithm(json.text("algorithm"));
    if (!algorithm) {
        json.refuse("algorithm", "expected max-log, scaled or table");
    }
    description.algorithm = static_cast<int>(*algorithm);
    description.extent = extentFrom(json);
    if (json.list("columns") != base::Json(columnsOf(unit, description.algorithm))) {
        json.refuse("columns", "expected those of the unit");
    }
    description.situations = situationsFrom(json, unit, description.algorithm);
    description.formats = formatsFrom(json, unit, description.algorithm);
    return description;
}

}  // namespace morvik::units
