// OwnFile: a file that one process at a time owns.
#include "OwnFile.h"

#include <filesystem>
#include <system_error>
#include <utility>

#include "Error.h"
#include "OutputFile.h"
#include "Path.h"

namespace morvik::base {

namespace {

/// Refuses links, too, wherever they lead.
const std::string& expectFile(const std::string& fileName)
{
    std::error_code none;  // set if there is no such file
    if (const auto found = std::filesystem::symlink_status(pathOf(fileName), none);
        std::filesystem::exists(found) && !std::filesystem::is_regular_file(found)) {
        throw Error(fileName + ": is not a regular file and is not replaced");
    }
    return fileName;
}

}  // namespace

OwnFile::OwnFile(std::string fileName) : itsName(std::move(fileName)), itsOwnership(expectFile(itsName)) {}

bool OwnFile::isTaken() const
{
    return itsOwnership.isTaken();
}

bool OwnFile::isNew() const
{
    return itsOwnership.isNew();
}

void OwnFile::write(const std::string& content)
{
    OutputFile file(expectFile(itsName));
    file.lock();  // before others see it
    file.secure();
    file.write(content);
    itsOwnership.moveTo(file.commit());
}

void OwnFile::remove()
{
    if (!system::removeFile(itsName)) {
        throw fileError(itsName, "removed");
    }
}

}  // namespace morvik::base
