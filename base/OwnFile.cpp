// OwnFile: a file that one process at a time owns.
#include "OwnFile.h"

#include <fcntl.h>
#include <sys/stat.h>

#include <utility>

#include "Error.h"
#include "OutputFile.h"

namespace morvik::base {

namespace {

/// Refuses links, too, wherever they lead.
void refuseOtherThanFile(const std::string& fileName)
{
    struct stat found = {};
    if (lstat(fileName.c_str(), &found) == 0 && !S_ISREG(found.st_mode)) {
        throw Error(fileName + ": is not a regular file and is not replaced");
    }
}

}  // namespace

OwnFile::OwnFile(std::string fileName) : itsName(std::move(fileName)), itsFile(-1)
{
    refuseOtherThanFile(itsName);
    // Between open() and the lock, the file may have been removed, or replaced by one that another process has locked.
    constexpr int patience = 100;  // for file systems without stable inode numbers
    for (int i = 0; i < patience && !itsIsTaken && !itsFile.isAt(itsName); ++i) {
        itsFile = Descriptor(open(itsName.c_str(), O_RDWR | O_CREAT | O_NOFOLLOW | O_CLOEXEC, 0666));
        itsIsTaken = itsFile.isOpen() && !itsFile.lock();
    }
}

OwnFile::~OwnFile()
{
    if (!itsIsTaken && itsFile.isEmpty() && itsFile.isAt(itsName)) {
        unlink(itsName.c_str());
    }
}

bool OwnFile::isTaken() const
{
    return itsIsTaken;
}

bool OwnFile::isNew() const
{
    return itsFile.isEmpty();
}

void OwnFile::write(const std::string& content)
{
    refuseOtherThanFile(itsName);
    OutputFile file(itsName);
    file.lock();  // before others see it
    file.secure();
    file.write(content);
    itsFile = file.commit();
}

void OwnFile::remove()
{
    if (unlink(itsName.c_str()) != 0) {
        throw fileError(itsName, "removed");
    }
}

}  // namespace morvik::base
