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
#include "base/Checksum.h"
#include "base/Error.h"
#include "base/OutputFile.h"
#include "base/Path.h"
#include "base/Printable.h"
#include "base/Text.h"
#include "hardware/tables/Table.h"
#include "hardware/units/Check.h"
#include "rules/BlockSizes.h"
#include "simulation/Plan.h"

namespace morvik {

namespace {

/// Stands for all units.
constexpr char everyUnit[] = "all";

/// What --unit takes.
std::vector<std::string> unitWords()
{
    std::vector<std::string> words;
    for (const units::Unit& unit : units::allUnits()) {
        words.emplace_back(unit.name);
    }
    words.emplace_back(everyUnit);
    return words;
}

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
std::string commandOfTable(units::Number unit, const UnitVectors& vectors)
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

/// The formats of a unit's table, when its files are written.
std::vector<units::DescribedFormat> formatsOf(units::Number unit, const UnitVectors& vectors)
{
    const tables::Table table = units::tableOf(unit, vectors.algorithm);
    std::vector<units::DescribedFormat> formats;
    for (const std::string& format : vectors.formats) {
        formats.push_back({format, {}});
        for (const std::string& name : tables::findFormat(format)->files(table)) {
            formats.back().files.push_back({name, base::sha256(vectors.folder + '/' + name)});
        }
    }
    return formats;
}

/// Writes the tables of a unit, and describes them.
units::Description writeTables(units::Number unit, const UnitVectors& vectors)
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
    return {MORVIK_VERSION,
            commandOfTable(unit, vectors),
            unit,
            vectors.algorithm,
            extent,
            situations.all(),
            formatsOf(unit, vectors)};
}

/// "branch: 98048 cases in csv,memh".
std::string casesText(const units::Description& made)
{
    return nameOf(made.unit) + ": " + base::counted(made.cases(), "case") + " in " +
           listed(made.formats, [](const units::DescribedFormat& format) { return format.name; });
}

std::string unitSummary(const units::Description& made)
{
    std::string text = casesText(made);
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
        if (!unit && text != everyUnit) {
            refuse("--unit", text, "expected " + alternatives(unitWords()));
        }
        for (std::size_t number = 0; number < units::allUnits().size(); ++number) {
            const auto each = static_cast<units::Number>(number);
            if (!unit || *unit == each) {
                units.push_back(each);
            }
        }
    };
    CLI::Option* const unit =
        addListOption(command, "--unit", vectors.units, append, "Instead of blocks: cases for single units of the core")
            ->check(offer(unitWords()))
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
        const units::Description made = writeTables(unit, vectors);
        base::writeFile(vectors.folder + '/' + descriptionName(unit), textOf(made));
        text += unitSummary(made);
    }
    print(text);
    return success;
}

int checkUnitVectors(const std::string& folder)
{
    int status = success;
    std::string text;
    for (const units::Number unit : units::unitsIn(folder)) {
        const units::CheckedUnit checked = units::checkUnit(folder, unit);
        base::expectOwnFile(base::standardStream, units::filesOf(folder, checked.description), "findings");
        text += base::visible(folder) + ": " + casesText(checked.description);
        if (checked.difference) {
            text += ": " + *checked.difference + '\n';
            status = differencesFound;
        } else {
            text += ", all as the model computes them\n";
        }
    }
    print(text);
    return status;
}

}  // namespace morvik
