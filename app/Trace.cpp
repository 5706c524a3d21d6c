// Trace: the subcommand that writes the internal values of selected passes.
#include "Trace.h"

#include <algorithm>
#include <cstdint>
#include <iostream>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "Arguments.h"
#include "DecoderOptions.h"
#include "Lists.h"
#include "SoftValueReader.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Numbers.h"
#include "base/Shown.h"
#include "hardware/trace/TraceWriter.h"

namespace morvik {

namespace {

struct TraceOptions {
    std::string input = base::standardStream;
    std::string output = base::standardStream;
    std::string format = "text";
    std::string halfIterations;
    std::uint32_t block = 0;
    DecoderOptions decoder;
    trace::Selection selection;
};

/// Applies --half-iterations, N or A:B; selects all without it.
void selectPasses(const TraceOptions& options, trace::Selection& selection)
{
    const std::uint32_t passes = 2 * options.decoder.iterations;
    selection.last = passes - 1;
    if (options.halfIterations.empty()) {
        return;
    }
    const std::vector<std::string> ends = splitAt(':', options.halfIterations);
    const auto first = base::parseNumber<std::uint32_t>(ends.front());
    const auto last = base::parseNumber<std::uint32_t>(ends.back());
    if (ends.size() > 2 || !first || !last || *first > *last || *last >= passes) {
        throw base::Error("--half-iterations: " + base::shown(options.halfIterations) +
                          " is not allowed, expected N or A:B, A not above B, from 0 to " + std::to_string(passes - 1) +
                          " (two for each of --iterations)");
    }
    selection.first = *first;
    selection.last = *last;
}

/// The names that stand for all signals of a kind.
std::vector<std::string> kindNames()
{
    std::vector<std::string> names;
    for (const Stage stage : stages) {
        if (signalsOf(stage).count > 1) {
            names.push_back(nameOf(stage));
        }
    }
    return names;
}

/// What --signals takes; `separator` stands before the names of kinds.
std::string knownSignals(const char* separator)
{
    std::string text = signalNames();
    for (const std::string& each : kindNames()) {
        text += separator + each;
        separator = ", ";
    }
    return text + " for all of a kind";
}

/// Appends the signal of this name, or all of a kind.
void appendSignals(const std::string& text, std::vector<unsigned>& signals)
{
    const std::size_t before = signals.size();
    for (unsigned i = 0; i < passSignals.size(); ++i) {
        if (text == passSignals[i].name || text == nameOf(stageOf(i))) {
            signals.push_back(i);
        }
    }
    if (signals.size() == before) {
        refuse("--signals", text, "expected " + knownSignals(", or "));
    }
}

/// The names that appendSignals() accepts.
std::vector<std::string> signalWords()
{
    std::vector<std::string> words(passSignals.size());
    std::transform(passSignals.begin(), passSignals.end(), words.begin(), [](const Signal& signal) {
        return std::string(signal.name);
    });
    const std::vector<std::string> kinds = kindNames();
    words.insert(words.end(), kinds.begin(), kinds.end());
    return words;
}

void appendUnit(const std::string& text, std::vector<std::uint32_t>& units)
{
    const auto unit = base::parseNumber<std::uint32_t>(text);
    if (!unit) {
        refuse("--units", text, "expected unit numbers, from 0");
    }
    units.push_back(*unit);
}

void checkUnits(const TraceOptions& options, const rules::Cut& cut)
{
    for (const std::uint32_t unit : options.selection.units) {
        if (unit >= cut.unitsAtWork()) {
            const std::uint32_t last = cut.unitsAtWork() - 1;
            throw base::Error("--units: unit " + std::to_string(unit) + " computes nothing of a block of " +
                              std::to_string(cut.K()) + " bits with --num-pu " +
                              std::to_string(options.decoder.generics.C_NUM_PU) + ", unit" +
                              (last > 0 ? "s 0 to " + std::to_string(last) + " do" : " 0 does"));
        }
    }
}

base::OutputFile openOutput(const TraceOptions& options)
{
    base::expectOwnFile(options.output, {options.input}, "traced values");
    base::OutputFile file(options.output);
    if (options.format == "npy" && !file.isReplaced()) {
        throw base::Error("--format npy needs a regular file; use --output FILE");
    }
    return file;
}

std::unique_ptr<trace::TraceWriter> writerOf(const TraceOptions& options, const rules::Cut& cut)
{
    if (options.format == "vcd" || options.format == "fst") {
        return (options.format == "vcd" ? trace::vcdTrace : trace::fstTrace)(
            openOutput(options), cut, options.selection);
    }
    const tables::Table table = trace::traceTable(options.selection);
    auto rows = options.format == "csv" ? tables::csvWriter(openOutput(options), table)
                                        : tables::npyWriter(openOutput(options), table);
    return trace::tableTrace(std::move(rows), options.block, options.selection);
}

void writeTrace(TraceOptions options)
{
    trace::Selection& selection = options.selection;
    selectPasses(options, selection);
    if (options.format == "text" && (!selection.signals.empty() || !selection.units.empty())) {
        throw base::Error(
            "--signals and --units need --format csv, vcd, fst or npy: they do not apply to the library's own text");
    }
    const SoftBlock block = readBlock(options.input, options.block);
    if (options.format == "text") {
        trace::writeText(block, options.decoder.generics, selection, openOutput(options));
        return;
    }
    if (selection.signals.empty()) {
        selection.signals = allSignals();
    }
    Passes passes(block, options.decoder.generics, std::cerr);
    checkUnits(options, passes.cut());
    const auto writer = writerOf(options, passes.cut());
    for (std::uint32_t halfIteration = 0; halfIteration <= selection.last; ++halfIteration) {
        passes.next();
        if (halfIteration >= selection.first) {
            writer->add(passes, halfIteration);
        }
    }
    writer->finish();
}

int runTrace(const TraceOptions& options)
{
    writeTrace(options);
    std::cerr << coreLine(options.decoder.generics, options.decoder.iterations);
    return success;
}

constexpr char traceExplanationBeforeSignals[] =
    R"(FILE is read as by 'morvik decode'. Half-iterations count from 0; even ones decode the second,
interleaved constituent code. 'text' is the library's own trace, which lacks the branch
metrics. 'vcd' has a scope for each unit and thread, and one unit of time for each trellis step.
'fst' is the same, compact; it needs vcd2fst of GTKWave.
docs/trace.md has the details.

Signals: )";

constexpr char traceExplanationAfterSignals[] =
    R"(.
Exit status: 0 written, 2 bad input or usage.

Example: waveforms of the first iteration
  morvik trace k1024.csv --half-iterations 0:1 --format vcd --output k1024.vcd)";

