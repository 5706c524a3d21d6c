// SetFolder: the folder of a set of vectors, which is replaced as a whole.
#include "SetFolder.h"

#include <algorithm>
#include <filesystem>
#include <set>
#include <system_error>
#include <utility>

#include "BlockFiles.h"
#include "Manifest.h"
#include "base/Error.h"
#include "base/Path.h"

namespace morvik::vectors {

namespace {

namespace fs = std::filesystem;

constexpr char asideName[] = ".morvik-unfinished";
constexpr char lockName[] = "lock";
constexpr char earlierName[] = "earlier";     // holds the set being replaced while files move
constexpr char temporaryName[] = ".morvik-";  // prefix of files that do not have their final names yet

/// The type of the entry itself: links are not followed.
fs::file_type kindOf(const std::string& path)
{
    std::error_code none;
    return fs::symlink_status(base::pathOf(path), none).type();
}

bool exists(const std::string& path)
{
    return kindOf(path) != fs::file_type::not_found;
}

bool isFolder(const std::string& path)
{
    return kindOf(path) == fs::file_type::directory;
}

/// Refuses links, which may lead to somebody else's folder.
void expectOwnFolder(const std::string& path)
{
    if (exists(path) && !isFolder(path)) {
        throw base::Error(path + ": is not a folder; remove it or choose another folder");
    }
}

std::string nameOfLock()
{
    return base::system::nameOfLock(lockName);
}

std::string asideIn(const std::string& folder)
{
    std::string path = pathIn(folder, asideName);
    expectOwnFolder(path);
    return path;
}

void move(const std::string& from, const std::string& to)
{
    if (!base::system::moveFile(from, to)) {
        throw base::fileError(to, "written");
    }
}

/// A file, a link, or an empty folder.
void removeOne(const std::string& path)
{
    std::error_code problem;
    if (!fs::remove(base::pathOf(path), problem)) {
        throw base::Error(path + ": cannot be removed: " + problem.message());
    }
}

std::vector<std::string> namesIn(const std::string& folder)
{
    std::vector<std::string> names;
    std::error_code problem;
    fs::directory_iterator entry(base::pathOf(folder), problem);
    while (!problem && entry != fs::directory_iterator()) {
        names.push_back(entry->path().filename().u8string());
        entry.increment(problem);
    }
    if (problem) {
        throw base::Error(folder + ": cannot be read: " + problem.message());
    }
    return names;
}

/// The names of a set's files other than the manifest.
std::vector<std::string> filesListed(const std::string& manifest)
{
    std::vector<std::string> names;
    for (const ManifestFormat& format : readManifest(manifest).formats) {
        for (const ManifestFile& file : format.files) {
            names.push_back(file.name);
        }
    }
    return names;
}

/// Throws if a folder has anything but files of a set and `others`.
void expectSetFiles(const std::string& folder, const std::set<std::string>& others)
{
    std::set<std::string> known = filesOfAllTables();
    known.insert(manifestName);
    for (const std::string& name : namesIn(folder)) {
        const bool isKnown = known.count(name) != 0 || name.rfind(temporaryName, 0) == 0;
        if (others.count(name) == 0 && (!isKnown || isFolder(pathIn(folder, name)))) {
            throw base::Error(pathIn(folder, name) + ": is not a file of a set; " + folder +
                              " is for unfinished ones alone");
        }
    }
}

}  // namespace

std::string pathIn(const std::string& folder, const std::string& name)
{
    return folder + '/' + name;
}

SetFolder::Made::Made(std::string folder) : path(std::move(folder)), isOwn(false)
{
    std::error_code problem;
    isOwn = fs::create_directories(base::pathOf(path), problem);
    if (problem || !fs::is_directory(base::pathOf(path), problem)) {
        throw base::Error(path + ": cannot be made" + (problem ? ": " + problem.message() : ""));
    }
}

SetFolder::Made::~Made()
{
    std::error_code ignored;  // if it is not empty
    if (isOwn) {
        fs::remove(base::pathOf(path), ignored);
    }
}

SetFolder::SetFolder(std::string path)
    : itsFolder(std::move(path)), itsAside(asideIn(itsFolder.path)), itsLock(pathIn(itsAside.path, lockName))
{
    if (itsLock.isTaken()) {
        throw base::Error(itsFolder.path +
                          ": another process is making a set in it; wait for that to end, or "
                          "choose another folder");
    }
    expectOwnAside();
    itsAside.isOwn = true;
    finishEarlier();
    expectSetOrNothing();
}

SetFolder::~SetFolder()
{
    try {
        if (!exists(made(earlierName))) {
            clearAside();
        }
    } catch (const base::Error&) {
        return;  // the next process removes it
    }
}

const std::string& SetFolder::aside() const
{
    return itsAside.path;
}

std::string SetFolder::placed(const std::string& name) const
{
    return pathIn(itsFolder.path, name);
}

std::string SetFolder::made(const std::string& name) const
{
    return pathIn(itsAside.path, name);
}

std::string SetFolder::earlier(const std::string& name) const
{
    return pathIn(made(earlierName), name);
}

void SetFolder::place()
{
    expectMovable();
    const Made holder(made(earlierName));
    try {
        moveAll();
    } catch (const base::Error&) {
        moveBack();
        throw;
    }
    base::system::syncFolder(itsFolder.path);
    clearAside();
}

/// Continues from wherever it was stopped.
void SetFolder::moveAll() const
{
    const std::vector<std::string> newFiles = filesListed(made(manifestName));
    const std::vector<std::string> oldFiles = earlierFiles();
    if (exists(placed(manifestName))) {
        move(placed(manifestName), earlier(manifestName));
    }
    for (const std::string& name : oldFiles) {
        const bool isNew = std::find(newFiles.begin(), newFiles.end(), name) != newFiles.end() && !exists(made(name));
        if (!isNew && exists(placed(name))) {
            move(placed(name), earlier(name));
        }
    }
    for (const std::string& name : newFiles) {
        if (exists(made(name))) {
            move(made(name), placed(name));
        }
    }
    move(made(manifestName), placed(manifestName));
}

/// Undoes the moves made so far.
void SetFolder::moveBack() const
{
    for (const std::string& name : filesListed(made(manifestName))) {
        if (!exists(made(name))) {
            move(placed(name), made(name));
        }
    }
    std::vector<std::string> names = earlierFiles();
    names.push_back(manifestName);
    for (const std::string& name : names) {
        if (exists(earlier(name)) && !isFolder(earlier(name))) {
            move(earlier(name), placed(name));
        }
    }
}

/// Cleans up after a killed process: a complete set is placed.
void SetFolder::finishEarlier()
{
    if (exists(made(manifestName))) {
        place();
    }
    clearAside();
}

/// Removes the manifest first: a set that has one is complete.
void SetFolder::clearAside() const
{
    if (exists(made(manifestName))) {
        removeOne(made(manifestName));
    }
    if (exists(made(earlierName))) {
        for (const std::string& name : namesIn(made(earlierName))) {
            removeOne(earlier(name));
        }
    }
    for (const std::string& name : namesIn(aside())) {
        if (name != nameOfLock()) {
            removeOne(made(name));
        }
    }
}

void SetFolder::expectOwnAside() const
{
    expectSetFiles(aside(), {nameOfLock(), earlierName});
    expectOwnFolder(made(earlierName));
    if (exists(made(earlierName))) {
        expectSetFiles(made(earlierName), {});
    }
}

void SetFolder::expectSetOrNothing() const
{
    if (exists(placed(manifestName))) {
        filesListed(placed(manifestName));
    } else if (namesIn(itsFolder.path).size() > 1) {
        throw base::Error(itsFolder.path + ": is not empty and holds no " + manifestName + " of an earlier set");
    }
}

/// Throws if a file that is not part of a set would be overwritten, or one cannot be moved.
void SetFolder::expectMovable() const
{
    const std::vector<std::string> own = earlierFiles();
    for (const std::string& name : own) {
        if (isFolder(placed(name))) {
            throw base::Error(placed(name) + ": is a folder, the earlier set has a file of this name");
        }
    }
    for (const std::string& name : filesListed(made(manifestName))) {
        const bool isThere = exists(placed(name));
        if (!exists(made(name)) && !(isThere && exists(made(earlierName)))) {
            throw base::Error(made(name) + ": is missing, the unfinished set cannot be placed");
        }
        if (exists(made(name)) && isThere && std::find(own.begin(), own.end(), name) == own.end()) {
            throw base::Error(placed(name) +
                              ": is not a file of the earlier set, but the new set has one of this name");
        }
    }
}

/// The files of the set being replaced, wherever they are by now.
std::vector<std::string> SetFolder::earlierFiles() const
{
    for (const std::string& manifest : {earlier(manifestName), placed(manifestName)}) {
        if (exists(manifest)) {
            return filesListed(manifest);
        }
    }
    return {};
}

void expectPlaced(const std::string& folder)
{
    if (!exists(pathIn(folder, manifestName)) && exists(pathIn(folder, asideName) + '/' + manifestName)) {
        throw base::Error(folder +
                          ": has a set that is not in place yet; if its command was killed, the next "
                          "'morvik vectors --out' into this folder finishes it");
    }
}

}  // namespace morvik::vectors
