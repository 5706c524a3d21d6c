// SystemWindows: the files of Windows 10 or later, by its wide-character functions.
#include "SystemWindows.h"

#include <fcntl.h>

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <filesystem>
#include <string_view>
#include <system_error>
#include <utility>

#include "System.h"

namespace morvik::base {

namespace system {

void setErrno()
{
    switch (const DWORD error = GetLastError()) {
    case ERROR_INVALID_NAME:
    case ERROR_BAD_NETPATH:
    case ERROR_BAD_NET_NAME:
        errno = ENOENT;
        break;
    case ERROR_SHARING_VIOLATION:
    case ERROR_LOCK_VIOLATION:
        errno = EACCES;
        break;
    case ERROR_BROKEN_PIPE:
    case ERROR_NO_DATA:
    case ERROR_PIPE_NOT_CONNECTED:
        errno = EPIPE;
        break;
    default:
        const std::error_condition known =
            std::error_code(static_cast<int>(error), std::system_category()).default_error_condition();
        errno = known.category() == std::generic_category() ? known.value() : EIO;
    }
}

}  // namespace system

using system::handleOf;
using system::setErrno;

namespace {

/// The most bytes that one transfer takes.
DWORD atOnce(std::size_t size)
{
    return static_cast<DWORD>(std::min<std::size_t>(size, 1U << 30));
}

/// Reads from a place, or where the file stands. A pipe without a writer is at its end.
std::int64_t readFrom(int descriptor, OVERLAPPED* place, char* content, std::size_t size)
{
    DWORD count = 0;
    if (ReadFile(handleOf(descriptor), content, atOnce(size), &count, place) != FALSE) {
        return count;
    }
    if (GetLastError() == ERROR_BROKEN_PIPE || GetLastError() == ERROR_HANDLE_EOF) {
        return 0;
    }
    setErrno();
    return -1;
}

OVERLAPPED at(std::uint64_t place)
{
    OVERLAPPED position = {};
    position.Offset = static_cast<DWORD>(place);
    position.OffsetHigh = static_cast<DWORD>(place >> 32);
    return position;
}

}  // namespace

Descriptor::~Descriptor()
{
    const int reason = errno;
    if (isOpen()) {
        _close(itsNumber);
    }
    errno = reason;
}

bool Descriptor::write(std::string_view content) const
{
    while (!content.empty()) {
        DWORD written = 0;
        if (WriteFile(handleOf(itsNumber), content.data(), atOnce(content.size()), &written, nullptr) == FALSE) {
            setErrno();
            return false;
        }
        content.remove_prefix(written);
    }
    return true;
}

bool Descriptor::writeAt(std::uint64_t place, std::string_view content) const
{
    OVERLAPPED position = at(place);
    LARGE_INTEGER before = {};
    const HANDLE file = handleOf(itsNumber);
    DWORD written = 0;
    // Unlike pwrite(), it moves on.
    const bool isWhole = SetFilePointerEx(file, {}, &before, FILE_CURRENT) != FALSE &&
                         WriteFile(file, content.data(), atOnce(content.size()), &written, &position) != FALSE &&
                         written == content.size() && SetFilePointerEx(file, before, nullptr, FILE_BEGIN) != FALSE;
    if (!isWhole) {
        setErrno();
    }
    return isWhole;
}

std::int64_t Descriptor::read(char* content, std::size_t size) const
{
    return readFrom(itsNumber, nullptr, content, size);
}

std::int64_t Descriptor::readAt(std::uint64_t place, char* content, std::size_t size) const
{
    OVERLAPPED position = at(place);
    return readFrom(itsNumber, &position, content, size);
}

bool Descriptor::rewind() const
{
    return SetFilePointerEx(handleOf(itsNumber), {}, nullptr, FILE_BEGIN) != FALSE;
}

bool Descriptor::sync() const
{
    if (FlushFileBuffers(handleOf(itsNumber)) != FALSE) {
        return true;
    }
    setErrno();
    return false;
}

bool Descriptor::lock() const
{
    return true;  // files are owned by those beside them
}

namespace system {

namespace {

Descriptor descriptorOf(HANDLE file)
{
    if (file == INVALID_HANDLE_VALUE) {
        setErrno();
        return Descriptor(-1);
    }
    return Descriptor(_open_osfhandle(reinterpret_cast<std::intptr_t>(file), _O_BINARY));
}

constexpr DWORD anySharing = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;

/// Repeats an action for a second while it fails for this reason; whether it has succeeded.
template <class Action>
bool patiently(DWORD reason, Action action)
{
    constexpr int patience = 50;
    for (int i = 0; i < patience; ++i) {
        if (action()) {
            return true;
        }
        if (GetLastError() != reason) {
            return false;
        }
        Sleep(20);
    }
    return false;
}

/// Lets a file vanish when it is closed, or stay.
bool letVanish(HANDLE file, bool vanishes)
{
    FILE_DISPOSITION_INFO info = {};
    info.DeleteFile = vanishes ? TRUE : FALSE;
    return SetFileInformationByHandle(file, FileDispositionInfo, &info, sizeof info) != FALSE;
}

std::optional<FileStatus> statusOf(HANDLE file)
{
    BY_HANDLE_FILE_INFORMATION found = {};
    if (GetFileType(file) != FILE_TYPE_DISK || GetFileInformationByHandle(file, &found) == FALSE) {
        return std::nullopt;
    }
    const auto joined = [](DWORD high, DWORD low) {
        return std::uint64_t{high} << 32 | low;
    };
    const bool isReadOnly = (found.dwFileAttributes & FILE_ATTRIBUTE_READONLY) != 0;
    return FileStatus{(found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) == 0,
                      isReadOnly ? 0444U : 0666U,
                      joined(found.nFileSizeHigh, found.nFileSizeLow),
                      found.dwVolumeSerialNumber,
                      joined(found.nFileIndexHigh, found.nFileIndexLow)};
}

}  // namespace

const char* const nowhere = "NUL";

bool isSameName(const std::string& a, const std::string& b)
{
    return CompareStringOrdinal(wide(a).c_str(), -1, wide(b).c_str(), -1, TRUE) == CSTR_EQUAL;
}

std::optional<FileStatus> statusOf(const std::string& name)
{
    const HANDLE handle = CreateFileW(wide(name).c_str(),
                                      FILE_READ_ATTRIBUTES,
                                      anySharing,
                                      nullptr,
                                      OPEN_EXISTING,
                                      FILE_FLAG_BACKUP_SEMANTICS,
                                      nullptr);  // which opens folders, too
    const Descriptor file = descriptorOf(handle);
    if (!file.isOpen()) {
        return std::nullopt;
    }
    // Something without status is a device.
    const auto status = statusOf(handle);
    return status ? status : FileStatus{false, 0666, 0, ~std::uint64_t{0}, ~std::uint64_t{0}};
}

std::optional<FileStatus> statusOf(int descriptor)
{
    return statusOf(handleOf(descriptor));
}

bool isWritable(const std::string& name)
{
    return _waccess(wide(name).c_str(), 2) == 0;
}

Descriptor openDevice(const std::string& name)
{
    return descriptorOf(CreateFileW(
        wide(name).c_str(), GENERIC_WRITE, anySharing, nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
}

Descriptor duplicate(int descriptor)
{
    return Descriptor(_dup(descriptor));
}

Descriptor createUnnamed(const std::string& /*folder*/, unsigned /*permissions*/)
{
    errno = ENOTSUP;
    return Descriptor(-1);
}

bool nameFile(const Descriptor& /*file*/, const std::string& /*name*/)
{
    errno = ENOTSUP;
    return false;
}

Descriptor createFile(const std::string& name, unsigned /*permissions*/)
{
    const HANDLE file = CreateFileW(
        wide(name).c_str(), GENERIC_WRITE | DELETE, anySharing, nullptr, CREATE_NEW, FILE_ATTRIBUTE_NORMAL, nullptr);
    Descriptor descriptor = descriptorOf(file);
    if (descriptor.isOpen()) {
        letVanish(file, true);  // where it can
    }
    return descriptor;
}

bool allow(const Descriptor& /*file*/, unsigned /*permissions*/)
{
    return true;  // a new file has the rights that its folder gives
}

bool replaceFile(const Descriptor& file, const std::string& from, const std::string& to)
{
    letVanish(handleOf(file.number()), false);
    const auto move = [&] {
        return MoveFileExW(wide(from).c_str(), wide(to).c_str(), MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH) !=
               FALSE;
    };
    // Programs that look through all new files hold them for moments.
    if (patiently(ERROR_ACCESS_DENIED, move) || patiently(ERROR_SHARING_VIOLATION, move)) {
        return true;
    }
    setErrno();
    return false;
}

bool moveFile(const std::string& from, const std::string& to)
{
    if (MoveFileExW(wide(from).c_str(), wide(to).c_str(), MOVEFILE_WRITE_THROUGH) != FALSE) {
        return true;
    }
    setErrno();
    return false;
}

bool removeFile(const std::string& name)
{
    return _wunlink(wide(name).c_str()) == 0;
}

void syncFolder(const std::string& /*folder*/) {}  // files are moved through to the disk

std::string makeTemporaryFolder(const std::string& prefix)
{
    static std::atomic<unsigned> count{0};
    const std::string name = prefix + std::to_string(processNumber()) + '-' + std::to_string(count++);
    const std::filesystem::path folder = std::filesystem::temp_directory_path() / pathOf(name);
    if (CreateDirectoryW(folder.c_str(), nullptr) == FALSE) {
        setErrno();
        return "";
    }
    return folder.u8string();
}

std::uint64_t processNumber()
{
    return GetCurrentProcessId();
}

// The lock is a file beside the other, which nobody else can open, and which Windows removes with the process.
Ownership::Ownership(std::string name) : itsName(std::move(name))
{
    const std::wstring lock = wide(nameOfLock(itsName));
    HANDLE file = INVALID_HANDLE_VALUE;
    patiently(ERROR_ACCESS_DENIED, [&] {  // while another process is closing it
        file = CreateFileW(lock.c_str(),
                           GENERIC_READ | GENERIC_WRITE | DELETE,
                           0,
                           nullptr,
                           OPEN_ALWAYS,
                           FILE_ATTRIBUTE_HIDDEN | FILE_FLAG_DELETE_ON_CLOSE,
                           nullptr);
        return file != INVALID_HANDLE_VALUE;
    });
    itsIsTaken = file == INVALID_HANDLE_VALUE && GetLastError() == ERROR_SHARING_VIOLATION;
    itsLock = descriptorOf(file);
}

Ownership::~Ownership() = default;

bool Ownership::isNew() const
{
    const auto found = statusOf(itsName);
    return !found || found->size == 0;
}

void Ownership::moveTo(Descriptor /*file*/) {}

std::string nameOfLock(const std::string& name)
{
    const std::filesystem::path path = pathOf(name);
    return (path.parent_path() / pathOf(".morvik-" + path.filename().u8string() + ".lock")).u8string();
}

Descriptor temporaryFile()
{
    static std::atomic<unsigned> count{0};
    const std::string name = "morvik-" + std::to_string(processNumber()) + "-stream" + std::to_string(count++);
    const std::filesystem::path path = std::filesystem::temp_directory_path() / pathOf(name);
    return descriptorOf(CreateFileW(path.c_str(),
                                    GENERIC_READ | GENERIC_WRITE | DELETE,
                                    anySharing,
                                    nullptr,
                                    CREATE_ALWAYS,
                                    FILE_ATTRIBUTE_TEMPORARY | FILE_FLAG_DELETE_ON_CLOSE,
                                    nullptr));
}

Pipe makePipe()
{
    HANDLE out = INVALID_HANDLE_VALUE;
    HANDLE in = INVALID_HANDLE_VALUE;
    if (CreatePipe(&out, &in, nullptr, 1U << 16) == FALSE) {
        setErrno();
        return {Descriptor(-1), Descriptor(-1)};
    }
    return {descriptorOf(out), descriptorOf(in)};
}

}  // namespace system

}  // namespace morvik::base
