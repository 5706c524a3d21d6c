// PlotScript: the gnuplot script of a plot.
#include "PlotScript.h"

#include <algorithm>
#include <cmath>
#include <locale>
#include <sstream>

#include "Series.h"
#include "Wording.h"
#include "base/Numbers.h"

namespace morvik::report {

namespace {

// The picture's layout, in points; all panels share its width.
constexpr int width = pictureWidth;
constexpr int headerHeight = 72;  // title and panel headings
constexpr int panelHeight = 430;
constexpr int axisHeight = 66;  // tick labels and title of the horizontal axis
constexpr int legendRowHeight = 22;
constexpr int noteHeight = 34;
constexpr int leftMargin = 62;  // of each panel, for its tick labels
constexpr int rightMargin = 18;

// In characters, so that text stays within the picture.
constexpr std::size_t longestTitle = 95;
constexpr std::size_t longestEntry = 110;  // of the legend
constexpr int characterWidth = 7;
constexpr int legendLine = 42;
constexpr int legendSample = 72;  // width of an entry besides its title: line and spaces

constexpr double arrowLength = 0.4;  // a bound's arrow ends at this fraction of it
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

/// Units in which a terminal measures font and marker sizes; terminals differ.
struct Measures {
    double font;
    double point;
};

/// The Cairo terminals measure fonts in points: 72 points are 96 of their pixels.
Measures measuresOf(const std::string& suffix)
{
    return suffix == ".svg" ? Measures{1, 0.85} : Measures{0.75, 1};
}

std::string legendTitle(const Curve& curve)
{
    return shortened(printable(curve.title), longestEntry);
}

bool isDrawn(const std::vector<Curve>& curves, const Quantity& quantity)
{
    return std::any_of(curves.begin(), curves.end(), [&quantity](const Curve& curve) {
        return std::any_of(curve.samples.begin(), curve.samples.end(), [&quantity](const Sample& sample) {
            return quantity.of(sample).canBeDrawn();
        });
    });
}

/// A row of the picture: the panels of a view, and their legend.
struct Band {
    Band(const View& view, int place) : name(view.axis->name), axis(*view.axis), curves(view.curves), top(place)
    {
        for (const Quantity* quantity : quantitiesOf(curves)) {
            if (isDrawn(curves, *quantity)) {
                quantities.push_back(quantity);
            }
        }
        if (quantities.empty()) {
            quantities = quantitiesOf(curves);
        }
        for (std::size_t i = 0; i < curves.size(); ++i) {
            looks.push_back(lookOf(curves, i, axis));
            const auto length = static_cast<int>(characters(legendTitle(curves[i])));
            entryWidth = std::max(entryWidth, legendSample + characterWidth * length);
        }
    }

    int legendRows() const
    {
        const int columns = std::clamp(width / entryWidth, 1, 4);
        return std::max(1, (static_cast<int>(curves.size()) + columns - 1) / columns);
    }

    int legendTop() const
    {
        return top + panelHeight + axisHeight;
    }

    int bottom() const
    {
        return legendTop() + legendRowHeight * legendRows();
    }

    std::string name;
    const Axis& axis;
    std::vector<Curve> curves;
    std::vector<Look> looks;
    std::vector<const Quantity*> quantities;
    int entryWidth = legendSample;  // of the legend
    int top;                        // of the panels
};

/// Whether any curve of the view has a line.
bool hasLines(const View& view)
{
    return std::any_of(view.curves.begin(), view.curves.end(), [](const Curve& curve) {
        return !curve.reference && curve.samples.size() > 1;
    });
}

class Script {
public:
    Script(const std::vector<Curve>& curves, const std::string& title, const Measures& measures)
        : itsTitle(shortened(printable(title), longestTitle)), itsMeasures(measures)
    {
        itsText.imbue(std::locale::classic());
        const std::vector<View> views = viewsOf(curves);
        for (const View& view : views) {
            if (views.size() == 1 || hasLines(view)) {  // at a single Eb/N0, only the iterations vary
                itsBands.emplace_back(view, (itsBands.empty() ? 0 : itsBands.back().bottom()) + headerHeight);
            }
        }
    }

    int height() const
    {
        return itsBands.back().bottom() + noteHeight;
    }

