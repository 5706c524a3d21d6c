// morvik-mpi: `morvik ber` on all processes of an MPI job. Only rank 0 talks to the user.
#include <algorithm>
#include <chrono>
#include <csignal>
#include <memory>
#include <optional>

#include "CommandLine.h"
#include "Programs.h"
#include "base/Error.h"
#include "base/System.h"
#include "ber/BerOptions.h"
#include "ber/Interruption.h"
#include "simulation/MpiWorkers.h"
#include "simulation/MpiWorld.h"

namespace {

using morvik::BerOptions;
using morvik::simulation::MpiWorld;
using morvik::simulation::Plan;

/// One by default: MPI starts a process per core unless told otherwise.
unsigned threadsOf(const BerOptions& options)
{
    return std::max(options.threads, 1U);
}

int runAsRankZero(MpiWorld& world, int argc, const char* const* argv)
{
    const auto makeWorkers = [&world](const BerOptions& options, const Plan& plan) {
        return std::make_unique<morvik::simulation::MpiWorkers>(
            world, plan, threadsOf(options), options.instructionSet);
    };
    const morvik::Program program = morvik::morvikMpiProgram(makeWorkers);
    const int status = morvik::runCommandLine(*program.arguments, program.commands, argc, argv);

    // The signal may mean that a rank has died. The 500 ms are part of the second that mpirun grants.
    const bool isInterrupted = morvik::Interruption::signal() != 0;
    const auto patience = isInterrupted ? std::chrono::milliseconds(500) : std::chrono::minutes(1);
    if (!dismissOthers(world, patience)) {
        world.abandon();
    }
    return status;
}

/// Parses the same arguments as rank 0, which reports what is wrong with them.
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
    } catch (const morvik::base::Error&) {
    }
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        std::signal(signal, SIG_IGN);  // rank 0 gets them, too, and stops all ranks once its work is saved
    }
    morvik::simulation::workForRankZero(plan ? &*plan : nullptr, threadsOf(options), options.instructionSet);
    return morvik::success;
}

}  // namespace

int main(int argc, char** argv)
{
    morvik::base::system::prepareProgram(argc, argv);  // before MPI opens anything
    MpiWorld world;
    return world.rank() == 0 ? runAsRankZero(world, argc, argv) : runAsOtherRank(argc, argv);
}
