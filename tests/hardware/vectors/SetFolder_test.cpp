// SetFolder: a set takes the place of an earlier one as a whole, and of nothing else.
#include "hardware/vectors/SetFolder.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "VectorSet.h"
#include "support/SmallFiles.h"

namespace morvik::support {
namespace {

class SetFolder : public VectorSet {};

TEST_F(SetFolder, TakesThePlaceOfAnEarlierOne)
{
    make();
    settings.formats = {"csv"};
    settings.ratios = false;
    settings.internal = false;
    make();
    EXPECT_EQ(difference(), "none");
    EXPECT_EQ(names(), ofCsv);
}

TEST_F(SetFolder, LeavesTheEarlierOneWhenTheDiskIsFull)
{
    settings.formats = {"csv"};
    settings.ratios = settings.internal = false;
    make();
    const std::string manifest = read("manifest.json");
    folder.write("set/mine.txt", "x");
    settings.blockSizes = {6144};
    {
        const morvik::support::SmallFiles small(20000);
        EXPECT_THROW(make(), morvik::base::Error);
    }
    EXPECT_EQ(read("manifest.json"), manifest);
    EXPECT_EQ(difference(), "none");
    EXPECT_EQ(read("mine.txt"), "x");
    EXPECT_EQ(names().size(), ofCsv.size() + 1) << "nothing else is left";
}

TEST_F(SetFolder, LeavesNoFolderWhereItCouldNotBeMade)
{
    const morvik::support::SmallFiles small(100);
    EXPECT_THROW(make(), morvik::base::Error);
    EXPECT_FALSE(std::filesystem::exists(path()));
}

TEST_F(SetFolder, LeavesFilesOfOthersAlone)
{
    settings.formats = {"csv"};
    settings.ratios = settings.internal = false;
    make();
    folder.write("set/mine.txt", "x");
    std::filesystem::create_directory(path() + "/work");
    settings.blocks = 1;
    make();
    EXPECT_EQ(read("mine.txt"), "x");
    EXPECT_EQ(names().size(), ofCsv.size() + 2);
    EXPECT_EQ(difference(), "none");

    folder.write("set/stimulus.npy", "mine, too");
    settings.formats = {"npy"};
    try {
        make();
        FAIL() << "accepted";
    } catch (const morvik::base::Error& error) {
        EXPECT_EQ(error.what(),
                  path() + "/stimulus.npy: is not a file of the earlier set, but the new set has one of this name");
    }
    EXPECT_EQ(read("stimulus.npy"), "mine, too");
}

TEST_F(SetFolder, IsMadeByOneProcessAtATime)
{
    settings.formats = {"csv"};
    settings.ratios = settings.internal = false;
    {
        const morvik::vectors::SetFolder other(path());
        try {
            make();
            FAIL() << "accepted";
        } catch (const morvik::base::Error& error) {
            EXPECT_EQ(
                error.what(),
                path() + ": another process is making a set in it; wait for that to end, or choose another folder");
        }
        EXPECT_TRUE(std::filesystem::exists(other.aside()));
    }
    EXPECT_FALSE(std::filesystem::exists(path()));
    make();
    EXPECT_EQ(names(), ofCsv);
}

TEST_F(SetFolder, IsMadeWhereAProcessWasKilled)
{
    settings.formats = {"csv"};
    settings.ratios = settings.internal = false;
    make();
    std::filesystem::create_directory(path() + "/.morvik-unfinished");
    folder.write("set/.morvik-unfinished/lock", "");
    folder.write("set/.morvik-unfinished/blocks.csv", "half of");
    EXPECT_EQ(difference(), "none");
    make();
    EXPECT_EQ(names(), ofCsv);
    EXPECT_EQ(difference(), "none");
}

TEST_F(SetFolder, IsCompleteWhereverAProcessWasKilledWhileItPlacedOne)
{
    namespace fs = std::filesystem;
    settings.ratios = settings.internal = false;
    settings.formats = {"csv"};
    const std::string aside = path() + "/.morvik-unfinished";
    // The steps by name: one file of the earlier set after the other goes, the manifest first; then the new ones come.
    const std::vector<std::string> order = {"manifest.json", "blocks.csv", "stimulus.csv", "expected.csv"};
    for (std::size_t steps = 0; steps < 2 * order.size(); ++steps) {
        fs::remove_all(path());
        settings.blockSizes = {48};
        make();
        const std::string manifest = read("manifest.json");
        fs::rename(path(), folder.path("new"));
        settings.blockSizes = {40};
        make();
        fs::rename(folder.path("new"), aside);
        fs::create_directory(aside + "/earlier");
        for (std::size_t step = 0; step < steps; ++step) {
            const std::string& name = order[step < order.size() ? step : step - order.size() + 1];
            const bool isOld = step < order.size();
            fs::rename((isOld ? path() : aside) + '/' + name, (isOld ? aside + "/earlier" : path()) + '/' + name);
        }
        if (steps > 0) {
            expectRefused(path() +
                          ": has a set that is not in place yet; if its command was killed, the next 'morvik vectors "
                          "--out' into this folder finishes it");
        }
        {
            const morvik::vectors::SetFolder next(path());
        }
        EXPECT_EQ(names(), ofCsv) << steps;
        EXPECT_EQ(read("manifest.json"), manifest) << steps;
        EXPECT_EQ(difference(), "none") << steps;
    }
}

TEST_F(SetFolder, LeavesTheEarlierOneWhenAFileCannotBeMoved)
{
    settings.formats = {"csv"};
    settings.ratios = settings.internal = false;
    make();
    const std::string manifest = read("manifest.json");
    std::filesystem::copy(path(), folder.path("new"));
    {
        morvik::vectors::SetFolder set(path());
        std::filesystem::copy(folder.path("new"), set.aside());
        std::filesystem::create_directories(set.aside() + "/earlier/expected.csv");  // where the old one is to go
        EXPECT_THROW(set.place(), morvik::base::Error);
        EXPECT_EQ(read("manifest.json"), manifest);
        EXPECT_EQ(difference(), "none");
        std::filesystem::remove(set.aside() + "/earlier/expected.csv");
    }
    make();
    EXPECT_EQ(names(), ofCsv);
}

TEST_F(SetFolder, LeavesTheEarlierOneWhereAFolderHasTheNameOfAFile)
{
    settings.formats = {"csv"};
    settings.ratios = settings.internal = false;
    make();
    const std::string manifest = read("manifest.json");
    std::filesystem::remove(path() + "/stimulus.csv");
    std::filesystem::create_directory(path() + "/stimulus.csv");
    folder.write("set/stimulus.csv/mine.txt", "x");
    settings.blocks = 1;
    try {
        make();
        FAIL() << "accepted";
    } catch (const morvik::base::Error& error) {
        EXPECT_EQ(error.what(), path() + "/stimulus.csv: is a folder, the earlier set has a file of this name");
    }
    EXPECT_EQ(read("manifest.json"), manifest);
    EXPECT_EQ(read("stimulus.csv/mine.txt"), "x");
    EXPECT_EQ(names(), ofCsv);
}

TEST_F(SetFolder, LeavesAloneWhatOthersKeepWhereUnfinishedOnesAre)
{
    const std::string aside = path() + "/.morvik-unfinished";
    const auto expectNotMade = [this](const std::string& message) {
        try {
            make();
            FAIL() << "accepted";
        } catch (const morvik::base::Error& error) {
            EXPECT_EQ(error.what(), message);
        }
    };
    std::filesystem::create_directory(path());
    std::filesystem::create_directory(folder.path("precious"));
    folder.write("precious/blocks.csv", "x");
    const std::string noFolder = ": is not a folder; remove it or choose another folder";
    std::filesystem::create_symlink("../precious", aside);
    expectNotMade(aside + noFolder);
    std::filesystem::remove(aside);

    std::filesystem::create_directory(aside);
    std::filesystem::create_symlink("../../precious", aside + "/earlier");
    expectNotMade(aside + "/earlier" + noFolder);
    std::filesystem::remove(aside + "/earlier");
    EXPECT_EQ(folder.read("precious/blocks.csv"), "x");

    folder.write("set/.morvik-unfinished/mine.txt", "x");
    expectNotMade(aside + "/mine.txt: is not a file of a set; " + aside + " is for unfinished ones alone");
    EXPECT_EQ(read(".morvik-unfinished/mine.txt"), "x");
}

TEST_F(SetFolder, LeavesOtherFoldersAlone)
{
    std::filesystem::create_directory(path());
    folder.write("set/mine.txt", "x");
    try {
        make();
        FAIL() << "accepted";
    } catch (const morvik::base::Error& error) {
        EXPECT_EQ(error.what(), path() + ": is not empty and holds no manifest.json of an earlier set");
    }
    EXPECT_EQ(read("mine.txt"), "x");
}

TEST_F(SetFolder, CannotBeMadeInAFile)
{
    folder.write("set", "x");
    EXPECT_THROW(make(), morvik::base::Error);
}

}  // namespace
}  // namespace morvik::support
