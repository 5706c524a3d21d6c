// Compare: the subcommand that finds where a hardware simulation departs from the model.
#include "Compare.h"

#include <iostream>
#include <memory>
#include <string>
#include <vector>

#include "Arguments.h"
#include "DecoderOptions.h"
#include "Notice.h"
#include "OtherRuns.h"
#include "SoftValueReader.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/UnpackedFile.h"
#include "hardware/comparison/Comparison.h"
#include "hardware/comparison/Coverage.h"
#include "hardware/comparison/Dump.h"
#include "hardware/comparison/Model.h"
#include "hardware/comparison/NameMap.h"
#include "hardware/comparison/Report.h"

namespace morvik {

namespace {

struct Options {
    std::string block;
    std::uint32_t number = 0;
    std::string dump;
    std::string map;
    std::string form;
    bool ignoreUnknown = false;
    bool partial = false;
    DecoderOptions decoder;
};

comparison::NameMap readMap(const std::string& file)
{
    if (file.empty()) {
        return {};
    }
    base::InputFile input(file);
    return comparison::readNameMap(input.stream(), input.name());
}

bool endsIn(const std::string& name, const std::string& ending)
{
    return name.size() > ending.size() && name.compare(name.size() - ending.size(), ending.size(), ending) == 0;
}

/// Whether the dump is a VCD, by the option, the content or the file name extension.
bool isVcd(const Options& options, const base::UnpackedFile& input)
{
    if (options.form.empty()) {
        return input.isFst() || endsIn(options.dump, ".vcd") || endsIn(options.dump, ".vcd.gz");
    }
    return options.form == "vcd";
}

void readDump(const Options& options, const comparison::NameMap& map, comparison::Dump& dump)
{
    base::UnpackedFile input(options.dump);
    try {
        if (isVcd(options, input)) {
            comparison::readVcd(input.stream(), input.name(), map, dump);
        } else {
            comparison::readCsv(input.stream(), input.name(), map, dump);
        }
    } catch (const base::Error&) {
        input.expectWhole();
        throw;
    }
    input.expectWhole();
}

int compare(const Options& options)
{
    base::expectOwnFile(base::standardStream, {options.block, options.dump, options.map}, "reports");
    const ComparedRun run = {
        options.block, options.number, readBlock(options.block, options.number), options.decoder.generics};
    const comparison::NameMap map = readMap(options.map);
    const comparison::Model model =
        comparison::computeModel(run.block, run.generics, options.decoder.iterations, std::cerr);
    comparison::Dump dump(model.values.passes(), model.values.steps());
    readDump(options, map, dump);
    const std::string dumpName = options.dump == base::standardStream ? "<stdin>" : options.dump;
    using comparison::Unknown;
    const comparison::Comparison found =
        comparison::compare(model, dump.values, options.ignoreUnknown ? Unknown::isIgnored : Unknown::differs);
    if (found.compared() == 0) {
        throw base::Error(dumpName +
                          (found.unknown() > 0 ? ": has no known value" : ": has no value that the core computes"));
    }
    const comparison::Coverage coverage = comparison::coverageOf(model, dump);
    // A few values may match another run by chance.
    constexpr std::uint64_t telling = 64;
    const auto otherRuns = found.knownDifferent() > 0 && found.knownCompared() >= telling
                               ? findOtherRuns(run, dump.values)
                               : std::vector<std::string>();
    print(coreLine(run.generics, options.decoder.iterations) +
          comparison::textOf({found, coverage, model, dump, dumpName, options.partial, otherRuns}));
    return found.first || !(coverage.isComplete() || options.partial) ? differencesFound : success;
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
or usage.

Example:
  morvik compare --block k40.csv --num-pu 8 --dump rtl.csv --map names.json)";

}  // namespace

Command addCompare(CLI::App& app)
{
    CLI::App* command = app.add_subcommand("compare", "Find where a hardware simulation departs from the model");
    const auto options = std::make_shared<Options>();

    command->add_option("--block", options->block, "Soft values, as 'morvik decode' takes them")
        ->type_name("FILE")
        ->required();
    command->add_option("--block-number", options->number, "Number of the block in the file, from 0")
        ->transform(integerFrom(0, UINT32_MAX - 1))
        ->type_name("N")
        ->capture_default_str();
    command->add_option("--dump", options->dump, "Values of the simulation, as CSV or VCD")
        ->type_name("FILE")
        ->required();
    command->add_option("--map", options->map, "Names and number formats of the dump, as JSON")->type_name("FILE");
    command->add_option("--format", options->form, "csv or vcd; by default from the file name extension")
        ->transform(oneOf({{"csv", "csv"}, {"vcd", "vcd"}}))
        ->type_name("FORMAT");
    command->add_flag("--ignore-x", options->ignoreUnknown, "Ignore unknown values (x), but count them");
    command->add_flag("--partial", options->partial, "Accept missing values, but count them");
    addDecoderOptions(*command, options->decoder);
    command->footer(explanationBeforeSignals + signalNames() + explanationAfterSignals);

    const auto run = [options] {
        return compare(*options);
    };
    return {command, run};
}

}  // namespace morvik
