// morvik: the command line of the decoder model.
#include <exception>
#include <iostream>
#include <string>
#include <vector>

#include "Ber.h"
#include "Command.h"
#include "Decode.h"
#include "Merge.h"

namespace {

using morvik::Command;

/// Writes the one line that ends a failed command.
int fail(const std::string& name, const std::string& what)
{
    std::cerr << name << ": " << what << std::endl;
    return morvik::badInputOrUsage;
}

int reportUsage(const CLI::App& app, const CLI::ParseError& error)
{
    const auto named = app.get_subcommands();
    const std::string name = named.empty() ? app.get_name() : app.get_name() + ' ' + named.front()->get_name();
    return fail(name, std::string(error.what()) + "; '" + name + " --help' tells what is allowed");
}

int run(const CLI::App& app, const Command& command)
{
    try {
        return command.run();
    } catch (const std::exception& error) {
        return fail(app.get_name() + ' ' + command.arguments->get_name(), error.what());
    }
}

}  // namespace

int main(int argc, char** argv)
{
    std::ios::sync_with_stdio(false);  // a trace writes millions of small pieces

    CLI::App app("The bit-accurate model of the morvik LTE turbo decoder, at the command line.", "morvik");
    app.set_version_flag("--version", "morvik " MORVIK_VERSION, "Print the version and exit");
    app.require_subcommand(0, 1);  // so that a file may bear the name of a subcommand
    app.footer("Example:\n  morvik decode k40.csv --reference k40.bits\n\n'morvik SUBCOMMAND --help' tells the rest.");

    const std::vector<Command> commands = {morvik::addDecode(app), morvik::addBer(app), morvik::addMerge(app)};

    try {
        app.parse(argc, argv);
    } catch (const CLI::Success& helpOrVersion) {
        return app.exit(helpOrVersion);
    } catch (const CLI::ParseError& error) {
        return reportUsage(app, error);
    }
    for (const Command& command : commands) {
        if (command.arguments->parsed()) {
            return run(app, command);
        }
    }
    std::cerr << app.help();
    return morvik::badInputOrUsage;
}
