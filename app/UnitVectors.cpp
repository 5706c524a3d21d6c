// UnitVectors: stimulus and expected values for single units of the core, which `morvik vectors --unit` writes.
#include "UnitVectors.h"

#include <algorithm>
#include <filesystem>
#include <memory>
#include <system_error>

#include "Arguments.h"
#include "Command.h"
#include "Lists.h"
#include "Notice.h"
#include "base/Error.h"
#include "base/Json.h"
#include "base/OutputFile.h"
#include "base/Path.h"
#include "base/Printable.h"
#include "base/Text.h"
#include "hardware/tables/Table.h"
#include "hardware/units/Situations.h"
#include "hardware/units/Stimulus.h"
#include "hardware/vectors/Checksum.h"
#include "rules/BlockSizes.h"
#include "simulation/Plan.h"

namespace morvik {

namespace {

using Json = nlohmann::ordered_json;

std::string nameOf(units::Number unit)
{
    return units::allUnits()[static_cast<std::size_t>(unit)].name;
}

std::vector<std::string> unitNames()
{
    std::vector<std::string> names;
    for (const units::Unit& unit : units::allUnits()) {
        names.emplace_back(unit.name);
    }
    return names;
}

/// What the cases of a unit are, and what they meet.
struct Made {
    units::Extent extent;
    std::vector<units::Situation> situations;

