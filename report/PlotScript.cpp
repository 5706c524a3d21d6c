// PlotScript: what gnuplot is told.
#include "PlotScript.h"

#include <algorithm>
#include <cmath>
#include <locale>
#include <sstream>

#include "Series.h"
#include "Wording.h"

namespace report {

namespace {

// The picture's layout, in points; all panels share its width.
constexpr int width = pictureWidth;
constexpr int headerHeight = 72;  // title and the panels' headings
constexpr int panelHeight = 430;
constexpr int axisHeight = 66;  // numbers and name of the horizontal axis
constexpr int legendRowHeight = 22;
constexpr int noteHeight = 34;
constexpr int leftMargin = 62;  // of each panel, where its numbers are
constexpr int rightMargin = 18;

// In characters, so that they stay within the picture.
constexpr std::size_t longestTitle = 95;
constexpr std::size_t longestEntry = 110;  // of the legend
constexpr int characterWidth = 7;
constexpr int legendLine = 42;
constexpr int legendSample = 72;  // what an entry takes besides its title: line and spaces

constexpr double arrowLength = 0.4;  // a bound's arrow goes down to this fraction of it
constexpr char ink[] = "#222222";
constexpr char faintInk[] = "#666666";

std::string dashType(std::size_t dash)
{
    const char* const types[] = {"solid", "(9,5)", "(3,3)", "(10,4,2,4)"};
    return types[dash];
}

struct Range {
    double from;
    double to;
};

/// What a font and a marker of size 1 are called by a terminal, for they differ.
struct Measures {
    double font;
    double point;
};

/// The terminals that draw with Cairo measure fonts in points, of which 72 are 96 of their pixels.
Measures measuresOf(const std::string& suffix)
{
    return suffix == ".svg" ? Measures{1, 0.85} : Measures{0.75, 1};
}

class Script {
public:
    Script(const std::vector<Curve>& curves, const std::string& title, const Measures& measures)
        : itsCurves(inOrder(curves)), itsTitle(shortened(printable(title), longestTitle)), itsMeasures(measures)
    {
        itsText.imbue(std::locale::classic());
        for (const Quantity* quantity : {&bitErrorRate, &blockErrorRate}) {
            if (isDrawn(*quantity)) {
                itsQuantities.push_back(quantity);
            }
        }
        if (itsQuantities.empty()) {
            itsQuantities = {&bitErrorRate, &blockErrorRate};
        }
        for (std::size_t i = 0; i < itsCurves.size(); ++i) {
            itsLooks.push_back(lookOf(itsCurves, i));
            const auto length = static_cast<int>(characters(legendTitle(itsCurves[i])));
            itsEntryWidth = std::max(itsEntryWidth, legendSample + characterWidth * length);
        }
    }

    int height() const
    {
        return headerHeight + panelHeight + axisHeight + legendHeight() + noteHeight;
    }

    std::string text()
    {
        writeData();
        writeFrame();
        const auto count = static_cast<int>(itsQuantities.size());
        for (int i = 0; i < count; ++i) {
            writePanel(*itsQuantities[static_cast<std::size_t>(i)], width * i / count, width * (i + 1) / count);
        }
        writeLegend();
        itsText << "unset multiplot\n";
        return itsText.str();
    }

private:
    bool isDrawn(const Quantity& quantity) const
    {
        return std::any_of(itsCurves.begin(), itsCurves.end(), [&quantity](const Curve& curve) {
            return std::any_of(curve.samples.begin(), curve.samples.end(), [&quantity](const Sample& sample) {
                return quantity.of(sample).canBeDrawn();
            });
        });
    }

    int legendRows() const
    {
        const int columns = std::clamp(width / itsEntryWidth, 1, 4);
        return std::max(1, (static_cast<int>(itsCurves.size()) + columns - 1) / columns);
    }

    int legendHeight() const
    {
        return legendRowHeight * legendRows();
    }

    static std::string legendTitle(const Curve& curve)
    {
        return shortened(printable(curve.title), longestEntry);
    }

    /// A place of the picture, counted from its upper left corner, as gnuplot counts: fractions, from below.
    std::string at(int x, int y) const
    {
        return "screen " + across(x) + ", screen " + up(y);
    }

