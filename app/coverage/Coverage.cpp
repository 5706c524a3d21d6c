// Coverage: the subcommand that tells which situations of the arithmetic sets and simulations have met.
#include "Coverage.h"

#include <filesystem>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "CountsJson.h"
#include "Lists.h"
#include "Notice.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/OutputFile.h"
#include "base/Path.h"
#include "base/Text.h"
#include "hardware/coverage/Counts.h"
#include "hardware/vectors/Set.h"
#include "report/CoveragePage.h"
#include "report/Page.h"
#include "rules/Algorithms.h"

namespace morvik {

namespace {

struct CoverageOptions {
    std::vector<std::string> inputs;
    std::string output;
    std::string report;
    bool all = false;
    bool json = false;
    bool missing = false;
    bool list = false;
};

std::string coreText(const coverage::Core& core)
{
    return std::to_string(core.units) + " units, " + std::string(rules::algorithmNames.at(core.algorithm));
}

std::string leftAligned(std::string text, std::size_t width)
{
    text.resize(std::max(text.size(), width), ' ');
    return text;
}

/// A line for a situation.
std::string situationLine(const coverage::Situation& situation, const std::string& count)
{
    constexpr std::size_t widestRule = 3;
    constexpr std::size_t widestName = 28;
    constexpr std::size_t widestCount = 10;
    return leftAligned("", widestRule - std::to_string(situation.rule).size()) + std::to_string(situation.rule) + "  " +
           leftAligned(situation.name, widestName) + (count.empty() ? "" : leftAligned(count, widestCount)) +
           situation.text + '\n';
}

std::string listText()
{
    std::string text;
    for (const coverage::Situation& each : coverage::situations()) {
        text += situationLine(each, "");
    }
    return text;
}

std::string missingText(const coverage::Counts& counts)
{
    return listed(counts.missing(), [](unsigned number) { return coverage::situations()[number].name; }) + '\n';
}

/// How many situations cannot be met for each reason.
std::string impossibleText(const coverage::Counts& counts)
{
    std::map<std::string, std::uint64_t> reasons;
    for (unsigned number = 0; number < coverage::situations().size(); ++number) {
        if (const auto why = counts.whyImpossible(number)) {
            ++reasons[*why];
        }
    }
    std::string text;
    for (const auto& [reason, count] : reasons) {
        text += "cannot occur: " + std::to_string(count) + ", as " + reason + '\n';
    }
    return text;
}

std::string countsText(const coverage::Counts& counts, bool all)
{
    std::string text;
    for (const coverage::CoreCounts& each : counts.cores()) {
        text += "core: " + coreText(each.core) + "; " + base::counted(each.blocks, "block") + '\n';
    }
    constexpr std::size_t none = 0;
    text += "situations: " + coverage::summary(counts, none) + '\n';
    for (unsigned number = 0; number < coverage::situations().size(); ++number) {
        const bool isPossible = !counts.whyImpossible(number);
        if (isPossible && (all || counts.met(number) == 0)) {
            const std::string count = counts.met(number) == 0 ? "missing" : std::to_string(counts.met(number));
            text += situationLine(coverage::situations()[number], count);
        }
    }
    return text + impossibleText(counts);
}

std::string jsonText(const coverage::Counts& counts)
{
    nlohmann::ordered_json object = {{"version", MORVIK_VERSION}};
    object.update(countsJson(counts));
    return object.dump(2) + '\n';
}

void writePage(const std::string& fileName, const coverage::Counts& counts)
{
    report::CoverageDescription page;
    page.lead = coverage::summary(counts, 0) + ", in " + base::counted(counts.blocks(), "block");
    for (const coverage::CoreCounts& each : counts.cores()) {
        page.cores.emplace_back(coreText(each.core), each.blocks);
    }
    for (unsigned number = 0; number < coverage::situations().size(); ++number) {
        const coverage::Situation& each = coverage::situations()[number];
        page.rows.push_back(
            {each.rule, each.name, each.text, counts.met(number), counts.whyImpossible(number).value_or("")});
    }
    report::writeCoveragePage(fileName, page);
}

/// The counts of a file, or of a set of vectors.
coverage::Counts countsOf(const std::string& input)
{
    if (std::filesystem::is_directory(base::pathOf(input))) {
        return vectors::situationsOf(input);
    }
    base::InputFile file(input);
    return coverage::readCounts(file.stream(), file.name());
}

/// All files that are read.
std::vector<std::string> filesOf(const std::vector<std::string>& inputs)
{
    std::vector<std::string> files;
    for (const std::string& input : inputs) {
        if (std::filesystem::is_directory(base::pathOf(input))) {
            const std::string manifest = (base::pathOf(input) / vectors::manifestName).u8string();
            const std::vector<std::string> ofSet = vectors::filesOf(input, vectors::readManifest(manifest));
            files.insert(files.end(), ofSet.begin(), ofSet.end());
        } else {
            files.push_back(input);
        }
    }
    return files;
}

int reportCoverage(const CoverageOptions& options)
{
    if (options.list) {
        if (!options.inputs.empty() || !options.output.empty() || !options.report.empty() || options.all ||
            options.json || options.missing) {
            throw base::Error("--list prints all situations, and takes nothing else; see 'morvik coverage --help'");
        }
        print(listText());
        return success;
    }
    if (options.inputs.empty()) {
        throw base::Error("FILE is required; see 'morvik coverage --help'");
    }
    const std::vector<std::string> files = filesOf(options.inputs);
    base::expectOwnFile(options.output, files, "counts");
    if (!options.report.empty()) {
        report::checkReport(options.report);
        base::expectOwnFile(options.report, files, "results");
    }
    coverage::Counts counts;
    for (const std::string& input : options.inputs) {
        counts.add(countsOf(input));
    }
    if (!options.output.empty()) {
        base::writeFile(options.output, coverage::textOf(counts));
    }
    if (!options.report.empty()) {
        writePage(options.report, counts);
    }
    print(options.json ? jsonText(counts) : options.missing ? missingText(counts) : countsText(counts, options.all));
    return counts.missing().empty() ? success : differencesFound;
}

constexpr char coverageExplanation[] =
    R"(A file is one that 'morvik vectors --coverage' or a checker in a simulator has written, or the folder
of a set of vectors. All are summed. A situation counts as missing if one of the cores can meet it and
none has. docs/coverage.md tells what the situations are.

Exit status: 0 nothing is missing, 1 situations are missing, 2 bad input or usage.

Example: a set that has all, and what one block alone meets
  morvik vectors --out set --cover all
  morvik vectors --out one --block-size 40 --blocks 1 --no-directed --coverage one.csv
  morvik coverage one.csv --report one.html)";

}  // namespace

Command addCoverage(CLI::App& app)
{
    CLI::App* command =
        app.add_subcommand("coverage", "Tell which situations of the arithmetic sets and simulations have met");
    const auto options = std::make_shared<CoverageOptions>();
    command->add_option("FILE", options->inputs, "Counts, or folders of vectors")->type_name("");
    command->add_option("--output", options->output, "Write the sums to this file, as CSV")->type_name("FILE");
    command->add_option("--report", options->report, "Draw the sums as an HTML page")->type_name("FILE");
    CLI::Option* const all = command->add_flag("--all", options->all, "Print the situations that have been met, too");
    CLI::Option* const json = command->add_flag("--json", options->json, "Print a JSON object instead of text");
    command
        ->add_flag("--missing",
                   options->missing,
                   "Print the names of missing situations alone, as --cover of 'morvik vectors' takes them")
        ->excludes(all, json);
    command->add_flag("--list", options->list, "Print all situations, and what they are, instead");
    command->footer(coverageExplanation);
    const auto work = [options] {
        return reportCoverage(*options);
    };
    return {command, work};
}

}  // namespace morvik
