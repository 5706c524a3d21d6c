// Descriptor: owns a file descriptor.
#ifndef MORVIK_BASE_DESCRIPTOR_H
#define MORVIK_BASE_DESCRIPTOR_H

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <utility>

namespace morvik::base {

/// Owns an open file descriptor and closes it. What fails sets errno.
class Descriptor {
public:
    explicit Descriptor(int number) : itsNumber(number) {}
    Descriptor(Descriptor&& other) noexcept : itsNumber(std::exchange(other.itsNumber, -1)) {}

    Descriptor& operator=(Descriptor&& other) noexcept
    {
        std::swap(itsNumber, other.itsNumber);
        return *this;
    }

    /// Keeps errno, which the caller may still report.
    ~Descriptor();

    bool isOpen() const
    {
        return itsNumber >= 0;
    }

    int number() const
    {
        return itsNumber;
    }

    bool write(std::string_view content) const;

    /// Writes at a place in the file.
    bool writeAt(std::uint64_t place, std::string_view content) const;

    /// Reads what is there, at most `size` bytes; 0 at the end, negative if it fails.
    std::int64_t read(char* content, std::size_t size) const;

    /// The same from a place in the file.
    std::int64_t readAt(std::uint64_t place, char* content, std::size_t size) const;

    /// Continues at the file's start.
    bool rewind() const;

    /// Writes to the disk what the system still holds; true, too, if the file system cannot.
    bool sync() const;

    /// Locks the file for this process until it is closed or the process ends in any way; false if another process
    /// holds the lock. Always succeeds on file systems without locks.
    bool lock() const;

private:
    int itsNumber;
};

}  // namespace morvik::base

#endif
