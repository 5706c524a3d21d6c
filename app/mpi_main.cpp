// morvik-mpi: `morvik ber` on all processes of an MPI job. Rank 0 does all that the user sees.
#include <algorithm>
#include <chrono>
#include <csignal>
#include <memory>
#include <optional>

#include "CommandLine.h"
#include "ber/Ber.h"
#include "ber/BerOptions.h"
#include "ber/Interruption.h"
#include "simulation/Error.h"
#include "simulation/MpiWorkers.h"
#include "simulation/MpiWorld.h"

namespace {

using morvik::BerOptions;
using simulation::MpiWorld;
using simulation::Plan;

/// MPI starts a process for each core, unless it is told otherwise.
unsigned threadsOf(const BerOptions& options)
{
    return std::max(options.threads, 1U);
}

int runAsRankZero(MpiWorld& world, int argc, const char* const* argv)
{
    CLI::App app("The error-rate simulation of the morvik LTE turbo decoder, on many machines.", "morvik-mpi");
    app.set_version_flag("--version", "morvik-mpi " MORVIK_VERSION, "Print the version and exit");
    app.require_subcommand(0, 1);
    app.footer("Example:\n  mpirun -n 16 morvik-mpi ber --block-size 512 --output k512.csv");
    const auto makeWorkers = [&world](const BerOptions& options, const Plan& plan) {
        return std::make_unique<simulation::MpiWorkers>(world, plan, threadsOf(options), options.instructionSet);
    };
    // What mpirun gives its processes as standard output is a terminal always, wherever its own goes.
    const morvik::Command ber = morvik::addBer(app, {"morvik-mpi ber", makeWorkers, false});
    ber.arguments->get_option("--threads")->description("Threads of each rank, by default 1");
    const int status = morvik::runCommandLine(app, {ber}, argc, argv);

    // The signal may have come because a rank is dead. The time is part of the second that mpirun grants.
    const bool isInterrupted = morvik::Interruption::signal() != 0;
    const auto patience = isInterrupted ? std::chrono::milliseconds(500) : std::chrono::minutes(1);
    if (!dismissOthers(world, patience)) {
        world.abandon();
    }
    return status;
}

/// Has the same arguments as rank 0. Whatever is wrong with them, rank 0 tells.
int runAsOtherRank(int argc, const char* const* argv)
{
    BerOptions options;
    std::optional<Plan> plan;
    CLI::App app;
    morvik::addBerOptions(*app.add_subcommand("ber"), options);
    try {
        app.parse(argc, argv);
        plan = planOf(options);
    } catch (const CLI::ParseError&) {
    } catch (const simulation::Error&) {
    }
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        std::signal(signal, SIG_IGN);  // rank 0 has them, too, and ends the work of all when its own is saved
    }
    simulation::workForRankZero(plan ? &*plan : nullptr, threadsOf(options), options.instructionSet);
    return morvik::success;
}

}  // namespace

int main(int argc, char** argv)
{
    MpiWorld world;
    return world.rank() == 0 ? runAsRankZero(world, argc, argv) : runAsOtherRank(argc, argv);
}
