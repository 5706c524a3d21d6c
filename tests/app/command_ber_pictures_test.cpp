// morvik ber and merge: the plot and the report that they leave.
#include <gtest/gtest.h>

#include <filesystem>
#include <iterator>
#include <regex>
#include <string>
#include <vector>

#include "support/BerTest.h"

namespace morvik::support {
namespace {

class BerPictures : public BerTest {
protected:
    /// Expects that the run is refused in this line, before anything is simulated or written.
    void expectRefusedAtOnce(const std::string& options, const std::string& line) const
    {
        SCOPED_TRACE(options);
        const std::vector<std::string> before = morvik.names();
        expectRefused(words("ber --block-size 40 --ebn0 0 --output results.csv " + options), "morvik ber: " + line);
        EXPECT_EQ(morvik.names(), before);
    }
};

const Arguments twoCurves =
    words("--block-size 40 --algorithm max-log,scaled --ebn0 0,2 --max-blocks 300 --block-errors 1000");

/// What a reader sees of a page.
std::string withoutTags(const std::string& page)
{
    return std::regex_replace(page, std::regex("<[^>]*>"), "");
}

TEST_F(BerPictures, ShowEachCurveAndTheReferences)
{
    morvik.write("other.csv", "# title: another decoder\nebn0_db,ber,fer\n0,1e-1,5e-1\n1,1e-2,1e-1\n");
    ber(twoCurves + words("--plot curves.svg --report report.html --reference other.csv"));
    for (const char* file : {"curves.svg", "report.html"}) {
        SCOPED_TRACE(file);
        const std::string text = morvik.read(file);
        EXPECT_NE(text.find("K = 40, 2 units, max-log, 8 iterations"), std::string::npos);
        EXPECT_NE(text.find("K = 40, 2 units, scaled, 8 iterations"), std::string::npos);
        EXPECT_NE(text.find("another decoder"), std::string::npos);
    }
    EXPECT_EQ(morvik.names(), (std::vector<std::string>{"curves.svg", "other.csv", "report.html"}));
}

TEST_F(BerPictures, AreEnoughForAQuietRun)
{
    EXPECT_EQ(ber(twoCurves + words("--quiet --plot curves.svg")), "");
    EXPECT_EQ(ber(twoCurves + words("--quiet --report report.html")), "");
    EXPECT_EQ(morvik.names(), words("curves.svg report.html"));
}

TEST_F(BerPictures, TellTheCountsAndHowTheRunIsRepeated)
{
    const std::string rates = berFile(twoCurves + words("--seed 7 --report report.html"));
    const std::string page = withoutTags(morvik.read("report.html"));
    EXPECT_NE(page.find("morvik ber --block-size 40 --num-pu 2 --algorithm max-log,scaled"), std::string::npos);
    EXPECT_NE(page.find("--seed 7"), std::string::npos);
    const std::vector<CsvRow> rows = csvRows(rates);
    EXPECT_EQ(rows.size(), 4U);
    for (const CsvRow& row : rows) {
        EXPECT_NE(page.find(row.at("block_errors")), std::string::npos) << row.at("block_errors");
    }
}

TEST_F(BerPictures, AreDrawnOfEarlierResultsToo)
{
    berFile(twoCurves);
    ber(twoCurves + words("--output results.csv --resume --plot again.svg"));
    EXPECT_NE(morvik.read("again.svg").find("K = 40, 2 units, scaled, 8 iterations"), std::string::npos);
}

TEST_F(BerPictures, TakeResultsOfEitherFormatAsReferences)
{
    berFile(twoCurves, "before.json");
    berFile(twoCurves, "before.csv");
    ber(twoCurves + words("--plot a.svg --reference before.json"));
    ber(twoCurves + words("--plot b.svg --reference before.csv"));
    EXPECT_NE(morvik.read("a.svg").find("before: K = 40, 2 units, max-log, 8 iterations"), std::string::npos);
    EXPECT_TRUE(morvik.read("a.svg") == morvik.read("b.svg"));
    morvik.write("bad.json", "{}");
    const CommandResult bad = morvik.run(Arguments{"ber"} + twoCurves + words("--plot c.svg --reference bad.json"));
    EXPECT_EQ(bad.status, 2);
    EXPECT_EQ(bad.err, "morvik ber: bad.json: lacks \"version\"\n");
}

TEST_F(BerPictures, OverEitherAxisHaveAllCurves)
{
    berFile(words("--block-size 40 --ebn0 4,5 --max-blocks 50"), "a.csv");
    berFile(words("--block-size 40 --modulation qpsk --esn0 1,2 --max-blocks 50"), "b.csv");
    const auto pointsIn = [this](const std::string& arguments) {
        EXPECT_EQ(morvik.run(words("merge " + arguments + " --output all.csv --plot all.svg")).err, "");
        const std::string picture = morvik.read("all.svg");
        const std::regex point("<use xlink");
        return std::distance(std::sregex_iterator(picture.begin(), picture.end(), point), std::sregex_iterator());
    };
    const auto alone = pointsIn("b.csv");
    const auto together = pointsIn("a.csv b.csv");
    EXPECT_GT(together, alone + 2) << "and more than in the legend";
    EXPECT_EQ(pointsIn("b.csv --reference a.csv"), together);
}

TEST_F(BerPictures, ThatCannotBeWrittenEndTheRunBeforeItBegins)
{
    expectRefusedAtOnce("--plot curves.gif",
                        "curves.gif: a plot's format follows from its suffix, expected .svg, .png or .pdf");
    expectRefusedAtOnce("--plot nowhere/curves.svg",
                        "nowhere/curves.svg: cannot be written: No such file or directory");
    expectRefusedAtOnce("--report nowhere/report.html",
                        "nowhere/report.html: cannot be written: No such file or directory");
    expectRefusedAtOnce("--report results.csv",
                        "results.csv: is not a name for a report, expected one that ends in .html");
    expectRefusedAtOnce("--reference nothing.csv", "nothing.csv: cannot be opened: No such file or directory");
    morvik.write("bad.csv", "ebn0_db,ber\n0,much\n");
    expectRefusedAtOnce("--reference bad.csv",
                        "bad.csv:2: \"much\" in the column ber is not allowed, expected a number from 0 to 1");
    morvik.write("other.csv", "esn0_db,ber\n0,0.1\n");
    expectRefusedAtOnce("--reference other.csv",
                        "other.csv:2: row without Eb/N0, over which curves are drawn here; it could be computed with "
                        "block_size, or with transport_block_size, coded_bits and modulation");
}

TEST_F(BerPictures, ThatWouldTakeThePlaceOfTheResultsEndTheRunBeforeItBegins)
{
    std::filesystem::create_symlink("results.csv", morvik.directory() + "/curves.svg");
    std::filesystem::create_symlink("curves.svg", morvik.directory() + "/report.html");
    expectRefusedAtOnce("--plot curves.svg", "curves.svg: is the same file as results.csv, each output needs its own");
    expectRefusedAtOnce("--report report.html",
                        "report.html: is the same file as results.csv, each output needs its own");
}

TEST_F(BerPictures, ThatWouldTakeThePlaceOfWhatIsReadEndTheRunBeforeItBegins)
{
    const std::string published = "ebn0_db,ber\n0,0.1\n";
    morvik.write("published.csv", published);
    std::filesystem::create_symlink("published.csv", morvik.directory() + "/curves.svg");
    const std::string why = ": is read as published.csv, results need a file of their own\n";
    const Arguments run = words("ber --block-size 40 --ebn0 0 --max-blocks 1 --reference published.csv");
    EXPECT_EQ(morvik.run(run + words("--output published.csv --overwrite")).err, "morvik ber: published.csv" + why);
    EXPECT_EQ(morvik.run(run + words("--plot curves.svg")).err, "morvik ber: curves.svg" + why);
    EXPECT_EQ(morvik.run(words("merge published.csv --output published.csv")).err, "morvik merge: published.csv" + why);
    EXPECT_EQ(morvik.read("published.csv"), published);
}

// ---- Of joined results

class MergePictures : public BerPictures {
protected:
    /// Makes a.csv and b.csv of the halves of some frames.
    void makeHalves() const
    {
        const Arguments run = words("--block-size 40 --ebn0 0,2 --seed 7 --frames");
        berFile(run + Arguments{"0:100"}, "a.csv");
        berFile(run + Arguments{"100:300"}, "b.csv");
    }

