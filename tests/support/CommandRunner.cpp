// CommandRunner: runs a program like a user's shell and captures its output.
#include "CommandRunner.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <stdexcept>
#include <utility>

namespace morvik::support {

namespace {

int openOrThrow(const std::string& path, int flags)
{
    const int descriptor = open(path.c_str(), flags | O_CLOEXEC, 0600);
    if (descriptor < 0) {
        throw std::runtime_error("cannot open " + path);
    }
    return descriptor;
}

}  // namespace

Process::Process(const std::string& program,
                 const std::vector<std::string>& arguments,
                 const std::string& directory,
                 const int (&streams)[3])
{
    std::vector<char*> argv = {const_cast<char*>(program.c_str())};
    for (const std::string& argument : arguments) {
        argv.push_back(const_cast<char*>(argument.c_str()));
    }
    argv.push_back(nullptr);

    itsId = fork();
    if (itsId < 0) {
        throw std::runtime_error("cannot fork");
    }
    if (itsId == 0) {
        bool ready = chdir(directory.c_str()) == 0;
        for (int i = 0; i < 3; ++i) {
            ready = ready && dup2(streams[i], i) == i;
        }
        if (ready) {
            execv(argv[0], argv.data());
        }
        _exit(127);
    }
}

pid_t Process::id() const
{
    return itsId;
}

// NOLINTNEXTLINE(readability-make-member-function-const): the process is gone afterwards.
int Process::wait()
{
    int status = 0;
    if (waitpid(itsId, &status, 0) != itsId) {
        throw std::runtime_error("cannot wait for the program");
    }
    return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
}

// NOLINTNEXTLINE(readability-make-member-function-const): the process is another afterwards.
void Process::send(int signal)
{
    if (kill(itsId, signal) != 0) {
        throw std::runtime_error("cannot send a signal");
    }
}

CommandRunner::CommandRunner(std::string program) : itsProgram(std::move(program)) {}

const std::string& CommandRunner::program() const
{
    return itsProgram;
}

const std::string& CommandRunner::directory() const
{
    return itsFolder.path();
}

void CommandRunner::write(const std::string& file, const std::string& text) const
{
    itsFolder.write(file, text);
}

std::string CommandRunner::read(const std::string& file) const
{
    return itsFolder.read(file);
}

std::vector<std::string> CommandRunner::names() const
{
    return itsFolder.names();
}

CommandResult CommandRunner::run(const std::vector<std::string>& arguments,
                                 const std::string& input,
                                 const std::string& output) const
{
    const std::string out = output.empty() ? ".out" : output;
    const int streams[] = {openOrThrow(itsFolder.path(input), O_RDONLY),
                           openOrThrow(itsFolder.path(out), O_WRONLY | O_CREAT | O_TRUNC),
                           openOrThrow(itsFolder.path(".err"), O_WRONLY | O_CREAT | O_TRUNC)};
    Process process(itsProgram, arguments, directory(), streams);
    for (const int stream : streams) {
        close(stream);
    }
    const int status = process.wait();
    return {status, output.empty() ? read(out) : std::string(), read(".err")};
}

}  // namespace morvik::support
