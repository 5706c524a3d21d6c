// AtomicFile: files that appear complete or not at all.
#include "AtomicFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <stdexcept>
#include <system_error>
#include <utility>

namespace report {

namespace {

namespace fs = std::filesystem;

[[noreturn]] void fail(const std::string& fileName, const std::string& why)
{
    throw std::runtime_error(fileName + ": cannot be written: " + why);
}

[[noreturn]] void failWith(const std::string& fileName, int error)
{
    fail(fileName, std::generic_category().message(error));
}

/// Where a name leads to, links being followed as far as they do.
fs::path targetOf(const std::string& fileName)
{
    std::error_code error;
    fs::path target = fileName;
    for (int links = 0; fs::is_symlink(target, error) && links < 40; ++links) {
        target = target.parent_path() / fs::read_symlink(target, error);
    }
    return target;
}

/// A file open for writing; whatever goes wrong is thrown in terms of `name`.
class Output {
public:
    Output(const fs::path& path, int flags, const std::string& name)
        : itsName(name), itsDescriptor(open(path.c_str(), flags | O_WRONLY | O_CLOEXEC, 0666))
    {
        if (itsDescriptor < 0) {
            failWith(itsName, errno);
        }
    }

    Output(const Output&) = delete;
    Output& operator=(const Output&) = delete;

    ~Output()
    {
        if (itsDescriptor >= 0) {
            ::close(itsDescriptor);
        }
    }

    void write(const std::string& content) const
    {
        std::size_t written = 0;
        while (written < content.size()) {
            const ssize_t count = ::write(itsDescriptor, content.data() + written, content.size() - written);
            if (count < 0 && errno != EINTR) {
                failWith(itsName, errno);
            }
            written += count > 0 ? static_cast<std::size_t>(count) : 0;
        }
    }

    /// Some file systems tell of a full disk no sooner than here.
    void close()
    {
        if (fsync(itsDescriptor) != 0 || ::close(std::exchange(itsDescriptor, -1)) != 0) {
            failWith(itsName, errno);
        }
    }

private:
    const std::string& itsName;
    int itsDescriptor;
};

/// A new file beside the target, removed in the end unless it took the target's place.
class Draft {
public:
    Draft(const fs::path& target, const std::string& name)
        : itsTarget(target), itsName(name), itsPath(pathBeside(target)), itsOutput(itsPath, O_CREAT | O_EXCL, name)
    {
    }

    Draft(const Draft&) = delete;
    Draft& operator=(const Draft&) = delete;

    ~Draft()
    {
        unlink(itsPath.c_str());  // it is not there any more when all went well
    }

    void publish(const std::string& content)
    {
        itsOutput.write(content);
        itsOutput.close();
        if (rename(itsPath.c_str(), itsTarget.c_str()) != 0) {
            failWith(itsName, errno);
        }
    }

private:
    /// A name that nothing else takes, on other machines neither. What a killed process has left is in nobody's way.
    static fs::path pathBeside(const fs::path& target)
    {
        const std::string name = '.' + target.filename().string() + '.' + std::to_string(getpid()) + ".tmp";
        fs::path path = target.parent_path() / name;
        unlink(path.c_str());
        return path;
    }

    const fs::path& itsTarget;
    const std::string& itsName;
    fs::path itsPath;
    Output itsOutput;
};

/// A pipe, a device or the like: nothing may take its place.
bool isSpecial(const fs::path& target)
{
    std::error_code ignored;
    return fs::exists(target, ignored) && !fs::is_regular_file(target, ignored);
}

}  // namespace

void checkWritable(const std::string& fileName)
{
    const fs::path target = targetOf(fileName);
    std::error_code ignored;
    if (fs::is_directory(target, ignored)) {
        failWith(fileName, EISDIR);
    }
    if (!target.has_filename()) {
        failWith(fileName, ENOENT);
    }
    if (!isSpecial(target)) {
        const Draft draft(target, fileName);
    } else if (access(target.c_str(), W_OK) != 0) {
        failWith(fileName, errno);
    }
}

void writeAtomically(const std::string& fileName, const std::string& content)
{
    const fs::path target = targetOf(fileName);
    if (isSpecial(target)) {
        Output(target, 0, fileName).write(content);
    } else {
        Draft(target, fileName).publish(content);
    }
}

}  // namespace report
