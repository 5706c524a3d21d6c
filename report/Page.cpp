// Page: the report on a run, as one self-contained HTML file.
#include "Page.h"

#include <algorithm>
#include <cmath>
#include <locale>
#include <sstream>

#include "PageParts.h"
#include "Series.h"
#include "Wording.h"
#include "base/Error.h"
#include "base/Numbers.h"
#include "base/OutputFile.h"
#include "base/Path.h"
#include "base/Text.h"

namespace morvik::report {

namespace {

constexpr char noFigure[] = "\u2013";

// ---- Figures as the page shows them

std::string rateText(const Rate& rate)
{
    if (rate.isLinear) {
        return std::isfinite(rate.value) ? base::numberText(rate.value, std::chars_format::fixed, 4) : noFigure;
    }
    if (rate.below) {
        return "< " + report::rate(rate.high);
    }
    if (!std::isfinite(rate.value)) {
        return noFigure;
    }
    return rate.value == 0 ? "0" : report::rate(rate.value);
}

std::string intervalText(const Rate& rate)
{
    if (rate.below) {
        return "no error seen";
    }
    if (rate.isLinear && rate.hasInterval()) {
        return base::numberText(rate.low, std::chars_format::fixed, 4) + " \u2026 " +
               base::numberText(rate.high, std::chars_format::fixed, 4);
    }
    return rate.hasInterval() ? report::rate(rate.low) + " \u2026 " + report::rate(rate.high) : "";
}

/// A count; without blocks there is no figure.
std::string countText(const Sample& sample, std::uint64_t count)
{
    return sample.blocks > 0 ? grouped(count) : noFigure;
}

std::string clippedText(const Sample& sample)
{
    return std::isfinite(sample.clipped) ? report::rate(sample.clipped) : noFigure;
}

std::string rowName(const Sample& sample)
{
    return "p" + std::to_string(sample.row);
}

std::string colourName(const View& view, std::size_t curve)
{
    return view.axis->name + ("-" + std::to_string(curve));
}

// ---- Data for the script

/// A JSON string that is safe in a script element: nothing in it is taken as markup.
std::string json(const std::string& text)
{
    std::string result = "\"";
    for (const char c : printable(text)) {
        if (c == '<') {
            result += "\\u003c";
        } else {
            result += c == '"' || c == '\\' ? std::string("\\") + c : std::string(1, c);
        }
    }
    return result + '"';
}

std::string json(double value)
{
    return std::isfinite(value) ? base::numberText(value) : "null";
}

std::string json(const Rate& rate)
{
    if (!rate.below && !std::isfinite(rate.value)) {
        return "null";
    }
    return "{\"value\":" + json(rate.value) + ",\"low\":" + json(rate.low) + ",\"high\":" + json(rate.high) +
           ",\"below\":" + (rate.below ? "true" : "false") + ",\"text\":" + json(rateText(rate)) +
           ",\"interval\":" + json(intervalText(rate)) + '}';
}

std::string countsJson(const Sample& sample)
{
    std::string text;
    const auto append = [&text](bool known, const std::string& name, const std::string& figure) {
        if (known) {
            text += (text.empty() ? "[" : ",[") + json(name) + ',' + json(figure) + ']';
        }
    };
    append(sample.blocks > 0, "Blocks", grouped(sample.blocks));
    append(sample.blocks > 0, "Bit errors", grouped(sample.bitErrors));
    append(sample.blocks > 0, "Block errors", grouped(sample.blockErrors));
    append(std::isfinite(sample.clipped), "Clipped", clippedText(sample));
    return '[' + text + ']';
}

/// How a curve is drawn; samples are identified by their rows.
std::string curveJson(const View& view, std::size_t index)
{
    const Curve& curve = view.curves[index];
    const Look look = lookOf(view.curves, index, *view.axis);
    std::string text = "{\"index\":" + std::to_string(index) + ",\"title\":" + json(curve.title) +
                       ",\"reference\":" + (curve.reference ? "true" : "false") +
                       ",\"colour\":" + json(colourName(view, index)) + ",\"marker\":" + std::to_string(look.marker) +
                       ",\"dash\":" + std::to_string(look.dash) + ",\"layer\":" + std::to_string(look.layer) +
                       ",\"samples\":[";
    const char* separator = "";
    for (const Sample& sample : curve.samples) {
        text += separator + std::to_string(sample.row);
        separator = ",";
    }
    return text + "]}";
}

std::string rowJson(const Sample& sample)
{
    return "{\"row\":" + json(rowName(sample)) + ",\"ebn0\":" + json(sample.ebn0) + ",\"esn0\":" + json(sample.esn0) +
           ",\"place\":" + json(decibels(sample.place())) + ",\"iterations\":" + std::to_string(sample.iterations) +
           ",\"ber\":" + json(bitErrorRate.of(sample)) + ",\"bler\":" + json(blockErrorRate.of(sample)) +
           ",\"bits\":" + json(throughput.of(sample)) + ",\"counts\":" + countsJson(sample) + '}';
}

/// The samples in the order of their rows, and the views.
std::string dataJson(const std::vector<View>& views)
{
    std::string text = "{\"rows\":[";
    const char* separator = "\n";
    for (const Curve& curve : views[0].curves) {
        for (const Sample& sample : curve.samples) {
            text += separator + rowJson(sample);
            separator = ",\n";
        }
    }
    text += "],\n\"views\":[";
    separator = "\n";
    for (const View& view : views) {
        text += separator + ("{\"axis\":" + json(std::string(view.axis->name))) + ",\"curves\":[";
        separator = "\n";
        for (std::size_t i = 0; i < view.curves.size(); ++i) {
            text += separator + curveJson(view, i);
            separator = ",\n";
        }
        text += "]}";
        separator = ",\n";
    }
    return text + "]}";
}

// ---- The page

std::string style(const std::vector<View>& views)
{
    std::ostringstream text;
    text.imbue(std::locale::classic());
    const auto write = [&](std::string Colour::*side) {
        for (const View& view : views) {
            for (std::size_t i = 0; i < view.curves.size(); ++i) {
                text << " --" << colourName(view, i) << ": " << lookOf(view.curves, i, *view.axis).colour.*side << ';';
            }
        }
    };
    text << ":root {";
    write(&Colour::onLight);
    text << " }\n@media screen and (prefers-color-scheme: dark) { :root {";
    write(&Colour::onDark);
    text << " } }\n" << pageStyle;
    return text.str();
}

/// Forbids loading anything from anywhere.
std::string head(const std::string& title, const std::vector<View>& views)
{
    return "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
           "<meta http-equiv=\"Content-Security-Policy\" content=\"default-src 'none'; style-src 'unsafe-inline'; "
           "script-src 'unsafe-inline'; base-uri 'none'; form-action 'none'\">\n"
           "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n<title>" +
           escaped(title) + "</title>\n<style>\n" + style(views) + "</style>\n</head>\n";
}

/// "3 curves and 2 references, 40 points".
std::string lead(const std::vector<Curve>& curves)
{
    std::size_t references = 0;
    std::size_t points = 0;
    for (const Curve& curve : curves) {
        references += curve.reference ? 1 : 0;
        points += curve.samples.size();
    }
    return base::counted(curves.size() - references, "curve") +
           (references > 0 ? " and " + base::counted(references, "reference") : "") + ", " +
           base::counted(points, "point");
}

constexpr char figureStart[] = R"(<section id="figure" aria-labelledby="figure-title">
<h2 id="figure-title" class="unseen">Curves</h2>
<div class="controls">
<fieldset><legend>Show</legend>
<label class="choice"><input type="radio" name="quantity" value="ber" autocomplete="off" checked><span>BER</span></label>
<label class="choice"><input type="radio" name="quantity" value="bler" autocomplete="off"><span>BLER</span></label>
)";

constexpr char throughputChoice[] =
    R"(<label class="choice"><input type="radio" name="quantity" value="bits" autocomplete="off"><span>Throughput</span></label>
)";

