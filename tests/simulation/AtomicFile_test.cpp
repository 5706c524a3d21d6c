// AtomicFile: files are replaced as a whole, or not at all.
#include "simulation/AtomicFile.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>

#include "simulation/Error.h"
#include "support/TemporaryFolder.h"

namespace {

using simulation::checkWritable;
using simulation::Error;
using simulation::isSamePlace;
using simulation::writeAtomically;

/// Files of this process can have so many bytes for as long as it lives, as if the disk were full then.
class SmallFiles {
public:
    explicit SmallFiles(rlim_t bytes)
    {
        signal(SIGXFSZ, SIG_IGN);
        getrlimit(RLIMIT_FSIZE, &itsOld);
        const rlimit small = {bytes, itsOld.rlim_max};
        setrlimit(RLIMIT_FSIZE, &small);
    }

    SmallFiles(const SmallFiles&) = delete;
    SmallFiles& operator=(const SmallFiles&) = delete;

    ~SmallFiles()
    {
        setrlimit(RLIMIT_FSIZE, &itsOld);
        signal(SIGXFSZ, SIG_DFL);
    }

private:
    rlimit itsOld = {};
};

std::string refusal(const std::string& file, const std::string& content)
{
    try {
        writeAtomically(file, content);
    } catch (const Error& error) {
        return error.what();
    }
    return "none";
}

class AtomicFile : public testing::Test {
protected:
    const support::TemporaryFolder folder;
    const std::string file = folder.path("file.csv");
};

using Names = std::vector<std::string>;

TEST_F(AtomicFile, IsMade)
{
    writeAtomically(file, "content\n");
    EXPECT_EQ(folder.read("file.csv"), "content\n");
    EXPECT_EQ(folder.names(), Names{"file.csv"});
}

TEST_F(AtomicFile, ReplacesAnotherWithItsPermissions)
{
    folder.write("file.csv", "a longer content that was there before\n");
    ASSERT_EQ(chmod(file.c_str(), 0640), 0);
    writeAtomically(file, "");
    EXPECT_EQ(folder.read("file.csv"), "");
    struct stat status = {};
    ASSERT_EQ(stat(file.c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777, 0640U);
    EXPECT_EQ(folder.names(), Names{"file.csv"});
}

TEST_F(AtomicFile, IsAnotherFileThanTheOneThatAReaderHasOpen)
{
    folder.write("file.csv", "old\n");
    std::filesystem::create_hard_link(file, folder.path("kept"));
    writeAtomically(file, "new\n");
    EXPECT_EQ(folder.read("kept"), "old\n");
    EXPECT_EQ(folder.read("file.csv"), "new\n");
}

TEST_F(AtomicFile, FollowsALink)
{
    std::filesystem::create_directory(folder.path("elsewhere"));
    folder.write("elsewhere/file.csv", "old\n");
    std::filesystem::create_symlink("elsewhere/file.csv", file);
    writeAtomically(file, "new\n");
    EXPECT_TRUE(std::filesystem::is_symlink(file));
    EXPECT_EQ(folder.read("elsewhere/file.csv"), "new\n");
}

TEST_F(AtomicFile, FollowsLinksToAFileThatIsNotThereYet)
{
    std::filesystem::create_directory(folder.path("elsewhere"));
    std::filesystem::create_symlink("elsewhere/link.csv", file);
    std::filesystem::create_symlink("file.csv", folder.path("elsewhere/link.csv"));
    checkWritable(file);
    writeAtomically(file, "new\n");
    EXPECT_TRUE(std::filesystem::is_symlink(file));
    EXPECT_EQ(folder.read("elsewhere/file.csv"), "new\n");
}

TEST_F(AtomicFile, IsRefusedWhereALinkLeadsNowhere)
{
    std::filesystem::create_symlink("file.csv", file);
    EXPECT_EQ(refusal(file, ""), file + ": cannot be written: Too many levels of symbolic links");
    EXPECT_THROW(checkWritable(file), Error);
    EXPECT_TRUE(std::filesystem::is_symlink(file));
}

TEST_F(AtomicFile, IsTheSamePlaceUnderAllOfItsNames)
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
}

TEST_F(AtomicFile, OverwritesWhatAKilledRunHasLeft)
{
    folder.write("file.csv.unfinished", "half of");
    writeAtomically(file, "new\n");
    EXPECT_EQ(folder.read("file.csv"), "new\n");
    EXPECT_EQ(folder.names(), Names{"file.csv"});
}

TEST_F(AtomicFile, KeepsTheOldContentWhenTheDiskIsFull)
{
    folder.write("file.csv", "old\n");
    std::string reason;
    {
        const SmallFiles small(1000);
        reason = refusal(file, std::string(1001, 'x'));
        EXPECT_EQ(refusal(file, std::string(1000, 'y')), "none");
    }
    EXPECT_EQ(reason, file + ": cannot be written: File too large");
    EXPECT_EQ(folder.read("file.csv"), std::string(1000, 'y'));
    EXPECT_EQ(folder.names(), Names{"file.csv"});
}

TEST_F(AtomicFile, IsRefusedWhereThereIsNoFolder)
{
    const std::string lost = folder.path("none/file.csv");
    EXPECT_EQ(refusal(lost, ""), lost + ": cannot be written: No such file or directory");
}

TEST_F(AtomicFile, IsCheckedWithoutLeavingAnything)
{
    checkWritable(file);
    EXPECT_EQ(folder.names(), Names{});
    folder.write("file.csv", "old\n");
    checkWritable(file);
    EXPECT_EQ(folder.read("file.csv"), "old\n");
    EXPECT_EQ(folder.names(), Names{"file.csv"});
}

TEST_F(AtomicFile, IsCheckedForAFolderAndAPlaceThatIsNoFile)
{
    EXPECT_THROW(checkWritable(folder.path("none/file.csv")), Error);
    EXPECT_THROW(checkWritable(folder.path()), Error);
    EXPECT_THROW(checkWritable("/dev/null"), Error);
    EXPECT_THROW(checkWritable("/dev/full"), Error);
    ASSERT_EQ(mkfifo(file.c_str(), 0600), 0);
    EXPECT_THROW(checkWritable(file), Error);
}

}  // namespace