void addSelectionOptions(CLI::App& command, TraceOptions& options)
{
    command.add_option("--half-iterations", options.halfIterations, "Passes to write, N or A:B; default: all")
        ->type_name("A:B");
    addListOption(command, "--signals", options.selection.signals, appendSignals, "Signals to write; default: all")
        ->check(offer(signalWords()))
        ->type_name("NAME[,NAME...]");
    addListOption(command, "--units", options.selection.units, appendUnit, "Units whose values to write; default: all")
        ->type_name("N[,N...]");
}

}  // namespace

Command addTrace(CLI::App& app)
{
    CLI::App* command =
        app.add_subcommand("trace", "Write the internal values of selected passes, as waveforms or tables");
    const auto options = std::make_shared<TraceOptions>();
    command->add_option("FILE", options->input, "Soft values, as CSV; - for standard input")
        ->type_name("")
        ->capture_default_str();
    command->add_option("--block", options->block, "Number of the block in FILE, from 0")
        ->transform(integerFrom(0, UINT32_MAX - 1))
        ->type_name("N")
        ->capture_default_str();
    command->add_option("--output", options->output, "File for the trace; - for standard output")
        ->type_name("FILE")
        ->capture_default_str();
    command->add_option("--format", options->format, "text, csv, vcd, fst or npy")
        ->transform(oneOf({{"text", "text"}, {"csv", "csv"}, {"vcd", "vcd"}, {"fst", "fst"}, {"npy", "npy"}}))
        ->type_name("FORMAT")
        ->capture_default_str();
    addSelectionOptions(*command, *options);
    addDecoderOptions(*command, options->decoder);
    command->footer(traceExplanationBeforeSignals + knownSignals(",\nand ") + traceExplanationAfterSignals);
    const auto work = [options] {
        return runTrace(*options);
    };
    return {command, work};
}

}  // namespace morvik
