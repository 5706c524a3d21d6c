// System: what differs between POSIX and Windows behaves alike.
#include "base/System.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <system_error>
#include <vector>

#include "base/ChildProcess.h"
#include "base/Error.h"
#include "base/OutputFile.h"
#include "base/OwnFile.h"
#include "base/Path.h"

namespace {

namespace system = morvik::base::system;
using morvik::base::Descriptor;
using morvik::base::isSamePlace;
using morvik::base::OutputFile;
using morvik::base::OwnFile;
using morvik::base::pathOf;

class Systems : public testing::Test {
protected:
    Systems()
    {
        std::filesystem::create_directory(pathOf(folder));
    }

    ~Systems() override
    {
        std::filesystem::remove_all(pathOf(temporary));
    }

    std::string path(const std::string& file) const
    {
        return folder + '/' + file;
    }

    static void write(const std::string& file, const std::string& content)
    {
        std::ofstream(pathOf(file), std::ios::binary) << content;
    }

    static std::string read(const std::string& file)
    {
        std::ifstream stream(pathOf(file), std::ios::binary);
        return {std::istreambuf_iterator<char>(stream), {}};
    }

    std::size_t entries() const
    {
        const std::filesystem::directory_iterator first(pathOf(folder));
        return static_cast<std::size_t>(std::distance(begin(first), end(first)));
    }

    const std::string temporary = system::makeTemporaryFolder("morvik-test-");
    const std::string folder = temporary + "/Gr\u00F6\u00DFe \u8A66";
    const std::string name = path("a file");
};

TEST_F(Systems, ReplaceFilesWhole)
{
    write(name, "old");
    {
        OutputFile abandoned(name);
        abandoned.write("new");
    }
    EXPECT_EQ(read(name), "old");
    OutputFile file(name);
    file.write("one\ntwo\r\n");
    file.overwriteStart("O");
    file.write("three");
    EXPECT_EQ(read(name), "old");
    file.secure();
    file.commit();
    EXPECT_EQ(read(name), "One\ntwo\r\nthree");
    EXPECT_EQ(entries(), 1U) << "nothing is left over";
}

TEST_F(Systems, TellFilesFromOthers)
{
    write(name, "four");
    write(path("another"), "4");
    const auto status = system::statusOf(name);
    ASSERT_TRUE(status);
    EXPECT_TRUE(status->isRegular);
    EXPECT_EQ(status->size, 4U);
    EXPECT_TRUE(status->isSameFileAs(*system::statusOf(path("./a file"))));
    EXPECT_FALSE(status->isSameFileAs(*system::statusOf(path("another"))));
    EXPECT_FALSE(system::statusOf(folder)->isRegular);
    EXPECT_FALSE(system::statusOf(system::nowhere)->isRegular);
    EXPECT_FALSE(system::statusOf(path("none")));
    EXPECT_EQ(errno, ENOENT);
    OutputFile(system::nowhere).commit();
    EXPECT_FALSE(isSamePlace(system::nowhere, system::nowhere)) << "nothing is kept there";
    EXPECT_TRUE(isSamePlace(name, path("../" + pathOf(folder).filename().u8string() + "/a file")));
    EXPECT_FALSE(isSamePlace(name, path("another")));
    EXPECT_THROW(OutputFile(path("none/file")), morvik::base::Error);
}

TEST_F(Systems, LetOneOwnAFile)
{
    {
        OwnFile file(name);
        EXPECT_TRUE(file.isNew());
        for (const char* const content : {"one", "two"}) {
            EXPECT_TRUE(OwnFile(name).isTaken());
            file.write(content);
            EXPECT_EQ(read(name), content);
        }
    }
    EXPECT_EQ(entries(), 1U);
    OwnFile next(name);
    EXPECT_FALSE(next.isTaken());
    EXPECT_FALSE(next.isNew());
    next.remove();
    EXPECT_FALSE(system::statusOf(name));
}

TEST_F(Systems, GiveProgramsEveryArgumentAsItIs)
{
    const std::vector<std::string> words = {
        MORVIK_TEST_ECHO, "a b", "", "\"", "c\\\"d", "e\\", "f g\\", "\\\\h", "\u8A66*?"};
    std::string expected;
    for (std::size_t i = 1; i < words.size(); ++i) {
        expected += '<' + words[i] + ">\n";
    }
    const morvik::base::Outcome outcome = morvik::base::runProgram(words, "input");
    EXPECT_TRUE(outcome.succeeded);
    EXPECT_EQ(outcome.out, expected + "input");
    EXPECT_EQ(outcome.err, "told\n");

    morvik::base::RunningProgram program(words);
    std::string output(std::istreambuf_iterator<char>(program.output()), {});
    EXPECT_EQ(output, expected);
    EXPECT_TRUE(program.isAtEnd());
    EXPECT_TRUE(program.wait().succeeded);
}

TEST_F(Systems, SayThatAProgramIsMissing)
{
    try {
        morvik::base::runProgram({"morvik-no-such-program"}, "");
        FAIL() << "it was found";
    } catch (const std::system_error& error) {
        EXPECT_EQ(error.code(), std::errc::no_such_file_or_directory);
    }
}

}  // namespace
