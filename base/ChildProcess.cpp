// ChildProcess: runs another program to completion, without a shell.
#include "ChildProcess.h"

#include <spawn.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <system_error>

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

}  // namespace

Outcome runProgram(const std::vector<std::string>& commandLine, const std::string& input)
{
    std::vector<std::string> words = commandLine;
    std::vector<char*> argv;
    argv.reserve(words.size() + 1);
    for (std::string& word : words) {
        argv.push_back(word.data());
    }
    argv.push_back(nullptr);

    const MemoryFile in(input);
    const MemoryFile out;
    const MemoryFile err;
    const Streams streams({in.descriptor(), out.descriptor(), err.descriptor()});
    pid_t process = 0;
    const int error = posix_spawnp(&process, argv[0], streams.actions(), nullptr, argv.data(), environ);
    if (error != 0) {
        fail(error);
    }
    const int status = waitFor(process);
    return {WIFEXITED(status) && WEXITSTATUS(status) == 0, out.content(), err.content()};
}

}  // namespace morvik::base