    std::string text()
    {
        for (const Band& band : itsBands) {
            writeData(band);
        }
        itsText << "set multiplot\n";
        writeTitle();
        for (const Band& band : itsBands) {
            writeFrame();
            const auto count = static_cast<int>(band.quantities.size());
            for (int i = 0; i < count; ++i) {
                writePanel(
                    band, *band.quantities[static_cast<std::size_t>(i)], width * i / count, width * (i + 1) / count);
            }
            writeLegend(band);
        }
        itsText << "unset multiplot\n";
        return itsText.str();
    }

private:
    /// Coordinates as gnuplot counts them, in fractions from below; ours start at the upper left corner.
    std::string at(int x, int y) const
    {
        return "screen " + across(x) + ", screen " + up(y);
    }

    std::string font(int size) const
    {
        return " font '," + base::numberText(size * itsMeasures.font) + "'";
    }

    static std::string across(int x)
    {
        return base::numberText(static_cast<double>(x) / width);
    }

    std::string up(int y) const
    {
        return base::numberText(1 - static_cast<double>(y) / height());
    }

    /// The data blocks of the plot commands.
    static std::string lineData(const Band& band, const Quantity& quantity, std::size_t curve)
    {
        return "$" + band.name + "_" + quantity.name + "_" + std::to_string(curve);
    }

    static std::string barData(const Band& band, const Quantity& quantity, std::size_t curve)
    {
        return lineData(band, quantity, curve) + "_bars";
    }

    static std::string boundData(const Band& band, const Quantity& quantity, std::size_t curve)
    {
        return lineData(band, quantity, curve) + "_bounds";
    }

    void writeData(const Band& band)
    {
        for (const Quantity* quantity : band.quantities) {
            for (std::size_t i = 0; i < band.curves.size(); ++i) {
                writeData(band, *quantity, i);
            }
        }
    }

