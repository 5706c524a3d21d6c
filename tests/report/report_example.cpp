// report_example: writes plots and pages of made-up curves into a folder, for tests that look at the files.
//   report_example FOLDER
#include <exception>
#include <iostream>
#include <string>

#include "report/CoveragePage.h"
#include "report/Page.h"
#include "report/Plot.h"
#include "support/SampleCurves.h"

namespace {

void write(const std::string& folder)
{
    const std::vector<morvik::report::Curve> curves = morvik::support::sampleCurves();
    const std::string title = "Error rates of a made-up decoder";
    for (const char* const name : {"/plot.svg", "/plot.png", "/plot.pdf"}) {
        morvik::report::writePlot(folder + name, curves, title);
    }
    morvik::report::writeReport(
        folder + "/report.html",
        curves,
        {title,
         {{"Block size", "512"}, {"Processing units", "8"}, {"Stop rule", "300 block errors"}, {"Seed", "1"}},
         "morvik ber --block-size 512 --algorithm scaled,max-log --seed 1"});
}

void writeIterations(const std::string& folder)
{
    const std::vector<morvik::report::Curve> curves = morvik::support::iterationCurves(12, {0, 0.25, 0.5, 0.75, 1});
    morvik::report::writePlot(folder + "/iterations.png", curves, "After each iteration");
    morvik::report::writeReport(folder + "/iterations.html", curves, {"After each iteration", {}, ""});
    morvik::report::writeReport(
        folder + "/one_ebn0.html", morvik::support::iterationCurves(12, {1}), {"At one Eb/N0", {}, ""});
}

void writeHostile(const std::string& folder)
{
    const std::vector<morvik::report::Curve> curves = morvik::support::hostileCurves();
    morvik::report::writePlot(folder + "/hostile.svg", curves, curves[1].title);
    morvik::report::writeReport(
        folder + "/hostile.html", curves, {curves[1].title, {{curves[1].title, curves[0].title}}, curves[0].title});
}

void writeCoverage(const std::string& folder)
{
    morvik::report::CoverageDescription coverage;
    coverage.lead = "3 of 4 met";
    coverage.cores = {{"2 units, max-log", 1234}};
    coverage.rows = {{3, "tie.forward.0", "The candidates are <equal>", 1000000, ""},
                     {3, "tie.forward.1", "The candidates & what follows", 0, ""},
                     {9, "table.none", "A difference is beyond the table", 0, "max-log has no table"},
                     {16, "decision.zero", "A ratio is 0", 1, ""},
                     {16, "decision.one", "A ratio is positive", 1000, ""}};
    morvik::report::writeCoveragePage(folder + "/coverage.html", coverage);
}

}  // namespace

int main(int argc, char** argv)
{
    if (argc != 2) {
        std::cerr << "report_example: one argument is needed, the folder\n";
        return 2;
    }
    try {
        write(argv[1]);
        writeIterations(argv[1]);
        writeHostile(argv[1]);
        writeCoverage(argv[1]);
        return 0;
    } catch (const std::exception& error) {
        std::cerr << "report_example: " << error.what() << '\n';
        return 1;
    }
}
