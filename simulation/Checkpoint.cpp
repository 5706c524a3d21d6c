// Checkpoint: the progress of a run as text, from which it can resume.
#include "Checkpoint.h"

#include <array>
#include <cstdint>
#include <string_view>

#include "Possible.h"
#include "base/Error.h"
#include "base/Json.h"
#include "base/Numbers.h"

namespace morvik::simulation {

namespace {

using base::Json;
using base::JsonMembers;

/// The FNV-1a hash in hexadecimal.
std::string checksum(std::string_view text)
{
    std::uint64_t hash = 0xcbf29ce484222325;
    for (const char c : text) {
        hash = (hash ^ static_cast<unsigned char>(c)) * 0x100000001b3;
    }
    constexpr std::size_t digits = 16;
    const std::string shortest = base::numberText(hash, 16);
    return std::string(digits - shortest.size(), '0') + shortest;
}

Json jsonOf(const Reception& reception)
{
    return {{"code_block_errors", reception.codeBlockErrors},
            {"undetected_errors", reception.undetected},
            {"transmissions", reception.transmissions},
            {"iterations", reception.iterations}};
}

Reception readReception(const JsonMembers& members)
{
    return {members.integer("code_block_errors", 0, UINT64_MAX),
            members.integer("undetected_errors", 0, UINT64_MAX),
            members.integer("transmissions", 0, UINT64_MAX),
            members.integer("iterations", 0, UINT64_MAX)};
}

Json jsonOf(const PointResult& point)
{
    Json errors = Json::array();
    for (const ErrorCounts& counts : point.tally.errors) {
        Json json = {{"bit_errors", counts.bitErrors},
                     {"block_errors", counts.blockErrors},
                     {"bit_error_squares", counts.bitErrorSquares},
                     {"failures", counts.failures}};
        if (counts.reception.transmissions > 0) {
            json["reception"] = jsonOf(counts.reception);
        }
        errors.push_back(json);
    }
    return {{"number", point.number},
            {"seconds", point.seconds},
            {"blocks", point.tally.blocks},
            {"clipped", point.tally.clipped},
            {"errors", errors}};
}

ErrorCounts countsOf(const Json& json, const std::string& place)
{
    const JsonMembers members(json, place);
    ErrorCounts counts;
    counts.bitErrors = members.integer("bit_errors", 0, UINT64_MAX);
    counts.blockErrors = members.integer("block_errors", 0, UINT64_MAX);
    counts.bitErrorSquares = members.integer("bit_error_squares", 0, UINT64_MAX);
    for (const Json& frame : members.list("failures")) {
        if (!frame.is_number_unsigned() || counts.failures.size() == ErrorCounts::keptFailures) {
            members.refuse("failures",
                           "expected at most " + std::to_string(ErrorCounts::keptFailures) + " frame numbers");
        }
        counts.failures.push_back(frame.get<std::uint64_t>());
    }
    if (members.has("reception")) {
        counts.reception = readReception({members.at("reception"), place + ": reception"});
    }
    return counts;
}

PointResult pointOf(const Json& json, const std::string& place)
{
    const JsonMembers members(json, place);
    PointResult point;
    point.number = static_cast<std::size_t>(members.integer("number", 0, UINT32_MAX));
    point.seconds = members.number("seconds");
    if (!isPossibleTime(point.seconds)) {
        members.refuse("seconds", "which is no time of a run");
    }
    point.tally.blocks = members.integer("blocks", 0, mostBlocks);
    point.tally.clipped = members.integer("clipped", 0, UINT64_MAX);
    point.tally.errors.clear();
    for (const Json& errors : members.list("errors")) {
        point.tally.errors.push_back(countsOf(errors, place + ": errors"));
    }
    return point;
}

std::vector<PointResult> readPoints(const JsonMembers& members, const std::string& name, const std::string& fileName)
{
    const std::string place = fileName + ": " + name + ' ';
    std::vector<PointResult> points;
    for (const Json& point : members.list(name)) {
        points.push_back(pointOf(point, place + std::to_string(points.size() + 1)));
    }
    return points;
}

Json jsonOf(const std::vector<PointResult>& points)
{
    Json list = Json::array();
    for (const PointResult& point : points) {
        list.push_back(jsonOf(point));
    }
    return list;
}

}  // namespace

std::string checkpointOpening(const std::string& body)
{
    return "morvik checkpoint " + checksum(body) + '\n';
}

std::string checkpointText(const Checkpoint& checkpoint)
{
    Json json = {{"version", checkpoint.version},
                 {"command", checkpoint.command},
                 {"ended", jsonOf(checkpoint.ended)},
                 {"begun", jsonOf(checkpoint.begun)}};
    if (checkpoint.running) {
        json["running"] = jsonOf(*checkpoint.running);
    }
    const std::string body = json.dump(1, ' ', false, Json::error_handler_t::replace) + '\n';
    return checkpointOpening(body) + body;
}

std::optional<Checkpoint> parseCheckpoint(const std::string& text, const std::string& fileName)
{
    const std::size_t lineEnd = text.find('\n');
    if (lineEnd == std::string::npos) {
        return std::nullopt;
    }
    const std::string body = text.substr(lineEnd + 1);
    if (text.substr(0, lineEnd + 1) != checkpointOpening(body)) {
        return std::nullopt;
    }
    const Json json = base::parseJson('\n' + body, fileName);  // keeps the file's line numbers
    const JsonMembers members(json, fileName);
    Checkpoint checkpoint;
    checkpoint.version = members.text("version");
    checkpoint.command = members.text("command");
    checkpoint.ended = readPoints(members, "ended", fileName);
    checkpoint.begun = readPoints(members, "begun", fileName);
    if (members.has("running")) {
        checkpoint.running = pointOf(members.at("running"), fileName + ": running");
    }
    return checkpoint;
}

}  // namespace morvik::simulation
