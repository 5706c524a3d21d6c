// Plot: which files are drawn, that they replace others as a whole, and in what words it is told why not.
#include "report/Plot.h"

#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>

#include "support/CommaLocale.h"
#include "support/SampleCurves.h"
#include "support/TemporaryFolder.h"

namespace morvik::report {
namespace {

/// What is looked up in PATH, for the lifetime of the object.
class ProgramsIn {
public:
    explicit ProgramsIn(const std::string& folder) : itsPrevious(std::getenv("PATH"))
    {
        setenv("PATH", folder.c_str(), 1);
    }

    ~ProgramsIn()
    {
        setenv("PATH", itsPrevious.c_str(), 1);
    }

    ProgramsIn(const ProgramsIn&) = delete;
    ProgramsIn& operator=(const ProgramsIn&) = delete;

private:
    std::string itsPrevious;
};

class Plot : public testing::Test {
protected:
    std::string path(const std::string& name) const
    {
        return itsFiles.path(name);
    }

    std::string drawn(const std::string& name, const std::vector<Curve>& curves = morvik::support::sampleCurves()) const
    {
        writePlot(path(name), curves, "Title");
        return itsFiles.read(name);
    }

    /// Puts a program of this name and content into a folder, and tells which.
    std::string folderWith(const std::string& program, const std::string& content) const
    {
        std::filesystem::create_directory(path("bin"));
        itsFiles.write("bin/" + program, content);
        chmod(path("bin/" + program).c_str(), 0755);
        return path("bin");
    }

