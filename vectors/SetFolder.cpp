// SetFolder: the folder of a set of vectors, which gets a new set as a whole.
#include "SetFolder.h"

#include <fcntl.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <system_error>
#include <utility>
#include <vector>

#include "Manifest.h"
#include "base/Descriptor.h"
#include "simulation/Error.h"
#include "simulation/TextFile.h"

namespace morvik::vectors {

namespace {

namespace fs = std::filesystem;

constexpr char asideName[] = ".morvik-unfinished";
constexpr char lockName[] = "lock";
constexpr char earlierName[] = "earlier.json";  // the manifest of the set that is being replaced

std::string pathOf(const std::string& folder, const std::string& name)
{
    return folder + '/' + name;
}

bool exists(const std::string& path)
{
    std::error_code none;
    return fs::symlink_status(path, none).type() != fs::file_type::not_found;
}

void move(const std::string& from, const std::string& to)
{
    if (std::rename(from.c_str(), to.c_str()) != 0) {
        throw simulation::fileError(to, "written");
    }
}

/// The names of the files in a folder, but for those that are not given.
std::vector<std::string> namesIn(const std::string& folder, const std::vector<std::string>& but)
{
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder)) {
        const std::string name = entry.path().filename().string();
        if (std::find(but.begin(), but.end(), name) == but.end()) {
            names.push_back(name);
        }
    }
    return names;
}

/// The names of the files that a set has beside the manifest.
std::vector<std::string> filesOf(const std::string& manifest)
{
    std::vector<std::string> names;
    for (const ManifestFormat& format : parseManifest(simulation::readText(manifest), manifest).formats) {
        for (const ManifestFile& file : format.files) {
            names.push_back(file.name);
        }
    }
    return names;
}

}  // namespace

SetFolder::Made::Made(std::string folder) : path(std::move(folder)), isOwn(false)
{
    std::error_code problem;
    isOwn = fs::create_directories(path, problem);
    if (problem || !fs::is_directory(path)) {
        throw simulation::Error(path + ": cannot be made" + (problem ? ": " + problem.message() : ""));
    }
}

SetFolder::Made::~Made()
{
    std::error_code ignored;  // that something is in it
    if (isOwn) {
        fs::remove(path, ignored);
    }
}

SetFolder::SetFolder(std::string path)
    : itsFolder(std::move(path)), itsAside(pathOf(itsFolder.path, asideName)), itsLock(pathOf(itsAside.path, lockName))
{
    if (itsLock.isTaken()) {
        throw simulation::Error(itsFolder.path +
                                ": another process is making a set in it; wait for that to end, or "
                                "choose another folder");
    }
    itsAside.isOwn = true;
    finishEarlier();
    expectSetOrNothing();
}

SetFolder::~SetFolder()
{
    try {
        clearAside();
    } catch (const fs::filesystem_error&) {
        return;  // the next one removes it
    }
}

const std::string& SetFolder::aside() const
{
    return itsAside.path;
}

void SetFolder::place()
{
    const std::string manifest = pathOf(itsFolder.path, manifestName);
    const std::string earlier = pathOf(aside(), earlierName);
    expectOwnNames();
    if (exists(manifest) && !exists(earlier)) {
        move(manifest, earlier);
    }
    if (exists(earlier)) {
        for (const std::string& name : filesOf(earlier)) {
            fs::remove(pathOf(itsFolder.path, name));
        }
    }
    for (const std::string& name : namesIn(aside(), {lockName, earlierName, manifestName})) {
        move(pathOf(aside(), name), pathOf(itsFolder.path, name));
    }
    move(pathOf(aside(), manifestName), manifest);
    base::Descriptor(open(itsFolder.path.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)).sync();
}

/// What a process has left that was killed: a complete set is placed.
void SetFolder::finishEarlier()
{
    if (exists(pathOf(aside(), manifestName))) {
        place();
    }
    clearAside();
}

void SetFolder::clearAside() const
{
    for (const std::string& name : namesIn(aside(), {lockName})) {
        fs::remove_all(pathOf(aside(), name));
    }
}

void SetFolder::expectSetOrNothing() const
{
    const std::string manifest = pathOf(itsFolder.path, manifestName);
    if (exists(manifest)) {
        filesOf(manifest);
    } else if (!namesIn(itsFolder.path, {asideName}).empty()) {
        throw simulation::Error(itsFolder.path + ": is not empty and holds no " + manifestName + " of an earlier set");
    }
}

/// Throws if a file that is no set's would be overwritten.
void SetFolder::expectOwnNames() const
{
    const std::string manifest = pathOf(itsFolder.path, manifestName);
    const std::string earlier = pathOf(aside(), earlierName);
    std::vector<std::string> own;
    if (exists(earlier) || exists(manifest)) {
        own = filesOf(exists(earlier) ? earlier : manifest);
    }
    for (const std::string& name : namesIn(aside(), {lockName, earlierName, manifestName})) {
        const std::string path = pathOf(itsFolder.path, name);
        if (exists(path) && std::find(own.begin(), own.end(), name) == own.end()) {
            throw simulation::Error(path + ": is no file of the earlier set, and the new one has such a file");
        }
    }
}

}  // namespace morvik::vectors
