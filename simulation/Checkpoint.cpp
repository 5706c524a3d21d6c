// Checkpoint: how far a run has come, as text to go on from.
#include "Checkpoint.h"

#include <array>
#include <charconv>
#include <cstdint>
#include <nlohmann/json.hpp>
#include <string_view>

namespace simulation {

namespace {

using Json = nlohmann::json;

constexpr std::string_view opening = "morvik checkpoint ";

/// The FNV-1a hash in hexadecimal.
std::string checksum(std::string_view text)
{
    std::uint64_t hash = 0xcbf29ce484222325;
    for (const char c : text) {
        hash = (hash ^ static_cast<unsigned char>(c)) * 0x100000001b3;
    }
    std::array<char, 16> digits = {};
    const auto result = std::to_chars(digits.data(), digits.data() + digits.size(), hash, 16);
    const std::string shortest(digits.data(), result.ptr);
    return std::string(digits.size() - shortest.size(), '0') + shortest;
}

Json jsonOf(const PointResult& point)
{
    Json errors = Json::array();
    for (const ErrorCounts& counts : point.tally.errors) {
        errors.push_back({{"bit_errors", counts.bitErrors},
                          {"block_errors", counts.blockErrors},
                          {"bit_error_squares", counts.bitErrorSquares},
                          {"failures", counts.failures}});
    }
    return {{"number", point.number},
            {"seconds", point.seconds},
            {"blocks", point.tally.blocks},
            {"clipped", point.tally.clipped},
            {"errors", errors}};
}

PointResult pointOf(const Json& json)
{
    PointResult point;
    json.at("number").get_to(point.number);
    json.at("seconds").get_to(point.seconds);
    json.at("blocks").get_to(point.tally.blocks);
    json.at("clipped").get_to(point.tally.clipped);
    point.tally.errors.clear();
    for (const Json& errors : json.at("errors")) {
        ErrorCounts counts;
        errors.at("bit_errors").get_to(counts.bitErrors);
        errors.at("block_errors").get_to(counts.blockErrors);
        errors.at("bit_error_squares").get_to(counts.bitErrorSquares);
        errors.at("failures").get_to(counts.failures);
        point.tally.errors.push_back(counts);
    }
    return point;
}

}  // namespace

std::string checkpointText(const Checkpoint& checkpoint)
{
    Json json = {{"version", checkpoint.version}, {"command", checkpoint.command}, {"ended", Json::array()}};
    for (const PointResult& point : checkpoint.ended) {
        json["ended"].push_back(jsonOf(point));
    }
    if (checkpoint.running) {
        json["running"] = jsonOf(*checkpoint.running);
    }
    const std::string body = json.dump(1) + '\n';
    return std::string(opening) + checksum(body) + '\n' + body;
}

std::optional<Checkpoint> parseCheckpoint(const std::string& text)
{
    const std::size_t lineEnd = text.find('\n');
    if (lineEnd == std::string::npos) {
        return std::nullopt;
    }
    const std::string body = text.substr(lineEnd + 1);
    if (text.substr(0, lineEnd) != std::string(opening) + checksum(body)) {
        return std::nullopt;
    }
    const Json json = Json::parse(body);
    Checkpoint checkpoint;
    json.at("version").get_to(checkpoint.version);
    json.at("command").get_to(checkpoint.command);
    for (const Json& point : json.at("ended")) {
        checkpoint.ended.push_back(pointOf(point));
    }
    if (json.contains("running")) {
        checkpoint.running = pointOf(json["running"]);
    }
    return checkpoint;
}

}  // namespace simulation