    void writeData(const Band& band, const Quantity& quantity, std::size_t curve)
    {
        const double least = rateRange(band, quantity).from;  // zero cannot be shown
        std::string lines;
        std::string bars;
        std::string bounds;
        for (const Sample& sample : band.curves[curve].samples) {
            const Rate rate = quantity.of(sample);
            const double x = band.axis.of(sample);
            if (!rate.canBeDrawn() || !std::isfinite(x)) {
                continue;
            }
            const std::string place = base::numberText(x) + ' ' + base::numberText(rate.below ? rate.high : rate.value);
            (rate.below ? bounds : lines) += place + '\n';
            if (!rate.below && rate.hasInterval()) {
                bars += base::numberText(x) + ' ' + base::numberText(std::max(rate.low, least)) + ' ' +
                        base::numberText(rate.high) + '\n';
            }
        }
        itsHasBars = itsHasBars || !bars.empty();
        itsHasBounds = itsHasBounds || !bounds.empty();
        writeBlock(lineData(band, quantity, curve), lines);
        writeBlock(barData(band, quantity, curve), bars);
        writeBlock(boundData(band, quantity, curve), bounds);
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

    static Range axisRange(const Band& band)
    {
        Range range{HUGE_VAL, -HUGE_VAL};
        for (const Quantity* quantity : band.quantities) {
            for (const Curve& curve : band.curves) {
                for (const Sample& sample : curve.samples) {
                    const double x = band.axis.of(sample);
                    if (quantity->of(sample).canBeDrawn() && std::isfinite(x)) {
                        range = {std::min(range.from, x), std::max(range.to, x)};
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

    /// Of a throughput, from 0 to a little above the greatest.
    static Range linearRange(const Band& band, const Quantity& quantity)
    {
        double most = 0;
        for (const Curve& curve : band.curves) {
            for (const Sample& sample : curve.samples) {
                const double value = quantity.of(sample).value;
                most = std::isfinite(value) ? std::max(most, value) : most;
            }
        }
        return {0, most > 0 ? 1.1 * most : 1};
    }

    /// Whole decades, at least one, up to 1.
    static Range rateRange(const Band& band, const Quantity& quantity)
    {
        if (quantity.isLinear) {
            return linearRange(band, quantity);
        }
        double least = 0.5;
        for (const Curve& curve : band.curves) {
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

    void writeTitle()
    {
        itsText << "set label 1 " << quoted(itsTitle) << " at " << at(leftMargin, 24) << " left noenhanced" << font(16)
                << " textcolor rgb '" << ink << "'\n";
    }

    void writeFrame()
    {
        itsText << "set style line 1 lc rgb '#d4d4d4' lw 0.8\n"
                << "set style line 2 lc rgb '#efefef' lw 0.6\n"
                << "set grid xtics ytics mytics ls 1, ls 2\n"
                << "set border 3 lc rgb '#888888' lw 1\n"
                << "set tics nomirror out scale 0.6,0.3 textcolor rgb '" << ink << "'\n";
    }

    void writePanel(const Band& band, const Quantity& quantity, int left, int right)
    {
        const Range x = axisRange(band);
        const Range y = rateRange(band, quantity);
        itsText << "set lmargin at screen " << across(left + leftMargin) << '\n'
                << "set rmargin at screen " << across(right - rightMargin) << '\n'
                << "set tmargin at screen " << up(band.top) << '\n'
                << "set bmargin at screen " << up(band.top + panelHeight) << '\n'
                << "set xrange [" << base::numberText(x.from) << ':' << base::numberText(x.to) << "]\n"
                << "set yrange [" << base::numberText(y.from) << ':' << base::numberText(y.to) << "]\n"
                << (quantity.isLinear ? "unset logscale y\nset mytics 2\nset format y '%g'\n"
                                      : "set logscale y\nset mytics 10\nset format y '10^{%T}'\n")
                << "set format x '%g'\n"
                << "set xtics nomirror " << (band.axis.isWhole ? "1" : "autofreq") << "\nset ytics nomirror\n"
                << "set label 3 '" << band.axis.label << "' at "
                << at((left + leftMargin + right - rightMargin) / 2, band.top + panelHeight + 46)
                << " center textcolor rgb '" << ink << "'\n"
                << "set label 2 " << quoted(heading(band, quantity)) << " at " << at(left + leftMargin, band.top - 16)
                << " left textcolor rgb '" << faintInk << "'\n"
                << "plot NaN notitle";
        writeLimit(band, quantity);
        for (const bool reference : {true, false}) {
            for (std::size_t i = 0; i < band.curves.size(); ++i) {
                if (band.curves[i].reference == reference) {
                    writeCurve(band, quantity, i);
                }
            }
        }
        itsText << "\nunset label 1\n";  // it is drawn with the first panel
    }

    static bool hasLimit(const Band& band, const Quantity& quantity)
    {
        return quantity.isLinear && &band.axis == &esn0Axis;
    }

    static std::string heading(const Band& band, const Quantity& quantity)
    {
        if (!quantity.isLinear) {
            return std::string(quantity.title) + " (" + quantity.name + ')';
        }
        return quantity.title + std::string(hasLimit(band, quantity) ? "; dotted: Shannon's limit" : "");
    }

    /// Shannon's limit for symbols of two dimensions.
    void writeLimit(const Band& band, const Quantity& quantity)
    {
        if (hasLimit(band, quantity)) {
            itsText << ", log(1 + 10**(x / 10.0)) / log(2) with lines lw 1.5 dt 3 lc rgb '" << faintInk << "' notitle";
        }
    }

    static std::string colourOf(const Band& band, std::size_t curve)
    {
        return std::string(" lc rgb '") + band.looks[curve].colour.onLight + "'";
    }

    static std::string lineStyle(const Band& band, std::size_t curve)
    {
        const Look& look = band.looks[curve];
        const double lineWidth = band.curves[curve].reference ? 1.5 : 2 + 2.0 * static_cast<double>(look.layer);
        return colourOf(band, curve) + " lw " + base::numberText(lineWidth) + " dt " + dashType(look.dash);
    }

    std::string pointStyle(const Band& band, std::size_t curve) const
    {
        const int open[markers] = {6, 4, 8, 12, 14};  // the next number is the filled marker
        const int marker = open[band.looks[curve].marker] + (band.curves[curve].reference ? 0 : 1);
        const double size = itsMeasures.point * (0.8 + 0.35 * static_cast<double>(band.looks[curve].layer));
        return colourOf(band, curve) + " lw 1.5 ps " + base::numberText(size) + " pt " + std::to_string(marker);
    }

    void writeCurve(const Band& band, const Quantity& quantity, std::size_t curve)
    {
        const std::string bars = barData(band, quantity, curve);
        const std::string line = lineData(band, quantity, curve);
        const std::string bounds = boundData(band, quantity, curve);
        if (hasBlock(bars)) {
            itsText << ", " << bars << " using 1:2:(0):($3-$2) with vectors heads size screen 0.003,90 lw 1.2"
                    << colourOf(band, curve) << " notitle";
        }
        if (hasBlock(line)) {
            itsText << ", " << line << " with lines" << lineStyle(band, curve) << " notitle, " << line << " with points"
                    << pointStyle(band, curve) << " notitle";
        }
        if (hasBlock(bounds)) {
            itsText << ", " << bounds << " using 1:2:(0):(" << arrowLength - 1
                    << "*$2) with vectors head filled size screen 0.006,20 lw 1.2" << colourOf(band, curve)
                    << " notitle, " << bounds << " with points pt 10 lw 1.4 ps " << 1.1 * itsMeasures.point
                    << colourOf(band, curve) << " notitle";
        }
    }

    /// In layout units, with the whole picture as the plot.
    void writeLegend(const Band& band)
    {
        itsText << "unset label\nunset border\nunset tics\nunset grid\nunset logscale\n"
                << "set lmargin at screen 0\nset rmargin at screen 1\n"
                << "set tmargin at screen 1\nset bmargin at screen 0\n"
                << "set xrange [0:" << width << "]\nset yrange [" << height() << ":0]\n"
                << "set label 1 " << quoted(note()) << " at " << width / 2 << ',' << height() - noteHeight / 2
                << " center noenhanced" << font(11) << " textcolor rgb '" << faintInk << "'\n";
        const auto count = static_cast<int>(band.curves.size());
        const int rows = band.legendRows();
        const int left = (width - band.entryWidth * ((count + rows - 1) / rows)) / 2;
        std::ostringstream commands;
        for (int i = 0; i < count; ++i) {
            const auto curve = static_cast<std::size_t>(i);
            const int x = left + band.entryWidth * (i / rows);
            const int y = band.legendTop() + legendRowHeight * (i % rows) + legendRowHeight / 2;
            const std::string block = "$LEGEND_" + band.name + "_" + std::to_string(i);
            const auto row = [y](int place) {
                return std::to_string(place) + ' ' + std::to_string(y) + '\n';
            };
            // The marker is in the middle of three places.
            itsText << block << " << END\n"
                    << row(x) << row(x + legendLine / 2) << row(x + legendLine) << "END\n"
                    << "set label " << i + 2 << ' ' << quoted(legendTitle(band.curves[curve])) << " at "
                    << x + legendLine + 10 << ',' << y << " left noenhanced textcolor rgb '" << ink << "'\n";
            commands << ", " << block << " with lines" << lineStyle(band, curve) << " notitle, " << block
                     << " every ::1::1 with points" << pointStyle(band, curve) << " notitle";
        }
        itsText << "plot NaN notitle" << commands.str() << "\nunset label\n";
    }

    /// Explains everything drawn besides lines and markers.
    std::string note() const
    {
        const std::string bars = itsHasBars ? "Bars: 95 % confidence." : "";
        const std::string bounds = itsHasBounds ? "Open triangles: no error was seen, the rate is lower." : "";
        return bars + (itsHasBars && itsHasBounds ? "  " : "") + bounds;
    }

    std::string itsTitle;
    Measures itsMeasures;
    std::vector<Band> itsBands;
    std::vector<std::string> itsBlocks;
    bool itsHasBars = false;
    bool itsHasBounds = false;
    std::ostringstream itsText;
};

/// Size of the picture, scale of its lines, and the font in the terminal's units.
std::string terminalOptions(const std::string& suffix, int height)
{
    if (suffix == ".svg") {
        return " size " + std::to_string(width) + ',' + std::to_string(height);
    }
    if (suffix == ".png") {  // two pixels per point
        return " size " + std::to_string(2 * width) + ',' + std::to_string(2 * height) +
               " fontscale 2 linewidth 2 pointscale 2";
    }
    return " size " + base::numberText(width / 72.0) + "," + base::numberText(height / 72.0) +  // in inches
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
        const bool isPlain = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == ' ';
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
           base::numberText(fontSize(suffix, 13)) + "'\n";
}

std::string plotScript(const std::string& suffix, const std::vector<Curve>& curves, const std::string& title)
{
    Script script(curves, title, measuresOf(suffix));
    return openingCommands(suffix, script.height()) + script.text();
}

}  // namespace morvik::report
