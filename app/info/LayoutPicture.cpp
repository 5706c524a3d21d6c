// LayoutPicture: draws the segments and windows of a block and the order of their computation.
#include "LayoutPicture.h"

#include <cmath>
#include <cstdio>
#include <string>
#include "base/Text.h"

namespace morvik {

namespace {

using report::Drawing;
using Anchor = Drawing::Anchor;

// The picture's layout, in points.
constexpr double left = 190;
constexpr double right = 960;
constexpr double titleHeight = 62;
constexpr double headingHeight = 30;
constexpr double segmentHeight = 17;
constexpr double arrowsHeight = 68;
constexpr double noteHeight = 40;
constexpr const char* ink = "#222222";
constexpr const char* faintInk = "#666666";
constexpr const char* backwardInk = "#b5541c";

/// Unit counts that divide a block alike.
struct Panel {
    std::string units;
    const rules::Cut* cut;

    double height() const
    {
        return headingHeight + segmentHeight * cut->segments() + arrowsHeight;
    }
};

std::vector<Panel> panelsOf(const BlockLayout& layout)
{
    std::vector<Panel> panels;
    for (const rules::Cut& cut : layout.cuts) {
        const std::string units = std::to_string(cut.units());
        if (!panels.empty() && panels.back().cut->segments() == cut.segments()) {
            panels.back().units += ", " + units;
        } else {
            panels.push_back({units, &cut});
        }
    }
    return panels;
}

/// Shades the rows from dark to light; two rows get the extremes.
std::string shadeOf(unsigned row, unsigned rows)
{
    const double lightness = rows > 1 ? static_cast<double>(row) / (rows - 1) : 0;
    const int dark[] = {0x1f, 0x5f, 0x99};
    const int light[] = {0xc6, 0xdd, 0xf1};
    unsigned shade[3];
    for (unsigned i = 0; i < 3; ++i) {
        shade[i] = static_cast<unsigned>(std::lround(dark[i] + lightness * (light[i] - dark[i])));
    }
    char text[32];
    std::snprintf(text, sizeof text, "#%02x%02x%02x", shade[0], shade[1], shade[2]);
    return text;
}

/// Paints one panel, whose segments begin at height `top`.
class Painter {
public:
    Painter(const rules::Cut& cut, double top, Drawing& drawing) : itsCut(cut), itsTop(top), itsDrawing(drawing) {}

    void paint()
    {
        paintSegmentNames();
        for (unsigned i = 0; i < itsCut.windows(); ++i) {
            paintWindow(i);
        }
        paintArrows(itsTop + segmentHeight * itsCut.segments() + 14);
    }

private:
    /// The x coordinate of a step within its segment.
    double across(std::uint32_t step) const
    {
        return left + (right - left) * step / itsCut.segmentLength();
    }

    void paintSegmentNames()
    {
        for (unsigned segment = 0; segment < itsCut.segments(); ++segment) {
            const std::uint32_t first = segment * itsCut.segmentLength();
            itsDrawing.text(left - 10,
                            itsTop + segmentHeight * (segment + 0.5),
                            "segment " + std::to_string(segment) + ": steps " + std::to_string(first) + " to " +
                                std::to_string(first + itsCut.segmentLength() - 1),
                            10,
                            Anchor::right,
                            ink);
        }
    }

    void paintWindow(unsigned number)
    {
        const rules::Window window = itsCut.window(number);
        const std::uint32_t begin = window.segment * itsCut.segmentLength();
        const double from = across(window.first - begin);
        const double to = across(window.last + 1 - begin);
        const double y = itsTop + segmentHeight * window.segment;
        itsDrawing.rectangle(from + 0.5, y + 0.5, to - from - 1, segmentHeight - 1, shadeOf(window.row, itsCut.rows()));
        const bool isDark = itsCut.rows() == 1 || 2 * window.row + 1 < itsCut.rows();
        itsDrawing.text((from + to) / 2,
                        y + segmentHeight / 2,
                        std::to_string(number),
                        10,
                        Anchor::centre,
                        isDark ? "#ffffff" : ink);
    }

    void paintArrows(double y)
    {
        itsDrawing.text(left - 10, y, "forward", 10, Anchor::right, ink);
        itsDrawing.arrow(left + 2, y, right - 2, y, ink);
        itsDrawing.text(left - 10, y + 14, "backward", 10, Anchor::right, backwardInk);
        for (unsigned row = 0; row < itsCut.rows(); ++row) {
            const std::uint32_t first = itsCut.windowStart(row);
            const std::uint32_t end = itsCut.windowStart(row + 1);
            itsDrawing.arrow(across(end) - 2, y + 14, across(first) + 2, y + 14, backwardInk);
            const double middle = (across(first) + across(end)) / 2;
            const std::string steps = std::to_string(end - first) + " steps";
            itsDrawing.text(middle, y + 26, "row " + std::to_string(row), 9, Anchor::centre, backwardInk);
            itsDrawing.text(middle, y + 38, steps, 9, Anchor::centre, backwardInk);
        }
    }

    const rules::Cut& itsCut;
    double itsTop;
    Drawing& itsDrawing;
};

std::string headingOf(const Panel& panel)
{
    const rules::Cut& cut = *panel.cut;
    std::string units = panel.units;
    const std::size_t last = units.rfind(", ");
    if (last != std::string::npos) {
        units.replace(last, 2, " and ");
    }
    return units + " units: " + base::counted(cut.segments(), "segment") + " of " +
           base::counted(cut.segmentLength(), "trellis step") + ", " + base::counted(cut.rows(), "row") + " of windows";
}

}  // namespace

report::Drawing pictureOf(const BlockLayout& layout)
{
    const std::vector<Panel> panels = panelsOf(layout);
    double height = titleHeight + noteHeight;
    std::string description = "A block of " + std::to_string(layout.K) + " bits.";
    for (const Panel& panel : panels) {
        height += panel.height();
        description += ' ' + headingOf(panel) + '.';
    }
    const std::string title = "K = " + std::to_string(layout.K) + ": segments and windows";
    Drawing drawing(static_cast<int>(std::lround(height)), title, description);
    drawing.text(24, 26, title, 16, Anchor::left, ink);
    double top = titleHeight;
    for (const Panel& panel : panels) {
        drawing.text(24, top, headingOf(panel), 12, Anchor::left, faintInk);
        Painter(*panel.cut, top + headingHeight / 2, drawing).paint();
        top += panel.height();
    }
    drawing.text(24,
                 height - 22,
                 "The numbers are the order of the backward recursion: the windows of a row, then the next row. The "
                 "forward recursion comes first and runs through whole segments.",
                 10,
                 Anchor::left,
                 faintInk);
    return drawing;
}

}  // namespace morvik
