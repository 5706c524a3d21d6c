// TransportJson: how a set's transport blocks are sent, as the manifest tells it.
#include "TransportJson.h"

#include <cmath>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "base/Thousandths.h"
#include "link/coding/TransportBlock.h"
#include "simulation/Plan.h"
#include "simulation/TransportSimulator.h"

namespace morvik::vectors {

namespace {

/// More than 50 dB of Eb/N0 and the bits of a symbol make.
constexpr int mostDecibels = 100;

unsigned numberFrom(const base::JsonMembers& json, const char* name, std::uint64_t lowest, std::uint64_t highest)
{
    return static_cast<unsigned>(json.integer(name, lowest, highest));
}

/// A value by its name, which `find` knows.
template <class Value>
Value namedFrom(const base::JsonMembers& json, const char* name, std::optional<Value> (*find)(std::string_view))
{
    const std::optional<Value> found = find(json.text(name));
    if (!found) {
        json.refuse(name, "expected a name that 'morvik vectors --help' lists");
    }
    return *found;
}

std::vector<unsigned> versionsFrom(const base::JsonMembers& json)
{
    std::vector<unsigned> versions;
    const base::Json& list = json.list("redundancy_versions");
    for (const base::Json& version : list) {
        if (!version.is_number_unsigned() || version.get<std::uint64_t>() >= link::redundancyVersions) {
            json.refuse("redundancy_versions", "expected a list of numbers from 0 to 3");
        }
        versions.push_back(version.get<unsigned>());
    }
    if (versions.empty() || versions.size() > simulation::mostTransmissions) {
        json.refuse("redundancy_versions",
                    "expected 1 to " + std::to_string(simulation::mostTransmissions) + " transmissions");
    }
    return versions;
}

simulation::LinkFormat linkFrom(const base::JsonMembers& json)
{
    simulation::LinkFormat format;
    format.transportBlockSize = numberFrom(json, "transport_block_size", 1, link::mostTransportBits);
    format.codedBits = numberFrom(json, "coded_bits", 1, UINT32_MAX);
    format.modulation = namedFrom(json, "modulation", link::modulationOf);
    format.versions = versionsFrom(json);
    format.softBufferBits = numberFrom(json, "soft_buffer_bits", 0, 16);
    if (format.softBufferBits == 1) {
        json.refuse("soft_buffer_bits", "expected 2 to 16, or 0 for full width");
    }
    format.softBufferSize = numberFrom(json, "soft_buffer_size", 0, link::unlimitedBuffer - 1);
    format.fading = namedFrom(json, "channel", link::fadingOf);
    format.demapper = namedFrom(json, "demapper", link::demapperOf);
    return format;
}

}  // namespace

nlohmann::ordered_json formatJson(const simulation::Point& point)
{
    const simulation::LinkFormat& format = point.link;
    const link::CodeBlocks blocks = link::codeBlocksOf(format.transportBlockSize);
    nlohmann::ordered_json json;
    json["transport_block_size"] = format.transportBlockSize;
    json["code_blocks"] = blocks.count;
    json["fillers"] = blocks.fillers;
    json["coded_bits"] = format.codedBits;
    json["modulation"] = nameOf(format.modulation);
    json["redundancy_versions"] = format.versions;
    json["soft_buffer_bits"] = format.softBufferBits;
    json["soft_buffer_size"] = format.softBufferSize;
    json["channel"] = nameOf(format.fading);
    json["demapper"] = nameOf(format.demapper);
    json["esn0_db"] = base::fromThousandths(point.milliEsn0);
    json["scales"] = transportSettingOf(point).scales;
    return json;
}

simulation::Point formatFrom(const base::JsonMembers& json, const Settings& settings)
{
    simulation::Sweep sweep;
    sweep.formats = {linkFrom(json)};
    sweep.numPus = {static_cast<unsigned>(settings.generics.C_NUM_PU)};
    sweep.algorithms = {static_cast<unsigned>(settings.generics.C_ALGORITHM_TYPE)};
    sweep.scaleOptions = {std::nullopt};
    sweep.iterations = {settings.iterations};
    sweep.axis = simulation::Axis::esn0;
    sweep.milliDecibels = {milliDecibelsFrom(json, "esn0_db", mostDecibels)};
    simulation::Point point = pointsOf(sweep).front();
    try {
        const link::TransportBlockCode code(formatOf(transportSettingOf(point)));
    } catch (const std::invalid_argument& error) {
        json.refuse("coded_bits", error.what());
    }
    return point;
}

int milliDecibelsFrom(const base::JsonMembers& json, const char* name, int most)
{
    const double decibels = json.number(name);
    const bool isInRange = decibels >= -most && decibels <= most;
    const int thousandths = isInRange ? static_cast<int>(std::lround(1000 * decibels)) : 0;
    if (!isInRange || base::fromThousandths(thousandths) != decibels) {
        const std::string end = std::to_string(most);
        json.refuse(name, "expected -" + end + " to " + end + " dB, with at most three decimals");
    }
    return thousandths;
}

void addOrigin(const Origin& origin, nlohmann::ordered_json& block)
{
    block["format"] = origin.format;
    block["transport_block"] = origin.transportBlock;
    block["code_block"] = origin.codeBlock;
    block["transmissions"] = origin.transmissions;
}

Origin originFrom(const base::JsonMembers& json)
{
    return {numberFrom(json, "format", 0, UINT32_MAX),
            numberFrom(json, "transport_block", 0, UINT32_MAX),
            numberFrom(json, "code_block", 0, UINT32_MAX),
            numberFrom(json, "transmissions", 1, UINT32_MAX)};
}

}  // namespace morvik::vectors
