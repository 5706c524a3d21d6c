// OutputFile: writes files.
#include "OutputFile.h"

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
#include "Path.h"
#include "System.h"

namespace morvik::base {

namespace {

/// Longest chain of symbolic links, as in Linux.
constexpr int mostLinks = 40;

constexpr std::size_t bufferSize = 65536;

/// Everybody may read and write a new file, as far as the user's mask allows.
constexpr unsigned newPermissions = 0666;

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
        return {{}, system::standardOutput};
    }
    std::filesystem::path path = pathOf(name);
    for (int links = 0; links <= mostLinks; ++links) {
        std::error_code none;  // set if this is no link
        const auto descriptor = descriptorNamed(path.u8string());
        const std::filesystem::path next = descriptor ? path : std::filesystem::read_symlink(path, none);
        if (descriptor || none) {
            return {path.u8string(), descriptor};
        }
        path = path.parent_path() / next;
    }
    errno = ELOOP;
    throw fileError(name, "written");
}

std::string folderOf(const std::string& place)
{
    const std::filesystem::path folder = pathOf(place).parent_path();
    return folder.empty() ? "." : folder.u8string();
}

/// A name in the folder that nobody else is likely to use.
std::string temporaryName(const std::string& folder)
{
    static std::atomic<unsigned> count{0};
    return folder + "/.morvik-" + std::to_string(system::processNumber()) + '-' + std::to_string(count++);
}

}  // namespace

OutputFile::OutputFile(const std::string& name) : itsName(name == standardStream ? "<stdout>" : name), itsFile(-1)
{
    const Place place = placeOf(name);
    if (place.descriptor) {
        std::cout.flush();  // earlier output comes first
        itsFile = system::duplicate(*place.descriptor);
        itsIsStandardOutput = place.descriptor == system::standardOutput;
    } else if (const auto old = system::statusOf(place.path); !old) {
        if (errno == ENOENT && !name.empty()) {
            openNew(place.path, newPermissions);
        }
    } else if (!old->isRegular) {
        itsFile = system::openDevice(place.path);
    } else if (system::isWritable(place.path)) {
        openNew(place.path, old->permissions);
        if (itsFile.isOpen()) {
            system::allow(itsFile, old->permissions);  // may fail on some file systems; the file grants no more
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
        system::removeFile(itsTemporary);
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
    if (!itsFile.writeAt(0, text)) {
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
        if ((itsIsSecured && !itsFile.sync()) || !nameNew() || !system::replaceFile(itsFile, itsTemporary, itsPlace)) {
            fail();
        }
        itsTemporary.clear();
        if (itsIsSecured) {
            system::syncFolder(folderOf(itsPlace));  // the new name, too
        }
    }
    return std::move(itsFile);
}

/// Creates the file unnamed where supported, so that it vanishes with the process; elsewhere under a temporary name.
void OutputFile::openNew(const std::string& place, unsigned permissions)
{
    itsPlace = place;
    const std::string folder = folderOf(itsPlace);
    itsFile = system::createUnnamed(folder, permissions);
    if (itsFile.isOpen()) {
        return;
    }
    do {
        itsTemporary = temporaryName(folder);
        itsFile = system::createFile(itsTemporary, permissions);
    } while (!itsFile.isOpen() && errno == EEXIST);
}

/// Gives an unnamed file a temporary name: only a named one can replace another atomically.
bool OutputFile::nameNew()
{
    if (!itsTemporary.empty()) {
        return true;
    }
    bool isNamed = false;
    std::string name;
    do {
        name = temporaryName(folderOf(itsPlace));
        isNamed = system::nameFile(itsFile, name);
    } while (!isNamed && errno == EEXIST);
    if (isNamed) {
        itsTemporary = name;
    }
    return isNamed;
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
    const auto isOther = [&name] {
        const auto old = system::statusOf(name);
        return old && !old->isRegular;
    };
    if (placeOf(name).descriptor || isOther()) {
        throw Error(name + ": is not a regular file, as results need");
    }
    OutputFile{name};
}

void expectOwnFile(const std::string& name, const std::vector<std::string>& inputs, const std::string& content)
{
    const auto find = [](const std::string& file, int stream) {
        return file == standardStream ? system::statusOf(stream) : system::statusOf(file);
    };
    const auto output = find(name, system::standardOutput);
    if (!output || !output->isRegular) {
        return;
    }
    for (const std::string& each : inputs) {
        const auto input = find(each, system::standardInput);
        if (input && input->isSameFileAs(*output)) {
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
        const std::filesystem::path path = std::filesystem::absolute(pathOf(placeOf(name).path));
        std::error_code failed;  // a pipe behind /dev/stdout has no path
        const std::filesystem::path canonical = std::filesystem::weakly_canonical(path, failed);
        return (failed ? path : canonical).u8string();
    };
    const std::string place = whole(a);
    return system::isSameName(place, whole(b)) && !system::isSameName(place, whole(system::nowhere));
}

void expectDistinct(const std::string& file, const std::string& other)
{
    if (!file.empty() && !other.empty() && isSamePlace(file, other)) {
        throw Error(file + ": is the same file as " + other + ", each output needs its own");
    }
}

}  // namespace morvik::base
