// CommandRunner: runs a program as a user's shell would, and keeps what it printed.
#include "CommandRunner.h"

#include <fcntl.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>
#include <utility>

namespace support {

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

// NOLINTNEXTLINE(readability-make-member-function-const): the process is gone afterwards.
int Process::wait()
{
    int status = 0;
    if (waitpid(itsId, &status, 0) != itsId) {
        throw std::runtime_error("cannot wait for the program");
    }
    return WIFEXITED(status) ? WEXITSTATUS(status) : -WTERMSIG(status);
}

CommandRunner::CommandRunner(std::string program) : itsProgram(std::move(program))
{
    std::string name = (std::filesystem::temp_directory_path() / "morvik-test-XXXXXX").string();
    if (mkdtemp(name.data()) == nullptr) {
        throw std::runtime_error("cannot make a temporary directory");
    }
    itsDirectory = name;
}

CommandRunner::~CommandRunner()
{
    std::error_code ignored;  // what cannot be removed stays among the temporary files
    std::filesystem::remove_all(itsDirectory, ignored);
}

const std::string& CommandRunner::program() const
{
    return itsProgram;
}

const std::string& CommandRunner::directory() const
{
    return itsDirectory;
}

void CommandRunner::write(const std::string& file, const std::string& text) const
{
    std::ofstream(path(file), std::ios::binary) << text;
}

std::string CommandRunner::read(const std::string& file) const
{
    std::ifstream stream(path(file), std::ios::binary);
    if (!stream) {
        throw std::runtime_error("cannot read " + file);
    }
    return std::string(std::istreambuf_iterator<char>(stream), {});
}

CommandResult CommandRunner::run(const std::vector<std::string>& arguments,
                                 const std::string& input,
                                 const std::string& output) const
{
    const std::string out = output.empty() ? ".out" : output;
    const int streams[] = {openOrThrow(path(input), O_RDONLY),
                           openOrThrow(path(out), O_WRONLY | O_CREAT | O_TRUNC),
                           openOrThrow(path(".err"), O_WRONLY | O_CREAT | O_TRUNC)};
    Process process(itsProgram, arguments, itsDirectory, streams);
    for (const int stream : streams) {
        close(stream);
    }
    const int status = process.wait();
    return {status, output.empty() ? read(out) : std::string(), read(".err")};
}

std::string CommandRunner::path(const std::string& file) const
{
    return (std::filesystem::path(itsDirectory) / file).string();  // an absolute name stays as it is
}

}  // namespace support
