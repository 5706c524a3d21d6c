// OutputFile: files are replaced as a whole, or not at all; what is not a regular file is written to.
#include "base/OutputFile.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdarg>
#include <filesystem>
#include <string>

#include "base/Error.h"
#include "support/SmallFiles.h"
#include "support/TemporaryFolder.h"

namespace {

using morvik::base::checkWritable;
using morvik::base::Error;
using morvik::base::expectOwnFile;
using morvik::base::isSamePlace;
using morvik::base::writeFile;

std::string messageOf(const std::exception_ptr& thrown)
{
    try {
        if (thrown) {
            std::rethrow_exception(thrown);
        }
    } catch (const Error& error) {
        return error.what();
    }
    return "none";
}

std::exception_ptr thrownByWriting(const std::string& file, const std::string& content)
{
    try {
        writeFile(file, content);
    } catch (...) {
        return std::current_exception();
    }
    return nullptr;
}

std::string refusal(const std::string& file, const std::string& content)
{
    return messageOf(thrownByWriting(file, content));
}

/// Hidden files, too.
std::vector<std::string> everythingIn(const morvik::support::TemporaryFolder& folder)
{
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(folder.path())) {
        names.push_back(entry.path().filename());
    }
    return names;
}

/// Whether files can be opened without a name, as on most file systems of Linux, but not on NFS.
bool unnamedFilesExist = true;

/// Opens by the given function, which takes a mode where the flags make a file.
template <class Open>
int openIfSupported(Open open, const char* path, int flags, va_list modes)
{
    const bool isUnnamed = (flags & O_TMPFILE) == O_TMPFILE;
    if (isUnnamed && !unnamedFilesExist) {
        errno = EOPNOTSUPP;
        return -1;
    }
    return isUnnamed || (flags & O_CREAT) != 0 ? open(path, flags, va_arg(modes, mode_t)) : open(path, flags);
}

class OutputFile : public testing::Test {
protected:
    const morvik::support::TemporaryFolder folder;
    const std::string file = folder.path("file.csv");
};

using Names = std::vector<std::string>;

TEST_F(OutputFile, IsMade)
{
    writeFile(file, "content\n");
    EXPECT_EQ(folder.read("file.csv"), "content\n");
    EXPECT_EQ(folder.names(), Names{"file.csv"});
}

