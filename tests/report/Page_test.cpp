// Page: the report as text. What a browser makes of it is looked at in report_in_browser.py.
#include "report/Page.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <regex>

#include "support/CommaLocale.h"
#include "support/SampleCurves.h"
#include "support/TemporaryFolder.h"

namespace morvik::report {
namespace {

class Page : public testing::Test {
protected:
    std::string path(const std::string& name = "r.html") const
    {
        return itsFiles.path(name);
    }

    std::string page(const std::vector<Curve>& curves, const RunDescription& run = {}) const
    {
        writeReport(path(), curves, run);
        return itsFiles.read("r.html");
    }

    const morvik::support::TemporaryFolder itsFiles;
};

std::size_t count(const std::string& text, const std::string& part)
{
    std::size_t found = 0;
    for (std::size_t at = text.find(part); at != std::string::npos; at = text.find(part, at + 1)) {
        ++found;
    }
    return found;
}

TEST_F(Page, HoldsTitleParametersAndCommand)
{
    const std::string text =
        page(morvik::support::sampleCurves(), {"A run", {{"Seed", "7"}, {"Note", "a < b"}}, "morvik ber --seed 7"});
    EXPECT_EQ(text.rfind("<!DOCTYPE html>\n<html lang=\"en\">", 0), 0U);
    EXPECT_EQ(count(text, "<title>A run</title>"), 1U);
    EXPECT_EQ(count(text, "<h1>A run</h1>"), 1U);
    EXPECT_EQ(count(text, "<th scope=\"row\">Seed</th><td>7</td>"), 1U);
    EXPECT_EQ(count(text, "<td>a &lt; b</td>"), 1U);
    EXPECT_EQ(count(text, "<span>morvik</span> <span>ber</span> <span>--seed</span> <span>7</span>"), 1U);
    EXPECT_EQ(count(text, "2 curves and 1 reference, 29 points"), 1U);
}

TEST_F(Page, HasARowForEachPoint)
{
    const std::string text = page(morvik::support::sampleCurves());
    EXPECT_EQ(count(text, "<tr id=\"p"), 29U);
    EXPECT_EQ(count(text, "<tbody"), 3U);
    EXPECT_EQ(count(text, "<tbody class=\"reference\">"), 1U);
    EXPECT_EQ(count(text,
                    "<td>1.00</td><td>4.18e-03</td><td>3.73e-03 \u2026 4.67e-03</td><td>7.13e-02</td>"
                    "<td>6.36e-02 \u2026 "
                    "7.98e-02</td><td>4\u202f224</td><td>9\u202f030</td><td>301</td><td>2.72e-03</td></tr>"),
              1U);
    EXPECT_EQ(
        count(text, "<td>&lt; 3.00e-06</td><td>no error seen</td><td>1\u202f000\u202f000</td><td>0</td><td>0</td>"),
        2U);
    EXPECT_EQ(count(text, "<td>\u22120.10</td><td>5.55e-02</td><td></td>"), 1U) << "the reference has no intervals";
}

TEST_F(Page, LeavesOutWhatIsNotKnown)
{
    Sample sample;
    sample.bler = 0;
    const std::string text = page({Curve{"c", false, {sample}}});
    EXPECT_EQ(count(text,
                    "<td>0.00</td><td>\u2013</td><td></td><td>0</td><td></td><td>\u2013</td><td>\u2013</td><td>\u2013</"
                    "td></tr>"),
              1U);
    EXPECT_EQ(count(text, "Clipped"), 0U);
    EXPECT_EQ(count(text, "\"ber\":null,\"bler\":{\"value\":0,"), 1U);
    EXPECT_EQ(count(text, "Parameters"), 0U);
    EXPECT_EQ(count(text, "<h2>Command"), 0U);
}

TEST_F(Page, TextsAreNeverMarkup)
{
    const auto curves = morvik::support::hostileCurves();
    const std::string text = page(curves, {curves[1].title, {{curves[0].title, curves[1].title}}, curves[0].title});
    EXPECT_EQ(count(text, "<script"), 2U) << "the data and the program";
    EXPECT_EQ(count(text, "</script"), 2U);
    EXPECT_EQ(count(text, "<img"), 0U);
    EXPECT_EQ(count(text, "\"title\":\"\\u003c/script>\\u003cscript>console.error('script')\\u003c/script>\""), 1U);
    EXPECT_EQ(
        count(text, "\"title\":\"\\u003cimg src=x onerror=\\\"console.error('image')\\\"> & 'quoted' \\\\\\\" ?  \""),
        1U);
}

TEST_F(Page, NamesNoOtherPlace)
{
    const std::string text = page(morvik::support::sampleCurves());
    const std::regex place("(https?:)?//[A-Za-z0-9][^\"' ]*|url\\(|@import| src=| href=");
    std::vector<std::string> places;
    for (std::sregex_iterator found(text.begin(), text.end(), place), end; found != end; ++found) {
        places.push_back(found->str());
    }
    EXPECT_EQ(places, std::vector<std::string>{"http://www.w3.org/2000/svg"}) << "a namespace, which is not loaded";
    EXPECT_EQ(count(text, "content=\"default-src 'none';"), 1U);
}

TEST_F(Page, TheSameCurvesGiveTheSamePage)
{
    const std::string text = page(morvik::support::sampleCurves());
    const CommaLocale locale;
    EXPECT_TRUE(page(morvik::support::sampleCurves()) == text);
}

TEST_F(Page, IsWrittenWhollyOrNotAtAll)
{
    checkReport(path());
    EXPECT_FALSE(std::filesystem::exists(path()));
    for (const auto& function :
         {std::function<void(const std::string&)>(checkReport),
          std::function<void(const std::string&)>([](const std::string& name) { writeReport(name, {}, {}); })}) {
        try {
            function(path("none/r.html"));
            ADD_FAILURE() << "there is no such folder";
        } catch (const std::runtime_error& error) {
            EXPECT_EQ(error.what(), path("none/r.html") + ": cannot be written: No such file or directory");
        }
    }
    page({});
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(itsFiles.path()), {}), 1);
}

}  // namespace
}  // namespace morvik::report
