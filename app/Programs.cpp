// Programs: the arguments of `morvik` and `morvik-mpi`.
#include "Programs.h"

#include "Encode.h"
#include "Trace.h"
#include "Vectors.h"
#include "ber/Merge.h"
#include "compare/Compare.h"
#include "coverage/Coverage.h"
#include "decode/Decode.h"
#include "doctor/Doctor.h"
#include "info/Info.h"
#include "selftest/SelfTest.h"

namespace morvik {

Program::Program(const std::string& name, const std::string& description)
    : arguments(std::make_unique<CLI::App>(description, name))
{
    arguments->set_version_flag("--version", name + " " MORVIK_VERSION, "Print the version and exit");
    arguments->require_subcommand(0, 1);            // so that a file may be named like a subcommand
    arguments->allow_windows_style_options(false);  // the same command line everywhere
}

Program morvikProgram()
{
    Program program("morvik", "The bit-accurate model of the morvik LTE turbo decoder, at the command line.");
    CLI::App& app = *program.arguments;
    app.footer(
        "Example:\n  morvik decode k40.csv --reference k40.bits\n\n'morvik SUBCOMMAND --help' describes each "
        "subcommand.");
    program.commands = {
        addDecode(app),
        addEncode(app),
        addBer(app),
        addMerge(app),
        addVectors(app),
        addTrace(app),
        addCompare(app),
        addCoverage(app),
        addDoctor(app),
        addInfo(app),
        addSelfTest(app),
    };
    return program;
}

Program morvikMpiProgram(const decltype(BerMeans::makeWorkers)& makeWorkers)
{
    Program program("morvik-mpi", "The error-rate simulation of the morvik LTE turbo decoder, on many machines.");
    CLI::App& app = *program.arguments;
    app.footer("Example:\n  mpirun -n 16 morvik-mpi ber --block-size 512 --output k512.csv");
    // mpirun always gives its processes a terminal as standard output, even if its own is redirected.
    program.commands = {addBer(app, {"morvik-mpi ber", makeWorkers, false})};
    program.commands.front().arguments->get_option("--threads")->description("Threads of each rank, by default 1");
    return program;
}

}  // namespace morvik