constexpr char figureMiddle[] = R"(</fieldset>
)";

constexpr char axisChoiceStart[] = R"(<fieldset><legend>Against</legend>
<label class="choice"><input type="radio" name="axis" value=")";

constexpr char axisChoiceEnd[] =
    R"(</span></label>
<label class="choice"><input type="radio" name="axis" value="iterations" autocomplete="off"><span>Iterations</span></label>
</fieldset>
)";

constexpr char figureEnd[] =
    R"(<label class="check"><input type="checkbox" id="bars" autocomplete="off" checked>95 % confidence</label>
<p class="hint">Point at the curves, or use the arrow keys</p>
</div>
<div id="chart" tabindex="0" role="group" aria-label="Chart; the arrow keys go from point to point">
<div id="tip" role="status" hidden></div>
</div>
<noscript><p>The curves are drawn by a script, which is not allowed to run here. The table has all the figures.</p></noscript>
<ul id="legend" aria-label="Series; press to hide or show"></ul>
</section>
)";

bool hasThroughput(const View& view)
{
    return quantitiesOf(view.curves).back() == &throughput;
}

std::string axisChoice(const std::vector<View>& views)
{
    return views.size() < 2 ? ""
                            : axisChoiceStart + std::string(views[0].axis->name) + "\" autocomplete=\"off\"><span>" +
                                  views[0].axis->title + axisChoiceEnd;
}

bool hasClipped(const std::vector<Curve>& curves)
{
    return std::any_of(curves.begin(), curves.end(), [](const Curve& curve) {
        return std::any_of(curve.samples.begin(), curve.samples.end(), [](const Sample& sample) {
            return std::isfinite(sample.clipped);
        });
    });
}