    std::string font(int size) const
    {
        return " font '," + exact(size * itsMeasures.font) + "'";
    }

    static std::string across(int x)
    {
        return exact(static_cast<double>(x) / width);
    }

    std::string up(int y) const
    {
        return exact(1 - static_cast<double>(y) / height());
    }

    /// The blocks that the plot commands refer to.
    static std::string lineData(const Quantity& quantity, std::size_t curve)
    {
        return std::string("$") + quantity.name + "_" + std::to_string(curve);
    }

    static std::string barData(const Quantity& quantity, std::size_t curve)
    {
        return lineData(quantity, curve) + "_bars";
    }

    static std::string boundData(const Quantity& quantity, std::size_t curve)
    {
        return lineData(quantity, curve) + "_bounds";
    }

    void writeData()
    {
        for (const Quantity* quantity : itsQuantities) {
            for (std::size_t i = 0; i < itsCurves.size(); ++i) {
                writeData(*quantity, i);
            }
        }
    }

    void writeData(const Quantity& quantity, std::size_t curve)
    {
        const double least = rateRange(quantity).from;  // zero has no place
        std::string lines;
        std::string bars;
        std::string bounds;
        for (const Sample& sample : itsCurves[curve].samples) {
            const Rate rate = quantity.of(sample);
            if (!rate.canBeDrawn() || !std::isfinite(sample.ebn0)) {
                continue;
            }
            const std::string place = exact(sample.ebn0) + ' ' + exact(rate.below ? rate.high : rate.value);
            (rate.below ? bounds : lines) += place + '\n';
            if (!rate.below && rate.hasInterval()) {
                bars += exact(sample.ebn0) + ' ' + exact(std::max(rate.low, least)) + ' ' + exact(rate.high) + '\n';
            }
        }
        itsHasBars = itsHasBars || !bars.empty();
        itsHasBounds = itsHasBounds || !bounds.empty();
        writeBlock(lineData(quantity, curve), lines);
        writeBlock(barData(quantity, curve), bars);
        writeBlock(boundData(quantity, curve), bounds);
    }

    void writeBlock(const std::string& name, const std::string& rows)
    {
        if (!rows.empty()) {
            itsText << name << " << END\n" << rows << "END\n";
            itsBlocks.push_back(name);
        }
    }

    bool hasBlock(const std::string& name) const
    {
        return std::find(itsBlocks.begin(), itsBlocks.end(), name) != itsBlocks.end();
    }

    Range ebn0Range() const
    {
        Range range{HUGE_VAL, -HUGE_VAL};
        for (const Quantity* quantity : itsQuantities) {
            for (const Curve& curve : itsCurves) {
                for (const Sample& sample : curve.samples) {
                    if (quantity->of(sample).canBeDrawn() && std::isfinite(sample.ebn0)) {
                        range = {std::min(range.from, sample.ebn0), std::max(range.to, sample.ebn0)};
                    }
                }
            }
        }
        if (range.from > range.to) {
            return {0, 1};
        }
        const double margin = range.from < range.to ? 0.03 * (range.to - range.from) : 0.5;
        return {range.from - margin, range.to + margin};
    }

    /// Whole decades, one at least, up to 1.
    Range rateRange(const Quantity& quantity) const
    {
        double least = 0.5;
        for (const Curve& curve : itsCurves) {
            for (const Sample& sample : curve.samples) {
                const Rate rate = quantity.of(sample);
                if (rate.canBeDrawn()) {
                    least = std::min(least, rate.below ? 0.8 * arrowLength * rate.high : rate.value);
                    least = rate.low > 0 ? std::min(least, rate.low) : least;
                }
            }
        }
        return {std::pow(10.0, std::floor(std::log10(least))), 1};
    }

    void writeFrame()
    {
        itsText << "set multiplot\n"
                << "set style line 1 lc rgb '#d4d4d4' lw 0.8\n"
                << "set style line 2 lc rgb '#efefef' lw 0.6\n"
                << "set grid xtics ytics mytics ls 1, ls 2\n"
                << "set border 3 lc rgb '#888888' lw 1\n"
                << "set tics nomirror out scale 0.6,0.3 textcolor rgb '" << ink << "'\n"
                << "set label 1 " << quoted(itsTitle) << " at " << at(leftMargin, 24) << " left noenhanced" << font(16)
                << " textcolor rgb '" << ink << "'\n";
    }

