// BerOptions: the arguments of `morvik ber`.
#include "BerOptions.h"

#include <algorithm>
#include <array>
#include <functional>
#include <iterator>
#include <utility>
#include <vector>

#include "Arguments.h"
#include "DecoderOptions.h"
#include "Lists.h"
#include "base/Error.h"
#include "base/Numbers.h"
#include "base/Shown.h"
#include "base/Thousandths.h"
#include "src/InstructionSetNames.h"

namespace morvik {

namespace {

using base::parseThousandths;
using base::thousandthsText;

constexpr std::uint64_t defaultBlockErrors = 100;
constexpr std::uint64_t defaultMaxBlocks = 1000000;
constexpr double defaultStopBler = 1e-4;
constexpr int largestMilliScale = 1000000;
constexpr std::uint64_t mostPoints = 1000000;

// ---- Elements of the lists

void appendNumPu(const std::string& text, std::vector<unsigned>& values)
{
    if (text != "2" && text != "4" && text != "8") {
        refuse("--num-pu", text, "expected 2, 4 or 8");
    }
    values.push_back(static_cast<unsigned>(text[0] - '0'));
}

void appendAlgorithm(const std::string& text, std::vector<unsigned>& values)
{
    const auto algorithm = simulation::algorithmOf(text);
    if (!algorithm) {
        refuse("--algorithm", text, "expected 0, 1, 2, max-log, scaled or table");
    }
    values.push_back(*algorithm);
}

void appendScale(const std::string& text, std::vector<simulation::ScaleOption>& values)
{
    if (text == "auto") {
        values.emplace_back();
        return;
    }
    const auto milliScale = parseThousandths(text);
    if (!milliScale || *milliScale <= 0 || *milliScale > largestMilliScale) {
        refuse("--scale", text, "expected auto or a number above 0 and up to 1000, with at most three decimals");
    }
    values.emplace_back(*milliScale);
}

void appendIterations(const std::string& text, std::vector<unsigned>& values)
{
    const auto iterations = base::parseNumber<std::uint32_t>(text);
    if (!iterations || *iterations < 1 || *iterations > 15) {
        refuse("--iterations", text, "expected an integer from 1 to 15");
    }
    values.push_back(*iterations);
}

/// What the axes take besides numbers, for messages.
constexpr char orRange[] = ", or START:STEP:STOP";

void appendDecibels(const std::string& option, const std::string& text, std::vector<int>& values)
{
    const std::vector<std::string> parts = splitAt(':', text);
    if (parts.size() == 1) {
        values.push_back(readMilliDecibels(option, text, orRange));
        return;
    }
    if (parts.size() != 3) {
        refuse(option, text, "a range is START:STEP:STOP");
    }
    const int start = readMilliDecibels(option, parts[0], orRange);
    const int step = readMilliDecibels(option, parts[1], orRange);
    const int stop = readMilliDecibels(option, parts[2], orRange);
    if (step <= 0) {
        refuse(option, text, "the step of a range has to be above 0");
    }
    if (stop < start) {
        refuse(option, text, "the range is empty: its stop is below its start");
    }
    for (int value = start; value <= stop; value += step) {
        values.push_back(value);
    }
}

// ---- Single values

/// Parses a count of at least 1.
std::function<void(const std::string&)> countInto(const std::string& option, std::optional<std::uint64_t>& count)
{
    return [option, &count](const std::string& text) {
        count = base::parseNumber<std::uint64_t>(text);
        if (!count || *count == 0) {
            refuse(option, text, "expected an integer from 1 on");
        }
    };
}

/// Parses 90, 90s, 1.5m or 2h.
double parseSeconds(const std::string& option, const std::string& text)
{
    double unit = 1;
    std::string number = text;
    for (const auto& [letter, seconds] : {std::pair('s', 1.0), std::pair('m', 60.0), std::pair('h', 3600.0)}) {
        if (!number.empty() && number.back() == letter) {
            number.pop_back();
            unit = seconds;
            break;
        }
    }
    const auto value = base::parseNumber<double>(number);
    if (!value || !(*value > 0 && *value < 1e9)) {
        refuse(option, text, "expected a number above 0, in seconds or with s, m or h after it");
    }
    return *value * unit;
}

double parseStopBler(const std::string& text)
{
    const auto value = base::parseNumber<double>(text);
    if (!value || !(*value >= 0 && *value <= 1)) {
        refuse("--stop-bler", text, "expected a number from 0 to 1");
    }
    return *value;
}

simulation::FrameRange parseFrames(const std::string& text)
{
    const auto frames = simulation::parseFrameRange(text);
    if (!frames) {
        refuse("--frames", text, "allowed is FROM:TO, two integers, with FROM below TO");
    }
    return *frames;
}

ReplayedFrame parseReplay(const std::string& text)
{
    const std::vector<std::string> parts = splitAt(':', text);
    const auto point = base::parseNumber<std::uint32_t>(parts.front());
    const auto frame = base::parseNumber<std::uint64_t>(parts.back());
    if (parts.size() != 2 || !point || !frame) {
        refuse("--replay", text, "allowed is POINT:FRAME, two integers as in the results");
    }
    return {*point, *frame};
}

// ---- The options in groups

/// Es/N0 and Eb/N0, of which one can be given.
void addAxis(CLI::App& command, simulation::Sweep& sweep)
{
    const auto add = [&](const std::string& option, simulation::Axis axis, const std::string& description) {
        const auto append = [option, axis, &sweep](const std::string& text, std::vector<int>& values) {
            sweep.axis = axis;
            appendDecibels(option, text, values);
        };
        return addListOption(command, option, sweep.milliDecibels, append, description)
            ->type_name("START:STEP:STOP|X[,X...]");
    };
    CLI::Option* const ebn0 =
        add("--ebn0", simulation::Axis::ebn0, "Eb/N0 in dB; by default where the size's rates fall");
    add("--esn0", simulation::Axis::esn0, "Instead of --ebn0: Es/N0, of a symbol, in dB")->excludes(ebn0);
}

void addSweepOptions(CLI::App& command, simulation::Sweep& sweep)
{
    const DecoderOptions usual;
    const auto usualUnits = static_cast<unsigned>(usual.generics.C_NUM_PU);
    const auto usualAlgorithm = static_cast<unsigned>(usual.generics.C_ALGORITHM_TYPE);
    addListOption(command, "--block-size", sweep.blockSizes, appendBlockSize, "Send plain code blocks of K bits")
        ->check(offer(blockSizeWords()))
        ->type_name("K[,K...]");
    sweep.numPus = {usualUnits};
    addListOption(command, "--num-pu", sweep.numPus, appendNumPu, "Parallel processing units: 2, 4 or 8")
        ->check(offer({"2", "4", "8"}))
        ->type_name("N[,N...]")
        ->default_str(std::to_string(usualUnits));
    sweep.algorithms = {usualAlgorithm};
    addListOption(command,
                  "--algorithm",
                  sweep.algorithms,
                  appendAlgorithm,
                  "0 or max-log: max-log-MAP; 1 or scaled: extrinsic values times 0.75; 2 or table: correction table")
        ->check(offer({"0", "1", "2", "max-log", "scaled", "table"}))
        ->type_name("TYPE[,TYPE...]")
        ->default_str(simulation::algorithmName(usualAlgorithm));
    sweep.scaleOptions = {std::nullopt};
    addListOption(command,
                  "--scale",
                  sweep.scaleOptions,
                  appendScale,
                  "Soft value for amplitude 1 of plain BPSK, otherwise for a log-likelihood ratio of 1; "
                  "auto: what suits the algorithm and the channel")
        ->check(offer({"auto"}))
        ->type_name("X[,X...]")
        ->default_str("auto");
    sweep.iterations = {usual.iterations};
    addListOption(command, "--iterations", sweep.iterations, appendIterations, "Turbo iterations, 1 to 15")
        ->type_name("N[,N...]")
        ->default_str(std::to_string(usual.iterations));
    addAxis(command, sweep);
}

void addRuleOptions(CLI::App& command, BerOptions& options)
{
    const auto add = [&command](const std::string& name, std::optional<std::uint64_t>& count, const std::string& text) {
        command.add_option_function<std::string>(name, countInto(name, count), text)->type_name("N");
    };
    add("--block-errors", options.blockErrors, "End a point with the block error N (100, if no other error ends it)");
    add("--bit-errors", options.bitErrors, "End a point with the bit error N");
    add("--max-blocks", options.maxBlocks, "End a point with the block N (1000000)");
    command
        .add_option_function<std::string>(
            "--max-time",
            [&options](const std::string& text) { options.maxSeconds = parseSeconds("--max-time", text); },
            "End a point after a time, such as 90, 1.5m or 2h; the only rule by which two runs can differ")
        ->type_name("T");
    command
        .add_option_function<std::string>(
            "--stop-bler",
            [&options](const std::string& text) { options.stopBler = parseStopBler(text); },
            "End a curve after the first point with a lower block error rate (0.0001; never if --ebn0 is given)")
        ->type_name("RATE");
    command
        .add_option_function<std::string>(
            "--frames",
            [&options](const std::string& text) { options.frames = parseFrames(text); },
            "Simulate the blocks FROM to TO - 1 of each point, all of them unless rules are given")
        ->type_name("FROM:TO");
    command.add_flag("--each-iteration", options.eachIteration, "Count errors after each iteration");
    command
        .add_option_function<std::string>(
            "--seed",
            [&options](const std::string& text) {
                const auto seed = base::parseNumber<std::uint64_t>(text);
                if (!seed) {
                    refuse("--seed", text, "expected an integer from 0 to 18446744073709551615");
                }
                options.seed = *seed;
            },
            "What bits and noise follow from")
        ->type_name("N")
        ->default_str("1");
}

/// "a, b or c".
std::string anyOf(const std::vector<std::string>& words)
{
    std::string text = words.front();
    for (std::size_t i = 1; i < words.size(); ++i) {
        text += (i + 1 < words.size() ? ", " : " or ") + words[i];
    }
    return text;
}

void addExecutionOptions(CLI::App& command, BerOptions& options)
{
    command.add_option("--threads", options.threads, "Threads, each with a decoder; by default as many as cores")
        ->transform(integerFrom(1, 1024))
        ->type_name("N");
    const std::vector<std::string> instructionSets(std::begin(instructionSetNames), std::end(instructionSetNames));
    command
        .add_option("--instruction-set",
                    options.instructionSet,
                    anyOf(instructionSets) + "; by default the fastest. All give the same results")
        ->check(offer(instructionSets))
        ->type_name("NAME");
    CLI::Option* const output =
        command.add_option("--output", options.output, "Results, as CSV or JSON by the ending .csv or .json")
            ->type_name("FILE");
    command
        .add_option_function<std::string>(
            "--checkpoint-interval",
            [&options](const std::string& text) {
                options.secondsBetweenCheckpoints = parseSeconds("--checkpoint-interval", text);
            },
            "Time between checkpoints, the most that a crash may lose, such as 10 or 5m")
        ->type_name("T")
        ->default_str("3");
    CLI::Option* const resume =
        command
            .add_flag("--resume",
                      options.resume,
                      "Go on where the run was stopped or, with larger limits than it had, where it ended")
            ->needs(output);
    command.add_flag("--overwrite", options.overwrite, "Replace earlier results, finished or not")
        ->needs(output)
        ->excludes(resume);
    command.add_flag("--quiet", options.quiet, "Print no table");
    command
        .add_option_function<std::string>(
            "--replay",
            [&options](const std::string& text) { options.replay = parseReplay(text); },
            "Write one block's soft values and bits, as 'morvik decode' reads them, and simulate nothing")
        ->type_name("POINT:FRAME");
}

// ---- The command that repeats a run

/// Lists ascending values; three or more with equal steps become a range.
std::string rangesText(const std::vector<int>& values)
{
    std::string list;
    for (std::size_t first = 0; first < values.size();) {
        std::size_t last = std::min(first + 1, values.size() - 1);
        const int step = values[last] - values[first];
        while (last + 1 < values.size() && values[last + 1] - values[last] == step) {
            ++last;
        }
        const bool isRange = last > first + 1;
        list += (list.empty() ? "" : ",") + thousandthsText(values[first]);
        list += isRange ? ':' + thousandthsText(step) + ':' + thousandthsText(values[last]) : "";
        first = isRange ? last + 1 : first + 1;
    }
    return list;
}

/// Holds the options that determine the results, and no others.
std::string commandOf(const BerOptions& options, const simulation::StopRules& rules)
{
    const simulation::Sweep& sweep = options.sweep;
    const auto number = [](auto value) {
        return std::to_string(value);
    };
    std::string command = "morvik ber";
    const auto add = [&command](const std::string& option, const std::string& value) {
        command += ' ' + option + ' ' + value;
    };
    if (!sweep.blockSizes.empty()) {
        add("--block-size", listed(sweep.blockSizes, number));
    }
    command += morvik::commandOf(options.link);
    add("--num-pu", listed(sweep.numPus, number));
    add("--algorithm", listed(sweep.algorithms, simulation::algorithmName));
    add("--scale", listed(sweep.scaleOptions, simulation::scaleOptionText));
    add("--iterations", listed(sweep.iterations, number));
    if (!sweep.milliDecibels.empty()) {
        add(sweep.axis == simulation::Axis::ebn0 ? "--ebn0" : "--esn0", rangesText(sweep.milliDecibels));
    }
    const auto addCount = [&](const std::string& option, const std::optional<std::uint64_t>& count) {
        if (count) {
            add(option, std::to_string(*count));
        }
    };
    addCount("--block-errors", rules.blockErrors);
    addCount("--bit-errors", rules.bitErrors);
    addCount("--max-blocks", rules.maxBlocks);
    if (rules.maxSeconds) {
        add("--max-time", base::numberText(*rules.maxSeconds));
    }
    add("--stop-bler", base::numberText(rules.stopBler));
    if (options.frames) {
        add("--frames", std::to_string(options.frames->from) + ':' + std::to_string(options.frames->to));
    }
    command += options.eachIteration ? " --each-iteration" : "";
    add("--seed", std::to_string(options.seed));
    return command;
}

simulation::StopRules rulesOf(const BerOptions& options)
{
    simulation::StopRules rules;
    rules.blockErrors = options.blockErrors;
    rules.bitErrors = options.bitErrors;
    rules.maxBlocks = options.maxBlocks;
    rules.maxSeconds = options.maxSeconds;
    rules.stopBler = options.stopBler.value_or(0);
    if (!options.frames) {
        if (!rules.blockErrors && !rules.bitErrors) {
            rules.blockErrors = defaultBlockErrors;
        }
        rules.maxBlocks = options.maxBlocks.value_or(defaultMaxBlocks);
        rules.stopBler = options.stopBler.value_or(options.sweep.milliDecibels.empty() ? defaultStopBler : 0);
    }
    return rules;
}

}  // namespace

void addBerOptions(CLI::App& command, BerOptions& options)
{
    addSweepOptions(command, options.sweep);
    addLinkOptions(command, options.link);
    addEarlyStop(command, options.link);
    addRuleOptions(command, options);
    addExecutionOptions(command, options);
    addPictureOptions(command, options.pictures);
    command.callback([&options] {
        if (options.sweep.blockSizes.empty() && !options.link.hasTransportBlocks()) {
            throw CLI::RequiredError("--block-size, --transport-block-size or --mcs");
        }
        if (options.quiet && options.output.empty() && !options.pictures.isAskedFor()) {
            throw CLI::RequiresError("--quiet", "--output, --plot or --report");
        }
    });
}

simulation::Plan planOf(const BerOptions& options)
{
    if (options.eachIteration && options.sweep.iterations.size() > 1) {
        throw base::Error("--each-iteration counts up to one number of --iterations, give only the largest");
    }
    const std::vector<unsigned>& versions = options.link.versions;
    if (options.eachIteration && versions.size() > 1) {
        throw base::Error("--each-iteration counts one transmission, --redundancy-versions " +
                          simulation::versionsText(versions, ',') + " are " + std::to_string(versions.size()));
    }
    if (options.eachIteration && options.link.stopsEarly.value_or(false)) {
        throw base::Error(
            "--each-iteration counts after every iteration, --early-stop crc keeps one: give one of them");
    }
    simulation::Sweep sweep = options.sweep;
    sweep.formats = simulation::formatsOf(options.link, !sweep.blockSizes.empty());
    const std::uint64_t points = simulation::countOfPoints(sweep);
    if (points > mostPoints) {
        throw base::Error("the lists combine to " + std::to_string(points) + " points, a run has " +
                          std::to_string(mostPoints) + " at most");
    }
    simulation::Plan plan;
    plan.points = simulation::pointsOf(sweep);
    plan.eachIteration = options.eachIteration;
    plan.rules = rulesOf(options);
    plan.frames = options.frames.value_or(plan.frames);
    plan.seed = options.seed;
    plan.version = MORVIK_VERSION;
    plan.command = commandOf(options, plan.rules);
    return plan;
}

}  // namespace morvik
