// OutputFile: writes files.
#include "OutputFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <iostream>
#include <optional>
#include <system_error>
#include <utility>

#include "Error.h"
#include "Numbers.h"

namespace morvik::base {

namespace {

/// Longest chain of symbolic links, as in Linux.
constexpr int mostLinks = 40;

constexpr std::size_t bufferSize = 65536;

constexpr mode_t permissions = S_IRWXU | S_IRWXG | S_IRWXO;

/// What a name resolves to through links: a path, existing or not, or an open descriptor of this process.
struct Place {
    std::string path;
    std::optional<int> descriptor;
};

/// The descriptor that such a path names: its link may not lead to any path.
std::optional<int> descriptorNamed(std::string_view path)
{
    for (const std::string_view folder : {"/dev/fd/", "/proc/self/fd/"}) {
        if (path.substr(0, folder.size()) == folder) {
            return parseNumber<int>(path.substr(folder.size()));
        }
    }
    return std::nullopt;
}

Place placeOf(const std::string& name)
{
    if (name == standardStream) {
        return {{}, STDOUT_FILENO};
    }
    std::filesystem::path path = name;
    for (int links = 0; links <= mostLinks; ++links) {
        std::error_code none;  // set if this is no link
        const auto descriptor = descriptorNamed(path.string());
        const std::filesystem::path next = descriptor ? path : std::filesystem::read_symlink(path, none);
        if (descriptor || none) {
            return {path.string(), descriptor};
        }
        path = path.parent_path() / next;
    }
    errno = ELOOP;
    throw fileError(name, "written");
}

std::string folderOf(const std::string& place)
{
    const std::filesystem::path folder = std::filesystem::path(place).parent_path();
    return folder.empty() ? "." : folder.string();
}

/// A name in the folder that nobody else is likely to use.
std::string temporaryName(const std::string& folder)
{
    static std::atomic<unsigned> count{0};
    return folder + "/.morvik-" + std::to_string(getpid()) + '-' + std::to_string(count++);
}

/// The path of an open file of this process.
std::string nameOf(const Descriptor& file)
{
    return "/proc/self/fd/" + std::to_string(file.number());
}

}  // namespace

OutputFile::OutputFile(const std::string& name) : itsName(name == standardStream ? "<stdout>" : name), itsFile(-1)
{
    const Place place = placeOf(name);
    struct stat old = {};
    if (place.descriptor) {
        std::cout.flush();  // earlier output comes first
        itsFile = Descriptor(fcntl(*place.descriptor, F_DUPFD_CLOEXEC, STDERR_FILENO + 1));
        itsIsStandardOutput = place.descriptor == STDOUT_FILENO;
    } else if (stat(place.path.c_str(), &old) != 0) {
        constexpr mode_t anybody = S_IRUSR | S_IWUSR | S_IRGRP | S_IWGRP | S_IROTH | S_IWOTH;
        if (errno == ENOENT && !name.empty()) {
            openNew(place.path, anybody);
        }
    } else if (!S_ISREG(old.st_mode)) {
        itsFile = Descriptor(open(place.path.c_str(), O_WRONLY | O_NOCTTY | O_CLOEXEC));
    } else if (access(place.path.c_str(), W_OK) == 0) {
        openNew(place.path, old.st_mode & permissions);
        if (itsFile.isOpen()) {
            itsFile.allow(old.st_mode & permissions);  // may fail on some file systems; open() grants no more
        }
    }
    if (!itsFile.isOpen()) {
        fail();
    }
}

OutputFile::~OutputFile()
{
    if (itsFile.isOpen() && !itsTemporary.empty()) {
        const int reason = errno;
        unlink(itsTemporary.c_str());
        errno = reason;
    }
}

bool OutputFile::isStandardOutput() const
{
    return itsIsStandardOutput;
}

bool OutputFile::isReplaced() const
{
    return !itsPlace.empty();
}

void OutputFile::write(std::string_view text)
{
    if (itsText.size() + text.size() > bufferSize) {
        writeOut(itsText);
        itsText.clear();
    }
    if (text.size() > bufferSize) {
        writeOut(text);
    } else {
        itsText += text;
    }
}

void OutputFile::overwriteStart(std::string_view text)
{
    writeOut(std::exchange(itsText, {}));
    if (!isReplaced()) {
        errno = ESPIPE;
        fail();
    }
    if (pwrite(itsFile.number(), text.data(), text.size(), 0) != static_cast<ssize_t>(text.size())) {
        fail();
    }
}

void OutputFile::flush()
{
    if (!isReplaced()) {
        writeOut(itsText);
        itsText.clear();
    }
}

void OutputFile::lock() const
{
    itsFile.lock();
}

void OutputFile::secure()
{
    itsIsSecured = true;
}

Descriptor OutputFile::commit()
{
    writeOut(std::exchange(itsText, {}));
    if (isReplaced()) {
        if ((itsIsSecured && !itsFile.sync()) || !nameNew() || rename(itsTemporary.c_str(), itsPlace.c_str()) != 0) {
            fail();
        }
        itsTemporary.clear();
        if (itsIsSecured) {
            Descriptor(open(folderOf(itsPlace).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC))
                .sync();  // the new name, too
        }
    }
    return std::move(itsFile);
}

/// Creates the file unnamed where supported, so that it vanishes with the process; elsewhere under a temporary name.
void OutputFile::openNew(const std::string& place, mode_t mode)
{
    itsPlace = place;
    const std::string folder = folderOf(itsPlace);
    itsFile = Descriptor(open(folder.c_str(), O_TMPFILE | O_WRONLY | O_CLOEXEC, mode));
    if (itsFile.isOpen() && access(nameOf(itsFile).c_str(), F_OK) == 0) {
        return;
    }
    do {
        itsTemporary = temporaryName(folder);
        itsFile = Descriptor(open(itsTemporary.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode));
    } while (!itsFile.isOpen() && errno == EEXIST);
}

/// Gives an unnamed file a temporary name: only a named one can replace another atomically.
bool OutputFile::nameNew()
{
    if (!itsTemporary.empty()) {
        return true;
    }
    int failure = 0;
    std::string name;
    do {
        name = temporaryName(folderOf(itsPlace));
        failure = linkat(AT_FDCWD, nameOf(itsFile).c_str(), AT_FDCWD, name.c_str(), AT_SYMLINK_FOLLOW);
    } while (failure != 0 && errno == EEXIST);
    if (failure == 0) {
        itsTemporary = name;
    }
    return failure == 0;
}

void OutputFile::writeOut(std::string_view text) const
{
    if (!itsFile.write(text)) {
        fail();
    }
}

void OutputFile::fail() const
{
    throw fileError(itsName, "written");
}

void writeFile(const std::string& name, std::string_view content)
{
    OutputFile file(name);
    file.secure();
    file.write(content);
    file.commit();
}

void checkWritable(const std::string& name)
{
    struct stat old = {};
    if (placeOf(name).descriptor || (stat(name.c_str(), &old) == 0 && !S_ISREG(old.st_mode))) {
        throw Error(name + ": is not a regular file, as results need");
    }
    OutputFile{name};
}

void expectOwnFile(const std::string& name, const std::vector<std::string>& inputs, const std::string& content)
{
    const auto find = [](const std::string& file, int stream, struct stat& found) {
        return (file == standardStream ? fstat(stream, &found) : stat(file.c_str(), &found)) == 0;
    };
    struct stat output = {};
    if (!find(name, STDOUT_FILENO, output) || !S_ISREG(output.st_mode)) {
        return;
    }
    for (const std::string& each : inputs) {
        struct stat input = {};
        if (find(each, STDIN_FILENO, input) && input.st_dev == output.st_dev && input.st_ino == output.st_ino) {
            const auto shown = [](const std::string& file, const char* stream) {
                return file == standardStream ? stream : file;
            };
            throw Error(shown(name, "<stdout>") + ": is read as " + shown(each, "<stdin>") + ", " + content +
                        " need a file of their own");
        }
    }
}

bool isSamePlace(const std::string& a, const std::string& b)
{
    const auto whole = [](const std::string& name) {
        const std::filesystem::path path = std::filesystem::absolute(placeOf(name).path);
        std::error_code failed;  // a pipe behind /dev/stdout has no path
        const std::filesystem::path canonical = std::filesystem::weakly_canonical(path, failed);
        return failed ? path : canonical;
    };
    const std::filesystem::path place = whole(a);
    return place == whole(b) && place != "/dev/null";  // which keeps nothing
}

void expectDistinct(const std::string& file, const std::string& other)
{
    if (!file.empty() && !other.empty() && isSamePlace(file, other)) {
        throw Error(file + ": is the same file as " + other + ", each output needs its own");
    }
}

}  // namespace morvik::base
