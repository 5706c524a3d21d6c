// AtomicFile: files that are there as a whole, in their old or their new content, whenever the machine stops.
#include "AtomicFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <string_view>
#include <system_error>

#include "Error.h"

namespace simulation {

namespace {

/// As many links behind each other as Linux follows.
constexpr int mostLinks = 40;

/// Where the content is to be: what the name is a link to, at last, whether that is there yet or not.
std::string placeOf(const std::string& fileName)
{
    std::filesystem::path place = fileName;
    for (int links = 0; links <= mostLinks; ++links) {
        std::error_code none;  // of a link
        const std::filesystem::path next = std::filesystem::read_symlink(place, none);
        if (none) {
            return place.string();
        }
        place = place.parent_path() / next;
    }
    errno = ELOOP;
    throw fileError(fileName, "written");
}

std::string folderOf(const std::string& place)
{
    const std::filesystem::path folder = std::filesystem::path(place).parent_path();
    return folder.empty() ? "." : folder.string();
}

/// An open file, closed at the end of its life.
class Descriptor {
public:
    explicit Descriptor(int number) : itsNumber(number) {}
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;

    ~Descriptor()
    {
        const int reason = errno;  // that a caller is still to tell
        close(itsNumber);
        errno = reason;
    }

    bool isOpen() const
    {
        return itsNumber >= 0;
    }

    bool write(std::string_view content) const
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

    bool sync() const
    {
        return fsync(itsNumber) == 0 || errno == EINVAL;  // that is: a file system without it
    }

    bool allow(mode_t mode) const
    {
        return fchmod(itsNumber, mode) == 0;
    }

private:
    int itsNumber;
};

/// A new file beside another, removed at the end of its life unless it took the other's place. Its name is always the
/// same, so that the one that a killed run has left is overwritten by the next.
class NewFile {
public:
    explicit NewFile(const std::string& place)
        : itsPlace(place),
          itsName(place + ".unfinished"),
          itsFile(open(itsName.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_NOFOLLOW | O_CLOEXEC, 0666))
    {
    }

    NewFile(const NewFile&) = delete;
    NewFile& operator=(const NewFile&) = delete;

    ~NewFile()
    {
        if (itsFile.isOpen() && !itsIsPlaced) {
            const int reason = errno;
            unlink(itsName.c_str());
            errno = reason;
        }
    }

    bool isMade() const
    {
        return itsFile.isOpen();
    }

    /// Writes it through to the disk, with the permissions of the file whose place it is to take.
    bool write(const std::string& content) const
    {
        struct stat old = {};
        const bool allowed = stat(itsPlace.c_str(), &old) != 0 || itsFile.allow(old.st_mode & 07777);
        return allowed && itsFile.write(content) && itsFile.sync();
    }

    bool place()
    {
        itsIsPlaced = rename(itsName.c_str(), itsPlace.c_str()) == 0;
        return itsIsPlaced;
    }

private:
    std::string itsPlace;
    std::string itsName;
    Descriptor itsFile;
    bool itsIsPlaced = false;
};

}  // namespace

void writeAtomically(const std::string& fileName, const std::string& content)
{
    const std::string place = placeOf(fileName);
    NewFile file(place);
    if (!file.isMade() || !file.write(content) || !file.place()) {
        throw fileError(fileName, "written");
    }
    Descriptor(open(folderOf(place).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)).sync();  // the new name, too
}

void checkWritable(const std::string& fileName)
{
    const std::string place = placeOf(fileName);
    struct stat old = {};
    const bool exists = stat(place.c_str(), &old) == 0;
    if (exists && !S_ISREG(old.st_mode)) {
        throw Error(fileName + ": is no regular file, results need one");
    }
    if ((exists && access(place.c_str(), W_OK) != 0) || !NewFile(place).isMade()) {
        throw fileError(fileName, "written");
    }
}

bool isSamePlace(const std::string& a, const std::string& b)
{
    const auto whole = [](const std::string& fileName) {
        return std::filesystem::weakly_canonical(std::filesystem::absolute(placeOf(fileName)));
    };
    return whole(a) == whole(b);
}

}  // namespace simulation
