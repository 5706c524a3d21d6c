// AtomicFile: files that are there as a whole, in their old or their new content, whenever the machine stops.
#include "AtomicFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <system_error>
#include <utility>

#include "Descriptor.h"
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

    /// The file itself, which is not written any more.
    Descriptor& descriptor()
    {
        return itsFile;
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
    writeLocked(fileName, content, false);
}

Descriptor writeLocked(const std::string& fileName, const std::string& content, bool isLocked)
{
    const std::string place = placeOf(fileName);
    NewFile file(place);
    if (file.isMade() && isLocked) {
        file.descriptor().lock();
    }
    if (!file.isMade() || !file.write(content) || !file.place()) {
        throw fileError(fileName, "written");
    }
    Descriptor(open(folderOf(place).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)).sync();  // the new name, too
    return std::move(file.descriptor());
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
