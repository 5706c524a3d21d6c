// SystemPosix: the operating system where it is POSIX, with what Linux adds.
#include <fcntl.h>
#include <spawn.h>
#include <sys/file.h>
#include <sys/ioctl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <initializer_list>
#include <system_error>
#include <utility>

#include "System.h"

namespace morvik::base {

Descriptor::~Descriptor()
{
    const int reason = errno;
    close(itsNumber);
    errno = reason;
}

bool Descriptor::write(std::string_view content) const
{
    while (!content.empty()) {
        const ssize_t written = ::write(itsNumber, content.data(), content.size());
        if (written < 0 && errno != EINTR) {
            return false;
        }
        content.remove_prefix(written > 0 ? static_cast<std::size_t>(written) : 0);
    }
    return true;
}

bool Descriptor::writeAt(std::uint64_t place, std::string_view content) const
{
    return pwrite(itsNumber, content.data(), content.size(), static_cast<off_t>(place)) ==
           static_cast<ssize_t>(content.size());
}

std::int64_t Descriptor::read(char* content, std::size_t size) const
{
    ssize_t count = -1;
    do {
        count = ::read(itsNumber, content, size);
    } while (count < 0 && errno == EINTR);
    return count;
}

std::int64_t Descriptor::readAt(std::uint64_t place, char* content, std::size_t size) const
{
    return pread(itsNumber, content, size, static_cast<off_t>(place));
}

bool Descriptor::rewind() const
{
    return lseek(itsNumber, 0, SEEK_SET) == 0;
}

bool Descriptor::sync() const
{
    return fsync(itsNumber) == 0 || errno == EINVAL;  // EINVAL: not supported by the file system
}

bool Descriptor::lock() const
{
    return flock(itsNumber, LOCK_EX | LOCK_NB) == 0 || errno != EWOULDBLOCK;
}

namespace system {

namespace {

[[noreturn]] void fail(int error)
{
    throw std::system_error(error, std::generic_category());
}

FileStatus statusOf(const struct stat& found)
{
    return {S_ISREG(found.st_mode),
            found.st_mode & (S_IRWXU | S_IRWXG | S_IRWXO),
            static_cast<std::uint64_t>(found.st_size),
            found.st_dev,
            found.st_ino};
}

/// The link to an open file of this process.
std::string linkTo(const Descriptor& file)
{
    return "/proc/self/fd/" + std::to_string(file.number());
}

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

/// Replaces the handler of those signals whose handler is `present`.
void replaceHandler(void (*present)(int), void (*next)(int), int flags)
{
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        struct sigaction action = {};
        sigaction(signal, nullptr, &action);
        if (action.sa_handler == present) {
            action.sa_handler = next;
            action.sa_flags = flags;
            sigemptyset(&action.sa_mask);
            sigaction(signal, &action, nullptr);
        }
    }
}

}  // namespace

const char* const nowhere = "/dev/null";

bool isSameName(const std::string& a, const std::string& b)
{
    return a == b;
}

std::optional<FileStatus> statusOf(const std::string& name)
{
    struct stat found = {};
    return stat(name.c_str(), &found) == 0 ? std::optional(statusOf(found)) : std::nullopt;
}

std::optional<FileStatus> statusOf(int descriptor)
{
    struct stat found = {};
    return fstat(descriptor, &found) == 0 ? std::optional(statusOf(found)) : std::nullopt;
}

bool isWritable(const std::string& name)
{
    return access(name.c_str(), W_OK) == 0;
}

Descriptor openDevice(const std::string& name)
{
    return Descriptor(open(name.c_str(), O_WRONLY | O_NOCTTY | O_CLOEXEC));
}

Descriptor duplicate(int descriptor)
{
    return Descriptor(fcntl(descriptor, F_DUPFD_CLOEXEC, standardError + 1));
}

Descriptor createUnnamed(const std::string& folder, unsigned permissions)
{
    Descriptor file(open(folder.c_str(), O_TMPFILE | O_WRONLY | O_CLOEXEC, permissions));
    // It is named through this link, which takes a /proc.
    return file.isOpen() && access(linkTo(file).c_str(), F_OK) == 0 ? std::move(file) : Descriptor(-1);
}

bool nameFile(const Descriptor& file, const std::string& name)
{
    return linkat(AT_FDCWD, linkTo(file).c_str(), AT_FDCWD, name.c_str(), AT_SYMLINK_FOLLOW) == 0;
}

Descriptor createFile(const std::string& name, unsigned permissions)
{
    return Descriptor(open(name.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, permissions));
}

bool allow(const Descriptor& file, unsigned permissions)
{
    return fchmod(file.number(), permissions) == 0;
}

bool replaceFile(const Descriptor& /*file*/, const std::string& from, const std::string& to)
{
    return std::rename(from.c_str(), to.c_str()) == 0;
}

bool moveFile(const std::string& from, const std::string& to)
{
    return std::rename(from.c_str(), to.c_str()) == 0;
}

bool removeFile(const std::string& name)
{
    return unlink(name.c_str()) == 0;
}

void syncFolder(const std::string& folder)
{
    Descriptor(open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)).sync();
}

