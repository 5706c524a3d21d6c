// Compare: the subcommand that finds where a hardware simulation departs from the model.
#include "Compare.h"

#include <algorithm>
#include <iostream>
#include <memory>
#include <string>
#include <vector>

#include "Arguments.h"
#include "BlockCase.h"
#include "CompareOptions.h"
#include "DumpFiles.h"
#include "Notice.h"
#include "Regression.h"
#include "ResultFiles.h"
#include "SoftValueReader.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "hardware/vectors/Manifest.h"

namespace morvik {

namespace {

comparison::NameMap readMap(const std::string& file)
{
    if (file.empty()) {
        return {};
    }
    base::InputFile input(file);
    return comparison::readNameMap(input.stream(), input.name());
}

/// Results may not replace one another or what is read; compareSets() looks at the files of sets.
void expectOwnResults(const CompareOptions& options)
{
    const std::vector<std::string> inputs = {options.block, options.dump, options.map};
    base::expectOwnFile(base::standardStream, inputs, "reports");
    for (const std::string& output : options.outputs()) {
        base::expectOwnFile(output, inputs, "results");
    }
    base::expectDistinct(options.json, options.junit);
    base::expectDistinct(options.json, options.coverage);
    base::expectDistinct(options.junit, options.coverage);
}

ComparedSet compareBlock(const CompareOptions& options, const comparison::NameMap& map)
{
    const std::uint32_t number = options.number.value_or(0);
    const veltra_ip_morvik_v1_0_generics& generics = options.decoder.generics;
    const BlockCase block = {
        "", "", {options.block, number, readBlock(options.block, number), generics}, options.decoder.iterations};
    comparison::Dump dump = emptyDump(block);
    readDump(options.dump, options.form, map, dump);
    return {options.block,
            coreText(generics, block.iterations),
            {},
            {block},
            {compareCase(block, shownName(options.dump), dump, options)}};
}

/// The report of a single block, or the first report of many and a summary.
std::string setsText(const std::vector<ComparedSet>& sets)
{
    if (sets.size() == 1 && sets.front().results.size() == 1) {
        return "core: " + sets.front().core + '\n' + sets.front().results.front().report;
    }
    std::string text = summaryText(sets);
    for (const ComparedSet& set : sets) {
        for (std::size_t i = 0; i < set.results.size(); ++i) {
            if (set.results[i].verdict == Verdict::different) {
                return text + "\nThe first that differs, " + set.folder + ", " + set.cases[i].title() + ":\n" +
                       set.results[i].report;
            }
        }
    }
    return text;
}

/// That of the worst result.
int exitStatus(const std::vector<ComparedSet>& sets)
{
    int worst = success;
    for (const ComparedSet& set : sets) {
        for (const CaseResult& result : set.results) {
            const bool agrees = result.verdict == Verdict::equal;
            worst = result.verdict == Verdict::unreadable ? badInputOrUsage
                                                          : std::max<int>(worst, agrees ? success : differencesFound);
            if (worst == badInputOrUsage) {
                return worst;
            }
        }
    }
    return worst;
}

/// Refuses options of the core beside --set: the set records them.
void expectNoCoreBesideSet(const CLI::App& command)
{
    for (const char* const name : {"--num-pu", "--algorithm", "--iterations", "--tag-width"}) {
        if (command.get_option(name)->count() > 0) {
            throw base::Error(std::string(name) + " cannot be combined with --set, whose manifest has it");
        }
    }
}

/// Prints a map for the dump, and names what it leaves out.
int suggest(const CompareOptions& options)
{
    const comparison::SuggestedMap map = comparison::suggestMap(readDumpNames(options.dump, options.form));
    print(map.json);
    for (const std::string& note : map.notes) {
        notice(note);
    }
    return success;
}

int compare(const CLI::App& command, const CompareOptions& options)
{
    if (options.suggestMap) {
        return suggest(options);
    }
    if (options.block.empty() == options.sets.empty()) {
        throw base::Error("either --block or --set is required; see 'morvik compare --help'");
    }
    if (!options.sets.empty()) {
        expectNoCoreBesideSet(command);
    }
    expectOwnResults(options);
    const comparison::NameMap map = readMap(options.map);
    const std::vector<ComparedSet> sets =
        options.sets.empty() ? std::vector<ComparedSet>{compareBlock(options, map)} : compareSets(options, map);
    for (const ComparedSet& set : sets) {
        for (const CaseResult& result : set.results) {
            std::cerr << result.warnings;
        }
    }
    if (!options.json.empty()) {
        base::writeFile(options.json, jsonText(sets));
    }
    if (!options.junit.empty()) {
        base::writeFile(options.junit, junitText(sets));
    }
    std::string text = setsText(sets);
    if (!options.coverage.empty()) {
        const coverage::Counts counts = situationsOf(sets);
        base::writeFile(options.coverage, coverage::textOf(counts));
        text += "\nsituations: " + coverage::summary(counts) + '\n';
    }
    print(text);
    return exitStatus(sets);
}

constexpr char explanationBeforeSignals[] =
    R"(A dump holds the values of a hardware simulation: CSV with the columns half_iteration, step,
signal and value, or VCD whose scopes have variables half_iteration and step, which tell where
the other values belong.
Signals: )";

constexpr char explanationAfterSignals[] =
    R"(.

A dump may leave out whole signals. Other missing values are an error without --partial, and an
x is a difference without --ignore-x. The map is a JSON object with other names and number
formats; docs/compare.md has examples.

Exit status: 0 all values agree, 1 a difference was found or values are missing, 2 bad input
or usage; of several blocks, the worst.

Examples:
  morvik compare --block k40.csv --num-pu 8 --dump rtl.csv --map names.json
  morvik compare --set sets/* --dump '{set}/rtl/{block}.fst' --junit results.xml)";

void addBlockOptions(CLI::App& command, CompareOptions& options)
{
    auto* block =
        command.add_option("--block", options.block, "Soft values, as 'morvik decode' takes them")->type_name("FILE");
    command.add_option("--set", options.sets, "Folders of 'morvik vectors', all of whose blocks to compare")
        ->type_name("DIR...")
        ->excludes(block);
    command.add_option("--block-number", options.number, "Number of the block, from 0; default: 0, or all of a set")
        ->transform(integerFrom(0, UINT32_MAX - 1))
        ->type_name("N");
}

void addDumpOptions(CLI::App& command, CompareOptions& options)
{
    command
        .add_option("--dump",
                    options.dump,
                    "Values of the simulation, as CSV, VCD or FST; for a set, {block} in the name stands for the "
                    "number, {set} for the folder")
        ->type_name("FILE")
        ->required();
    command.add_option("--map", options.map, "Names and number formats of the dump, as JSON")->type_name("FILE");
    command.add_flag("--suggest-map", options.suggestMap, "Print a map for the names in the dump, and compare nothing");
    command
        .add_option("--format",
                    options.form,
                    "csv, vcd, or memh, npy or c of 'morvik vectors'; by default from the file name extension")
        ->transform(oneOf({{"csv", "csv"}, {"vcd", "vcd"}, {"memh", "memh"}, {"npy", "npy"}, {"c", "c"}}))
        ->type_name("FORMAT");
    command.add_flag("--ignore-x", options.ignoreUnknown, "Ignore unknown values (x), but count them");
    command.add_flag("--partial", options.partial, "Accept missing values, but count them");
}

void addResultOptions(CLI::App& command, CompareOptions& options)
{
    command.add_option("--json", options.json, "Write all results to this file, as JSON")->type_name("FILE");
    command.add_option("--junit", options.junit, "Write all results to this file, for CI servers")->type_name("FILE");
    command
        .add_option(
            "--coverage",
            options.coverage,
            "Write how often right values of the dumps meet each situation of the arithmetic to this file, as CSV")
        ->type_name("FILE");
    command.add_option("--threads", options.threads, "Threads that compare blocks of a set; default: as many as cores")
        ->transform(integerFrom(1, 1024))
        ->type_name("N");
}

}  // namespace

Command addCompare(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("compare", "Find where a hardware simulation departs from the model");
    const auto options = std::make_shared<CompareOptions>();
    addBlockOptions(*command, *options);
    addDumpOptions(*command, *options);
    addResultOptions(*command, *options);
    addDecoderOptions(*command, options->decoder);
    command->footer(explanationBeforeSignals + signalNames() + explanationAfterSignals);
    const auto run = [options, command] {
        return compare(*command, *options);
    };
    return {command, run};
}

}  // namespace morvik
