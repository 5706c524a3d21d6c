// Drawing: a picture of rectangles, arrows and text, in the formats of the plots.
#include "Drawing.h"

#include <utility>

#include "PlotScript.h"
#include "Wording.h"
#include "base/Numbers.h"

namespace morvik::report {

namespace {

std::string place(double x, double y)
{
    return base::numberText(x) + ',' + base::numberText(y);
}

const char* nameOf(Drawing::Anchor anchor)
{
    switch (anchor) {
    case Drawing::Anchor::left:
        return "left";
    case Drawing::Anchor::right:
        return "right";
    case Drawing::Anchor::centre:
        break;
    }
    return "center";
}

}  // namespace

Drawing::Drawing(int height, std::string title, std::string description)
    : itsHeight(height), itsTitle(std::move(title)), itsDescription(std::move(description))
{
}

void Drawing::rectangle(double x, double y, double width, double height, const std::string& colour)
{
    itsShapes += "set object rectangle from " + place(x, y) + " to " + place(x + width, y + height) + " fc rgb '" +
                 colour + "' fs solid noborder\n";
}

void Drawing::arrow(double fromX, double fromY, double toX, double toY, const std::string& colour)
{
    itsShapes += "set arrow from " + place(fromX, fromY) + " to " + place(toX, toY) +
                 " head filled size screen 0.006,20 lw 1.4 lc rgb '" + colour + "'\n";
}

void Drawing::text(
    double x, double y, const std::string& words, double points, Anchor anchor, const std::string& colour)
{
    itsWords.push_back({x, y, words, points, anchor, colour});
}

const std::string& Drawing::title() const
{
    return itsTitle;
}

const std::string& Drawing::description() const
{
    return itsDescription;
}

std::string Drawing::script(const std::string& suffix) const
{
    std::string text = openingCommands(suffix, itsHeight) +
                       "unset border\nunset tics\nunset key\n"
                       "set lmargin at screen 0\nset rmargin at screen 1\n"
                       "set tmargin at screen 1\nset bmargin at screen 0\n"
                       "set xrange [0:" +
                       std::to_string(pictureWidth) + "]\nset yrange [" + std::to_string(itsHeight) + ":0]\n" +
                       itsShapes;
    for (const Words& each : itsWords) {
        text += "set label " + quoted(each.words) + " at " + place(each.x, each.y) + ' ' + nameOf(each.anchor) +
                " front noenhanced font '," + base::numberText(fontSize(suffix, each.points)) + "' textcolor rgb '" +
                each.colour + "'\n";
    }
    return text + "plot NaN notitle\n";
}

}  // namespace morvik::report
