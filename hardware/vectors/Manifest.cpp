// Manifest: manifest.json, the description of a set of vectors.
#include "Manifest.h"

#include <algorithm>
#include <filesystem>

#include "Received.h"
#include "TransportJson.h"
#include "base/Error.h"
#include "base/Json.h"
#include "base/Path.h"
#include "base/Shown.h"
#include "base/TextFile.h"
#include "base/Thousandths.h"
#include "hardware/coverage/Situations.h"
#include "rules/Algorithms.h"
#include "rules/BlockSizes.h"

namespace morvik::vectors {

namespace {

using Json = nlohmann::ordered_json;

Json parametersOf(const Settings& settings)
{
    Json json;
    json["num_pu"] = settings.generics.C_NUM_PU;
    json["algorithm"] = rules::algorithmNames.at(static_cast<std::size_t>(settings.generics.C_ALGORITHM_TYPE));
    json["tag_width"] = settings.generics.C_TAG_WIDTH;
    json["iterations"] = settings.iterations;
    json["block_sizes"] = settings.blockSizes;
    for (const simulation::Point& point : settings.transport) {
        json["transport_formats"].push_back(formatJson(point));
    }
    json["blocks"] = settings.blocks;
    json["ebn0_db"] = base::fromThousandths(settings.milliDecibels);
    json["seed"] = settings.seed;
    json["directed"] = settings.directed;
    if (!settings.cover.empty()) {
        json["cover"] = settings.cover;
        json["cover_limit"] = settings.coverLimit;
    }
    json["width"] = settings.width;
    json["separate_streams"] = settings.separateStreams;
    json["soft"] = settings.ratios;
    json["internal"] = settings.internal;
    return json;
}

Json blockOf(const ManifestBlock& block)
{
    Json json = {
        {"name", block.name}, {"block_size", block.K}, {"tag", block.tag}, {"expected_tag", block.expectedTag}};
    if (block.origin) {
        addOrigin(*block.origin, json);
        json["crc"] = block.crcFits;
    }
    return json;
}

Json tableOf(const KeptTable& kept)
{
    Json columns = Json::array();
    for (const tables::Column& column : kept.table.columns) {
        columns.push_back({{"name", column.name}, {"bits", column.bits}, {"signed", column.isSigned}});
    }
    return {{"name", kept.table.name}, {"rows", kept.rows}, {"columns", columns}};
}

Json entryOf(const ManifestFormat& format)
{
    Json tables = Json::array();
    for (const KeptTable& kept : format.tables) {
        tables.push_back(tableOf(kept));
    }
    Json files = Json::array();
    for (const ManifestFile& file : format.files) {
        files.push_back({{"name", file.name}, {"sha256", file.sha256}});
    }
    return {{"name", format.name}, {"files", files}, {"tables", tables}};
}

/// A member's value, at most 32 bits.
std::uint32_t word(const base::JsonMembers& members, const char* name)
{
    return static_cast<std::uint32_t>(members.integer(name, 0, UINT32_MAX));
}

std::vector<unsigned> blockSizesFrom(const base::JsonMembers& json)
{
    std::vector<unsigned> sizes;
    for (const base::Json& size : json.list("block_sizes")) {
        if (!size.is_number_unsigned() || size.get<std::uint64_t>() > UINT32_MAX ||
            rules::findBlockSize(size.get<std::uint32_t>()) == nullptr) {
            json.refuse("block_sizes", "expected a list of block sizes of 3GPP TS 36.212");
        }
        sizes.push_back(size.get<unsigned>());
    }
    return sizes;
}

std::vector<simulation::Point> transportFrom(const base::JsonMembers& json, const Settings& settings)
{
    std::vector<simulation::Point> points;
    const base::Json& list = json.list("transport_formats");
    if (list.empty() || list.size() > mostFormats) {
        json.refuse("transport_formats", "expected 1 to " + std::to_string(mostFormats) + " formats");
    }
    for (const base::Json& each : list) {
        points.push_back(formatFrom({each, json.place() + ": format " + std::to_string(points.size())}, settings));
    }
    return points;
}

std::vector<std::string> coverFrom(const base::JsonMembers& json)
{
    std::vector<std::string> names;
    for (const base::Json& each : json.list("cover")) {
        if (!each.is_string() || coverage::situationsNamed(each.get<std::string>()).empty()) {
            json.refuse("cover", "expected a list of situations");
        }
        names.push_back(each.get<std::string>());
    }
    return names;
}

/// The settings of the set. What the core checks itself is not checked here.
Settings settingsOf(const base::JsonMembers& json)
{
    Settings settings;
    settings.generics.C_NUM_PU = static_cast<std::int32_t>(json.integer("num_pu", 2, 8));
    const auto algorithm = rules::findAlgorithm(json.text("algorithm"));
    if (!algorithm) {
        json.refuse("algorithm", "expected max-log, scaled or table");
    }
    settings.generics.C_ALGORITHM_TYPE = static_cast<std::int32_t>(*algorithm);
    settings.generics.C_TAG_WIDTH = static_cast<std::int32_t>(json.integer("tag_width", 0, 32));
    settings.iterations = static_cast<unsigned>(json.integer("iterations", 1, 15));
    settings.width = static_cast<unsigned>(json.integer("width", 8, 16));
    if (settings.width % 8 != 0) {
        json.refuse("width", "expected 8 or 16");
    }
    settings.blockSizes = blockSizesFrom(json);
    if (json.has("transport_formats")) {
        settings.transport = transportFrom(json, settings);
    }
    settings.blocks = word(json, "blocks");
    settings.milliDecibels = milliDecibelsFrom(json, "ebn0_db", 50);
    settings.seed = json.integer("seed", 0, UINT64_MAX);
    settings.directed = json.flag("directed");
    if (json.has("cover")) {
        settings.cover = coverFrom(json);
        settings.coverLimit = word(json, "cover_limit");
    }
    settings.separateStreams = json.flag("separate_streams");
    settings.ratios = json.flag("soft");
    settings.internal = json.flag("internal");
    return settings;
}

ManifestBlock blockFrom(const base::JsonMembers& json)
{
    ManifestBlock block = {
        json.text("name"), word(json, "block_size"), word(json, "tag"), word(json, "expected_tag"), {}, false};
    if (block.name == receivedName) {
        block.origin = originFrom(json);
        block.crcFits = json.flag("crc");
    }
    return block;
}

/// The tables of a format, which must be those that it writes, apart from their rows.
std::vector<KeptTable> tablesFrom(const base::Json& list,
                                  const std::string& place,
                                  const std::vector<tables::Table>& tables)
{
    std::vector<KeptTable> found;
    for (const tables::Table& table : tables) {
        const std::size_t i = found.size();
        const bool isThere = i < list.size();
        const std::uint64_t rows =
            isThere ? base::JsonMembers(list[i], place + ": table").integer("rows", 0, UINT64_MAX) : 0;
        found.push_back({table, rows});
        if (!isThere || list[i] != base::Json(tableOf(found.back()))) {
            throw base::Error(place + " lacks the table " + table.name + " as its parameters make it");
        }
    }
    if (list.size() > found.size()) {
        throw base::Error(place + " has more tables than its parameters make");
    }
    return found;
}

/// The format and its files, which must be those that it writes with these settings.
ManifestFormat formatFrom(const base::Json& value, const Settings& settings, const std::string& fileName)
{
    const base::JsonMembers json(value, fileName + ": format");
    ManifestFormat found;
    found.name = json.text("name");
    const tables::Format* const format = tables::findFormat(found.name);
    if (format == nullptr) {
        throw base::Error(fileName + ": format " + base::shown(found.name) + " is not known");
    }
    const std::string place = fileName + ": format " + found.name;
    for (const base::Json& each : json.list("files")) {
        const base::JsonMembers file(each, fileName + ": file of format " + found.name);
        found.files.push_back({file.text("name"), file.text("sha256")});
    }
    const std::vector<tables::Table> tables = Layout(*format, settings).tables;
    std::vector<std::string> names;
    for (const tables::Table& table : tables) {
        const std::vector<std::string> ofTable = format->files(table);
        names.insert(names.end(), ofTable.begin(), ofTable.end());
    }
    for (std::size_t i = 0; i < names.size(); ++i) {
        if (i == found.files.size() || found.files[i].name != names[i]) {
            throw base::Error(std::string(place).append(" lacks the file ").append(names[i]));
        }
    }
    if (const std::size_t next = names.size(); next < found.files.size()) {
        throw base::Error(place + " has no file " + base::shown(found.files[next].name));
    }
    found.tables = tablesFrom(json.list("tables"), place, tables);
    return found;
}

}  // namespace

Settings blocksAlone(const Manifest& manifest)
{
    Settings settings = manifest.settings;
    settings.ratios = false;
    settings.internal = false;
    return settings;
}

std::string manifestText(const Manifest& manifest)
{
    Json json;
    json["version"] = manifest.version;
    json["command"] = manifest.command;
    json["parameters"] = parametersOf(manifest.settings);
    json["blocks"] = Json::array();
    for (const ManifestBlock& block : manifest.blocks) {
        json["blocks"].push_back(blockOf(block));
    }
    json["formats"] = Json::array();
    for (const ManifestFormat& format : manifest.formats) {
        json["formats"].push_back(entryOf(format));
    }
    constexpr int indentation = 2;
    return json.dump(indentation, ' ', false, Json::error_handler_t::replace) + '\n';
}

Manifest parseManifest(const std::string& text, const std::string& fileName)
{
    const base::Json json = base::parseJson(text, fileName);
    const base::JsonMembers members(json, fileName);
    Manifest manifest;
    manifest.version = members.text("version");
    manifest.command = members.text("command");
    manifest.settings = settingsOf({members.at("parameters"), fileName + ": parameters"});
    for (const base::Json& each : members.list("formats")) {
        const ManifestFormat format = formatFrom(each, manifest.settings, fileName);
        if (std::any_of(manifest.formats.begin(), manifest.formats.end(), [&format](const ManifestFormat& other) {
                return other.name == format.name;
            })) {
            throw base::Error(fileName + ": names the format " + format.name + " twice");
        }
        manifest.formats.push_back(format);
    }
    for (const base::Json& each : members.list("blocks")) {
        manifest.blocks.push_back(blockFrom({each, fileName + ": block " + std::to_string(manifest.blocks.size())}));
    }
    if (manifest.formats.empty()) {
        throw base::Error(fileName + ": names no format");
    }
    if (manifest.blocks.empty()) {
        throw base::Error(fileName + ": names no block");
    }
    return manifest;
}

Manifest readManifest(const std::string& fileName)
{
    base::expectRegularFile(fileName);
    return parseManifest(base::readText(fileName), fileName);
}

std::vector<std::string> filesOf(const std::string& folder, const Manifest& manifest)
{
    const std::filesystem::path path = base::pathOf(folder);
    std::vector<std::string> files = {(path / manifestName).u8string()};
    for (const ManifestFormat& format : manifest.formats) {
        for (const ManifestFile& file : format.files) {
            files.push_back((path / base::pathOf(file.name)).u8string());
        }
    }
    return files;
}

}  // namespace morvik::vectors
