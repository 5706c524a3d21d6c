// Plot: curves and shapes drawn to a file by gnuplot.
#include "Plot.h"

#include <algorithm>
#include <system_error>

#include "PlotScript.h"
#include "Series.h"
#include "Wording.h"
#include "base/ChildProcess.h"
#include "base/Error.h"
#include "base/OutputFile.h"
#include "base/Path.h"

namespace morvik::report {

namespace {

[[noreturn]] void fail(const std::string& fileName, const std::string& what)
{
    throw base::Error(fileName + ": " + what);
}

/// Returns the format; throws if it is unknown.
std::string suffixOf(const std::string& fileName)
{
    std::string suffix = base::pathOf(fileName).extension().u8string();
    if (suffix != ".svg" && suffix != ".png" && suffix != ".pdf") {
        fail(fileName, "a plot's format follows from its suffix, expected .svg, .png or .pdf");
    }
    return suffix;
}

/// gnuplot's error message on one line. gnuplot prints the command above it, with a mark below the place.
std::string lastLine(const std::string& messages)
{
    const std::size_t end = messages.find_last_not_of(" \n");
    if (end == std::string::npos) {
        return "gnuplot failed";
    }
    const std::size_t start = messages.find_last_of('\n', end);
    const std::string line = messages.substr(start + 1, end - start);
    return "gnuplot says: " + printable(line.substr(std::min(line.find_first_not_of(' '), line.size())));
}

/// Returns gnuplot's standard output. gnuplot does not read the user's own settings.
std::string draw(const std::string& fileName, const std::string& script)
{
    try {
        base::Outcome outcome = base::runProgram({"gnuplot", "-d", "-"}, script);
        if (!outcome.succeeded) {
            fail(fileName, "cannot be drawn: " + lastLine(outcome.err));
        }
        return std::move(outcome.out);
    } catch (const std::system_error& error) {
        fail(fileName,
             "needs gnuplot (Debian package gnuplot-nox), which cannot be started: " + error.code().message());
    }
}

/// Text alternative for readers who cannot see the picture.
std::string description(const std::vector<Curve>& curves)
{
    const std::vector<View> views = viewsOf(curves);
    const std::string both = views.size() > 1 ? " and against iterations" : "";
    const bool hasThroughput = quantitiesOf(curves).back() == &throughput;
    std::string text = (hasThroughput ? "Block error rates, on a logarithmic scale, and throughput against "
                                      : "Bit and block error rates against ") +
                       std::string(views[0].axis->title) + both +
                       (hasThroughput ? ". Series: " : ", on a logarithmic scale. Series: ");
    const std::vector<Curve>& ordered = views[0].curves;
    for (std::size_t i = 0; i < ordered.size(); ++i) {
        text += (i == 0 ? "" : "; ") + ordered[i].title + (ordered[i].reference ? " (reference)" : "");
    }
    return text + '.';
}

/// Replaces gnuplot's title and description, and removes those of the parts, which a browser would show as tooltips.
std::string labelled(std::string svg, const std::string& title, const std::string& description)
{
    std::size_t end = 0;
    const auto replaceNext = [&svg, &end](const std::string& element, const std::string& text) {
        const std::size_t start = svg.find('<' + element + '>', end);
        const std::string close = "</" + element + '>';
        end = start == std::string::npos ? start : svg.find(close, start);
        if (end == std::string::npos) {
            return false;
        }
        svg.replace(start, end + close.size() - start, text);
        end = start + text.size();
        return true;
    };
    const std::string titleElement = "<title>" + escaped(title) + "</title>";
    const std::string descriptionElement = "<desc>" + escaped(description) + "</desc>";
    if (replaceNext("title", titleElement) && replaceNext("desc", descriptionElement)) {
        while (replaceNext("title", "")) {
        }
    }
    const std::size_t root = svg.find("<svg");
    if (root != std::string::npos) {
        svg.insert(root + 4, " role=\"img\"");
    }
    return svg;
}

}  // namespace

void checkPlot(const std::string& fileName)
{
    const std::string suffix = suffixOf(fileName);
    base::checkWritable(fileName);
    draw(fileName, terminalCommand(suffix) + '\n');
}

void writePlot(const std::string& fileName, const std::vector<Curve>& curves, const std::string& title)
{
    const std::string suffix = suffixOf(fileName);
    std::string picture = draw(fileName, plotScript(suffix, curves, title));
    if (suffix == ".svg") {
        picture = labelled(std::move(picture), title, description(curves));
    }
    base::writeFile(fileName, picture);
}

void writeDrawing(const std::string& fileName, const Drawing& drawing)
{
    const std::string suffix = suffixOf(fileName);
    std::string picture = draw(fileName, drawing.script(suffix));
    if (suffix == ".svg") {
        picture = labelled(std::move(picture), drawing.title(), drawing.description());
    }
    base::writeFile(fileName, picture);
}

}  // namespace morvik::report
