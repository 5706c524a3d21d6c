// System: all that programs ask of the operating system beyond the standard library, the same for POSIX and Windows.
//
// SystemPosix.cpp and SystemWindows.cpp implement it. File names are UTF-8. What fails sets errno; a function that
// returns a Descriptor then returns a closed one.
#ifndef MORVIK_BASE_SYSTEM_H
#define MORVIK_BASE_SYSTEM_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "Descriptor.h"

namespace morvik::base::system {

/// The descriptors of the standard streams.
constexpr int standardInput = 0;
constexpr int standardOutput = 1;
constexpr int standardError = 2;

/// The device that keeps nothing.
extern const char* const nowhere;

struct FileStatus {
    bool isRegular;
    unsigned permissions;  // those of POSIX for user, group and others
    std::uint64_t size;
    std::uint64_t device;
    std::uint64_t number;  // of the file on its device

    bool isSameFileAs(const FileStatus& other) const
    {
        return device == other.device && number == other.number;
    }
};

/// Whether two names of absolute paths are the same; on Windows, the case of letters makes no difference.
bool isSameName(const std::string& a, const std::string& b);

/// The status of what a name stands for, links followed.
std::optional<FileStatus> statusOf(const std::string& name);

/// The status of an open file.
std::optional<FileStatus> statusOf(int descriptor);

/// Whether this process may write the file.
bool isWritable(const std::string& name);

/// Opens a device, a pipe or another file that is not replaced.
Descriptor openDevice(const std::string& name);

/// A descriptor of the same open file, with a number above those of the standard streams.
Descriptor duplicate(int descriptor);

/// Creates a file without a name; fails where there are none.
Descriptor createUnnamed(const std::string& folder, unsigned permissions);

/// Names an unnamed file; fails if there is one of this name.
bool nameFile(const Descriptor& file, const std::string& name);

/// Creates a file; fails if there is one of this name. On Windows it vanishes with the process until it replaces
/// another.
Descriptor createFile(const std::string& name, unsigned permissions);

/// Sets the permissions.
bool allow(const Descriptor& file, unsigned permissions);

/// Gives the open file `from` the name `to`, atomically, whether or not there is a file of this name.
bool replaceFile(const Descriptor& file, const std::string& from, const std::string& to);

/// Moves a file to a name that nothing has.
bool moveFile(const std::string& from, const std::string& to);

bool removeFile(const std::string& name);

/// Writes the names in a folder to the disk.
void syncFolder(const std::string& folder);

/// Makes a folder for temporary files, whose name begins with `prefix`; an empty name if it fails.
std::string makeTemporaryFolder(const std::string& prefix);

/// A number that no other running process has.
std::uint64_t processNumber();

/// Owns a file by its name, before it exists, until the process ends in any way.
class Ownership {
public:
    explicit Ownership(std::string name);
    Ownership(const Ownership&) = delete;
    Ownership& operator=(const Ownership&) = delete;

    /// Removes the file if it is empty.
    ~Ownership();

    /// Whether another process owns the file.
    bool isTaken() const
    {
        return itsIsTaken;
    }

    /// Whether the file did not exist or is empty.
    bool isNew() const;

    /// Takes over a file, locked, that has replaced the earlier one.
    void moveTo(Descriptor file);

private:
    std::string itsName;
    Descriptor itsLock{-1};
    bool itsIsTaken = false;
};

/// The name of the file that shows others the ownership: the file itself or, on Windows, which replaces no open file,
/// one beside it.
std::string nameOfLock(const std::string& name);

/// A file that has no name and vanishes when it is closed.
Descriptor temporaryFile();

/// The ends of a pipe, which other programs do not inherit.
struct Pipe {
    Descriptor out;
    Descriptor in;
};
Pipe makePipe();

/// A program that runs.
class Process {
public:
    /// Starts a program found through PATH with these standard streams. Throws std::system_error if it cannot be
    /// started.
    Process(const std::vector<std::string>& commandLine, const std::array<int, 3>& streams);
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;

    /// Ends the program if it still runs.
    ~Process();

    /// Waits for its end; whether its exit status is 0.
    bool wait();

private:
    std::intptr_t itsNumber = 0;  // 0 after its end
};

/// The width in columns of the terminal on standard output; nothing if that is no terminal.
std::optional<std::size_t> terminalWidth();

/// Calls `note` with the signal when the user or the system asks this process to end: SIGINT, SIGTERM or SIGHUP; on
/// Windows SIGINT for Ctrl-C and Ctrl-Break, SIGTERM when the console is closed. A second request of the same kind ends
/// the process at once. Signals that the process ignores stay ignored.
void watchEndRequests(void (*note)(int signal));

/// Ends it.
void unwatchEndRequests(void (*note)(int signal));

/// Prepares the program; to be called at the beginning of main.
///
/// POSIX: opens closed standard streams on /dev/null in the wrong direction, so that using them still fails. Otherwise
/// the first files that the program opens would get their numbers and receive what is printed. Also ignores SIGXFSZ:
/// writing beyond the file size limit then fails as on a full disk, instead of ending the program.
///
/// Windows: replaces the arguments by their UTF-8 form, and lets the standard streams pass every byte as it is and the
/// console show UTF-8. Failures open no window.
void prepareProgram(int& argc, char**& argv);

}  // namespace morvik::base::system

#endif
