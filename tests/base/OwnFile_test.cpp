// OwnFile: one at a time has the file, and the system takes it back from the dead.
#include "base/OwnFile.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>

#include "base/Error.h"
#include "support/TemporaryFolder.h"

namespace {

using morvik::base::OwnFile;

class OwnFiles : public testing::Test {
protected:
    const morvik::support::TemporaryFolder folder;
    const std::string name = folder.path("file");
};

TEST_F(OwnFiles, AreTakenFromTheBeginningToTheEnd)
{
    {
        OwnFile file(name);
        EXPECT_FALSE(file.isTaken());
        EXPECT_TRUE(OwnFile(name).isTaken());
        file.write("one");
        EXPECT_TRUE(OwnFile(name).isTaken()) << "the new file as well as the old";
        file.write("two");
        EXPECT_TRUE(OwnFile(name).isTaken());
        EXPECT_EQ(folder.read("file"), "two");
    }
    EXPECT_FALSE(OwnFile(name).isTaken());
    EXPECT_EQ(folder.read("file"), "two") << "what has been written stays";
}

TEST_F(OwnFiles, AreLeftToOthersWhenTheyAreRemoved)
{
    OwnFile file(name);
    file.write("one");
    file.remove();
    OwnFile next(name);
    EXPECT_FALSE(next.isTaken());
    EXPECT_TRUE(next.isNew());
    EXPECT_TRUE(OwnFile(name).isTaken());
}

TEST_F(OwnFiles, AreNewUntilSomethingIsInThem)
{
    {
        const OwnFile file(name);
        EXPECT_TRUE(file.isNew());
        EXPECT_EQ(folder.names(), std::vector<std::string>{"file"});
    }
    EXPECT_TRUE(folder.names().empty()) << "it was never written";
    folder.write("file", "old");
    EXPECT_FALSE(OwnFile(name).isNew());
    EXPECT_EQ(folder.read("file"), "old");
}

TEST_F(OwnFiles, OfTheDeadCanBeTaken)
{
    int ready[2];
    ASSERT_EQ(pipe(ready), 0);
    const pid_t child = fork();
    if (child == 0) {
        OwnFile file(name);
        file.write("of the child");
        const ssize_t written = write(ready[1], "x", 1);
        pause();
        _exit(written == 1 ? 0 : 1);
    }
    char byte = 0;
    ASSERT_EQ(read(ready[0], &byte, 1), 1);
    EXPECT_TRUE(OwnFile(name).isTaken());
    kill(child, SIGKILL);
    waitpid(child, nullptr, 0);
    EXPECT_FALSE(OwnFile(name).isTaken());
    EXPECT_EQ(folder.read("file"), "of the child");
    close(ready[0]);
    close(ready[1]);
}

TEST_F(OwnFiles, ThatCannotBeOpenedTellWhenTheyAreWritten)
{
    OwnFile file(folder.path("none/file"));
    EXPECT_FALSE(file.isTaken());
    EXPECT_THROW(file.write("x"), morvik::base::Error);
}

TEST_F(OwnFiles, AreNoLinksToOthers)
{
    folder.write("another", "kept");
    std::filesystem::create_symlink("another", name);
    EXPECT_THROW(OwnFile{name}, morvik::base::Error);
    unlink(name.c_str());
    {
        OwnFile file(name);
        unlink(name.c_str());
        std::filesystem::create_symlink("another", name);
        EXPECT_THROW(file.write("x"), morvik::base::Error);
    }
    EXPECT_EQ(folder.read("another"), "kept");
    EXPECT_EQ(folder.names(), (std::vector<std::string>{"another", "file"}));
}

}  // namespace
