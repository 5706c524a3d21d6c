// CommandLine: takes a program from its arguments to its exit status.
#include "CommandLine.h"

#include <exception>
#include <iostream>
#include <string>

#include "Notice.h"
#include "base/Error.h"

namespace morvik {

namespace {

/// Reports the failure of a command in one line.
int fail(const std::string& name, const std::string& what)
{
    notice(name + ": " + what);
    return badInputOrUsage;
}

int reportUsage(const CLI::App& app, const CLI::ParseError& error)
{
    const auto named = app.get_subcommands();
    const std::string name = named.empty() ? app.get_name() : app.get_name() + ' ' + named.front()->get_name();
    return fail(name, std::string(error.what()) + "; see '" + name + " --help'");
}

/// Flushes standard output; a failure would otherwise go unnoticed. Returns the exit status.
int finish(const std::string& name, int status)
{
    return std::cout.flush() ? status : fail(name, base::fileError("<stdout>", "written").what());
}

int run(const CLI::App& app, const Command& command)
{
    const std::string name = app.get_name() + ' ' + command.arguments->get_name();
    try {
        return finish(name, command.run());
    } catch (const std::exception& error) {
        return fail(name, error.what());
    }
}

}  // namespace

int runCommandLine(CLI::App& app, const std::vector<Command>& commands, int argc, const char* const* argv)
{
    try {
        app.parse(argc, argv);
    } catch (const CLI::Success& helpOrVersion) {
        return finish(app.get_name(), app.exit(helpOrVersion));
    } catch (const CLI::ParseError& error) {
        return reportUsage(app, error);
    }
    for (const Command& command : commands) {
        if (command.arguments->parsed()) {
            return run(app, command);
        }
    }
    std::cerr << app.help();
    return badInputOrUsage;
}

}  // namespace morvik