void writeRow(std::ostream& page, const View& view, const Sample& sample, bool withClipped)
{
    const auto cell = [&page](const std::string& content) {
        page << "<td>" << content << "</td>";
    };
    page << "<tr id=\"" << rowName(sample) << "\">";
    const double place = view.axis->of(sample);
    cell(std::isfinite(place) ? decibels(place) : noFigure);
    for (const Quantity* quantity : {&bitErrorRate, &blockErrorRate}) {
        cell(escaped(rateText(quantity->of(sample))));
        cell(escaped(intervalText(quantity->of(sample))));
    }
    for (const std::uint64_t count : {sample.blocks, sample.bitErrors, sample.blockErrors}) {
        cell(countText(sample, count));
    }
    if (withClipped) {
        cell(clippedText(sample));
    }
    if (hasThroughput(view)) {
        cell(rateText(throughput.of(sample)));
    }
    page << "</tr>\n";
}

void writePoints(std::ostream& page, const View& view)
{
    const std::vector<Curve>& curves = view.curves;
    const bool withClipped = hasClipped(curves);
    page << "<section>\n<h2 id=\"points\">All points</h2>\n<div class=\"scroll\">\n"
            "<table class=\"points\" aria-labelledby=\"points\">\n<thead><tr><th "
            "scope=\"col\">E<sub>"
         << (view.axis == &esn0Axis ? 's' : 'b')
         << "</sub>/N<sub>0</sub> "
            "(dB)</th><th scope=\"col\">BER</th><th scope=\"col\">95 %</th><th scope=\"col\">BLER</th>"
            "<th scope=\"col\">95 %</th><th scope=\"col\">Blocks</th><th scope=\"col\">Bit errors</th>"
            "<th scope=\"col\">Block errors</th>"
         << (withClipped ? "<th scope=\"col\">Clipped</th>" : "")
         << (hasThroughput(view) ? "<th scope=\"col\">Bits per symbol</th>" : "") << "</tr></thead>\n";
    for (std::size_t i = 0; i < curves.size(); ++i) {
        page << "<tbody" << (curves[i].reference ? " class=\"reference\"" : "")
             << ">\n<tr><th scope=\"rowgroup\" colspan=\"" << 8 + (withClipped ? 1 : 0) + (hasThroughput(view) ? 1 : 0)
             << "\"><span class=\"swatch\" style=\"border-color: var(--" << colourName(view, i) << ")\"></span>"
             << escaped(curves[i].title) << (curves[i].reference ? " <small>reference</small>" : "") << "</th></tr>\n";
        for (const Sample& sample : curves[i].samples) {
            writeRow(page, view, sample, withClipped);
        }
        page << "</tbody>\n";
    }
    page << "</table>\n</div>\n</section>\n";
}

/// A command that may wrap between its words, but not at a hyphen.
std::string withWholeWords(const std::string& command)
{
    std::string result = "<span>";
    for (const char c : escaped(command)) {
        result += c == ' ' ? "</span> <span>" : std::string(1, c);
    }
    return result + "</span>";
}

void writeRun(std::ostream& page, const RunDescription& run)
{
    if (!run.parameters.empty()) {
        page << "<section>\n<h2 id=\"parameters\">Parameters</h2>\n"
                "<table class=\"parameters\" aria-labelledby=\"parameters\">\n";
        for (const auto& [name, value] : run.parameters) {
            page << "<tr><th scope=\"row\">" << escaped(name) << "</th><td>" << escaped(value) << "</td></tr>\n";
        }
        page << "</table>\n</section>\n";
    }
    if (!run.command.empty()) {
        page << "<section>\n<h2>Command</h2>\n<pre><code>" << withWholeWords(run.command)
             << "</code></pre>\n</section>\n";
    }
}

/// The curves in order, with each sample's row of the table.
std::vector<Curve> numbered(const std::vector<Curve>& curves)
{
    std::vector<Curve> result = inOrder(curves);
    std::size_t row = 0;
    for (Curve& curve : result) {
        for (Sample& sample : curve.samples) {
            sample.row = row++;
        }
    }
    return result;
}

}  // namespace

void checkReport(const std::string& fileName)
{
    if (base::pathOf(fileName).extension() != ".html") {
        throw base::Error(fileName + ": is not a name for a report, expected one that ends in .html");
    }
    base::checkWritable(fileName);
}

void writeReport(const std::string& fileName, const std::vector<Curve>& curves, const RunDescription& run)
{
    const std::vector<View> views = viewsOf(numbered(curves));
    std::ostringstream page;
    page.imbue(std::locale::classic());
    page << head(run.title, views) << "<body>\n<main>\n<h1>" << escaped(run.title) << "</h1>\n<p class=\"lead\">"
         << lead(curves) << "</p>\n"
         << figureStart << (hasThroughput(views[0]) ? throughputChoice : "") << figureMiddle << axisChoice(views)
         << figureEnd;
    writePoints(page, views[0]);
    writeRun(page, run);
    page << "<footer>Rates are given with their 95 % confidence intervals. Where no error was seen, the rate is below "
            "the bound that is given; the chart shows it as an open triangle with an arrow.</footer>\n</main>\n"
            "<script type=\"application/json\" id=\"data\">"
         << dataJson(views) << "</script>\n<script>\n"
         << pageScript << "</script>\n</body>\n</html>\n";
    base::writeFile(fileName, page.str());
}

}  // namespace morvik::report