    /// Runs `morvik merge`, and expects that it succeeds. Returns what it printed.
    std::string merge(const std::string& arguments) const
    {
        const CommandResult result = morvik.run(words("merge " + arguments));
        EXPECT_EQ(result.status, 0) << result.err;
        EXPECT_EQ(result.err, "");
        return result.out;
    }
};

TEST_F(MergePictures, ShowTheSumsAndTheReferences)
{
    makeHalves();
    morvik.write("other.csv", "# title: another decoder\nebn0_db,ber,fer\n0,1e-1,5e-1\n1,1e-2,1e-1\n");
    merge("a.csv b.csv --output all.csv --plot all.svg --report all.html --reference other.csv");
    for (const char* file : {"all.svg", "all.html"}) {
        SCOPED_TRACE(file);
        EXPECT_NE(morvik.read(file).find("K = 40, 2 units, scaled, 8 iterations"), std::string::npos);
        EXPECT_NE(morvik.read(file).find("another decoder"), std::string::npos);
    }
    const std::string page = withoutTags(morvik.read("all.html"));
    const std::vector<CsvRow> rows = csvRows(morvik.read("all.csv"));
    ASSERT_EQ(rows.size(), 2U);
    for (const CsvRow& row : rows) {
        EXPECT_EQ(row.at("blocks"), "300");
        EXPECT_NE(page.find(row.at("block_errors")), std::string::npos) << row.at("block_errors");
    }
    EXPECT_NE(page.find("morvik merge a.csv b.csv"), std::string::npos);
    EXPECT_NE(page.find("Points2\nSeed7\n"), std::string::npos) << page;
}

TEST_F(MergePictures, AreAllThatIsMadeIfNoOutputIsNamed)
{
    makeHalves();
    EXPECT_EQ(merge("a.csv --plot a.svg"), "") << "of one file, too";
    EXPECT_EQ(morvik.names(), words("a.csv a.svg b.csv"));
}

TEST_F(MergePictures, ThatCannotBeMadeAreRefusedBeforeAnythingIsWritten)
{
    makeHalves();
    const auto expectNothingWritten = [this](const std::string& options, const std::string& line) {
        expectRefused(words("merge a.csv b.csv --output all.csv " + options), "morvik merge: " + line);
        EXPECT_EQ(morvik.names(), words("a.csv b.csv"));
    };
    expectNothingWritten("--plot all.gif",
                         "all.gif: a plot's format follows from its suffix, expected .svg, .png or .pdf");
    expectNothingWritten("--report all.csv", "all.csv: is not a name for a report, expected one that ends in .html");
    expectNothingWritten("--reference none.csv", "none.csv: cannot be opened: No such file or directory");
    morvik.write("empty.csv", morvik.read("a.csv").substr(0, morvik.read("a.csv").find('\n') + 1));
    expectRefused(words("merge empty.csv --plot all.svg"), "morvik merge: there are no points to draw");
}

}  // namespace
}  // namespace morvik::support