    void writePanel(const Quantity& quantity, int left, int right)
    {
        const Range x = ebn0Range();
        const Range y = rateRange(quantity);
        itsText << "set lmargin at screen " << across(left + leftMargin) << '\n'
                << "set rmargin at screen " << across(right - rightMargin) << '\n'
                << "set tmargin at screen " << up(headerHeight) << '\n'
                << "set bmargin at screen " << up(headerHeight + panelHeight) << '\n'
                << "set xrange [" << exact(x.from) << ':' << exact(x.to) << "]\n"
                << "set yrange [" << exact(y.from) << ':' << exact(y.to) << "]\n"
                << "set logscale y\nset mytics 10\nset format y '10^{%T}'\nset format x '%g'\n"
                << "set label 3 'E_b/N_0 (dB)' at "
                << at((left + leftMargin + right - rightMargin) / 2, headerHeight + panelHeight + 46)
                << " center textcolor rgb '" << ink << "'\n"
                << "set label 2 '" << quantity.title << " (" << quantity.name << ")' at "
                << at(left + leftMargin, headerHeight - 16) << " left textcolor rgb '" << faintInk << "'\n"
                << "plot NaN notitle";
        for (const bool reference : {true, false}) {
            for (std::size_t i = 0; i < itsCurves.size(); ++i) {
                if (itsCurves[i].reference == reference) {
                    writeCurve(quantity, i);
                }
            }
        }
        itsText << "\nunset label 1\n";  // it is drawn with the first panel
    }

    std::string colourOf(std::size_t curve) const
    {
        return std::string(" lc rgb '") + itsLooks[curve].colour.onLight + "'";
    }

    std::string lineStyle(std::size_t curve) const
    {
        const double lineWidth =
            itsCurves[curve].reference ? 1.5 : 2 + 2.0 * static_cast<double>(itsLooks[curve].layer);
        return colourOf(curve) + " lw " + exact(lineWidth) + " dt " + dashType(itsLooks[curve].dash);
    }

    std::string pointStyle(std::size_t curve) const
    {
        const int open[markers] = {6, 4, 8, 12, 14};  // the next number is the filled one
        const int marker = open[itsLooks[curve].marker] + (itsCurves[curve].reference ? 0 : 1);
        const double size = itsMeasures.point * (0.8 + 0.35 * static_cast<double>(itsLooks[curve].layer));
        return colourOf(curve) + " lw 1.5 ps " + exact(size) + " pt " + std::to_string(marker);
    }

    void writeCurve(const Quantity& quantity, std::size_t curve)
    {
        const std::string bars = barData(quantity, curve);
        const std::string line = lineData(quantity, curve);
        const std::string bounds = boundData(quantity, curve);
        if (hasBlock(bars)) {
            itsText << ", " << bars << " using 1:2:(0):($3-$2) with vectors heads size screen 0.003,90 lw 1.2"
                    << colourOf(curve) << " notitle";
        }
        if (hasBlock(line)) {
            itsText << ", " << line << " with lines" << lineStyle(curve) << " notitle, " << line << " with points"
                    << pointStyle(curve) << " notitle";
        }
        if (hasBlock(bounds)) {
            itsText << ", " << bounds << " using 1:2:(0):(" << arrowLength - 1
                    << "*$2) with vectors head filled size screen 0.006,20 lw 1.2" << colourOf(curve) << " notitle, "
                    << bounds << " with points pt 10 lw 1.4 ps " << 1.1 * itsMeasures.point << colourOf(curve)
                    << " notitle";
        }
    }

