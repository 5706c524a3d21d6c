// Descriptor: owns a file descriptor.
#ifndef MORVIK_BASE_DESCRIPTOR_H
#define MORVIK_BASE_DESCRIPTOR_H

#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <string>
#include <string_view>
#include <utility>

namespace morvik::base {

/// Owns an open file descriptor and closes it.
class Descriptor {
public:
    explicit Descriptor(int number) : itsNumber(number) {}
    Descriptor(Descriptor&& other) noexcept : itsNumber(std::exchange(other.itsNumber, -1)) {}

    Descriptor& operator=(Descriptor&& other) noexcept
    {
        std::swap(itsNumber, other.itsNumber);
        return *this;
    }

    ~Descriptor()
    {
        const int reason = errno;  // the caller may still report it
        close(itsNumber);
        errno = reason;
    }

    bool isOpen() const
    {
        return itsNumber >= 0;
    }

    int number() const
    {
        return itsNumber;
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
        return fsync(itsNumber) == 0 || errno == EINVAL;  // EINVAL: not supported by the file system
    }

    bool allow(mode_t mode) const
    {
        return fchmod(itsNumber, mode) == 0;
    }

    /// Locks the file for this process until it is closed or the process ends in any way; false if another process
    /// holds the lock. Always succeeds on file systems without locks.
    bool lock() const
    {
        return flock(itsNumber, LOCK_EX | LOCK_NB) == 0 || errno != EWOULDBLOCK;
    }

    /// Whether `fileName` names this file.
    bool isAt(const std::string& fileName) const
    {
        struct stat own = {};
        struct stat named = {};
        return fstat(itsNumber, &own) == 0 && stat(fileName.c_str(), &named) == 0 && own.st_dev == named.st_dev &&
               own.st_ino == named.st_ino;
    }

    bool isEmpty() const
    {
        struct stat own = {};
        return fstat(itsNumber, &own) == 0 && own.st_size == 0;
    }

private:
    int itsNumber;
};

}  // namespace morvik::base

#endif
