// ChildProcess: runs other programs, without a shell.
#include "ChildProcess.h"

#include <fcntl.h>
#include <spawn.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <streambuf>
#include <system_error>
#include <utility>

#include "Descriptor.h"
#include "Printable.h"

namespace morvik::base {

namespace {

[[noreturn]] void fail(int error)
{
    throw std::system_error(error, std::generic_category());
}

/// A file in memory. Unlike a pipe, it never fills up and blocks the program whose standard stream it is.
class MemoryFile {
public:
    explicit MemoryFile(const std::string& content = {}) : itsDescriptor(memfd_create("stream", MFD_CLOEXEC))
    {
        const auto size = static_cast<ssize_t>(content.size());
        if (itsDescriptor < 0 || write(itsDescriptor, content.data(), content.size()) != size ||
            lseek(itsDescriptor, 0, SEEK_SET) != 0) {
            fail(errno);
        }
    }

    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;

    ~MemoryFile()
    {
        close(itsDescriptor);
    }

    int descriptor() const
    {
        return itsDescriptor;
    }

    std::string content() const
    {
        std::string text;
        std::array<char, 4096> piece{};
        for (ssize_t count = 0; (count = pread(itsDescriptor, piece.data(), piece.size(), off_t(text.size()))) > 0;) {
            text.append(piece.data(), static_cast<std::size_t>(count));
        }
        return text;
    }

private:
    int itsDescriptor;
};

/// The descriptors that a program gets as its standard streams.
class Streams {
public:
    explicit Streams(const std::array<int, 3>& descriptors)
    {
        posix_spawn_file_actions_init(&itsActions);
        for (int stream = 0; stream < 3; ++stream) {
            posix_spawn_file_actions_adddup2(&itsActions, descriptors.at(static_cast<std::size_t>(stream)), stream);
        }
    }

    Streams(const Streams&) = delete;
    Streams& operator=(const Streams&) = delete;

    ~Streams()
    {
        posix_spawn_file_actions_destroy(&itsActions);
    }

    const posix_spawn_file_actions_t* actions() const
    {
        return &itsActions;
    }

private:
    posix_spawn_file_actions_t itsActions{};
};

int waitFor(pid_t process)
{
    int status = 0;
    while (waitpid(process, &status, 0) < 0) {
        if (errno != EINTR) {
            fail(errno);
        }
    }
    return status;
}

/// Starts a program with these standard streams.
pid_t start(const std::vector<std::string>& commandLine, const std::array<int, 3>& descriptors)
{
    std::vector<std::string> words = commandLine;
    std::vector<char*> argv;
    argv.reserve(words.size() + 1);
    for (std::string& word : words) {
        argv.push_back(word.data());
    }
    argv.push_back(nullptr);

    const Streams streams(descriptors);
    pid_t process = 0;
    const int error = posix_spawnp(&process, argv[0], streams.actions(), nullptr, argv.data(), environ);
    if (error != 0) {
        fail(error);
    }
    return process;
}

bool isSuccess(int status)
{
    return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

/// Reads what comes out of a pipe.
class PipeBuffer : public std::streambuf {
public:
    explicit PipeBuffer(Descriptor pipe) : itsPipe(std::move(pipe)) {}

    bool isAtEnd() const
    {
        return itsIsAtEnd;
    }

protected:
    int_type underflow() override
    {
        ssize_t count = -1;
        do {
            count = read(itsPipe.number(), itsContent.data(), itsContent.size());
        } while (count < 0 && errno == EINTR);
        if (count <= 0) {
            itsIsAtEnd = count == 0;
            return traits_type::eof();
        }
        setg(itsContent.data(), itsContent.data(), itsContent.data() + count);
        return traits_type::to_int_type(itsContent.front());
    }

private:
    Descriptor itsPipe;
    std::array<char, 65536> itsContent{};
    bool itsIsAtEnd = false;
};

/// The ends of a pipe, which other programs do not inherit.
struct Pipe {
    Pipe()
    {
        std::array<int, 2> ends{};
        if (pipe2(ends.data(), O_CLOEXEC) != 0) {
            fail(errno);
        }
        out = Descriptor(ends[0]);
        in = Descriptor(ends[1]);
    }

    Descriptor out{-1};
    Descriptor in{-1};
};

}  // namespace

std::string Outcome::firstMessage() const
{
    const std::size_t first = err.find_first_not_of('\n');
    if (first == std::string::npos) {
        return "it failed without a message";
    }
    return visible(err.substr(first, err.find('\n', first) - first));
}

Outcome runProgram(const std::vector<std::string>& commandLine, const std::string& input)
{
    const MemoryFile in(input);
    const MemoryFile out;
    const MemoryFile err;
    const int status = waitFor(start(commandLine, {in.descriptor(), out.descriptor(), err.descriptor()}));
    return {isSuccess(status), out.content(), err.content()};
}

class RunningProgram::Process {
public:
    explicit Process(const std::vector<std::string>& commandLine) : Process(commandLine, Pipe()) {}
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;

    ~Process()
    {
        if (itsNumber > 0) {
            kill(itsNumber, SIGTERM);
            waitpid(itsNumber, nullptr, 0);
        }
    }

    Outcome wait()
    {
        const int status = waitFor(std::exchange(itsNumber, 0));
        return {isSuccess(status), "", itsMessages.content()};
    }

    PipeBuffer buffer;
    std::istream output{&buffer};

private:
    Process(const std::vector<std::string>& commandLine, Pipe pipe)
        : buffer(std::move(pipe.out)),
          itsNumber(start(commandLine, {itsInput.descriptor(), pipe.in.number(), itsMessages.descriptor()}))
    {
    }

    MemoryFile itsInput;
    MemoryFile itsMessages;
    pid_t itsNumber;
};

RunningProgram::RunningProgram(const std::vector<std::string>& commandLine)
    : itsProcess(std::make_unique<Process>(commandLine))
{
}

RunningProgram::~RunningProgram() = default;

std::istream& RunningProgram::output()
{
    return itsProcess->output;
}

bool RunningProgram::isAtEnd() const
{
    return itsProcess->buffer.isAtEnd();
}

Outcome RunningProgram::wait()
{
    return itsProcess->wait();
}

}  // namespace morvik::base