std::string makeTemporaryFolder(const std::string& prefix)
{
    std::string name = (std::filesystem::temp_directory_path() / (prefix + "XXXXXX")).string();
    return mkdtemp(name.data()) == nullptr ? "" : name;
}

std::uint64_t processNumber()
{
    return static_cast<std::uint64_t>(getpid());
}

Ownership::Ownership(std::string name) : itsName(std::move(name))
{
    const auto isOurs = [this] {
        const auto own = statusOf(itsLock.number());
        const auto named = statusOf(itsName);
        return own && named && own->isSameFileAs(*named);
    };
    // Between open() and the lock, the file may have been removed, or replaced by one that another process has locked.
    constexpr int patience = 100;  // for file systems without stable inode numbers
    for (int i = 0; i < patience && !itsIsTaken && !isOurs(); ++i) {
        itsLock = Descriptor(open(itsName.c_str(), O_RDWR | O_CREAT | O_NOFOLLOW | O_CLOEXEC, 0666));
        itsIsTaken = itsLock.isOpen() && !itsLock.lock();
    }
}

Ownership::~Ownership()
{
    const auto own = statusOf(itsLock.number());
    const auto named = statusOf(itsName);
    if (!itsIsTaken && own && own->size == 0 && named && own->isSameFileAs(*named)) {
        removeFile(itsName);
    }
}

bool Ownership::isNew() const
{
    const auto own = statusOf(itsLock.number());
    return own && own->size == 0;
}

void Ownership::moveTo(Descriptor file)
{
    itsLock = std::move(file);
}

std::string nameOfLock(const std::string& name)
{
    return name;
}

Descriptor temporaryFile()
{
    return Descriptor(memfd_create("stream", MFD_CLOEXEC));
}

Pipe makePipe()
{
    std::array<int, 2> ends = {-1, -1};
    if (pipe2(ends.data(), O_CLOEXEC) != 0) {
        ends = {-1, -1};
    }
    return {Descriptor(ends[0]), Descriptor(ends[1])};
}

Process::Process(const std::vector<std::string>& commandLine, const std::array<int, 3>& streams)
{
    std::vector<std::string> words = commandLine;
    std::vector<char*> argv;
    argv.reserve(words.size() + 1);
    for (std::string& word : words) {
        argv.push_back(word.data());
    }
    argv.push_back(nullptr);

    const Streams given(streams);
    pid_t process = 0;
    const int error = posix_spawnp(&process, argv[0], given.actions(), nullptr, argv.data(), environ);
    if (error != 0) {
        fail(error);
    }
    itsNumber = process;
}

Process::~Process()
{
    if (itsNumber > 0) {
        kill(static_cast<pid_t>(itsNumber), SIGTERM);
        waitpid(static_cast<pid_t>(itsNumber), nullptr, 0);
    }
}

bool Process::wait()
{
    const auto process = static_cast<pid_t>(std::exchange(itsNumber, 0));
    int status = 0;
    while (waitpid(process, &status, 0) < 0) {
        if (errno != EINTR) {
            fail(errno);
        }
    }
    return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

std::optional<std::size_t> terminalWidth()
{
    winsize size = {};
    if (isatty(standardOutput) == 0) {
        return std::nullopt;
    }
    const bool isKnown = ioctl(standardOutput, TIOCGWINSZ, &size) == 0 && size.ws_col > 0;
    return isKnown ? size.ws_col : 80;
}

void watchEndRequests(void (*note)(int signal))
{
    replaceHandler(SIG_DFL, note, static_cast<int>(SA_RESETHAND | SA_RESTART));
}

void unwatchEndRequests(void (*note)(int signal))
{
    replaceHandler(note, SIG_DFL, 0);
}

void prepareProgram(int& /*argc*/, char**& /*argv*/)
{
    for (const int stream : {standardInput, standardOutput, standardError}) {
        if (fcntl(stream, F_GETFD) >= 0 || errno != EBADF) {
            continue;
        }
        // open() returns the lowest free number, this one. Using it in the other direction fails as on a closed stream.
        if (open("/dev/null", stream == standardInput ? O_WRONLY : O_RDONLY) != stream) {
            std::abort();
        }
    }
    std::signal(SIGXFSZ, SIG_IGN);
}

}  // namespace system

}  // namespace morvik::base
