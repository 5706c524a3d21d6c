// Manifest: manifest.json, which tells all about a set of vectors.
#include "Manifest.h"

#include <nlohmann/json.hpp>

#include "simulation/Error.h"
#include "simulation/Point.h"
#include "simulation/Shown.h"
#include "simulation/Thousandths.h"

namespace morvik::vectors {

namespace {

using Json = nlohmann::ordered_json;

Json parametersOf(const Settings& settings)
{
    Json json;
    json["num_pu"] = settings.generics.C_NUM_PU;
    json["algorithm"] = simulation::algorithmName(static_cast<unsigned>(settings.generics.C_ALGORITHM_TYPE));
    json["tag_width"] = settings.generics.C_TAG_WIDTH;
    json["iterations"] = settings.iterations;
    json["block_sizes"] = settings.blockSizes;
    json["blocks"] = settings.blocks;
    json["ebn0_db"] = simulation::fromThousandths(settings.milliDecibels);
    json["seed"] = settings.seed;
    json["directed"] = settings.directed;
    json["width"] = settings.width;
    json["separate_streams"] = settings.separateStreams;
    json["soft"] = settings.ratios;
    json["internal"] = settings.internal;
    return json;
}

Json tableOf(const KeptTable& kept)
{
    Json columns = Json::array();
    for (const Column& column : kept.table.columns) {
        columns.push_back({{"name", column.name}, {"bits", column.bits}, {"signed", column.isSigned}});
    }
    return {{"name", kept.table.name}, {"rows", kept.rows}, {"columns", columns}};
}

Json formatOf(const ManifestFormat& format)
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

/// An integer that has to lie within bounds.
template <class Integer>
Integer bounded(const Json& json, const char* name, Integer lowest, Integer highest)
{
    const Json& member = json.at(name);
    const auto value = member.is_number_integer() ? member.get<std::int64_t>() : -1;
    if (value < static_cast<std::int64_t>(lowest) || value > static_cast<std::int64_t>(highest)) {
        throw simulation::Error(std::string(name) + ' ' + member.dump() + " is not allowed");
    }
    return static_cast<Integer>(value);
}

/// The value of a member that is no larger than 32 bits hold.
std::uint32_t word(const Json& json, const char* name)
{
    return bounded(json, name, std::uint32_t{0}, UINT32_MAX);
}

/// What the check of a set needs to know. Whatever the core refuses is left to it.
Settings settingsOf(const Json& json)
{
    Settings settings;
    settings.generics.C_NUM_PU = bounded(json, "num_pu", 2, 8);
    const auto name = json.at("algorithm").get<std::string>();
    const auto algorithm = simulation::algorithmOf(name);
    if (!algorithm) {
        throw simulation::Error("algorithm " + simulation::shown(name) + " is not allowed");
    }
    settings.generics.C_ALGORITHM_TYPE = static_cast<std::int32_t>(*algorithm);
    settings.generics.C_TAG_WIDTH = bounded(json, "tag_width", 0, 32);
    settings.iterations = bounded(json, "iterations", 1U, 15U);
    settings.width = bounded(json, "width", 8U, 16U);
    if (settings.width % 8 != 0) {
        throw simulation::Error("width " + std::to_string(settings.width) + " is not allowed");
    }
    settings.blockSizes = json.at("block_sizes").get<std::vector<unsigned>>();
    settings.blocks = word(json, "blocks");
    settings.directed = json.at("directed").get<bool>();
    settings.separateStreams = json.at("separate_streams").get<bool>();
    settings.ratios = json.at("soft").get<bool>();
    settings.internal = json.at("internal").get<bool>();
    return settings;
}

/// The tables of a format, which have to be those that it writes, but for their rows.
std::vector<KeptTable> tablesFrom(const Json& json, const std::string& format, const std::vector<Table>& tables)
{
    std::vector<KeptTable> found;
    for (const Table& table : tables) {
        const std::size_t i = found.size();
        const std::uint64_t rows = i < json.size() ? json.at(i).at("rows").get<std::uint64_t>() : 0;
        found.push_back({table, rows});
        if (i >= json.size() || nlohmann::json(json.at(i)) != nlohmann::json(tableOf(found.back()))) {
            throw simulation::Error("format " + format + " lacks the table " + table.name +
                                    " as its parameters make it");
        }
    }
    if (json.size() > found.size()) {
        throw simulation::Error("format " + format + " has more tables than its parameters make");
    }
    return found;
}

/// The format with its files, which have to be those that it writes with these settings.
ManifestFormat formatFrom(const Json& json, const Settings& settings)
{
    ManifestFormat found;
    found.name = json.at("name").get<std::string>();
    const Format* const format = findFormat(found.name);
    if (format == nullptr) {
        throw simulation::Error("format " + simulation::shown(found.name) + " is not known");
    }
    for (const Json& file : json.at("files")) {
        found.files.push_back({file.at("name").get<std::string>(), file.at("sha256").get<std::string>()});
    }
    std::size_t next = 0;
    const std::vector<Table> tables = Layout(*format, settings).tables;
    for (const Table& table : tables) {
        for (const std::string& name : format->files(table)) {
            if (next == found.files.size() || found.files[next].name != name) {
                throw simulation::Error("format " + found.name + " lacks the file " + name);
            }
            ++next;
        }
    }
    if (next < found.files.size()) {
        throw simulation::Error("format " + found.name + " has no file " + simulation::shown(found.files[next].name));
    }
    found.tables = tablesFrom(json.at("tables"), found.name, tables);
    return found;
}

Manifest manifestFrom(const Json& json)
{
    Manifest manifest;
    manifest.version = json.at("version").get<std::string>();
    manifest.command = json.at("command").get<std::string>();
    manifest.settings = settingsOf(json.at("parameters"));
    for (const Json& format : json.at("formats")) {
        manifest.formats.push_back(formatFrom(format, manifest.settings));
    }
    for (const Json& block : json.at("blocks")) {
        manifest.blocks.push_back({block.at("name").get<std::string>(),
                                   word(block, "block_size"),
                                   word(block, "tag"),
                                   word(block, "expected_tag")});
    }
    if (manifest.formats.empty()) {
        throw simulation::Error("names no format");
    }
    if (manifest.blocks.empty()) {
        throw simulation::Error("names no block");
    }
    return manifest;
}

}  // namespace

std::string manifestText(const Manifest& manifest)
{
    Json json;
    json["version"] = manifest.version;
    json["command"] = manifest.command;
    json["parameters"] = parametersOf(manifest.settings);
    json["blocks"] = Json::array();
    for (const ManifestBlock& block : manifest.blocks) {
        json["blocks"].push_back(
            {{"name", block.name}, {"block_size", block.K}, {"tag", block.tag}, {"expected_tag", block.expectedTag}});
    }
    json["formats"] = Json::array();
    for (const ManifestFormat& format : manifest.formats) {
        json["formats"].push_back(formatOf(format));
    }
    constexpr int indentation = 2;
    return json.dump(indentation) + '\n';
}

Manifest parseManifest(const std::string& text, const std::string& fileName)
{
    try {
        return manifestFrom(Json::parse(text));
    } catch (const nlohmann::json::exception& error) {
        throw simulation::Error(fileName + ": is no manifest of vectors (" + error.what() + ')');
    } catch (const simulation::Error& error) {
        throw simulation::Error(fileName + ": " + error.what());
    }
}

}  // namespace morvik::vectors