    std::uint64_t cases() const
    {
        return extent.directed + extent.random;
    }
};

/// The options that units have a use for.
void expectOptionsOfUnits(const CLI::App& command, const UnitVectors& vectors)
{
    const std::vector<std::string> allowed = {
        "--unit", "--cases", "--out", "--algorithm", "--seed", "--format", "--block-size"};
    for (const CLI::Option* const option : command.get_options()) {
        const bool isAllowed = std::find(allowed.begin(), allowed.end(), option->get_name()) != allowed.end();
        if (option->count() > 0 && !isAllowed) {
            throw base::Error(option->get_name() + " cannot be combined with --unit, as a unit does not depend on it");
        }
    }
    const bool hasAddress =
        std::find(vectors.units.begin(), vectors.units.end(), units::Number::address) != vectors.units.end();
    if (command.get_option("--block-size")->count() > 0 && !hasAddress) {
        throw base::Error("--block-size is for the unit address alone");
    }
    if (vectors.folder.empty()) {
        throw base::Error("--unit requires --out");
    }
}

/// The command that makes the files of a unit again, without the folder.
std::string commandOf(units::Number unit, const UnitVectors& vectors)
{
    std::string command = "morvik vectors --unit " + nameOf(unit) + " --algorithm " +
                          simulation::algorithmName(static_cast<unsigned>(vectors.algorithm)) + " --cases " +
                          std::to_string(vectors.randomCases) + " --seed " + std::to_string(vectors.seed) +
                          " --format " + listed(vectors.formats, [](const std::string& format) { return format; });
    if (unit == units::Number::address && vectors.blockSizes.size() != rules::blockSizes.size()) {
        command += " --block-size " + listed(vectors.blockSizes, [](unsigned K) { return std::to_string(K); });
    }
    return command;
}

Made writeTables(units::Number unit, const UnitVectors& vectors)
{
    const tables::Table table = units::tableOf(unit, vectors.algorithm);
    std::vector<std::unique_ptr<tables::TableWriter>> writers;
    for (const std::string& format : vectors.formats) {
        writers.push_back(tables::findFormat(format)->writer(vectors.folder, table));
    }
    units::Situations situations(unit, vectors.algorithm);
    const auto write = [&](const std::vector<std::int32_t>& inputs) {
        const std::vector<std::int32_t> outputs = units::compute(unit, vectors.algorithm, inputs);
        situations.add(inputs, outputs);
        const tables::Row row = units::rowOf(unit, vectors.algorithm, inputs, outputs);
        for (const auto& writer : writers) {
            writer->add(0, row);
        }
    };
    const units::StimulusSettings settings = {vectors.algorithm, vectors.seed, vectors.randomCases, vectors.blockSizes};
    const units::Extent extent = units::stimulate(unit, settings, write);
    for (const auto& writer : writers) {
        writer->finish();
    }
    return {extent, situations.all()};
}

Json filesOf(units::Number unit, const UnitVectors& vectors)
{
    const tables::Table table = units::tableOf(unit, vectors.algorithm);
    Json files = Json::array();
    for (const std::string& format : vectors.formats) {
        for (const std::string& name : tables::findFormat(format)->files(table)) {
            files.push_back({{"name", name}, {"sha256", vectors::sha256(vectors.folder + '/' + name)}});
        }
    }
    return files;
}

void writeDescription(units::Number unit, const UnitVectors& vectors, const Made& made)
{
    Json json;
    json["morvik"] = MORVIK_VERSION;
    json["command"] = commandOf(unit, vectors);
    json["unit"] = nameOf(unit);
    json["algorithm"] = simulation::algorithmName(static_cast<unsigned>(vectors.algorithm));
    json["exhaustive"] = made.extent.isExhaustive;
    json["cases"] = made.cases();
    json["directed"] = made.extent.directed;
    json["random"] = made.extent.random;
    json["columns"] = Json::array();
    for (const tables::Column& column : units::tableOf(unit, vectors.algorithm).columns) {
        json["columns"].push_back({{"name", column.name}, {"bits", column.bits}, {"signed", column.isSigned}});
    }
    json["situations"] = Json::array();
    for (const units::Situation& situation : made.situations) {
        json["situations"].push_back({{"name", situation.name}, {"count", situation.total()}});
        if (situation.counts.size() > 1) {
            json["situations"].back()["in_each_" + situation.place] = situation.counts;
        }
    }
    json["files"] = filesOf(unit, vectors);
    base::writeFile(vectors.folder + '/' + nameOf(unit) + ".json", json.dump(2) + '\n');
}

std::string summaryOf(units::Number unit, const UnitVectors& vectors, const Made& made)
{
    std::string text = nameOf(unit) + ": " + base::counted(made.cases(), "case") + " in " +
                       listed(vectors.formats, [](const std::string& format) { return format; });
    text += made.extent.isExhaustive ? ", exhaustive\n"
                                     : ": " + std::to_string(made.extent.directed) + " directed, " +
                                           std::to_string(made.extent.random) + " random\n";
    for (const units::Situation& situation : made.situations) {
        constexpr std::size_t width = 32;
        std::string line = "  " + situation.name;
        line.resize(std::max(line.size() + 1, width), ' ');
        const std::string count = std::to_string(situation.total());
        line += std::string(count.size() < 8 ? 8 - count.size() : 0, ' ') + count;
        if (situation.counts.size() > 1) {
            line += "  at least " + std::to_string(situation.fewest()) + " in each of " +
                    base::counted(situation.counts.size(), situation.place);
        }
        text += line + '\n';
    }
    return text;
}

void makeFolder(const std::string& folder)
{
    std::error_code error;
    std::filesystem::create_directories(base::pathOf(folder), error);
    if (error) {
        throw base::Error(folder + ": " + error.message());
    }
}

}  // namespace

void addUnitOptions(CLI::App& command, UnitVectors& vectors)
{
    const auto append = [](const std::string& text, std::vector<units::Number>& units) {
        const auto unit = units::findUnit(text);
        if (!unit) {
            refuse("--unit", text, "expected " + alternatives(unitNames()));
        }
        units.push_back(*unit);
    };
    CLI::Option* const unit =
        addListOption(command, "--unit", vectors.units, append, "Instead of blocks: cases for single units of the core")
            ->check(offer(unitNames()))
            ->type_name("NAME[,NAME...]");
    command.add_option("--cases", vectors.randomCases, "Random cases of each unit beside the directed ones")
        ->transform(integerFrom(0, 10000000))
        ->type_name("N")
        ->capture_default_str()
        ->needs(unit);
}

int makeUnitVectors(const CLI::App& command, UnitVectors vectors)
{
    expectOptionsOfUnits(command, vectors);
    if (vectors.blockSizes.empty()) {
        for (const rules::BlockSize& size : rules::blockSizes) {
            vectors.blockSizes.push_back(size.K);
        }
    }
    makeFolder(vectors.folder);
    std::string text = base::visible(vectors.folder) + ": for the algorithm " +
                       simulation::algorithmName(static_cast<unsigned>(vectors.algorithm)) + '\n';
    for (const units::Number unit : vectors.units) {
        const Made made = writeTables(unit, vectors);
        writeDescription(unit, vectors, made);
        text += summaryOf(unit, vectors, made);
    }
    print(text);
    return success;
}

}  // namespace morvik