    const morvik::support::TemporaryFolder itsFiles;
};

template <class Function>
std::string refusal(Function function)
{
    try {
        function();
    } catch (const std::runtime_error& error) {
        return error.what();
    }
    return "not refused";
}

/// What the check and the drawing say, which is the same.
std::string sayings(const std::string& path)
{
    std::string check = refusal([&path] { checkPlot(path); });
    EXPECT_EQ(check, refusal([&path] { writePlot(path, morvik::support::sampleCurves(), "Title"); }));
    return check;
}

TEST_F(Plot, TheSuffixTellsTheFormat)
{
    EXPECT_EQ(drawn("a.svg").substr(0, 5), "<?xml");
    EXPECT_EQ(drawn("a.png").substr(0, 8), "\x89PNG\r\n\x1a\n");
    EXPECT_EQ(drawn("a.pdf").substr(0, 5), "%PDF-");
    EXPECT_EQ(itsFiles.names(), (std::vector<std::string>{"a.pdf", "a.png", "a.svg"}));
}

TEST_F(Plot, CheckingLeavesNothing)
{
    for (const char* const name : {"a.svg", "a.png", "a.pdf"}) {
        checkPlot(path(name));
    }
    EXPECT_TRUE(itsFiles.names().empty());
    itsFiles.write("a.svg", "old");
    checkPlot(path("a.svg"));
    EXPECT_EQ(itsFiles.read("a.svg"), "old");
}

TEST_F(Plot, RefusesOtherSuffixes)
{
    const std::string words = ": a plot's format follows from its suffix, expected .svg, .png or .pdf";
    for (const char* const name : {"a.jpg", "a", "a.svg.gz", "a.SVG", ".svg"}) {
        EXPECT_EQ(sayings(path(name)), path(name) + words);
    }
}

TEST_F(Plot, RefusesPlacesWhereNothingCanBeWritten)
{
    EXPECT_EQ(sayings(path("none/a.svg")), path("none/a.svg") + ": cannot be written: No such file or directory");
    std::filesystem::create_directory(path("folder.svg"));
    const std::string said = refusal([this] { checkPlot(path("folder.svg")); });
    EXPECT_EQ(said.rfind(path("folder.svg") + ": ", 0), 0U) << said;
    EXPECT_EQ(itsFiles.names(), std::vector<std::string>{"folder.svg"});
}

TEST_F(Plot, SaysWhenGnuplotIsMissing)
{
    const ProgramsIn programs(itsFiles.path());
    EXPECT_EQ(sayings(path("a.svg")),
              path("a.svg") +
                  ": needs gnuplot (Debian package gnuplot-nox), which cannot be started: No such file or directory");
    EXPECT_TRUE(itsFiles.names().empty());
}

TEST_F(Plot, SaysWhatGnuplotSaysAndKeepsWhatWasThere)
{
    itsFiles.write("a.png", "old");
    const ProgramsIn programs(
        folderWith("gnuplot",
                   "#!/bin/sh\necho 'gnuplot> set terminal'\n"
                   "printf '%s\\n' 'set terminal' '   ^' '     line 0: unknown terminal' '' >&2\nexit 1\n"));
    EXPECT_EQ(sayings(path("a.png")), path("a.png") + ": cannot be drawn: gnuplot says: line 0: unknown terminal");
    EXPECT_EQ(itsFiles.read("a.png"), "old");
    EXPECT_EQ(itsFiles.names(), (std::vector<std::string>{"a.png", "bin"}));
}

TEST_F(Plot, SaysWhenGnuplotWasEndedByASignal)
{
    const ProgramsIn programs(folderWith("gnuplot", "#!/bin/sh\nkill -9 $$\n"));
    EXPECT_EQ(sayings(path("a.png")), path("a.png") + ": cannot be drawn: gnuplot failed");
}

TEST_F(Plot, ReplacesWhatWasThereWhereALinkLeads)
{
    itsFiles.write("target.svg", "old");
    std::filesystem::create_symlink("target.svg", path("link.svg"));
    EXPECT_EQ(drawn("link.svg").substr(0, 5), "<?xml");
    EXPECT_TRUE(std::filesystem::is_symlink(path("link.svg")));
    EXPECT_TRUE(itsFiles.read("target.svg") == itsFiles.read("link.svg"));
}

TEST_F(Plot, FilesMayHaveAnyName)
{
    const std::string name = "a'b \"c\" `touch x`; $(touch y) \\ # %d\n\xff.svg";
    EXPECT_EQ(drawn(name).substr(0, 5), "<?xml");
    EXPECT_EQ(itsFiles.names(), std::vector<std::string>{name});
}

TEST_F(Plot, TheUsersOwnSettingsHaveNoSay)
{
    itsFiles.write(".gnuplot", "exit status 3\n");
    const std::string home = std::getenv("HOME") == nullptr ? "/" : std::getenv("HOME");
    setenv("HOME", itsFiles.path().c_str(), 1);
    const std::string picture = drawn("a.svg");
    setenv("HOME", home.c_str(), 1);
    EXPECT_EQ(picture.substr(0, 5), "<?xml");
}

TEST_F(Plot, TheSameCurvesGiveTheSamePicture)
{
    const std::string picture = drawn("a.svg");
    const CommaLocale locale;
    EXPECT_TRUE(drawn("b.svg") == picture);
}

TEST_F(Plot, DrawsWhatThereIs)
{
    const auto holds = [](const std::string& picture, const std::string& text) {
        return picture.find(text) != std::string::npos;
    };
    EXPECT_TRUE(holds(drawn("none.svg", {}), "Bit error rate"));
    EXPECT_TRUE(holds(drawn("empty.svg", {Curve{"nothing yet", false, {}}}), "nothing yet"));

    Sample sample;
    sample.ebn0 = 1;
    sample.ber = 1e-12;
    EXPECT_TRUE(holds(drawn("one.svg", {Curve{"one", false, {sample}}}), ">one<"));
    EXPECT_FALSE(holds(itsFiles.read("one.svg"), "Block error rate (BLER)")) << "only one rate is known";

    sample.bler = 0.5;
    sample.blerLow = 0;
    sample.blerHigh = 1;
    EXPECT_TRUE(holds(drawn("two.svg", {Curve{"two", false, {sample}}}), "Block error rate (BLER)"));
}

TEST_F(Plot, ZeroHasNoPlaceOnALogarithmicAxis)
{
    std::vector<Curve> curves = morvik::support::sampleCurves();
    const std::string picture = drawn("a.svg", curves);
    Sample zero;
    zero.ebn0 = 0.5;
    zero.ber = zero.bler = 0;
    curves[0].samples.push_back(zero);
    EXPECT_TRUE(drawn("b.svg", curves) == picture);
}

TEST_F(Plot, ManySeriesAndLongTitlesStayWithinThePicture)
{
    std::vector<Curve> curves;
    for (int i = 0; i < 40; ++i) {
        curves.push_back(morvik::support::sampleCurves()[1]);
        curves.back().title = std::to_string(i) + std::string(300, 'x');
    }
    const std::string picture = drawn("a.svg", curves);
    EXPECT_NE(picture.find(">39" + std::string(107, 'x') + "\u2026<"), std::string::npos);
    EXPECT_NE(picture.find("height=\"" + std::to_string(72 + 430 + 66 + 40 * 22 + 34) + "\""), std::string::npos);
}

TEST_F(Plot, ShowsIterationsInPanelsOfTheirOwn)
{
    const std::string both = drawn("a.svg", morvik::support::iterationCurves(4, {0, 0.25, 1.5}));
    EXPECT_NE(both.find(">Iterations<"), std::string::npos);
    EXPECT_NE(both.find(">K = 512, 8 units, scaled, 4 iterations<"), std::string::npos);
    EXPECT_NE(both.find(">K = 512, 8 units, scaled, 0.25 dB<"), std::string::npos);
    EXPECT_NE(both.find("height=\"" + std::to_string(2 * (72 + 430 + 66) + (2 + 1) * 22 + 34) + "\""),
              std::string::npos)
        << both.substr(0, 300);
    const std::string one = drawn("b.svg", morvik::support::iterationCurves(4, {0.25}));
    EXPECT_NE(one.find(">Iterations<"), std::string::npos);
    EXPECT_EQ(one.find("4 iterations<"), std::string::npos) << "points are no curve";
    EXPECT_NE(one.find("height=\"" + std::to_string(72 + 430 + 66 + 22 + 34) + "\""), std::string::npos);
}

}  // namespace

TEST_F(Plot, ShowsTheThroughputBesideShannonsLimit)
{
    std::vector<Curve> curves = morvik::support::sampleCurves();
    EXPECT_EQ(drawn("rates.svg", curves).find("Shannon"), std::string::npos);
    for (Sample& sample : curves[1].samples) {
        sample.esn0 = sample.ebn0 + 2;
        sample.throughput = 1.5 * (1 - sample.bler);
    }
    const std::string picture = drawn("throughput.svg", curves);
    EXPECT_NE(picture.find("Throughput in bits per symbol; dotted: Shannon's limit"), std::string::npos);
    EXPECT_NE(picture.find("Block error rate (BLER)"), std::string::npos);
    EXPECT_EQ(picture.find("Bit error rate"), std::string::npos);
    EXPECT_NE(picture.find("throughput against Es/N0"), std::string::npos) << "in the description";
}

}  // namespace morvik::report