    /// In the units of the layout, the whole picture being the plot.
    void writeLegend()
    {
        const int top = headerHeight + panelHeight + axisHeight;
        itsText << "unset label\nunset border\nunset tics\nunset grid\nunset logscale\n"
                << "set lmargin at screen 0\nset rmargin at screen 1\n"
                << "set tmargin at screen 1\nset bmargin at screen 0\n"
                << "set xrange [0:" << width << "]\nset yrange [" << height() << ":0]\n"
                << "set label 1 " << quoted(note()) << " at " << width / 2 << ',' << height() - noteHeight / 2
                << " center noenhanced" << font(11) << " textcolor rgb '" << faintInk << "'\n";
        const auto count = static_cast<int>(itsCurves.size());
        const int rows = legendRows();
        const int left = (width - itsEntryWidth * ((count + rows - 1) / rows)) / 2;
        std::ostringstream commands;
        for (int i = 0; i < count; ++i) {
            const auto curve = static_cast<std::size_t>(i);
            const int x = left + itsEntryWidth * (i / rows);
            const int y = top + legendRowHeight * (i % rows) + legendRowHeight / 2;
            const std::string block = "$LEGEND_" + std::to_string(i);
            const auto row = [y](int place) {
                return std::to_string(place) + ' ' + std::to_string(y) + '\n';
            };
            // The marker stands in the middle of three places.
            itsText << block << " << END\n"
                    << row(x) << row(x + legendLine / 2) << row(x + legendLine) << "END\n"
                    << "set label " << i + 2 << ' ' << quoted(legendTitle(itsCurves[curve])) << " at "
                    << x + legendLine + 10 << ',' << y << " left noenhanced textcolor rgb '" << ink << "'\n";
            commands << ", " << block << " with lines" << lineStyle(curve) << " notitle, " << block
                     << " every ::1::1 with points" << pointStyle(curve) << " notitle";
        }
        itsText << "plot NaN notitle" << commands.str() << '\n';
    }

    /// Explains what is drawn besides lines and markers.
    std::string note() const
    {
        const std::string bars = itsHasBars ? "Bars: 95 % confidence." : "";
        const std::string bounds = itsHasBounds ? "Open triangles: no error was seen, the rate is lower." : "";
        return bars + (itsHasBars && itsHasBounds ? "  " : "") + bounds;
    }

    std::vector<Curve> itsCurves;
    std::vector<Look> itsLooks;
    std::string itsTitle;
    Measures itsMeasures;
    int itsEntryWidth = legendSample;  // of the legend
    std::vector<const Quantity*> itsQuantities;
    std::vector<std::string> itsBlocks;
    bool itsHasBars = false;
    bool itsHasBounds = false;
    std::ostringstream itsText;
};

/// Size of the picture, scale of its lines, and the font in the terminal's measure.
std::string terminalOptions(const std::string& suffix, int height)
{
    if (suffix == ".svg") {
        return " size " + std::to_string(width) + ',' + std::to_string(height);
    }
    if (suffix == ".png") {  // two pixels for each point
        return " size " + std::to_string(2 * width) + ',' + std::to_string(2 * height) +
               " fontscale 2 linewidth 2 pointscale 2";
    }
    return " size " + exact(width / 72.0) + "," + exact(height / 72.0) +  // in inches
           " fontscale 1 linewidth 1.5 pointscale 1.2";
}

}  // namespace

std::string terminalCommand(const std::string& suffix)
{
    const char* const name = suffix == ".svg" ? "svg" : suffix == ".png" ? "pngcairo" : "pdfcairo";
    return std::string("set terminal ") + name + " enhanced background rgb '#ffffff'";
}

std::string quoted(const std::string& text)
{
    std::string result = "\"";
    for (const char c : printable(text)) {
        const bool isPlain = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == ' ';
        if (isPlain) {
            result += c;
        } else {
            const unsigned code = static_cast<unsigned char>(c);
            result += '\\';
            for (const unsigned digit : {code >> 6U, code >> 3U & 7U, code & 7U}) {
                result += std::to_string(digit);
            }
        }
    }
    return result + '"';
}

double fontSize(const std::string& suffix, double points)
{
    return points * measuresOf(suffix).font;
}

std::string openingCommands(const std::string& suffix, int height)
{
    return "set encoding utf8\n" + terminalCommand(suffix) + terminalOptions(suffix, height) + " font 'sans-serif," +
           exact(fontSize(suffix, 13)) + "'\n";
}

std::string plotScript(const std::string& suffix, const std::vector<Curve>& curves, const std::string& title)
{
    Script script(curves, title, measuresOf(suffix));
    return openingCommands(suffix, script.height()) + script.text();
}

}  // namespace report