TEST_F(OutputFile, ReplacesAnotherWithItsPermissions)
{
    folder.write("file.csv", "a longer content that was there before\n");
    ASSERT_EQ(chmod(file.c_str(), 0640), 0);
    writeFile(file, "");
    EXPECT_EQ(folder.read("file.csv"), "");
    struct stat status = {};
    ASSERT_EQ(stat(file.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777, 0640U);
    EXPECT_EQ(folder.names(), Names{"file.csv"});
}

TEST_F(OutputFile, IsAnotherFileThanTheOneThatAReaderHasOpen)
{
    folder.write("file.csv", "old\n");
    std::filesystem::create_hard_link(file, folder.path("kept"));
    writeFile(file, "new\n");
    EXPECT_EQ(folder.read("kept"), "old\n");
    EXPECT_EQ(folder.read("file.csv"), "new\n");
}

TEST_F(OutputFile, FollowsALink)
{
    std::filesystem::create_directory(folder.path("elsewhere"));
    folder.write("elsewhere/file.csv", "old\n");
    std::filesystem::create_symlink("elsewhere/file.csv", file);
    writeFile(file, "new\n");
    EXPECT_TRUE(std::filesystem::is_symlink(file));
    EXPECT_EQ(folder.read("elsewhere/file.csv"), "new\n");
}

TEST_F(OutputFile, FollowsLinksToAFileThatIsNotThereYet)
{
    std::filesystem::create_directory(folder.path("elsewhere"));
    std::filesystem::create_symlink("elsewhere/link.csv", file);
    std::filesystem::create_symlink("file.csv", folder.path("elsewhere/link.csv"));
    checkWritable(file);
    writeFile(file, "new\n");
    EXPECT_TRUE(std::filesystem::is_symlink(file));
    EXPECT_EQ(folder.read("elsewhere/file.csv"), "new\n");
}

TEST_F(OutputFile, IsRefusedWhereALinkLeadsNowhere)
{
    std::filesystem::create_symlink("file.csv", file);
    EXPECT_EQ(refusal(file, ""), file + ": cannot be written: Too many levels of symbolic links");
    EXPECT_THROW(checkWritable(file), Error);
    EXPECT_TRUE(std::filesystem::is_symlink(file));
}

TEST_F(OutputFile, IsTheSamePlaceUnderAllOfItsNames)
{
    std::filesystem::create_symlink("file.csv", folder.path("link.svg"));
    std::filesystem::create_directory(folder.path("sub"));
    for (const char* state : {"is not there", "is there"}) {
        SCOPED_TRACE(state);
        EXPECT_TRUE(isSamePlace(file, folder.path("link.svg")));
        EXPECT_TRUE(isSamePlace(file, folder.path("sub/../file.csv")));
        EXPECT_FALSE(isSamePlace(file, folder.path("other.csv")));
        EXPECT_FALSE(isSamePlace(file, folder.path("sub/file.csv")));
        folder.write("file.csv", "");
    }
    EXPECT_FALSE(isSamePlace("/dev/null", "/dev/null")) << "nothing is kept there";
}

TEST_F(OutputFile, ComparesThePlaceOfAPipe)
{
    int ends[2] = {};
    ASSERT_EQ(pipe(ends), 0);
    const std::string inlet = "/dev/fd/" + std::to_string(ends[1]);
    EXPECT_TRUE(isSamePlace(inlet, inlet));
    EXPECT_FALSE(isSamePlace(inlet, file));
    close(ends[0]);
    close(ends[1]);
}

TEST_F(OutputFile, LeavesFilesOfOtherNamesAlone)
{
    folder.write("file.csv.unfinished", "the user's own");
    writeFile(file, "new\n");
    EXPECT_EQ(folder.read("file.csv"), "new\n");
    EXPECT_EQ(folder.read("file.csv.unfinished"), "the user's own");
}

TEST_F(OutputFile, HasItsNameWhenItIsComplete)
{
    folder.write("file.csv", "old\n");
    {
        morvik::base::OutputFile output(file);
        output.write("lost\n");
    }
    EXPECT_EQ(folder.read("file.csv"), "old\n");
    morvik::base::OutputFile output(file);
    output.write(std::string(100000, 'x'));
    morvik::base::OutputFile moved(std::move(output));
    moved.write("end");
    moved.overwriteStart("start");
    moved.flush();
    EXPECT_EQ(folder.read("file.csv"), "old\n");
    moved.commit();
    EXPECT_EQ(folder.read("file.csv"), "start" + std::string(99995, 'x') + "end");
    EXPECT_EQ(everythingIn(folder), Names{"file.csv"});
}

TEST_F(OutputFile, LetsNobodyRunItAsAnother)
{
    folder.write("file.csv", "old\n");
    ASSERT_EQ(chmod(file.c_str(), 07755), 0);
    writeFile(file, "new\n");
    struct stat status = {};
    ASSERT_EQ(stat(file.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0755U);
}

TEST_F(OutputFile, IsWrittenToWhereItIsAPipe)
{
    ASSERT_EQ(mkfifo(file.c_str(), 0600), 0);
    const morvik::base::Descriptor reader(open(file.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    morvik::base::OutputFile output(file);
    EXPECT_FALSE(output.isReplaced());
    output.write("one\n");
    output.flush();
    char text[16] = {};
    EXPECT_EQ(read(reader.number(), text, sizeof text), 4);
    EXPECT_STREQ(text, "one\n");
    EXPECT_THROW(output.overwriteStart("x"), Error);
    EXPECT_TRUE(std::filesystem::is_fifo(file));
}

TEST_F(OutputFile, IsWrittenToWhereItIsADevice)
{
    writeFile("/dev/null", "x");
    EXPECT_EQ(refusal("/dev/full", "x"), "/dev/full: cannot be written: No space left on device");
    EXPECT_TRUE(std::filesystem::is_character_file("/dev/null"));
    EXPECT_TRUE(std::filesystem::is_character_file("/dev/full"));
}

TEST_F(OutputFile, IsWrittenToWhereItIsAnOpenDescriptor)
{
    const morvik::base::Descriptor opened(open(file.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600));
    ASSERT_TRUE(opened.write("before\n"));
    std::filesystem::create_symlink("/dev/fd/" + std::to_string(opened.number()), folder.path("link"));
    writeFile(folder.path("link"), "between\n");
    ASSERT_TRUE(opened.write("after\n"));
    EXPECT_EQ(folder.read("file.csv"), "before\nbetween\nafter\n");
    EXPECT_THROW(checkWritable(folder.path("link")), Error);
    EXPECT_THROW(writeFile("/dev/fd/999", ""), Error);
}

TEST_F(OutputFile, IsNoneOfTheInputs)
{
    folder.write("file.csv", "");
    std::filesystem::create_hard_link(file, folder.path("hard"));
    std::filesystem::create_symlink("file.csv", folder.path("soft"));
    const auto refused = [&](const std::string& name, const std::vector<std::string>& inputs) -> std::string {
        try {
            expectOwnFile(name, inputs, "results");
        } catch (const Error& error) {
            return error.what();
        }
        return "none";
    };
    for (const char* const name : {"hard", "soft", "file.csv"}) {
        const std::string output = folder.path(name);
        EXPECT_EQ(refused(output, {"missing", file}),
                  output + ": is read as " + file + ", results need a file of their own");
    }
    EXPECT_EQ(refused(file, {folder.path("other"), "/dev/null", ""}), "none");
    EXPECT_EQ(refused("/dev/null", {"/dev/null"}), "none");
    EXPECT_EQ(refused("", {""}), "none");
}

TEST_F(OutputFile, KeepsTheOldContentWhenTheDiskIsFull)
{
    folder.write("file.csv", "old\n");
    std::string reason;
    {
        const morvik::support::SmallFiles small(1000);
        reason = refusal(file, std::string(1001, 'x'));
        EXPECT_EQ(refusal(file, std::string(1000, 'y')), "none");
    }
    EXPECT_EQ(reason, file + ": cannot be written: File too large");
    EXPECT_EQ(folder.read("file.csv"), std::string(1000, 'y'));
    EXPECT_EQ(everythingIn(folder), Names{"file.csv"});
}

TEST_F(OutputFile, TellsWhyItCannotTakeThePlaceOfAnother)
{
    folder.write("file.csv", "old\n");
    // UBSan opens a pipe to examine the first object of a type, so it has to meet the error's types before.
    EXPECT_EQ(refusal("", ""), ": cannot be written: No such file or directory");
    rlimit old = {};
    getrlimit(RLIMIT_NOFILE, &old);
    const rlimit none = {0, old.rlim_max};
    setrlimit(RLIMIT_NOFILE, &none);
    const std::exception_ptr thrown = thrownByWriting(file, "new\n");
    setrlimit(RLIMIT_NOFILE, &old);
    EXPECT_EQ(messageOf(thrown), file + ": cannot be written: Too many open files");
    EXPECT_EQ(folder.read("file.csv"), "old\n");
}

TEST_F(OutputFile, IsRefusedWithoutAName)
{
    EXPECT_EQ(refusal("", ""), ": cannot be written: No such file or directory");
}

TEST_F(OutputFile, IsRefusedWhereThereIsNoFolder)
{
    const std::string lost = folder.path("none/file.csv");
    EXPECT_EQ(refusal(lost, ""), lost + ": cannot be written: No such file or directory");
}

TEST_F(OutputFile, IsCheckedWithoutLeavingAnything)
{
    checkWritable(file);
    EXPECT_EQ(everythingIn(folder), Names{});
    folder.write("file.csv", "old\n");
    checkWritable(file);
    EXPECT_EQ(folder.read("file.csv"), "old\n");
    EXPECT_EQ(everythingIn(folder), Names{"file.csv"});
}

TEST_F(OutputFile, IsCheckedForAFolderAndAPlaceThatIsNoFile)
{
    EXPECT_THROW(checkWritable(folder.path("none/file.csv")), Error);
    EXPECT_THROW(checkWritable(folder.path()), Error);
    EXPECT_THROW(checkWritable("/dev/null"), Error);
    EXPECT_THROW(checkWritable("/dev/full"), Error);
    ASSERT_EQ(mkfifo(file.c_str(), 0600), 0);
    EXPECT_THROW(checkWritable(file), Error);
}

/// As on a file system without unnamed files.
class NamedOutputFile : public OutputFile {
protected:
    NamedOutputFile()
    {
        unnamedFilesExist = false;
    }

    ~NamedOutputFile() override
    {
        unnamedFilesExist = true;
    }

    /// The names that a file takes until it is complete, in the order of their numbers.
    std::string temporaryName(unsigned number) const
    {
        return ".morvik-" + std::to_string(getpid()) + '-' + std::to_string(number);
    }

    /// The number of the next file's name.
    unsigned nextNumber() const
    {
        const morvik::base::OutputFile probe(folder.path("probe"));
        const Names names = everythingIn(folder);
        const std::string& name = *std::find_if(
            names.begin(), names.end(), [](const std::string& each) { return each.rfind(".morvik-", 0) == 0; });
        return static_cast<unsigned>(std::stoul(name.substr(name.rfind('-') + 1))) + 1;
    }
};

TEST_F(NamedOutputFile, ReplacesAnotherWhenItIsComplete)
{
    folder.write("file.csv", "old\n");
    ASSERT_EQ(chmod(file.c_str(), 0640), 0);
    {
        morvik::base::OutputFile output(file);
        output.write("new\n");
        EXPECT_EQ(everythingIn(folder).size(), 2U);
        EXPECT_EQ(folder.read("file.csv"), "old\n");
        output.commit();
    }
    EXPECT_EQ(folder.read("file.csv"), "new\n");
    struct stat status = {};
    ASSERT_EQ(stat(file.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777, 0640U);
    EXPECT_EQ(everythingIn(folder), Names{"file.csv"});
}

TEST_F(NamedOutputFile, VanishesWhenItIsGivenUp)
{
    {
        morvik::base::OutputFile output(file);
        output.write("lost\n");
        morvik::base::OutputFile moved(std::move(output));
        EXPECT_EQ(everythingIn(folder).size(), 1U);
    }
    EXPECT_EQ(everythingIn(folder), Names{});
    checkWritable(file);
    EXPECT_EQ(everythingIn(folder), Names{});
}

TEST_F(NamedOutputFile, LeavesNamesThatAreTaken)
{
    const unsigned next = nextNumber();
    folder.write(temporaryName(next), "of another machine\n");
    folder.write(temporaryName(next + 1), "left by a crash\n");
    writeFile(file, "new\n");
    EXPECT_EQ(folder.read("file.csv"), "new\n");
    EXPECT_EQ(folder.read(temporaryName(next)), "of another machine\n");
    EXPECT_EQ(folder.read(temporaryName(next + 1)), "left by a crash\n");
    EXPECT_EQ(everythingIn(folder).size(), 3U);
}

}  // namespace

// Of each pair, the linker puts the second in the place of the system's function, which becomes the first. The names
// are its own. 32-bit programs open files by open64. NOLINTBEGIN(bugprone-reserved-identifier)
extern "C" int __real_open(const char* path, int flags, ...);
extern "C" int __wrap_open(const char* path, int flags, ...);

int __wrap_open(const char* path, int flags, ...)
{
    va_list modes;
    va_start(modes, flags);
    const int file = openIfSupported(__real_open, path, flags, modes);
    va_end(modes);
    return file;
}

extern "C" int __real_open64(const char* path, int flags, ...);
extern "C" int __wrap_open64(const char* path, int flags, ...);

int __wrap_open64(const char* path, int flags, ...)
{
    va_list modes;
    va_start(modes, flags);
    const int file = openIfSupported(__real_open64, path, flags, modes);
    va_end(modes);
    return file;
}
// NOLINTEND(bugprone-reserved-identifier)
