// Ber: the subcommand that simulates error rates.
#include "Ber.h"

#include <algorithm>
#include <iostream>
#include <memory>
#include <optional>
#include <string>
#include <thread>

#include "BerOptions.h"
#include "Interruption.h"
#include "LiveTable.h"
#include "Notice.h"
#include "Pictures.h"
#include "base/Error.h"
#include "base/OutputFile.h"
#include "base/Path.h"
#include "base/Shown.h"
#include "base/System.h"
#include "base/Text.h"
#include "hardware/testbench/Decoder.h"
#include "simulation/Journal.h"
#include "simulation/LinkWords.h"
#include "simulation/Replay.h"
#include "simulation/Run.h"
#include "simulation/ThreadWorkers.h"
#include "simulation/Warnings.h"
#include "src/InstructionSetNames.h"

namespace morvik {

namespace {

/// Ignores all progress.
class NoTable : public simulation::Progress {
public:
    void isAt(const simulation::PointResult&) override {}
    void hasEnded(const simulation::PointResult&) override {}
};

std::unique_ptr<simulation::Progress> progressOf(const BerMeans& means,
                                                 const BerOptions& options,
                                                 const simulation::Plan& plan)
{
    if (options.quiet) {
        return std::make_unique<NoTable>();
    }
    return std::make_unique<LiveTable>(
        plan, std::cout, means.hasTerminal ? base::system::terminalWidth() : std::nullopt);
}

std::unique_ptr<simulation::Workers> makeThreads(const BerOptions& options, const simulation::Plan& plan)
{
    const unsigned threads = options.threads > 0 ? options.threads : std::max(std::thread::hardware_concurrency(), 1U);
    return std::make_unique<simulation::ThreadWorkers>(plan, threads, options.instructionSet);
}

bool hasInstructionSet(const std::string& name)
{
    try {
        Decoder(veltra_ip_morvik_v1_0_get_default_generics(), std::cerr).useInstructionSet(name);
        return true;
    } catch (const Refusal&) {
        return false;
    }
}

/// Throws Error if the decoder does not know the instruction set or this machine lacks it.
void checkInstructionSet(const std::string& name)
{
    if (name.empty() || hasInstructionSet(name)) {
        return;
    }
    std::string message = "--instruction-set: " + base::shown(name) + " is not allowed, this machine has";
    const char* separator = " ";
    for (const char* const each : instructionSetNames) {
        if (hasInstructionSet(each)) {
            message += separator + std::string(each);
            separator = ", ";
        }
    }
    throw base::Error(message);
}

void warn(const BerMeans& means, const std::string& warning)
{
    if (!warning.empty()) {
        notice(means.command + ": " + warning);
    }
}

int simulate(const BerMeans& means, const BerOptions& options, const simulation::Plan& plan)
{
    using simulation::Journal;
    const Interruption interruption;
    Journal journal(plan,
                    options.output,
                    options.resume      ? Journal::Earlier::resume
                    : options.overwrite ? Journal::Earlier::overwrite
                                        : Journal::Earlier::refuse);
    Pictures pictures(options.pictures, options.output, {});
    pictures.takeAxis(axisOf(plan.points));
    if (options.resume && journal.isEmpty()) {
        notice(means.command + ": nothing to resume, starts from the beginning");
    }
    warn(means, highRateWarning(plan));
    warn(means, narrowBufferWarning(plan));
    bool isComplete = false;
    {
        const auto workers = means.makeWorkers(options, plan);
        const auto progress = progressOf(means, options, plan);
        const auto isInterrupted = [] {
            return Interruption::signal() != 0;
        };
        isComplete = run(plan, {*workers, journal, *progress, isInterrupted, options.secondsBetweenCheckpoints});
    }
    if (!journal.ended().empty()) {
        const std::string points = std::to_string(journal.ended().size()) + " of " + std::to_string(plan.points.size());
        pictures.draw(resultsOf(plan, journal.ended()), points);
    }
    if (isComplete) {
        if (options.sweep.milliDecibels.empty()) {
            warn(means, unfallenWarning(plan, journal.ended()));
        }
        return success;
    }
    notice(means.command + ": interrupted" +
           (options.output.empty() ? "" : ", --resume goes on from " + journal.checkpointName()));
    return 128 + Interruption::signal();
}

/// Names the files after the output, but never overwrites it.
int replayFrame(const BerOptions& options, const simulation::Plan& plan, const ReplayedFrame& replayed)
{
    if (replayed.point >= plan.points.size()) {
        throw base::Error("--replay: there is no point " + std::to_string(replayed.point) + ", the last one is " +
                          std::to_string(plan.points.size() - 1));
    }
    const auto [softValues, sentBits, wrongBits] =
        simulation::replay(plan, replayed.point, replayed.frame, options.instructionSet);
    const std::string stem = base::pathOf(options.output).replace_extension().u8string();
    const std::string name = stem + (stem.empty() ? "" : ".") + "point" + std::to_string(replayed.point) + ".frame" +
                             std::to_string(replayed.frame);
    base::writeFile(name + ".csv", softValues);
    base::writeFile(name + ".bits", sentBits);

    const simulation::Point& point = plan.points[replayed.point];
    print(base::counted(wrongBits, "wrong bit") + '\n' + "morvik decode " + name + ".csv --reference " + name +
          ".bits --num-pu " + std::to_string(point.numPu) + " --algorithm " +
          simulation::algorithmName(point.algorithm) + " --iterations " + std::to_string(point.iterations) + '\n');
    return success;
}

int ber(const BerMeans& means, const BerOptions& options)
{
    const simulation::Plan plan = planOf(options);
    checkInstructionSet(options.instructionSet);
    return options.replay ? replayFrame(options, plan, *options.replay) : simulate(means, options, plan);
}

/// The end of the help text.
constexpr char berExplanation[] =
    R"(Simulates every combination of the options that take lists: plain code blocks, with BPSK over
white Gaussian noise unless another modulation or channel is named, or transport blocks of
3GPP TS 36.212. Eb/N0 counts tail and CRCs as energy, not as information. The same seed gives the same
results whatever the number of threads or the machine. docs/error_rates.md tells the rest.

Exit status: 0 all simulated, 2 bad input or usage, 128 and the signal's number when a
signal ended the run; --resume goes on then, as it does after a crash.

Example: the waterfall of 512 bits after four and after eight iterations
  morvik ber --block-size 512 --iterations 4,8 --output k512.csv

Example: the throughput of each MCS
  morvik ber --mcs 0:28 --resource-blocks 6 --resource-elements 138 --plot mcs.svg)";

}  // namespace

Command addBer(CLI::App& app)
{
    return addBer(app, {"morvik ber", makeThreads, true});
}

Command addBer(CLI::App& app, const BerMeans& means)
{
    CLI::App* command = app.add_subcommand("ber", "Simulate bit and block error rates");
    const auto options = std::make_shared<BerOptions>();
    addBerOptions(*command, *options);
    command->footer(berExplanation);
    const auto run = [means, options] {
        return ber(means, *options);
    };
    return {command, run};
}

}  // namespace morvik
